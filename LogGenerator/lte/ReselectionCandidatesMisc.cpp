#include "LogGenerator/lte/ReselectionCandidatesMisc.h"

#include "LogGenerator/lte/LteConversions.h"
#include "platform/Log.h"

namespace corvane {

namespace {
constexpr std::size_t kMinimumLength = 21;
}  // namespace

void ReselectionCandidatesMisc::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto accepted =
      acceptPacket("Reselection Candidates", data, logCode, lte::kReselectionCandidatesCode, kMinimumLength);
  if (!accepted) return;
  const PacketView& packet = *accepted;
  lte::RowWriter rows(*this);
  rows.set("Version", lte::decimalText(packet.u8(13)));
  rows.set("Serving EARFCN", lte::decimalText(packet.le16(15)));
  rows.set("Serving Cell ID", lte::decimalText(packet.le16(17)));
}

}  // namespace corvane
