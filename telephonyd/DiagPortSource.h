#pragma once

// A live baseband's diagnostic port as the service's packet source: a USB
// serial tty (put in raw mode) or a WWAN diagnostic character device, framed
// as platform/DiagFrames.h says, speaking the commands of DiagCommands.h.
//
// The log codes the channels want become the baseband's log mask: the port's
// id ranges are asked for first, then each equipment id's mask is set, never
// with a bit beyond its range; when no channel wants anything any more, and
// when the source goes away, logging is switched off again, so the modem is
// left as it was found. Every log record that arrives (also inside a second
// subscription's frames) becomes a packet of type 1.
//
// The port may vanish at any time (a USB reset, a modem reboot): that is said
// once, the channels stay open, and the device is tried again every second;
// when it is back the id ranges and the mask are set again. The device is
// locked (flock) while open, so two services never read one port. Frames with
// a bad CRC, bytes between frames, oversize frames, frames not understood and
// replies that never come (after kReplyTimeout) are counted, and logged at most
// once per kReportEvery; none of them is fatal.

#include <chrono>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "platform/DiagFrames.h"
#include "platform/RunLoop.h"
#include "platform/DiagCommands.h"
#include "telephonyd/PacketSource.h"

namespace corvane::telephonyd {

class DiagPortSource final : public PacketSource {
 public:
  static constexpr std::chrono::seconds kReplyTimeout{1};
  static constexpr std::chrono::seconds kReopenEvery{1};
  static constexpr std::chrono::seconds kReportEvery{60};

  // What went wrong on the port, in all.
  struct Counts {
    std::uint64_t records = 0;           // log records handed on
    std::uint64_t badCrc = 0;
    std::uint64_t strayBytes = 0;        // before, between or after frames
    std::uint64_t oversized = 0;
    std::uint64_t notUnderstood = 0;     // other commands, malformed frames, unknown subscriptions' contents
    std::uint64_t unansweredRequests = 0;
    std::uint64_t refusedRequests = 0;   // replies with a status other than 0
    std::uint64_t vanished = 0;          // times the port went away
  };

  // Opens and locks the device; nothing, with a one-line reason, when it
  // cannot be opened or another program holds it. The run loop must outlive
  // the source.
  static std::unique_ptr<DiagPortSource> open(RunLoop& loop, std::string device, std::string technology,
                                              std::string& error);
  ~DiagPortSource() override;
  DiagPortSource(const DiagPortSource&) = delete;
  DiagPortSource& operator=(const DiagPortSource&) = delete;

  std::string_view technology() const override { return technology_; }
  Availability availability() override;
  SourcePacket nextPacket() override;
  bool isLive() const override { return true; }
  void setArrivalHandler(std::function<void()> arrived) override { arrived_ = std::move(arrived); }
  void setWantedCodes(const std::set<std::uint32_t>& logCodes) override;

  bool deviceOpen() const { return fd_ >= 0; }
  // The port has told the number of mask bits of its equipment ids.
  bool rangesKnown() const { return ranges_.has_value(); }
  const Counts& counts() const { return counts_; }
  // The masks last set, by equipment id (empty while logging is off).
  const std::map<std::uint32_t, std::vector<std::uint8_t>>& masks() const { return sentMasks_; }

 private:
  DiagPortSource(RunLoop& loop, std::string device, std::string technology);
  bool openDevice(std::string& error);
  void closeDevice();
  void deviceGone(const std::string& reason);
  void tryReopen();
  void onReadable();
  void onFrame(std::span<const std::uint8_t> frame);
  void takeRecord(std::span<const std::uint8_t> record);
  void onReply(const diag::LogConfigReply& reply);
  void applyMask();
  void queueRequest(std::vector<std::uint8_t> request);
  void sendNextRequest();
  // False when the port has gone (noticed, unless told not to).
  bool writeFrame(std::span<const std::uint8_t> payload, bool noticeGone = true);
  void report();

  RunLoop& loop_;
  std::string device_;
  std::string technology_;
  int fd_ = -1;
  RunLoop::Handle watch_ = 0;
  RunLoop::Handle reopenTimer_ = 0;
  RunLoop::Handle reportTimer_ = 0;
  RunLoop::Handle replyDeadline_ = 0;
  diag::Deframer deframer_;
  std::vector<std::uint8_t> readBuffer_;
  std::vector<std::uint8_t> writeBuffer_;

  std::set<std::uint32_t> wanted_;
  std::optional<diag::IdRanges> ranges_;
  std::map<std::uint32_t, std::vector<std::uint8_t>> sentMasks_;
  bool loggingOn_ = false;
  std::set<std::uint32_t> reportedOutOfRange_;
  std::deque<std::vector<std::uint8_t>> requests_;
  std::optional<diag::LogConfigOperation> awaiting_;

  std::deque<SourcePacket> packets_;
  std::function<void()> arrived_;
  Counts counts_;
  Counts reported_;
  diag::FrameCounts deframed_;  // of the deframers of earlier openings
  std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace corvane::telephonyd
