#include "LogGenerator/logcode/ExtraCodePayloads.h"

#include "platform/Log.h"
#include "platform/PropertyList.h"

namespace corvane {

namespace {

std::optional<Value> parsePayload(std::span<const std::uint8_t> packet) {
  const auto payload = packet.size() > kLogRecordHeaderSize ? packet.subspan(kLogRecordHeaderSize)
                                                            : std::span<const std::uint8_t>{};
  return plist::parse(payload);
}

}  // namespace

LogCode_0xFF0000::LogCode_0xFF0000(std::span<const std::uint8_t> packet) {
  auto parsed = parsePayload(packet);
  if (!parsed || !parsed->isDictionary()) {
    log::printf(log::kError, "SIM File dictionary data could not be constructed");
    throw UnknownDataException();
  }
  dictionary_ = *parsed->asDictionary();
}

Value LogCode_0xFF0000::valueForKey(std::string_view key) const { return dictionary_.get(key); }

CellInfoArray::CellInfoArray(std::span<const std::uint8_t> packet) {
  auto parsed = parsePayload(packet);
  if (!parsed) {
    log::printf(log::kError, "Cell Info Array data could not be constructed");
    return;
  }
  if (const Array* a = parsed->asArray()) array_ = *a;
}

std::optional<std::int32_t> CellInfoArray::integerValue(const Dictionary& cell, std::string_view key) {
  const Value* v = cell.find(key);
  if (!v) return std::nullopt;
  if (const std::int64_t* i = v->asInteger()) return static_cast<std::int32_t>(*i);
  if (const double* r = v->asReal()) {
    if (*r > -2147483649.0 && *r < 2147483648.0) return static_cast<std::int32_t>(*r);
  }
  return std::nullopt;
}

LogCode_0xFF0002::LogCode_0xFF0002(std::span<const std::uint8_t> packet) {
  auto parsed = parsePayload(packet);
  if (parsed) {
    if (const Array* a = parsed->asArray()) array_ = *a;
  }
}

}  // namespace corvane
