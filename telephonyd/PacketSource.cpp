#include "telephonyd/PacketSource.h"

#include "platform/Log.h"

namespace corvane::telephonyd {

namespace {

void readCodes(const Dictionary& command, std::string_view key, std::uint32_t limit, std::set<std::uint32_t>& codes) {
  const Value* list = command.find(key);
  if (!list) return;
  const Array* array = list->asArray();
  if (!array) {
    log::printf(log::kError, "Start command: \"%.*s\" is not an array; no such codes are streamed",
                static_cast<int>(key.size()), key.data());
    return;
  }
  for (const Value& entry : array->elements()) {
    const std::int64_t* code = entry.asInteger();
    if (code && *code >= 0 && *code <= limit) {
      codes.insert(static_cast<std::uint32_t>(*code));
    } else {
      log::printf(log::kError, "Start command: ignoring an entry of \"%.*s\" that is not a code",
                  static_cast<int>(key.size()), key.data());
    }
  }
}

}  // namespace

PacketFilter PacketFilter::fromStartCommand(const Dictionary& command) {
  PacketFilter filter;
  readCodes(command, "SetQuendraLogCodes", 0xFFFF, filter.logCodes_);
  readCodes(command, "SetTsExtraCodes", 0xFFFF, filter.extraCodes_);
  return filter;
}

bool PacketFilter::accepts(const SourcePacket& packet) const {
  if (!packet.code) return true;
  const std::uint32_t code = *packet.code;
  if (code >= kExtraCodeBase) return extraCodes_.count(code - kExtraCodeBase) != 0;
  return logCodes_.count(code) != 0;
}

}  // namespace corvane::telephonyd
