#pragma once

// Puts the fields of one ordinary log record into place, at the offsets the
// decoders read them from: absolute offsets from the packet's type byte (the
// payload starts at 13), multi-byte values little-endian, bit ranges counted
// from bit 0 of the value's lowest byte.
//
// Every write is checked: a field must lie inside the record and after the
// header, its value must fit its bits, and no bit may be written twice, so
// that two fields of a layout that overlap by mistake fail loudly instead of
// mixing their values.

#include <cstddef>
#include <cstdint>
#include <stdexcept>
#include <string>

#include "LogGenerator/records/Field.h"
#include "platform/Value.h"

namespace corvane::telephonyd {

// A field of a record layout, as the decoders read it.
using RecordField = records::Field;

// A count or identity of the simulated network, for an unsigned field.
// Throws std::logic_error for a negative one.
inline std::uint32_t unsignedOf(int value) {
  if (value < 0) throw std::logic_error(std::to_string(value) + " is written as an unsigned field");
  return static_cast<std::uint32_t>(value);
}

class RecordWriter {
 public:
  // A record of `packetSize` bytes in all, header included; the payload starts zeroed.
  // Throws std::length_error when the size leaves no payload or exceeds a record's.
  explicit RecordWriter(std::size_t packetSize);

  // Throws std::out_of_range for a field outside the payload, a value wider
  // than the field or a field wider than its bytes, and std::logic_error for
  // a bit that an earlier field already wrote.
  void put(const RecordField& field, std::uint32_t value);
  // Puts the raw value that the field's conversion shows as `value` (an RSRP
  // in dBm, say). Throws std::logic_error for a value the conversion cannot
  // show exactly.
  void putValue(const RecordField& field, double value) { put(field, field.conversion.rawFor(value)); }

  // The finished packet: type 0x01, record length, code, timestamp, payload.
  Bytes packet(std::uint16_t code, std::uint64_t timestamp) const;

 private:
  Bytes payload_;
  Bytes written_;  // per payload byte, the bits a field has written
};

}  // namespace corvane::telephonyd
