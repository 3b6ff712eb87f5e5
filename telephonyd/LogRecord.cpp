#include "telephonyd/LogRecord.h"

#include <stdexcept>

#include "platform/PropertyList.h"

namespace corvane::telephonyd {

namespace {

void appendLittleEndian(Bytes& out, std::uint64_t value, std::size_t width) {
  for (std::size_t i = 0; i < width; ++i) out.push_back(static_cast<std::uint8_t>(value >> (8 * i)));
}

Bytes encode(std::uint8_t type, std::uint16_t code, std::uint64_t timestamp, std::span<const std::uint8_t> payload) {
  if (payload.size() > kMaximumLogPayloadSize) {
    throw std::length_error("log payload of " + std::to_string(payload.size()) + " bytes does not fit a record");
  }
  Bytes packet;
  packet.reserve(kLogPacketHeaderSize + payload.size());
  packet.push_back(type);
  appendLittleEndian(packet, kLogRecordHeaderSize + payload.size(), 2);
  appendLittleEndian(packet, code, 2);
  appendLittleEndian(packet, timestamp, 8);
  packet.insert(packet.end(), payload.begin(), payload.end());
  return packet;
}

}  // namespace

Bytes encodeLogPacket(std::uint16_t code, std::uint64_t timestamp, std::span<const std::uint8_t> payload) {
  return encode(kLogTypeOrdinary, code, timestamp, payload);
}

Bytes encodeExtraCodePacket(std::uint16_t n, std::uint64_t timestamp, const Value& propertyList) {
  return encode(kLogTypeExtraCode, n, timestamp, plist::serializeOrThrow(propertyList, plist::Format::Binary));
}

}  // namespace corvane::telephonyd
