#pragma once

// A field that the baseband sends as a two's complement number: its bits are
// sign-extended before its conversion applies, so a byte 0x9C is -100 and a
// 16-bit 0xFC18 is -1000. The conversions of Field.h take their raw value as
// unsigned; a layout names its signed fields with this type instead, and the
// simulator's encoders write negative values through rawFor.
//
// Header-only, like Field.h.

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <stdexcept>
#include <string>

#include "LogGenerator/records/Field.h"

namespace corvane::records {

struct SignedField {
  Field field;

  // The same field in a list entry that begins `entry` bytes into the record.
  constexpr SignedField at(std::size_t entry) const { return {field.at(entry)}; }
  constexpr std::size_t end() const { return field.end(); }
  // The bit that holds the sign.
  constexpr std::uint32_t signBit() const { return 1u << (field.last - field.first); }

  // The field's bits, sign-extended. Bytes beyond the end of the packet read as zero.
  std::int32_t number(const PacketView& packet, std::size_t entry = 0) const { return numberOf(field.raw(packet, entry)); }
  constexpr std::int32_t numberOf(std::uint32_t raw) const {
    return static_cast<std::int32_t>((raw ^ signBit()) - signBit());
  }
  // x × step + origin of the signed number, as the conversion scales it.
  double value(const PacketView& packet, std::size_t entry = 0) const {
    return number(packet, entry) * field.conversion.step + field.conversion.origin;
  }

  // The bits that show as `wanted`: the inverse that encoders use. Throws
  // std::logic_error for a value that is no whole number of steps from the
  // origin or that the field's bits cannot hold.
  std::uint32_t rawFor(double wanted) const {
    const Conversion& c = field.conversion;
    const double x = c.kind == Conversion::Kind::Decimal ? wanted : (wanted - c.origin) / c.step;
    const double lowest = -static_cast<double>(signBit());
    if (x != std::floor(x) || x < lowest || x >= -lowest) {
      throw std::logic_error(std::to_string(wanted) + " is no signed " +
                             std::to_string(field.last - field.first + 1) + "-bit number of " +
                             std::to_string(c.step) + " steps from " + std::to_string(c.origin));
    }
    const std::uint32_t mask = signBit() | (signBit() - 1);
    return static_cast<std::uint32_t>(static_cast<std::int64_t>(x)) & mask;
  }
};

// The field's bits as a two's complement number, shown through the conversion
// (Decimal, Whole or Fixed).
constexpr SignedField signedField(Field field) { return {field}; }

}  // namespace corvane::records
