#pragma once

// The version report record that opens a DLF binary: 161 bytes, log code
// 0x1FFD, naming the program that wrote the file and when. All multi-byte
// fields are little-endian; every text field is a bounded copy that always
// ends in a NUL, the rest of the field zero.

#include <cstddef>
#include <cstdint>

namespace corvane {

inline constexpr std::size_t kDlfVersionReportSize = 161;
inline constexpr std::uint16_t kDlfVersionReportCode = 0x1FFD;

struct DlfTimeRecord {
  std::uint32_t seconds = 0;            // since 1970-01-01 00:00 UTC
  std::int16_t timeZoneMinutes = 0;     // local offset from GMT
  std::uint8_t daylightSaving = 0;      // 1 when in effect
};

// Result codes of QNVDLFAddVersionReport.
inline constexpr int kDlfOk = 0;
inline constexpr int kDlfBufferTooSmall = 3;

// Writes the record at the start of buffer. Sets bytesWritten to 0, then to 161
// on success; a capacity below 161 gives kDlfBufferTooSmall and writes nothing.
int QNVDLFAddVersionReport(std::uint8_t* buffer, std::size_t capacity, std::size_t* bytesWritten,
                           std::uint16_t firstReportNumber, std::uint16_t secondReportNumber,
                           const char* versionText, const char* executableName, const char* buildDateText,
                           const DlfTimeRecord& time);

}  // namespace corvane
