#include "LogGenerator/gsm_umts/ServingPLMN.h"

#include <array>

#include "LogGenerator/gsm_umts/CellListRows.h"
#include "LogGenerator/gsm_umts/RecordRows.h"
#include "LogGenerator/gsm_umts/records/PlmnSelectionModeRecord.h"
#include "LogGenerator/gsm_umts/records/RegistrationRecord.h"

namespace corvane {

namespace {

using namespace gsm_umts;

constexpr RowField kSelectionModeRows[] = {{"PLMN Sel Mod", plmn_selection::kMode}};
constexpr RowField kRegistrationRowsAfterCodes[] = {
    {"Routing Area Code", registration::kRoutingAreaCode},
    {"Service Type", registration::kServiceType},
};

// From the serving cell, UMTS or GSM; the rows are plain numbers here, without
// blanks or leading zeros.
constexpr std::array<cell_list::CellListRow, 3> kCellListRows = {{
    {CellMonitorMCC, "Mobile Country Code", "ServingPLMN: Failed to retrieve MCC\n"},
    {CellMonitorMNC, "Mobile Network Code", "ServingPLMN: Failed to retrieve MNC\n"},
    {CellMonitorLAC, "Location Area Code", "ServingPLMN: Failed to retrieve LAC\n"},
}};

// Three BCD digits of the PLMN identity, "%c%c%c", a blank for a nibble that
// is no digit.
Text digitsText(std::span<const records::Field, 3> digits, const PacketView& packet) {
  Text text;
  char* end = text.begin();
  for (const records::Field& digit : digits) end += fieldText(digit, packet).view().copy(end, 1);
  text.setEnd(end);
  return text;
}

}  // namespace

void ServingPLMN::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "Serving PLMN");
  const PacketView packet(data);
  switch (logCode) {
    case plmn_selection::kCode:
      writeRecordRows<kSelectionModeRows>(*this, packet, plmn_selection::kMinimumLength);
      return;
    case registration::kCode: updateFromRegistration(packet); return;
    case kExtraCodeCellList:
      cell_list::writeServingCellRows(
          *this, data, {CellMonitorRadioAccessTechnologyUMTS, CellMonitorRadioAccessTechnologyGSM}, kCellListRows);
      return;
    default: logUnknownCode(logCode); return;
  }
}

void ServingPLMN::updateFromRegistration(const PacketView& packet) const {
  if (packet.size() < registration::kMinimumLength) return;
  RowWriter rows(*this);
  rows.set("Mobile Country Code", digitsText(registration::kMccDigits, packet));
  rows.set("Mobile Network Code", digitsText(registration::kMncDigits, packet));
  // The baseband passes the location area code on high byte first.
  rows.set("Location Area Code", decimalText(registration::kLocationAreaCodeHigh.raw(packet) << 8 |
                                             registration::kLocationAreaCodeLow.raw(packet)));
  writeRows<kRegistrationRowsAfterCodes>(rows, packet);
}

}  // namespace corvane
