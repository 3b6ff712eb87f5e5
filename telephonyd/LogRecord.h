#pragma once

// The framing of a log-code packet as the service delivers it:
//
//   offset 0     type: 0x01 ordinary log code, 0xFF extra code
//   offset 1-2   record length, little-endian: the record that starts at
//                offset 1 (this field, code, timestamp and payload), so 12 +
//                the payload's size
//   offset 3-4   log code, little-endian (an extra code's n, not 0xFF0000 + n)
//   offset 5-12  timestamp, little-endian, the baseband's own form: the
//                upper 48 bits count 1.25 ms ticks since 1980-01-06 00:00:00
//                UTC, the lower 16 bits a fraction of a tick
//   offset 13-   payload
//
// Extra codes carry a binary property list as their payload.

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <span>

#include "platform/Value.h"

namespace corvane::telephonyd {

inline constexpr std::uint8_t kLogTypeOrdinary = 0x01;
inline constexpr std::uint8_t kLogTypeExtraCode = 0xFF;
inline constexpr std::size_t kLogRecordHeaderSize = 12;
inline constexpr std::size_t kLogPacketHeaderSize = 1 + kLogRecordHeaderSize;
// The record length is 16 bits wide.
inline constexpr std::size_t kMaximumLogPayloadSize = 0xFFFF - kLogRecordHeaderSize;

// The record timestamp of a moment: the ticks and the fraction of a tick
// (rounded down to 1/65536). Moments before the baseband epoch give 0.
using BasebandMoment = std::chrono::sys_time<std::chrono::microseconds>;
std::uint64_t basebandTimestamp(BasebandMoment moment);
// The moment a record timestamp names, to the microsecond (rounded down).
BasebandMoment basebandMoment(std::uint64_t timestamp);
// The time from one timestamp to a later one, to the microsecond; negative
// when `to` is the earlier.
std::chrono::microseconds basebandInterval(std::uint64_t from, std::uint64_t to);

// Throw std::length_error for a payload beyond kMaximumLogPayloadSize: no
// record can say how long it is.
Bytes encodeLogPacket(std::uint16_t code, std::uint64_t timestamp, std::span<const std::uint8_t> payload);
// The payload is the value as a binary property list (PropertyListError when it cannot be one).
Bytes encodeExtraCodePacket(std::uint16_t n, std::uint64_t timestamp, const Value& propertyList);

}  // namespace corvane::telephonyd
