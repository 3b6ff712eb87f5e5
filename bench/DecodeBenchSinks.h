#pragma once

// The log sinks of the decode benchmarks. The sections trace every packet at
// level 4, so a decode figure depends on where those lines go:
//   Syslog          the production sink (syslog(3));
//   EveryLine       a sink that takes every line and drops it: the cost of
//                   making the lines, without any I/O;
//   ErrorsOnly      a sink that takes only levels 0-3: level-4 lines are
//                   never made.

#include <benchmark/benchmark.h>

#include <memory>
#include <string_view>

#include "platform/Log.h"

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

}  // namespace corvane::bench
