#pragma once

// Rows from the telephony service's cell-monitor list (extra code 0xFF0001),
// as the GSM/UMTS sections read it: find the cells of a technology and type,
// and set a row from each of a cell's values. A value that is missing or not a
// number logs the row's failure line and leaves the row as it was; the next
// value is read all the same, so one missing value never hides the others.

#include <cstdint>
#include <initializer_list>
#include <span>
#include <string_view>
#include <vector>

#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "LogGenerator/logcode/Rows.h"
#include "platform/CellMonitor.h"
#include "platform/Log.h"

namespace corvane::cell_list {

struct CellListRow {
  std::string_view cellMonitorKey;
  std::string_view row;
  const char* failure;
  // A measured level: the value's low 16 bits, signed. kCellMonitorNotMeasured
  // shows as the empty text, any other v as "%d<unit>" of v × scale.
  bool measured = false;
  int scale = 1;
  std::string_view unit{};
};

// The cells of the list, or nullptr after "Failed to get Cell Array\n" when
// the record held no list.
inline const Array* cellsOf(const CellInfoArray& list) {
  const Array* cells = list.array();
  if (!cells) log::write(log::kError, "Failed to get Cell Array\n");
  return cells;
}

inline bool hasText(const Dictionary& cell, std::string_view key, std::string_view expected) {
  const Value* v = cell.find(key);
  const std::string* text = v ? v->asString() : nullptr;
  return text && *text == expected;
}

// Whether the cell is of one of the technologies and of the type.
inline bool cellIs(const Dictionary& cell, std::initializer_list<std::string_view> technologies,
                   std::string_view type) {
  if (!cell.contains(CellMonitorCellRadioAccessTechnology) || !cell.contains(CellMonitorCellType)) return false;
  bool technologyMatches = false;
  for (std::string_view technology : technologies) {
    technologyMatches = technologyMatches || hasText(cell, CellMonitorCellRadioAccessTechnology, technology);
  }
  return technologyMatches && hasText(cell, CellMonitorCellType, type);
}

// The first cell of one of the technologies and of the type, or nullptr.
inline const Dictionary* firstCell(const Array& cells, std::initializer_list<std::string_view> technologies,
                                   std::string_view type) {
  for (const Value& element : cells.elements()) {
    const Dictionary* cell = element.asDictionary();
    if (cell && cellIs(*cell, technologies, type)) return cell;
  }
  return nullptr;
}

inline Text cellValueText(const CellListRow& row, std::int32_t value) {
  if (!row.measured) return decimalText(value);
  const auto level = static_cast<std::int16_t>(value);
  if (level == kCellMonitorNotMeasured) return Text();
  return wholeText(static_cast<std::int64_t>(level) * row.scale, row.unit);
}

// Each row of the table from the cell, in order.
inline void writeCellRows(RowWriter& rows, const Dictionary& cell, std::span<const CellListRow> table) {
  for (const CellListRow& row : table) {
    if (const auto value = CellInfoArray::integerValue(cell, row.cellMonitorKey)) {
      rows.set(row.row, cellValueText(row, *value));
    } else {
      log::write(log::kError, row.failure);
    }
  }
}

// One row dictionary per cell of the technology and type, in list order. A
// row that a value fails to fill is left out; the cell is listed all the same.
inline Array rowsOfCells(const Array& cells, std::string_view technology, std::string_view type,
                         std::span<const CellListRow> table) {
  std::vector<Value> rows;
  for (const Value& element : cells.elements()) {
    const Dictionary* cell = element.asDictionary();
    if (!cell || !cellIs(*cell, {technology}, type)) continue;
    RowWriter row{Dictionary()};
    writeCellRows(row, *cell, table);
    rows.push_back(row.value());
  }
  return Array(std::move(rows));
}

// Sets the rows of the table from the first serving cell of one of the
// technologies; a record without a list or without such a cell changes nothing.
inline void writeServingCellRows(const Base& section, std::span<const std::uint8_t> data,
                                 std::initializer_list<std::string_view> technologies,
                                 std::span<const CellListRow> table) {
  const CellInfoArray list(data);
  const Array* cells = cellsOf(list);
  if (!cells) return;
  const Dictionary* serving = firstCell(*cells, technologies, CellMonitorCellTypeServing);
  if (!serving) return;
  RowWriter rows(section);
  writeCellRows(rows, *serving, table);
}

// Lists the neighbour cells of the technology, one row dictionary each, in
// place of the section's list. The list is emptied first, so a record whose
// list does not parse leaves it empty.
inline void installNeighborRows(const Base& section, std::span<const std::uint8_t> data,
                                std::string_view technology, std::span<const CellListRow> table) {
  const CellInfoArray list(data);
  const SectionList rows(section);
  const Array* cells = cellsOf(list);
  if (!cells) return;
  rows.install(rowsOfCells(*cells, technology, CellMonitorCellTypeNeighbor, table));
}

}  // namespace corvane::cell_list
