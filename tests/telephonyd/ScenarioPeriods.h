#pragma once

// A log-code scenario read period by period, and readers of the display its
// packets make: shared by the tests of the radio encoders.

#include <cstdint>
#include <cstdlib>
#include <fstream>
#include <memory>
#include <optional>
#include <sstream>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "platform/Log.h"
#include "platform/Value.h"
#include "telephonyd/LogCodeSimulator.h"
#include "telephonyd/LogRecord.h"

namespace corvane::telephonyd::scenario {

inline constexpr std::uint64_t kScenarioStart = 1'800'000'000'000'000;  // microseconds: 2027-01-15 08:00 UTC
inline constexpr std::uint64_t kMicrosecondsPerPeriod = 40'000;
inline constexpr std::uint64_t kPeriodsPerSecond = 25;

struct Period {
  std::uint64_t number = 0;
  std::vector<SourcePacket> packets;
  // The network as the encoders saw it in this period.
  SimulatedNetwork network;
};

class PeriodReader {
 public:
  PeriodReader(std::string_view technology, std::uint64_t seed)
      : scenario_(makeLogCodeScenario(technology, seed, kScenarioStart)) {}

  // The next period that has packets. The scenario runs a period when the
  // packets of the one before are all taken, so right after a packet comes
  // the network is still that of the packet's period.
  Period next() {
    SourcePacket first = ahead_ ? std::move(*ahead_) : scenario_->nextPacket();
    Period period{periodOf(first), {std::move(first)}, aheadNetwork_ ? *aheadNetwork_ : scenario_->network()};
    ahead_.reset();
    for (;;) {
      SourcePacket packet = scenario_->nextPacket();
      if (periodOf(packet) != period.number) {
        ahead_ = std::move(packet);
        aheadNetwork_ = scenario_->network();
        return period;
      }
      period.packets.push_back(std::move(packet));
    }
  }

 private:
  static std::uint64_t periodOf(const SourcePacket& packet) {
    std::uint64_t timestamp = 0;
    for (int i = 7; i >= 0; --i) timestamp = timestamp << 8 | packet.data->at(static_cast<std::size_t>(5 + i));
    const auto since = basebandMoment(timestamp) - BasebandMoment(std::chrono::microseconds(kScenarioStart));
    return static_cast<std::uint64_t>(since.count()) / kMicrosecondsPerPeriod;
  }

  std::unique_ptr<LogCodeSimulator> scenario_;
  std::optional<SourcePacket> ahead_;
  std::optional<SimulatedNetwork> aheadNetwork_;
};

inline std::vector<std::uint32_t> codesOf(const Period& period) {
  std::vector<std::uint32_t> codes;
  for (const SourcePacket& packet : period.packets) codes.push_back(*packet.code);
  return codes;
}

// One packet as a line of the samples: its bytes in hex, space-separated.
inline std::string hexLine(const Bytes& packet) {
  std::string line;
  for (std::uint8_t byte : packet) {
    if (!line.empty()) line += ' ';
    line += "0123456789abcdef"[byte >> 4];
    line += "0123456789abcdef"[byte & 15];
  }
  return line;
}

// The packets of the scenario's first `seconds`, a hex line each: a sample
// file's body.
inline std::string hexLinesOfFirstSeconds(PeriodReader& reader, std::uint64_t seconds) {
  std::string text;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= seconds * kPeriodsPerSecond) break;
    for (const SourcePacket& packet : period.packets) text += hexLine(*packet.data) + "\n";
  }
  return text;
}

// The sample file's contents as they are; written from `expected` first when
// CORVANE_UPDATE_SAMPLES=1. Empty when the file cannot be read.
inline std::string sampleFile(const std::string& path, const std::string& expected) {
  const char* update = std::getenv("CORVANE_UPDATE_SAMPLES");
  if (update && std::string(update) == "1") std::ofstream(path, std::ios::binary | std::ios::trunc) << expected;
  std::ifstream file(path, std::ios::binary);
  std::stringstream contents;
  contents << file.rdbuf();
  return contents.str();
}

// --- Reading the display ---

// The node of that name anywhere in the display, depth first.
inline const Value* findNode(const Value& node, std::string_view name) {
  const Dictionary* d = node.asDictionary();
  if (!d) return nullptr;
  for (const auto& [key, value] : d->entries()) {
    if (key == name) return &value;
    if (const Value* found = findNode(value, name)) return found;
  }
  return nullptr;
}

inline std::string rowText(const Value& display, std::string_view section, std::string_view row) {
  const Value* rows = findNode(display, section);
  const Value* v = rows && rows->asDictionary() ? rows->asDictionary()->find(row) : nullptr;
  return v && v->asString() ? *v->asString() : "<none>";
}

inline std::string textIn(const Dictionary& rows, std::string_view key) {
  const Value* v = rows.find(key);
  return v && v->asString() ? *v->asString() : "<none>";
}

inline std::vector<Dictionary> listRows(const Value& display, std::string_view section) {
  std::vector<Dictionary> rows;
  const Value* list = findNode(display, section);
  if (!list || !list->asArray()) throw std::runtime_error(std::string(section) + " is no list");
  for (const Value& row : list->asArray()->elements()) rows.push_back(*row.asDictionary());
  return rows;
}

// A technology's own decoder, fed period by period, its log lines captured.
class Decoder {
 public:
  explicit Decoder(std::string_view technology) : generator_(LogGenerator::generatorFromTechnology(technology)) {}
  void feed(const Period& period) {
    for (const SourcePacket& packet : period.packets) generator_->updateState(state_, *packet.data);
  }
  Value display() { return generator_->generateLogUsingState(state_); }

 private:
  log::ScopedCapture quiet_;
  std::unique_ptr<LogGenerator> generator_;
  Dictionary state_;
};

}  // namespace corvane::telephonyd::scenario
