#include "LogGenerator/utran/UTRANServingCellInfo.h"

#include <array>

#include "LogGenerator/gsm_umts/CellListRows.h"
#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/utran/records/ServingCellRecord.h"
#include "platform/CellMonitor.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using namespace utran::serving_cell;

constexpr RowField kServingCellRows[] = {
    {"Cell Access Restrictions", kAccessRestrictions},
    {"Cell ID", kCellId},
    {"Downlink UARFCN", kDownlinkUarfcn},
    {"Uplink UARFCN", kUplinkUarfcn},
    {"URA ID", kUraId},
    {"Allowed Access", kAllowedAccess},
};

// A value of the serving cell in the cell list and the rows it sets: the
// UARFCN sets both frequencies.
struct CellListValue {
  std::string_view cellMonitorKey;
  std::array<std::string_view, 2> rows;
  const char* failure;
};

constexpr std::array<CellListValue, 5> kCellListValues = {{
    {CellMonitorLAC, {"Local Area Code"}, "Serving Cell Info: Failed to retrieve LAC\n"},
    {CellMonitorCellId, {"Cell ID"}, "Serving Cell Info: Failed to retrieve Cell ID\n"},
    {CellMonitorBandInfo, {"Freq Band Indicator"}, "Serving Cell Info: Failed to retrieve Freq Band Indicator\n"},
    {CellMonitorSCN, {"Cell Scrambling Code"}, "Serving Cell Info: Failed to retrieve Cell Scrambling Code\n"},
    {CellMonitorUARFCN, {"Uplink UARFCN", "Downlink UARFCN"}, "Serving Cell Info: Failed to retrieve UARFCN\n"},
}};

}  // namespace

void UTRANServingCellInfo::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "Serving Cell Info");
  switch (logCode) {
    case kCode: updateFromServingCell(PacketView(data)); return;
    case kExtraCodeCellList: updateFromCellList(data); return;
    default: return;
  }
}

void UTRANServingCellInfo::updateFromServingCell(const PacketView& packet) const {
  if (packet.size() < kMinimumLength) return;
  RowWriter rows(*this);
  writeRows<kServingCellRows>(rows, packet);
}

void UTRANServingCellInfo::updateFromCellList(std::span<const std::uint8_t> data) const {
  const CellInfoArray list(data);
  const Array* cells = list.array();
  if (!cells) return;
  // Every serving UTRAN2 cell of the list is written: the last one shows.
  for (const Value& element : cells->elements()) {
    const Dictionary* cell = element.asDictionary();
    if (!cell || !cell_list::cellIs(*cell, {CellMonitorRadioAccessTechnologyUTRAN2}, CellMonitorCellTypeServing)) {
      continue;
    }
    RowWriter rows(*this);
    for (const CellListValue& value : kCellListValues) {
      const auto number = CellInfoArray::integerValue(*cell, value.cellMonitorKey);
      if (!number) {
        log::write(log::kError, value.failure);
        continue;
      }
      const Text text = decimalText(*number);
      for (std::string_view row : value.rows) {
        if (!row.empty()) rows.set(row, text);
      }
    }
  }
}

}  // namespace corvane
