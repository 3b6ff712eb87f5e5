#pragma once

// The log sinks and the updateState loop of the decode benchmarks. The sections trace every packet at
// level 4, so a decode figure depends on where those lines go:
//   Syslog          the production sink (syslog(3));
//   EveryLine       a sink that takes every line and drops it: the cost of
//                   making the lines, without any I/O;
//   ErrorsOnly      a sink that takes only levels 0-3: level-4 lines are
//                   never made.

#include <benchmark/benchmark.h>

#include <memory>
#include <string_view>
#include <vector>

#include "platform/Log.h"
#include "platform/Value.h"

namespace corvane::bench {

class EveryLineSink final : public log::Sink {
 public:
  void write(int, std::string_view text) override { benchmark::DoNotOptimize(text.data()); }
};

class ErrorsOnlySink final : public log::Sink {
 public:
  void write(int, std::string_view text) override { benchmark::DoNotOptimize(text.data()); }
  bool wants(int priority) const override { return priority <= log::kError; }
};

enum class SinkKind { Syslog, EveryLine, ErrorsOnly };

inline std::shared_ptr<log::Sink> makeSink(SinkKind kind) {
  switch (kind) {
    case SinkKind::Syslog: return std::make_shared<log::SyslogSink>();
    case SinkKind::EveryLine: return std::make_shared<EveryLineSink>();
    case SinkKind::ErrorsOnly: return std::make_shared<ErrorsOnlySink>();
  }
  return nullptr;
}

// A generator whose display is built, as after the first packet.
template <class Generator>
struct DecodingSetUp {
  DecodingSetUp() {
    log::setSink(std::make_shared<EveryLineSink>());
    generator_.getDisplayFromState(state_);
  }
  Generator generator_;
  Dictionary state_;
};

// Decodes the packets, over and over, with the log lines going to `sink`.
template <class Generator>
void runPackets(benchmark::State& state, const std::vector<Bytes>& packets, SinkKind sink) {
  if (packets.empty()) {
    state.SkipWithError("no packets");
    return;
  }
  DecodingSetUp<Generator> setUp;
  log::setSink(makeSink(sink));
  std::size_t next = 0;
  for (auto _ : state) {
    setUp.generator_.updateWithData(packets[next]);
    if (++next == packets.size()) next = 0;
  }
  state.counters["packets_per_second"] =
      benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
  state.counters["packets_in_mix"] = static_cast<double>(packets.size());
}

// Folds the packets, over and over, through the generator's updateState,
// which also appends each packet to the bytes kept for the DLF log. The
// display generation that hands those bytes over (every 100,000 packets) is
// left out of the timing. `setUp` holds generator_ and state_.
template <class SetUp>
void runUpdateState(benchmark::State& state, SetUp& setUp, const std::vector<Bytes>& packets) {
  std::size_t next = 0;
  std::size_t sinceDisplay = 0;
  for (auto _ : state) {
    setUp.generator_.updateState(setUp.state_, packets[next]);
    if (++next == packets.size()) next = 0;
    if (++sinceDisplay == 100000) {
      state.PauseTiming();
      setUp.generator_.generateLogUsingState(setUp.state_);
      sinceDisplay = 0;
      state.ResumeTiming();
    }
  }
  state.counters["packets_per_second"] =
      benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

}  // namespace corvane::bench
