#include "telephonyd/LogRecord.h"

#include <stdexcept>

#include "platform/PropertyList.h"

namespace corvane::telephonyd {

namespace {

using namespace std::chrono;

// 1980-01-06 00:00:00 UTC, where the baseband's clock starts.
constexpr sys_days kBasebandEpoch{year{1980} / January / 6};
// The unit of the upper 48 bits of a timestamp: 1.25 ms.
using Ticks = duration<std::int64_t, std::ratio<1, 800>>;
constexpr std::int64_t kMicrosecondsPerTick = duration_cast<microseconds>(Ticks{1}).count();
static_assert(kMicrosecondsPerTick == 1250);
constexpr int kFractionBits = 16;

// Microseconds since the epoch that a timestamp names, exactly as far as a
// microsecond goes.
std::int64_t microsecondsSinceEpoch(std::uint64_t timestamp) {
  const auto ticks = static_cast<std::int64_t>(timestamp >> kFractionBits);
  const auto fraction = static_cast<std::int64_t>(timestamp & ((1u << kFractionBits) - 1));
  return ticks * kMicrosecondsPerTick + (fraction * kMicrosecondsPerTick >> kFractionBits);
}

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

std::uint64_t basebandTimestamp(BasebandMoment moment) {
  const std::int64_t since = (moment - kBasebandEpoch).count();
  if (since <= 0) return 0;
  const auto ticks = static_cast<std::uint64_t>(since / kMicrosecondsPerTick);
  const auto rest = static_cast<std::uint64_t>(since % kMicrosecondsPerTick);
  // The fraction rounded up, so that reading it back rounds down to the same microsecond.
  const std::uint64_t fraction = ((rest << kFractionBits) + kMicrosecondsPerTick - 1) / kMicrosecondsPerTick;
  return ticks << kFractionBits | fraction;
}

BasebandMoment basebandMoment(std::uint64_t timestamp) {
  return BasebandMoment(kBasebandEpoch) + microseconds(microsecondsSinceEpoch(timestamp));
}

microseconds basebandInterval(std::uint64_t from, std::uint64_t to) {
  return microseconds(microsecondsSinceEpoch(to) - microsecondsSinceEpoch(from));
}

Bytes encodeLogPacket(std::uint16_t code, std::uint64_t timestamp, std::span<const std::uint8_t> payload) {
  return encode(kLogTypeOrdinary, code, timestamp, payload);
}

Bytes encodeExtraCodePacket(std::uint16_t n, std::uint64_t timestamp, const Value& propertyList) {
  return encode(kLogTypeExtraCode, n, timestamp, plist::serializeOrThrow(propertyList, plist::Format::Binary));
}

}  // namespace corvane::telephonyd
