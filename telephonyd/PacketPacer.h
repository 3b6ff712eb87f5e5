#pragma once

// Hands over the packets of a source that keeps its own time when they fall
// due on the run loop's clock: the first packet at once, each later one when
// its due time (SourcePacket::due) has passed since the first's. A pause takes
// nothing more from the source; a resume goes on at the same pace from the
// packet that was next, without making up for the pause. A loop that was held
// up (a suspended process) does not flood its clients: once more than
// kLongestLag behind, the pace starts afresh at the packet that is due.

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>

#include "platform/RunLoop.h"
#include "telephonyd/PacketSource.h"

namespace corvane::telephonyd {

class PacketPacer {
 public:
  // A source that has nothing yet is asked again after this.
  static constexpr std::chrono::milliseconds kRetry{2};
  static constexpr std::chrono::seconds kLongestLag{1};
  // Most packets handed over in one turn of the run loop.
  static constexpr std::uint64_t kMostPerTurn = 10000;

  using Deliver = std::function<void(const SourcePacket&)>;
  // After each turn that handed something over.
  using TurnDone = std::function<void()>;

  // The run loop and the source must outlive the pacer.
  PacketPacer(RunLoop& loop, PacketSource& source, Deliver deliver, TurnDone turnDone);
  ~PacketPacer();
  PacketPacer(const PacketPacer&) = delete;
  PacketPacer& operator=(const PacketPacer&) = delete;

  // Starts, or goes on after a pause; nothing once the source has ended.
  void resume();
  void pause();

  bool running() const { return running_; }
  // The source said it has no more packets.
  bool ended() const { return ended_; }
  std::uint64_t delivered() const { return delivered_; }

 private:
  void turn();
  void schedule(RunLoop::Duration delay);

  RunLoop& loop_;
  PacketSource& source_;
  Deliver deliver_;
  TurnDone turnDone_;
  bool running_ = false;
  bool ended_ = false;
  bool rebase_ = true;  // the next packet is due at once, and the pace counts from it
  RunLoop::Duration base_{};  // the run loop's time of due 0
  std::optional<SourcePacket> ahead_;
  RunLoop::Handle timer_ = 0;
  std::uint64_t delivered_ = 0;
  std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace corvane::telephonyd
