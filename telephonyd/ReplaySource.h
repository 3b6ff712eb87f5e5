#pragma once

// A capture file played back as the service's packets: a DLF, a framed
// diagnostic stream, hex lines or a snapshot, read by corvane-decode's readers
// (tools/CaptureReader.h) on a thread of its own, in constant memory.
//
// Pacing follows the records' timestamps (LogRecord.h), divided by the speed:
// each packet is due as long after the one before it as its timestamp is
// later. A timestamp that goes backwards, or jumps more than kLongestGap ahead,
// is not waited for: its packet follows at once. Packets without a timestamp
// (the property-list reports of IFX) follow one another at the interval given.
// At full speed nothing waits. Played in a loop, the capture starts again at
// once after its last packet; played once, the source ends there.
//
// The technology is the one given, else the one whose decoders read most of
// the log codes among the capture's first packets (property-list reports are
// IFX's); a capture that does not tell is an error that says which option to
// give.

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "telephonyd/PacketSource.h"

namespace corvane::telephonyd {

class ReplaySource final : public PacketSource {
 public:
  static constexpr std::chrono::seconds kLongestGap{10};
  // Packets looked at to tell the technology of a capture.
  static constexpr std::uint64_t kPacketsToTellTechnology = 20000;

  struct Settings {
    std::string path;
    std::string technology;  // empty: told by the capture
    double speed = 1.0;      // 0: as fast as the clients take them
    bool loop = false;
    // Between packets without a timestamp.
    std::chrono::nanoseconds untimedInterval = std::chrono::milliseconds(500);
  };

  // Nothing, with a one-line reason in `error`, when the file cannot be read
  // or its technology cannot be told.
  static std::unique_ptr<ReplaySource> open(Settings settings, std::string& error);
  ~ReplaySource() override;
  ReplaySource(const ReplaySource&) = delete;
  ReplaySource& operator=(const ReplaySource&) = delete;

  std::string_view technology() const override { return settings_.technology; }
  Availability availability() override;
  SourcePacket nextPacket() override;
  bool keepsTime() const override { return settings_.speed > 0; }

  // Packets handed out so far, over all rounds of a loop.
  std::uint64_t packetsPlayed() const { return played_; }

 private:
  struct Queued {
    std::shared_ptr<const Bytes> data;
    std::optional<std::uint32_t> code;
    std::optional<std::uint64_t> timestamp;
    bool firstOfRound = false;
  };

  explicit ReplaySource(Settings settings);
  void readerMain();
  // The reader's side: blocks while the queue is full; false once told to stop.
  bool hand(std::vector<Queued>& batch);

  Settings settings_;

  std::mutex mutex_;
  std::condition_variable space_;
  std::deque<Queued> shared_;  // from the reader, under mutex_
  bool readerDone_ = false;    // under mutex_
  bool stopping_ = false;      // under mutex_
  std::thread reader_;

  // The service's side.
  std::deque<Queued> taken_;
  bool ended_ = false;
  std::optional<std::uint64_t> previousTimestamp_;
  std::chrono::nanoseconds due_{0};
  std::uint64_t played_ = 0;
};

// The technology whose decoders read most of the log packets, given as their
// number per code (extra codes, read by every technology, do not count); IFX
// when there are property-list reports and no log packets; empty when that
// does not tell (no code is read, or two technologies read as many), with the
// reason in `why`.
std::string technologyOfCodes(const std::map<std::uint32_t, std::uint64_t>& codes, std::uint64_t reports,
                              std::string& why);

}  // namespace corvane::telephonyd
