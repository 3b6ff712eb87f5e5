#include "LogGenerator/lte/ReselectionCandidatesMisc.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/lte/records/ReselectionCandidatesRecord.h"

namespace corvane {

namespace {

using namespace lte::reselection;

constexpr RowField kRows[] = {
    {"Version", kVersion},
    {"Serving EARFCN", kServingEarfcn},
    {"Serving Cell ID", kServingCellId},
};

}  // namespace

void ReselectionCandidatesMisc::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("Reselection Candidates", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  RowWriter rows(*this);
  writeRows<kRows>(rows, *packet);
}

}  // namespace corvane
