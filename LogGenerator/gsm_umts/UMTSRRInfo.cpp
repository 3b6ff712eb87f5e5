#include "LogGenerator/gsm_umts/UMTSRRInfo.h"

#include <array>
#include <limits>

#include "LogGenerator/gsm_umts/CellListRows.h"
#include "LogGenerator/gsm_umts/RecordRows.h"
#include "LogGenerator/gsm_umts/records/CipheringRecord.h"
#include "LogGenerator/gsm_umts/records/RrcStateRecord.h"
#include "LogGenerator/gsm_umts/records/TransmitPowerRecord.h"
#include "LogGenerator/gsm_umts/records/UmtsCellRecord.h"
#include "LogGenerator/logcode/Entries.h"

namespace corvane {

namespace {

using namespace gsm_umts;

constexpr std::string_view kDbm = " dBm";

constexpr RowField kRrcStateRows[] = {{"RRC State", rrc_state::kState}};
constexpr RowField kCipheringRows[] = {{"Ciphering", ciphering::kCiphering}};
constexpr RowField kCellRowsBeforeUarfcn[] = {
    {"Cell ID", umts_cell::kCellId},
    {"Downlink Frequency", umts_cell::kDownlinkUarfcn},
    {"Uplink Frequency", umts_cell::kUplinkUarfcn},
};
constexpr RowField kCellRowsAfterUarfcn[] = {{"URA ID", umts_cell::kUraId}};

constexpr std::array<cell_list::CellListRow, 3> kCellListRows = {{
    {CellMonitorCellId, "Cell ID", "UMTSRRInfo: Failed to retrieve Cell ID\n"},
    {CellMonitorUARFCN, "UARFCN", "UMTSRRInfo: Failed to retrieve UARFCN\n"},
    {CellMonitorSCN, "Scrambling Code", "UMTSRRInfo: Failed to retrieve Scrambling Code\n"},
}};

}  // namespace

BoundedList UMTSRRInfo::samples(const PacketView& packet) {
  return BoundedList(transmit_power::kCount.raw(packet), transmit_power::kSamples);
}

void UMTSRRInfo::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "UMTSRRInfo");
  const PacketView packet(data);
  switch (logCode) {
    case rrc_state::kCode: writeRecordRows<kRrcStateRows>(*this, packet, rrc_state::kMinimumLength); return;
    case transmit_power::kCode: updateFromTransmitPower(packet); return;
    case umts_cell::kCode: updateFromCell(packet); return;
    case ciphering::kCode: writeRecordRows<kCipheringRows>(*this, packet, ciphering::kMinimumLength); return;
    case kExtraCodeCellList:
      cell_list::writeServingCellRows(*this, data, {CellMonitorRadioAccessTechnologyUMTS}, kCellListRows);
      return;
    default: logUnknownCode(logCode); return;
  }
}

void UMTSRRInfo::updateFromTransmitPower(const PacketView& packet) const {
  if (packet.size() < transmit_power::kMinimumLength) return;
  double sum = 0.0;
  int used = 0;
  forEachEntry(packet, samples(packet), transmit_power::kSamples.entrySize, [&](std::size_t sample) {
    const std::int32_t raw = transmit_power::kPower.number(packet, sample);
    if (raw == transmit_power::kNoMeasurement) return;
    sum += transmit_power::powerDbm(raw);
    ++used;
  });
  // Without a measured sample the average is not a number, and the row has
  // always shown it so: printf's text for it (" nan" at width 4), then the unit.
  const double average = used == 0 ? std::numeric_limits<double>::quiet_NaN() : sum / used;
  RowWriter(*this).set("Transmit Power", fixedText(average, kDbm));
}

void UMTSRRInfo::updateFromCell(const PacketView& packet) const {
  if (packet.size() < umts_cell::kMinimumLength) return;
  RowWriter rows(*this);
  writeRows<kCellRowsBeforeUarfcn>(rows, packet);
  // A UARFCN comes only with the cell-monitor list, where it repeats the
  // downlink frequency; a fresh baseband record of the cell drops it.
  rows.remove("UARFCN");
  writeRows<kCellRowsAfterUarfcn>(rows, packet);
}

}  // namespace corvane
