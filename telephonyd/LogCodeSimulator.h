#pragma once

// The simulator's scenarios for the log-code technologies (Quendra_GSM,
// Quendra_LTE, Quendra_UTRAN2). A scenario runs in simulated periods: at the
// start of each the network takes its measurement step when one is due, then
// every encoder adds the packets that are due in that period. Packets come out
// in that order; a period with none adds nothing.
//
// Every packet is a log record (telephonyd/LogRecord.h) whose timestamp is the
// simulated clock at the start of its period, in the baseband's form: the
// clock starts at the scenario's start time and advances by the schedule, not
// by the wall clock.
// So the packets depend only on the technology, the seed and the start time,
// whatever the pace at which they are taken.
//
// The radio log codes of each technology join as further encoders.

#include <chrono>
#include <cstdint>
#include <deque>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "telephonyd/PacketSource.h"
#include "telephonyd/SimulatedNetwork.h"

namespace corvane::telephonyd {

class LogCodeSimulator final : public PacketSource {
 public:
  static constexpr std::chrono::milliseconds kPeriod{40};
  // The periods in a span that is a whole number of them.
  static constexpr std::uint64_t periodsIn(std::chrono::milliseconds span) {
    return static_cast<std::uint64_t>(span / kPeriod);
  }

  class Encoder {
   public:
    virtual ~Encoder() = default;
    // Adds the packets due in `period` (0, 1, 2 ...) to `out`. `timestamp`:
    // the record timestamp of the start of the period (baseband form,
    // LogRecord.h; basebandMoment() tells the moment).
    virtual void encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
                        std::vector<SourcePacket>& out) = 0;
  };

  // `clockStart`: microseconds since 1970-01-01 UTC at period 0. Throws
  // std::invalid_argument for a technology that is not a log-code technology.
  LogCodeSimulator(std::string_view technology, std::uint64_t seed, std::uint64_t clockStart);

  void addEncoder(std::unique_ptr<Encoder> encoder);

  std::string_view technology() const override { return technology_; }
  // Throws std::logic_error when the scenario has no encoder (it would never yield a packet).
  SourcePacket nextPacket() override;

  const SimulatedNetwork& network() const { return network_; }
  // The period whose packets come next.
  std::uint64_t period() const { return nextPeriod_; }

 private:
  void runPeriod();

  std::string technology_;
  SimulatedNetwork network_;
  std::uint64_t clockStart_;
  std::vector<std::unique_ptr<Encoder>> encoders_;
  std::uint64_t nextPeriod_ = 0;
  std::vector<SourcePacket> due_;
  std::deque<SourcePacket> pending_;
};

// The extra codes, from the network: SIM files (0xFF0000) every 10 s, the cell
// list (0xFF0001) every measurement period, PDP contexts (0xFF0002) every 5 s
// and as soon as they change; all three in period 0.
class ExtraCodeEncoder final : public LogCodeSimulator::Encoder {
 public:
  static constexpr std::chrono::seconds kSimFilesEvery{10};
  static constexpr std::chrono::seconds kPdpContextsEvery{5};

  void encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
              std::vector<SourcePacket>& out) override;

 private:
  std::uint64_t reportedPdpGeneration_ = 0;
};

// The scenario of a log-code technology with all its encoders; nothing for
// other technologies.
std::unique_ptr<LogCodeSimulator> makeLogCodeScenario(std::string_view technology, std::uint64_t seed,
                                                      std::uint64_t clockStart);

}  // namespace corvane::telephonyd
