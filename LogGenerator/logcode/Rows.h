#pragma once

// How sections write their rows: a dictionary of rows for a section that shows
// key/value rows, an array of row dictionaries for a list. Most rows are one
// field of the packet shown through its conversion, listed as data:
//
//   constexpr RowField kRows[] = {{"Version", layout::kVersion}, ...};
//   writeRows<kRows>(rows, packet);
//
// and a list's row shape is made from the same table, so a key is typed once.
//
// The one rule for list entries that a packet's count places past its end
// (docs/architecture.md): a list stops at its last entry that lies wholly
// inside the packet. An entry the packet does not hold is not shown at all,
// rather than shown with zeros as if the baseband had measured them.

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <optional>
#include <span>
#include <string_view>
#include <utility>
#include <vector>

#include "LogGenerator/logcode/Base.h"
#include "LogGenerator/logcode/DisplayText.h"

namespace corvane {

// A row that shows one field.
struct RowField {
  std::string_view key;
  records::Field field;
};

// Writes the rows of one dictionary for the length of one packet: a section's
// container, looked up once (without one, before the first display build, the
// rows go nowhere), or a list's new row. Rows are written in the order the
// dictionary holds them, so each is first looked for right behind the one
// before.
class RowWriter {
 public:
  explicit RowWriter(const Base& section) : rows_(section.sectionDictionary()) {}
  explicit RowWriter(Dictionary rows) : rows_(std::move(rows)) {}
  void set(std::string_view key, std::string_view text) {
    if (rows_) rows_->setString(key, text, next_);
  }
  void remove(std::string_view key) const {
    if (rows_) rows_->remove(key);
  }
  // The dictionary written, for a list's row.
  Value value() const { return rows_ ? Value(*rows_) : Value(); }

 private:
  std::optional<Dictionary> rows_;
  std::size_t next_ = 0;
};

// Each row of the table, in order, from the packet (in the list entry that
// begins `entry` bytes in).
inline void writeRows(RowWriter& rows, std::span<const RowField> table, const PacketView& packet,
                      std::size_t entry = 0) {
  for (const RowField& row : table) rows.set(row.key, fieldText(row.field, packet, entry));
}

namespace rows_detail {
template <const auto& Table, std::size_t... I>
inline void writeEach(RowWriter& rows, const PacketView& packet, std::size_t entry, std::index_sequence<I...>) {
  (rows.set(Table[I].key, fieldText(Table[I].field, packet, entry)), ...);
}
}  // namespace rows_detail

// The same for a constant table, written out row by row at compile time:
// each row's conversion is known there, so a row costs its read and its text
// and nothing to choose them. The form for the tables of the sections.
//
//   writeRows<kRows>(rows, packet);
template <const auto& Table>
inline void writeRows(RowWriter& rows, const PacketView& packet, std::size_t entry = 0) {
  rows_detail::writeEach<Table>(rows, packet, entry, std::make_index_sequence<std::size(Table)>());
}

// The keys of a list's rows, in the order they are written. A new row is a
// copy of a prototype that holds them already, so filling it never searches.
class RowShape {
 public:
  RowShape(std::initializer_list<std::string_view> keys) {
    for (std::string_view key : keys) add(key);
  }
  explicit RowShape(std::span<const RowField> table) {
    for (const RowField& row : table) add(row.key);
  }
  RowWriter makeRow() const { return RowWriter(prototype_.shallowCopy()); }

 private:
  // An empty string, which the row's text is then written into.
  void add(std::string_view key) { prototype_.set(key, Value(std::string())); }

  Dictionary prototype_;
};

// True when the entry's bytes all lie inside the packet.
inline bool entryInside(const PacketView& packet, std::size_t offset, std::size_t width) {
  return packet.covers(offset, width);
}

// One row per entry of a list of fixed-size entries, made by makeRow(offset of
// the entry), in order; the rows stop at the first entry not wholly inside the
// packet. The index is 8 bits wide, as the counts are.
template <class MakeRow>
Array rowsOfEntries(const PacketView& packet, const BoundedList& entries, std::size_t entrySize, MakeRow makeRow) {
  std::vector<Value> rows;
  rows.reserve(entries.count());
  for (std::uint8_t i = 0; i < entries.count(); ++i) {
    const std::size_t entry = entries.entryOffset(i);
    if (!entryInside(packet, entry, entrySize)) break;
    rows.push_back(makeRow(entry));
  }
  return Array(std::move(rows));
}

// The row array of a list section for the length of one packet. Made, it
// empties the list; install() puts the new rows in whole. Without a container
// (before the first display build) both go nowhere.
class SectionList {
 public:
  explicit SectionList(const Base& section) : list_(section.sectionArray()) {
    if (list_) Base::clearElementsInArray(*list_);
  }
  void install(const Array& rows) const {
    if (list_) Base::replaceArray(*list_, rows);
  }

 private:
  std::optional<Array> list_;
};

}  // namespace corvane
