#pragma once

// Where the service's packets come from. Today that is the built-in simulator;
// replayed capture files and a live baseband diagnostic port are meant to sit
// behind the same interface.

#include <cstdint>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>

#include "platform/Value.h"

namespace corvane::telephonyd {

// Extra codes are numbered from here (0xFF0000 + n); ordinary log codes are 16-bit.
inline constexpr std::uint32_t kExtraCodeBase = 0xFF0000;

struct SourcePacket {
  // Shared: one packet is queued for every channel that wants it, without copies.
  std::shared_ptr<const Bytes> data;
  // The log code (or extra code) of a log-code packet; none for technologies
  // whose packets are not log records (IFX).
  std::optional<std::uint32_t> code;
};

class PacketSource {
 public:
  virtual ~PacketSource() = default;
  // The LogChannelTechnology value that "GetTechnology" answers.
  virtual std::string_view technology() const = 0;
  virtual SourcePacket nextPacket() = 0;
};

// The packets one channel asked for in its start command: packets without a
// code always; log codes listed under "SetQuendraLogCodes"; extra codes listed
// (less 0xFF0000) under "SetTsExtraCodes". A missing list asks for none.
class PacketFilter {
 public:
  static PacketFilter fromStartCommand(const Dictionary& command);
  bool accepts(const SourcePacket& packet) const;

  const std::set<std::uint32_t>& logCodes() const { return logCodes_; }
  const std::set<std::uint32_t>& extraCodes() const { return extraCodes_; }

 private:
  std::set<std::uint32_t> logCodes_;
  std::set<std::uint32_t> extraCodes_;
};

}  // namespace corvane::telephonyd
