#pragma once

// Rows that show a signed field (records/SignedField.h): the same data-driven
// form as the rows of Rows.h,
//
//   constexpr SignedRowField kRows[] = {{"RSSI", layout::kRssi}, ...};
//   writeSignedRows<kRows>(rows, packet, entry);

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <string_view>
#include <utility>

#include "LogGenerator/logcode/DisplayText.h"
#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/records/SignedField.h"

namespace corvane {

// What a signed field of a packet shows: "%d" of the number, "%d<unit>" of
// x × step + origin kept to 16 bits signed, or "%4.2f<unit>" of it.
inline Text signedFieldText(const records::SignedField& field, const PacketView& packet, std::size_t entry = 0) {
  using Kind = records::Conversion::Kind;
  const records::Conversion& c = field.field.conversion;
  const std::uint32_t raw = field.field.raw(packet, entry);
  if (c.isNotPresent(raw)) return Text(kNotPresentText);
  const std::int32_t number = field.numberOf(raw);
  switch (c.kind) {
    case Kind::Whole:
      return wholeText(static_cast<std::int16_t>(static_cast<std::int64_t>(number) * static_cast<std::int64_t>(c.step) +
                                                 static_cast<std::int64_t>(c.origin)),
                       c.unit);
    case Kind::Fixed: return fixedText(number * c.step + c.origin, c.unit);
    default: return decimalText(number);
  }
}

// A row that shows one signed field.
struct SignedRowField {
  std::string_view key;
  records::SignedField field;
};

namespace signed_rows_detail {
template <const auto& Table, std::size_t... I>
inline void writeEach(RowWriter& rows, const PacketView& packet, std::size_t entry, std::index_sequence<I...>) {
  (rows.set(Table[I].key, signedFieldText(Table[I].field, packet, entry)), ...);
}
}  // namespace signed_rows_detail

// Each row of a constant table, in order, from the packet (in the list entry
// that begins `entry` bytes in), written out row by row as writeRows<Table>.
template <const auto& Table>
inline void writeSignedRows(RowWriter& rows, const PacketView& packet, std::size_t entry = 0) {
  signed_rows_detail::writeEach<Table>(rows, packet, entry, std::make_index_sequence<std::size(Table)>());
}

}  // namespace corvane
