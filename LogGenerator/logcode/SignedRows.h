#pragma once

// Rows that show a signed field (records/SignedField.h): the same data-driven
// form as the rows of Rows.h,
//
//   constexpr SignedRowField kRows[] = {{"RSSI", layout::kRssi}, ...};
//   writeSignedRows(rows, kRows, packet, entry);

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

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

// Each row of the table, in order, from the packet (in the list entry that
// begins `entry` bytes in).
inline void writeSignedRows(RowWriter& rows, std::span<const SignedRowField> table, const PacketView& packet,
                            std::size_t entry = 0) {
  for (const SignedRowField& row : table) rows.set(row.key, signedFieldText(row.field, packet, entry));
}

}  // namespace corvane
