#include "platform/DiagCommands.h"

#include <algorithm>

namespace corvane::diag {

namespace {

constexpr std::size_t kLogConfigHeaderSize = 8;  // command, three zero bytes, operation
constexpr std::size_t kCodesPerId = 0x1000;

void put32(std::vector<std::uint8_t>& out, std::uint32_t value) {
  for (int i = 0; i < 4; ++i) out.push_back(static_cast<std::uint8_t>(value >> (8 * i)));
}

std::uint32_t get32(std::span<const std::uint8_t> bytes, std::size_t at) {
  std::uint32_t value = 0;
  for (int i = 3; i >= 0; --i) value = value << 8 | bytes[at + static_cast<std::size_t>(i)];
  return value;
}

std::uint16_t get16(std::span<const std::uint8_t> bytes, std::size_t at) {
  return static_cast<std::uint16_t>(bytes[at] | bytes[at + 1] << 8);
}

std::vector<std::uint8_t> logConfigHeader(LogConfigOperation operation) {
  std::vector<std::uint8_t> out{kLogConfigCommand, 0, 0, 0};
  put32(out, static_cast<std::uint32_t>(operation));
  return out;
}

bool knownOperation(std::uint32_t operation) {
  return operation == static_cast<std::uint32_t>(LogConfigOperation::Disable) ||
         operation == static_cast<std::uint32_t>(LogConfigOperation::RetrieveIdRanges) ||
         operation == static_cast<std::uint32_t>(LogConfigOperation::SetMask);
}

}  // namespace

std::vector<std::uint8_t> disableLoggingRequest() { return logConfigHeader(LogConfigOperation::Disable); }

std::vector<std::uint8_t> retrieveIdRangesRequest() { return logConfigHeader(LogConfigOperation::RetrieveIdRanges); }

std::vector<std::uint8_t> setMaskRequest(std::uint32_t equipmentId, std::uint32_t bits,
                                         std::span<const std::uint8_t> mask) {
  std::vector<std::uint8_t> out = logConfigHeader(LogConfigOperation::SetMask);
  put32(out, equipmentId);
  put32(out, bits);
  out.insert(out.end(), mask.begin(), mask.end());
  return out;
}

std::map<std::uint32_t, std::vector<std::uint8_t>> logMasks(const std::set<std::uint32_t>& codes,
                                                             const IdRanges& ranges,
                                                             std::set<std::uint32_t>& outOfRange) {
  std::map<std::uint32_t, std::vector<std::uint8_t>> masks;
  for (std::uint32_t id = 0; id < kEquipmentIds; ++id) {
    // A range beyond the codes an id can have is taken at most that far.
    const std::uint32_t bits = std::min<std::uint32_t>(ranges[id], kCodesPerId);
    if (bits > 0) masks[id].assign((bits + 7) / 8, 0);
  }
  for (std::uint32_t code : codes) {
    const std::uint32_t id = code >> 12;
    const std::uint32_t bit = code & 0xFFF;
    if (id >= kEquipmentIds || bit >= std::min<std::uint32_t>(ranges[id], kCodesPerId)) {
      outOfRange.insert(code);
      continue;
    }
    masks[id][bit / 8] |= static_cast<std::uint8_t>(1u << (bit % 8));
  }
  return masks;
}

std::optional<LogConfigReply> parseLogConfigReply(std::span<const std::uint8_t> frame) {
  if (frame.size() < kLogConfigHeaderSize + 4 || frame[0] != kLogConfigCommand) return std::nullopt;
  const std::uint32_t operation = get32(frame, 4);
  if (!knownOperation(operation)) return std::nullopt;
  LogConfigReply reply;
  reply.operation = static_cast<LogConfigOperation>(operation);
  reply.status = get32(frame, 8);
  if (reply.operation == LogConfigOperation::RetrieveIdRanges && reply.status == 0) {
    if (frame.size() < 12 + 4 * kEquipmentIds) return std::nullopt;
    for (std::size_t id = 0; id < kEquipmentIds; ++id) reply.ranges[id] = get32(frame, 12 + 4 * id);
  }
  return reply;
}

std::optional<LogConfigRequest> parseLogConfigRequest(std::span<const std::uint8_t> frame) {
  if (frame.size() < kLogConfigHeaderSize || frame[0] != kLogConfigCommand) return std::nullopt;
  const std::uint32_t operation = get32(frame, 4);
  if (!knownOperation(operation)) return std::nullopt;
  LogConfigRequest request;
  request.operation = static_cast<LogConfigOperation>(operation);
  if (request.operation == LogConfigOperation::SetMask) {
    if (frame.size() < kLogConfigHeaderSize + 8) return std::nullopt;
    request.equipmentId = get32(frame, 8);
    request.bits = get32(frame, 12);
    const std::size_t maskBytes = (static_cast<std::size_t>(request.bits) + 7) / 8;
    if (frame.size() - 16 < maskBytes) return std::nullopt;
    request.mask.assign(frame.begin() + 16, frame.begin() + 16 + static_cast<std::ptrdiff_t>(maskBytes));
  }
  return request;
}

std::vector<std::uint8_t> logConfigReply(LogConfigOperation operation, std::uint32_t status, const IdRanges* ranges) {
  std::vector<std::uint8_t> out = logConfigHeader(operation);
  put32(out, status);
  if (ranges) {
    for (std::uint32_t bits : *ranges) put32(out, bits);
  }
  return out;
}

std::optional<std::span<const std::uint8_t>> logRecordOfFrame(std::span<const std::uint8_t> frame) {
  if (frame.size() < kLogFrameHeaderSize + kRecordHeaderSize || frame[0] != kLogCommand) return std::nullopt;
  const auto record = frame.subspan(kLogFrameHeaderSize);
  if (get16(frame, 2) != record.size() || get16(record, 0) != record.size()) return std::nullopt;
  return record;
}

std::vector<std::uint8_t> logFrame(std::span<const std::uint8_t> record) {
  std::vector<std::uint8_t> out{kLogCommand, 0, static_cast<std::uint8_t>(record.size() & 0xFF),
                                static_cast<std::uint8_t>(record.size() >> 8)};
  out.insert(out.end(), record.begin(), record.end());
  return out;
}

std::optional<std::span<const std::uint8_t>> unwrapSubscription(std::span<const std::uint8_t> frame) {
  if (frame.size() <= kSubscriptionHeaderSize || frame[0] != kSubscriptionCommand) return std::nullopt;
  return frame.subspan(kSubscriptionHeaderSize);
}

}  // namespace corvane::diag
