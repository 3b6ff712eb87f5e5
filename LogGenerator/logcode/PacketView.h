#pragma once

// The reader every section decodes its packet with: fields at absolute offsets
// from the first byte of the packet, little-endian, and bit ranges of them.
//
// No read passes the end of the packet. The one rule for fields that lie wholly
// or partly beyond the end: those bytes read as zero. A section that needs to
// know can ask covers(offset, width) first.

#include <cstddef>
#include <cstdint>
#include <span>

namespace corvane {

class PacketView {
 public:
  PacketView() = default;
  explicit PacketView(std::span<const std::uint8_t> bytes) : bytes_(bytes) {}

  std::size_t size() const { return bytes_.size(); }
  std::span<const std::uint8_t> bytes() const { return bytes_; }

  // True when the width bytes at offset all lie inside the packet.
  bool covers(std::size_t offset, std::size_t width) const {
    return offset <= bytes_.size() && width <= bytes_.size() - offset;
  }

  std::uint8_t u8(std::size_t offset) const { return offset < bytes_.size() ? bytes_[offset] : 0; }
  // A field that starts at or past the end is zero (this also keeps offset
  // arithmetic near the top of the range from wrapping back into the packet).
  std::uint16_t le16(std::size_t offset) const {
    if (offset >= bytes_.size()) return 0;
    return static_cast<std::uint16_t>(u8(offset) | (u8(offset + 1) << 8));
  }
  std::uint32_t le32(std::size_t offset) const {
    if (offset >= bytes_.size()) return 0;
    if (bytes_.size() - offset >= 4) {
      // Wholly inside: one load.
      const std::uint8_t* p = bytes_.data() + offset;
      return static_cast<std::uint32_t>(p[0]) | static_cast<std::uint32_t>(p[1]) << 8 |
             static_cast<std::uint32_t>(p[2]) << 16 | static_cast<std::uint32_t>(p[3]) << 24;
    }
    return static_cast<std::uint32_t>(le16(offset)) | (static_cast<std::uint32_t>(le16(offset + 2)) << 16);
  }
  std::uint64_t le64(std::size_t offset) const {
    if (offset >= bytes_.size()) return 0;
    return static_cast<std::uint64_t>(le32(offset)) | (static_cast<std::uint64_t>(le32(offset + 4)) << 32);
  }

  // Bits first..last (inclusive, bit 0 the lowest) of a value.
  static constexpr std::uint32_t bits(std::uint32_t value, unsigned first, unsigned last) {
    const unsigned width = last - first + 1;
    const std::uint32_t mask = width >= 32 ? 0xFFFFFFFFu : ((1u << width) - 1u);
    return (value >> first) & mask;
  }
  // Bits first..last of the byte, 16-bit or 32-bit value at offset.
  std::uint32_t bits8(std::size_t offset, unsigned first, unsigned last) const { return bits(u8(offset), first, last); }
  std::uint32_t bits16(std::size_t offset, unsigned first, unsigned last) const {
    return bits(le16(offset), first, last);
  }
  std::uint32_t bits32(std::size_t offset, unsigned first, unsigned last) const {
    return bits(le32(offset), first, last);
  }

 private:
  std::span<const std::uint8_t> bytes_;
};

}  // namespace corvane
