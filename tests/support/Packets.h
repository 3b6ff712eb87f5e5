#pragma once

// Log packets for decoder tests, laid out by hand: type byte, 16-bit record
// length, 16-bit code, 8-byte timestamp, then the payload from offset 13.
// Fields are poked in by the tests at the offsets the decoders read.

#include <cstdint>
#include <initializer_list>
#include <span>

#include "platform/Value.h"

namespace corvane::test {

// A packet of `size` bytes in all: the header of `code`, the rest zero.
inline Bytes logPacket(std::uint16_t code, std::size_t size, std::uint8_t type = 0x01) {
  Bytes p(size, 0);
  if (size > 0) p[0] = type;
  const std::size_t recordLength = size > 0 ? size - 1 : 0;
  if (size > 1) p[1] = static_cast<std::uint8_t>(recordLength & 0xFF);
  if (size > 2) p[2] = static_cast<std::uint8_t>(recordLength >> 8);
  if (size > 3) p[3] = static_cast<std::uint8_t>(code & 0xFF);
  if (size > 4) p[4] = static_cast<std::uint8_t>(code >> 8);
  return p;
}

// An extra-code packet: type 0xFF, code n, then the payload bytes.
inline Bytes extraCodePacket(std::uint16_t n, std::span<const std::uint8_t> payload) {
  Bytes p = logPacket(n, 13 + payload.size(), 0xFF);
  std::copy(payload.begin(), payload.end(), p.begin() + 13);
  return p;
}

inline void put16(Bytes& p, std::size_t offset, std::uint16_t v) {
  p.at(offset) = static_cast<std::uint8_t>(v & 0xFF);
  p.at(offset + 1) = static_cast<std::uint8_t>(v >> 8);
}

inline void put32(Bytes& p, std::size_t offset, std::uint32_t v) {
  put16(p, offset, static_cast<std::uint16_t>(v & 0xFFFF));
  put16(p, offset + 2, static_cast<std::uint16_t>(v >> 16));
}

}  // namespace corvane::test
