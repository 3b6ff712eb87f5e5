#pragma once

// The framing of a baseband's diagnostic port. Each frame ends with a 0x7E
// flag; inside a frame 0x7D escapes the next byte, which is sent XOR 0x20
// (0x7D 0x5E is 0x7E, 0x7D 0x5D is 0x7D). The last two bytes of the unescaped
// frame are a CRC-16/X.25 (reflected polynomial 0x8408, initial value 0xFFFF,
// final XOR 0xFFFF), little-endian, over the bytes before them.
//
// The deframer takes a stream in pieces of any size and hands over each whole
// frame, unescaped and without its CRC, in a buffer of its own that it reuses:
// no allocation per frame. What is not a good frame is counted, never fatal,
// and reading resynchronises at the next flag:
//   - bytes before the first flag that are no good frame (a capture that
//     began in the middle of one);
//   - empty frames (two flags in a row: many ports send a flag before each
//     frame too);
//   - frames too short to hold a CRC, frames whose CRC is wrong, frames with
//     an escape right before the flag, frames longer than the largest frame;
//   - bytes after the last flag, cut off by the end of the stream.
// Frames whose CRC is wrong may be kept instead (handed over as such).

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <span>
#include <vector>

namespace corvane::diag {

inline constexpr std::uint8_t kFlag = 0x7E;
inline constexpr std::uint8_t kEscape = 0x7D;
inline constexpr std::uint8_t kEscapeXor = 0x20;
// Unescaped, CRC included: a log record of 65535 bytes behind its 4-byte
// command header, with room to spare.
inline constexpr std::size_t kLargestFrame = 70000;

// CRC-16/X.25 of the bytes.
std::uint16_t crc16(std::span<const std::uint8_t> bytes);

// Appends the frame of `payload`: the payload and its CRC, escaped, then the flag.
void appendFrame(std::vector<std::uint8_t>& out, std::span<const std::uint8_t> payload);

// What the deframer met besides good frames.
struct FrameCounts {
  std::uint64_t frames = 0;          // good frames handed over
  std::uint64_t badCrc = 0;          // frames whose CRC is wrong (handed over too when kept)
  std::uint64_t empty = 0;           // two flags in a row
  std::uint64_t tooShort = 0;        // one or two bytes: no room for a CRC
  std::uint64_t badEscape = 0;       // an escape byte right before the flag
  std::uint64_t oversized = 0;       // longer than the largest frame
  std::uint64_t leadingBytes = 0;    // bytes before the first flag that are no good frame
  std::uint64_t trailingBytes = 0;   // bytes after the last flag
  std::uint64_t skipped() const { return badCrc + tooShort + badEscape + oversized; }
};

class Deframer {
 public:
  // A frame as handed over: its unescaped bytes without the CRC, valid until
  // the next call; `crcGood` is false only for frames kept despite their CRC.
  struct Frame {
    std::span<std::uint8_t> bytes;
    bool crcGood;
  };

  explicit Deframer(bool keepBadCrc = false, std::size_t largestFrame = kLargestFrame);

  // Takes the next piece of the stream; calls onFrame(Frame) for every frame
  // the piece completes, in order.
  template <class OnFrame>
  void feed(std::span<const std::uint8_t> bytes, OnFrame&& onFrame);

  // The stream has ended: whatever follows the last flag is counted as cut off.
  void finish();

  const FrameCounts& counts() const { return counts_; }

 private:
  // Ends the frame collected so far; true when it is to be handed over.
  bool endFrame();

  std::vector<std::uint8_t> frame_;
  std::size_t size_ = 0;
  bool escaped_ = false;
  bool overflowed_ = false;
  bool sawFlag_ = false;
  bool lastCrcGood_ = true;
  bool keepBadCrc_;
  std::size_t largest_;
  FrameCounts counts_;
};

namespace detail {

// The first flag or escape byte in [p, end), or end: eight bytes at a time.
inline const std::uint8_t* findFlagOrEscape(const std::uint8_t* p, const std::uint8_t* end) {
  constexpr std::uint64_t kOnes = 0x0101010101010101ULL;
  constexpr std::uint64_t kHighs = 0x8080808080808080ULL;
  // True when some byte of v is zero.
  auto anyZeroByte = [](std::uint64_t v) { return ((v - kOnes) & ~v & kHighs) != 0; };
  while (end - p >= 8) {
    std::uint64_t word;
    std::memcpy(&word, p, 8);
    if (anyZeroByte(word ^ (kOnes * kFlag)) || anyZeroByte(word ^ (kOnes * kEscape))) break;
    p += 8;
  }
  while (p < end && *p != kFlag && *p != kEscape) ++p;
  return p;
}

}  // namespace detail

template <class OnFrame>
void Deframer::feed(std::span<const std::uint8_t> bytes, OnFrame&& onFrame) {
  const std::uint8_t* p = bytes.data();
  const std::uint8_t* const end = p + bytes.size();
  std::uint8_t* const buffer = frame_.data();
  while (p < end) {
    // The bytes of the frame up to the next flag or escape, copied in one run.
    const std::uint8_t* run = p;
    p = detail::findFlagOrEscape(p, end);
    if (p > run) {
      std::size_t n = static_cast<std::size_t>(p - run);
      if (escaped_) {
        // The byte after an escape; the escape itself was not copied.
        if (size_ < largest_) buffer[size_++] = static_cast<std::uint8_t>(*run ^ kEscapeXor);
        else overflowed_ = true;
        escaped_ = false;
        ++run;
        --n;
      }
      const std::size_t room = largest_ - size_;
      if (n > room) {
        overflowed_ = true;
        n = room;
      }
      if (n > 0) std::memcpy(buffer + size_, run, n);
      size_ += n;
    }
    if (p == end) break;
    if (*p == kEscape) {
      if (escaped_) {
        // An escaped escape byte sent unescaped: taken as its XOR, as any.
        if (size_ < largest_) buffer[size_++] = static_cast<std::uint8_t>(kEscape ^ kEscapeXor);
        else overflowed_ = true;
        escaped_ = false;
      } else {
        escaped_ = true;
      }
      ++p;
      continue;
    }
    // The flag.
    ++p;
    if (endFrame()) onFrame(Frame{std::span<std::uint8_t>(buffer, size_ - 2), lastCrcGood_});
    size_ = 0;
    escaped_ = false;
    overflowed_ = false;
  }
}

}  // namespace corvane::diag
