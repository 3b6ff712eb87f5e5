#pragma once

// Where the service's packets come from: the built-in simulator, a replayed
// capture file, or a live baseband's diagnostic port.

#include <chrono>
#include <cstdint>
#include <functional>
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
  // Sources that keep their own time (PacketSource::keepsTime): when the
  // packet is due, counted from the source's first packet.
  std::chrono::nanoseconds due{0};
};

class PacketSource {
 public:
  virtual ~PacketSource() = default;
  // The LogChannelTechnology value that "GetTechnology" answers.
  virtual std::string_view technology() const = 0;

  enum class Availability {
    Ready,  // nextPacket() has one now
    Later,  // none yet (a capture's reader is behind): ask again soon
    Ended,  // none ever again (a capture played to its end)
  };
  // The simulators are always ready.
  virtual Availability availability() { return Availability::Ready; }
  // Only while available() is Ready.
  virtual SourcePacket nextPacket() = 0;

  // True when the packets say when they are due (SourcePacket::due), as a
  // replayed capture's timestamps do; otherwise the service paces them at its
  // rate.
  virtual bool keepsTime() const { return false; }

  // A live source (a baseband's diagnostic port) has packets when they come:
  // it calls the handler on the run loop whenever new ones are ready, and the
  // service takes them at once. Other sources never call it.
  virtual bool isLive() const { return false; }
  virtual void setArrivalHandler(std::function<void()> /*arrived*/) {}
  // The log codes that the streaming channels ask for, all together, each time
  // that changes; a live source asks its baseband for just those.
  virtual void setWantedCodes(const std::set<std::uint32_t>& /*logCodes*/) {}
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
