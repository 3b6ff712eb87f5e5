#include "LogGenerator/lte/NeighborMeasurementMisc.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/lte/records/NeighborMeasurementRecord.h"

namespace corvane {

namespace {

using namespace lte::neighbor_measurement;

constexpr RowField kRows[] = {
    {"Version", kVersion},
    {"E-ARFCN", kEarfcn},
    {"Qrxlevmin", kQrxlevmin},
};

}  // namespace

void NeighborMeasurementMisc::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("Neighbor Measurements", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  RowWriter rows(*this);
  writeRows<kRows>(rows, *packet);
}

}  // namespace corvane
