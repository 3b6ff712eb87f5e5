#include "LogGenerator/logcode/DlfVersionReport.h"

#include <cstring>

namespace corvane {

namespace {

// Field offsets and widths of the record.
constexpr std::size_t kLengthOffset = 0;
constexpr std::size_t kCodeOffset = 2;
constexpr std::size_t kTimestampOffset = 4;
constexpr std::size_t kFirstReportOffset = 12;
constexpr std::size_t kSecondReportOffset = 14;
constexpr std::size_t kVersionOffset = 16, kVersionWidth = 7;
constexpr std::size_t kExecutableOffset = 23, kExecutableWidth = 16;
constexpr std::size_t kBuildDateOffset = 63, kBuildDateWidth = 18;
constexpr std::size_t kTimeOffset = 81;
constexpr std::size_t kTimeZoneOffset = 85;
constexpr std::size_t kDaylightOffset = 87;

void put16(std::uint8_t* out, std::size_t offset, std::uint16_t v) {
  out[offset] = static_cast<std::uint8_t>(v & 0xFF);
  out[offset + 1] = static_cast<std::uint8_t>(v >> 8);
}

void put32(std::uint8_t* out, std::size_t offset, std::uint32_t v) {
  put16(out, offset, static_cast<std::uint16_t>(v & 0xFFFF));
  put16(out, offset + 2, static_cast<std::uint16_t>(v >> 16));
}

// At most width - 1 characters, then NUL; the rest of the field stays zero.
void putText(std::uint8_t* out, std::size_t offset, std::size_t width, const char* text) {
  if (!text) return;
  const std::size_t n = strnlen(text, width - 1);
  std::memcpy(out + offset, text, n);
  out[offset + n] = 0;
}

}  // namespace

int QNVDLFAddVersionReport(std::uint8_t* buffer, std::size_t capacity, std::size_t* bytesWritten,
                           std::uint16_t firstReportNumber, std::uint16_t secondReportNumber,
                           const char* versionText, const char* executableName, const char* buildDateText,
                           const DlfTimeRecord& time) {
  if (bytesWritten) *bytesWritten = 0;
  if (!buffer || capacity < kDlfVersionReportSize) return kDlfBufferTooSmall;

  std::memset(buffer, 0, kDlfVersionReportSize);
  put16(buffer, kLengthOffset, static_cast<std::uint16_t>(kDlfVersionReportSize));
  put16(buffer, kCodeOffset, kDlfVersionReportCode);
  // The 8-byte timestamp at kTimestampOffset stays 0.
  static_assert(kTimestampOffset + 8 == kFirstReportOffset);
  put16(buffer, kFirstReportOffset, firstReportNumber);
  put16(buffer, kSecondReportOffset, secondReportNumber);
  putText(buffer, kVersionOffset, kVersionWidth, versionText);
  putText(buffer, kExecutableOffset, kExecutableWidth, executableName);
  putText(buffer, kBuildDateOffset, kBuildDateWidth, buildDateText);
  put32(buffer, kTimeOffset, time.seconds);
  put16(buffer, kTimeZoneOffset, static_cast<std::uint16_t>(time.timeZoneMinutes));
  put16(buffer, kDaylightOffset, time.daylightSaving);

  if (bytesWritten) *bytesWritten = kDlfVersionReportSize;
  return kDlfOk;
}

}  // namespace corvane
