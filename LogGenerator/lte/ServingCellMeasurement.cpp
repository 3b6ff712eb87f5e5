#include "LogGenerator/lte/ServingCellMeasurement.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/lte/records/ServingCellMeasurementRecord.h"

namespace corvane {

namespace {

using namespace lte::serving_measurement;

constexpr RowField kRows[] = {
    {"Version", kVersion},
    {"E-ARFCN", kEarfcn},
    {"Physical Cell ID", kPhysicalCellId},
    {"Serving Layer Priority", kLayerPriority},
    {"Measured RSRP", kMeasuredRsrp},
    {"Average RSRP", kAverageRsrp},
    {"Measured RSRQ", kMeasuredRsrq},
    {"Average RSRQ", kAverageRsrq},
    {"Measured RSSI", kRssi},
    {"Qrxlevmin", kQrxlevmin},
    {"P_Max", kPMax},
    {"Max UE Tx Power", kMaxUeTxPower},
    {"Srxlev", kSrxlev},
    {"Num of Consecutive DRX Cycles of S < 0", kDrxCyclesBelowZero},
    {"S Intra Search", kSIntraSearch},
    {"S Non Intra Search", kSNonIntraSearch},
    {"Measurement Rules Updated", kRulesUpdated},
    {"Measurement Rules", kRules},
};

}  // namespace

void ServingCellMeasurement::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("Serving Cell Measurements", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  RowWriter rows(*this);
  writeRows<kRows>(rows, *packet);
}

}  // namespace corvane
