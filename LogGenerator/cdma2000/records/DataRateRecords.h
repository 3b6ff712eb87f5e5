#pragma once

// The EV-DO byte counters from which the data rates are computed. Each record
// carries a sequence value and counters of packets received or sent at each
// rate; the bit total is the sum of each counter times the bits its rate
// carries. The rate over an interval is the growth of the bit total over the
// growth of the sequence value, 1024 per step, in kbps.

#include <array>
#include <cstdint>

#include "LogGenerator/records/Field.h"

// 0x1192, forward link: at least 241 bytes.
//   13-16    sequence value
//   17-240   56 u32 counters C0..C55
namespace corvane::records::forward_rate {

inline constexpr std::uint16_t kCode = 0x1192;
inline constexpr std::size_t kMinimumSize = 241;
inline constexpr Field kSequence = le32(13);
inline constexpr std::size_t kFirstCounter = 17;
inline constexpr std::array<std::uint32_t, 56> kBitsPerCount{
    128, 256, 512,  1024, 0,    128, 256,  512,  1024, 0, 128,  256, 512,  1024, 0,    128,  256,  512,  1024,
    0,   128, 256,  512,  1024, 0,   512,  1024, 2048, 0, 128,  256, 512,  1024, 0,    512,  1024, 2048, 0,
    1024, 3072, 0,  512,  1024, 2048, 0,  4096, 0,    1024, 3072, 0, 4096, 0,  5120, 0,    5120, 0,
};
constexpr Field counter(std::size_t i) { return le32(kFirstCounter + 4 * i); }

}  // namespace corvane::records::forward_rate

// 0x127e, reverse link: at least 1750 bytes.
//   14-17    sequence value
//   18-      six blocks of 288 bytes, each of twelve 24-byte rate entries;
//            of an entry, its first four u32 counters (bytes 0-15) count.
namespace corvane::records::reverse_rate {

inline constexpr std::uint16_t kCode = 0x127e;
inline constexpr std::size_t kMinimumSize = 1750;
inline constexpr Field kSequence = le32(14);
inline constexpr std::size_t kFirstBlock = 18;
inline constexpr std::size_t kBlocks = 6;
inline constexpr std::size_t kBlockSize = 288;
inline constexpr std::size_t kRateEntrySize = 24;
inline constexpr std::size_t kCountersPerEntry = 4;
inline constexpr std::array<std::uint32_t, 12> kBitsPerCount{128,  256,  512,  768,  1024, 1536,
                                                            2048, 3072, 4096, 6144, 8192, 12288};
constexpr Field counter(std::size_t block, std::size_t rate, std::size_t n) {
  return le32(kFirstBlock + kBlockSize * block + kRateEntrySize * rate + 4 * n);
}

}  // namespace corvane::records::reverse_rate
