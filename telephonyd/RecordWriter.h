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

#include "platform/Value.h"

namespace corvane::telephonyd {

// A field of a record layout: `bytes` (1, 2 or 4) little-endian bytes at
// `offset`, of which bits first..last hold the value (all of them by default).
struct RecordField {
  std::size_t offset = 0;
  unsigned bytes = 1;
  unsigned first = 0;
  unsigned last = 8 * bytes - 1;

  // The same field in the list entry that begins `entry` bytes into the record.
  constexpr RecordField at(std::size_t entry) const { return {offset + entry, bytes, first, last}; }
};

class RecordWriter {
 public:
  // A record of `packetSize` bytes in all, header included; the payload starts zeroed.
  // Throws std::length_error when the size leaves no payload or exceeds a record's.
  explicit RecordWriter(std::size_t packetSize);

  // Throws std::out_of_range for a field outside the payload, a value wider
  // than the field or a field wider than its bytes, and std::logic_error for
  // a bit that an earlier field already wrote.
  void put(const RecordField& field, std::uint32_t value);

  // The finished packet: type 0x01, record length, code, timestamp, payload.
  Bytes packet(std::uint16_t code, std::uint64_t timestamp) const;

 private:
  Bytes payload_;
  Bytes written_;  // per payload byte, the bits a field has written
};

}  // namespace corvane::telephonyd
