#include "telephonyd/RecordWriter.h"

#include <stdexcept>
#include <string>

#include "telephonyd/LogRecord.h"

namespace corvane::telephonyd {

RecordWriter::RecordWriter(std::size_t packetSize) {
  if (packetSize <= kLogPacketHeaderSize || packetSize - kLogPacketHeaderSize > kMaximumLogPayloadSize) {
    throw std::length_error("a record of " + std::to_string(packetSize) + " bytes has no room for a payload");
  }
  payload_.assign(packetSize - kLogPacketHeaderSize, 0);
  written_.assign(payload_.size(), 0);
}

void RecordWriter::put(const RecordField& field, std::uint32_t value) {
  const std::string where = "field at offset " + std::to_string(field.offset);
  if (field.bytes != 1 && field.bytes != 2 && field.bytes != 4) {
    throw std::out_of_range(where + " is " + std::to_string(field.bytes) + " bytes wide");
  }
  if (field.first > field.last || field.last >= 8 * field.bytes) {
    throw std::out_of_range(where + ": bits " + std::to_string(field.first) + "-" + std::to_string(field.last) +
                            " do not lie in " + std::to_string(field.bytes) + " bytes");
  }
  if (field.offset < kLogPacketHeaderSize || field.offset + field.bytes > kLogPacketHeaderSize + payload_.size()) {
    throw std::out_of_range(where + " lies outside the payload of a " +
                            std::to_string(kLogPacketHeaderSize + payload_.size()) + "-byte record");
  }
  const unsigned width = field.last - field.first + 1;
  if (width < 32 && value >> width != 0) {
    throw std::out_of_range(where + ": " + std::to_string(value) + " does not fit " + std::to_string(width) + " bits");
  }
  const std::size_t start = field.offset - kLogPacketHeaderSize;
  const std::uint64_t mask = ((std::uint64_t{1} << width) - 1) << field.first;
  const std::uint64_t bits = std::uint64_t{value} << field.first;
  for (unsigned i = 0; i < field.bytes; ++i) {
    if ((written_[start + i] & static_cast<std::uint8_t>(mask >> (8 * i))) != 0) {
      throw std::logic_error(where + " overlaps a field written before");
    }
  }
  for (unsigned i = 0; i < field.bytes; ++i) {
    const auto byteMask = static_cast<std::uint8_t>(mask >> (8 * i));
    written_[start + i] |= byteMask;
    payload_[start + i] |= static_cast<std::uint8_t>(bits >> (8 * i)) & byteMask;
  }
}

Bytes RecordWriter::packet(std::uint16_t code, std::uint64_t timestamp) const {
  return encodeLogPacket(code, timestamp, payload_);
}

}  // namespace corvane::telephonyd
