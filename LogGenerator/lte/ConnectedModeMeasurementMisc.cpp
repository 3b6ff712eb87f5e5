#include "LogGenerator/lte/ConnectedModeMeasurementMisc.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/lte/records/IntraFrequencyMeasurementRecord.h"

namespace corvane {

namespace {

using namespace lte::intra_frequency;

constexpr RowField kRows[] = {
    {"E-ARFCN", kEarfcn},
    {"Serving Physical Cell ID", kServingPhysicalCellId},
    {"Subframe Number", kSubframeNumber},
    {"Serving Filtered RSRP", kServingFilteredRsrp},
    {"Serving Filtered RSRQ", kServingFilteredRsrq},
};

}  // namespace

void ConnectedModeMeasurementMisc::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet =
      acceptPacket("Connected mode LTE Intra-frequency Measurement", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  RowWriter rows(*this);
  writeRows<kRows>(rows, *packet);
}

}  // namespace corvane
