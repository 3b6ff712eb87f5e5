#pragma once

// The packets that the simulator's scenario of a technology sends over its
// first simulated span, for the decode benchmarks: taken before the timed loop.

#include <cstdint>
#include <string_view>
#include <vector>

#include "platform/Value.h"
#include "telephonyd/LogCodeSimulator.h"

namespace corvane::bench {

inline constexpr std::uint64_t kScenarioStart = 1'800'000'000'000'000;  // microseconds

// The packets of the first `microseconds` of the scenario; with or without
// the extra codes.
inline std::vector<Bytes> scenarioPackets(std::string_view technology, std::uint64_t seed, std::uint64_t microseconds,
                                          bool extraCodes) {
  auto scenario = telephonyd::makeLogCodeScenario(technology, seed, kScenarioStart);
  std::vector<Bytes> packets;
  for (;;) {
    const telephonyd::SourcePacket packet = scenario->nextPacket();
    std::uint64_t timestamp = 0;
    for (int i = 7; i >= 0; --i) timestamp = timestamp << 8 | packet.data->at(static_cast<std::size_t>(5 + i));
    if (timestamp - kScenarioStart >= microseconds) break;
    if (extraCodes || *packet.code < telephonyd::kExtraCodeBase) packets.push_back(*packet.data);
  }
  return packets;
}

// The packets of one log code among them.
inline std::vector<Bytes> packetsOfCode(std::vector<Bytes> packets, std::uint32_t code) {
  std::erase_if(packets, [code](const Bytes& packet) {
    return static_cast<std::uint32_t>(packet[3] | packet[4] << 8) != code;
  });
  return packets;
}

}  // namespace corvane::bench
