#pragma once

// Log records and DLF files built byte by byte, for the tests of the readers
// and of what the service sends.

#include <algorithm>
#include <cstdint>
#include <string_view>
#include <vector>

#include "platform/Value.h"

namespace corvane::test {

inline void appendLittleEndian(Bytes& out, std::uint64_t value, int width) {
  for (int i = 0; i < width; ++i) out.push_back(static_cast<std::uint8_t>(value >> (8 * i)));
}

// [length of the whole record][code][timestamp][payload]
inline Bytes logRecord(std::uint16_t code, std::uint64_t timestamp, const Bytes& payload) {
  Bytes record;
  appendLittleEndian(record, 12 + payload.size(), 2);
  appendLittleEndian(record, code, 2);
  appendLittleEndian(record, timestamp, 8);
  record.insert(record.end(), payload.begin(), payload.end());
  return record;
}

// The packet is sized once and filled: growing a one-byte vector by the record
// makes GCC 12 at -O3 warn of a copy out of bounds that cannot happen.
inline Bytes withType(std::uint8_t type, const Bytes& record) {
  Bytes packet(1 + record.size());
  packet[0] = type;
  std::copy(record.begin(), record.end(), packet.begin() + 1);
  return packet;
}

// The 161-byte version report that opens a DLF as the application writes it.
inline Bytes dlfVersionReport() {
  Bytes report(161, 0);
  report[0] = 161;
  report[2] = 0xFD;
  report[3] = 0x1F;
  report[12] = 1;
  report[14] = 1;
  const std::string_view version = "Corvan";  // "Corvane 0.1.0" cut to 6 characters, then NUL
  for (std::size_t i = 0; i < version.size(); ++i) report[16 + i] = static_cast<std::uint8_t>(version[i]);
  const std::string_view executable = "EXECUTABLE_NAME";
  for (std::size_t i = 0; i < executable.size(); ++i) report[23 + i] = static_cast<std::uint8_t>(executable[i]);
  return report;
}

// A DLF as the application writes it: the version report, then each display
// interval's packets, concatenated, less the first byte of the interval.
inline Bytes dlfOfIntervals(const std::vector<std::vector<Bytes>>& intervals) {
  Bytes dlf = dlfVersionReport();
  for (const auto& packets : intervals) {
    Bytes interval;
    for (const Bytes& packet : packets) interval.insert(interval.end(), packet.begin(), packet.end());
    if (interval.size() >= 2) dlf.insert(dlf.end(), interval.begin() + 1, interval.end());
  }
  return dlf;
}

inline Bytes concatenated(const std::vector<Bytes>& parts) {
  Bytes out;
  for (const Bytes& part : parts) out.insert(out.end(), part.begin(), part.end());
  return out;
}

}  // namespace corvane::test
