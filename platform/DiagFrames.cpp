#include "platform/DiagFrames.h"

#include <generic_crc.h>

namespace corvane::diag {

namespace {

// crcutil works on reflected polynomials; "canonical" inverts the CRC before
// and after, which is X.25's initial value and final XOR of 0xFFFF.
using Crc16 = crcutil::GenericCrc<crcutil::uint64, crcutil::uint64, crcutil::uint64, 4>;
constexpr std::uint64_t kReflectedPolynomial = 0x8408;

const Crc16& crcTables() {
  static const Crc16 tables(kReflectedPolynomial, 16, true);
  return tables;
}

void appendEscaped(std::vector<std::uint8_t>& out, std::uint8_t byte) {
  if (byte == kFlag || byte == kEscape) {
    out.push_back(kEscape);
    out.push_back(static_cast<std::uint8_t>(byte ^ kEscapeXor));
  } else {
    out.push_back(byte);
  }
}

}  // namespace

std::uint16_t crc16(std::span<const std::uint8_t> bytes) {
  return static_cast<std::uint16_t>(crcTables().CrcDefault(bytes.data(), bytes.size(), 0));
}

void appendFrame(std::vector<std::uint8_t>& out, std::span<const std::uint8_t> payload) {
  for (std::uint8_t byte : payload) appendEscaped(out, byte);
  const std::uint16_t crc = crc16(payload);
  appendEscaped(out, static_cast<std::uint8_t>(crc & 0xFF));
  appendEscaped(out, static_cast<std::uint8_t>(crc >> 8));
  out.push_back(kFlag);
}

Deframer::Deframer(bool keepBadCrc, std::size_t largestFrame)
    : frame_(largestFrame), keepBadCrc_(keepBadCrc), largest_(largestFrame) {}

bool Deframer::endFrame() {
  const bool first = !sawFlag_;
  sawFlag_ = true;
  if (size_ == 0 && !escaped_ && !overflowed_) {
    if (!first) ++counts_.empty;
    return false;
  }
  // Bytes before the first flag are a frame only when they are a good one:
  // anything else is where the capture began.
  auto skip = [&](std::uint64_t& count) {
    if (first) counts_.leadingBytes += size_;
    else ++count;
    return false;
  };
  if (overflowed_) return skip(counts_.oversized);
  if (escaped_) return skip(counts_.badEscape);
  if (size_ < 3) return skip(counts_.tooShort);
  const std::uint16_t sent = static_cast<std::uint16_t>(frame_[size_ - 2] | frame_[size_ - 1] << 8);
  lastCrcGood_ = crc16(std::span<const std::uint8_t>(frame_.data(), size_ - 2)) == sent;
  if (!lastCrcGood_) {
    if (first) return skip(counts_.badCrc);
    ++counts_.badCrc;
    return keepBadCrc_;
  }
  ++counts_.frames;
  return true;
}

void Deframer::finish() {
  if (size_ > 0 || escaped_ || overflowed_) {
    if (sawFlag_) counts_.trailingBytes += size_ + (escaped_ ? 1 : 0);
    else counts_.leadingBytes += size_ + (escaped_ ? 1 : 0);
  }
  size_ = 0;
  escaped_ = false;
  overflowed_ = false;
}

}  // namespace corvane::diag
