// CDMA2000 decode throughput: packets per second on one core through the real
// CDMA2000 generator (its dispatch, its eight decoders and the lookup into a
// display built from the C2KTemplate), over the simulator's Quendra_CDMA
// session: 1x idle, a call with its traffic frames, idle again and an EV-DO
// data session, about 60 simulated seconds built in memory before the timed
// loop. Every packet goes through updateState, which also keeps its bytes for
// the DLF log; the display generation that hands them over (every 100,000
// packets) is left out of the timing.
//
// The decoders log only failures, which these packets do not cause, so the
// figure does not depend on the log sink (ErrorsOnly: level-4 lines are never
// made). BM_CdmaDecodeByCode shows each code alone.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <memory>
#include <vector>

#include "DecodeBenchSinks.h"
#include "LogGenerator/cdma2000/C2KLogGenerator.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "telephonyd/LogCodeSimulator.h"

namespace {

using namespace corvane;

constexpr std::uint64_t kSeed = 4;
constexpr std::uint64_t kStart = 1'800'000'000'000'000;  // microseconds
constexpr std::uint64_t kSessionMicroseconds = 60'000'000;

// The radio records of the session; the extra codes are not asked for by the CDMA2000 generator.
std::vector<Bytes> session() {
  auto scenario = telephonyd::makeLogCodeScenario(kLogChannelTechnologyQuendraCDMA, kSeed, kStart);
  std::vector<Bytes> packets;
  for (;;) {
    const telephonyd::SourcePacket packet = scenario->nextPacket();
    std::uint64_t timestamp = 0;
    for (int i = 7; i >= 0; --i) timestamp = timestamp << 8 | packet.data->at(static_cast<std::size_t>(5 + i));
    if (timestamp - kStart >= kSessionMicroseconds) break;
    if (*packet.code < telephonyd::kExtraCodeBase) packets.push_back(*packet.data);
  }
  return packets;
}

void run(benchmark::State& state, const std::vector<Bytes>& packets) {
  if (packets.empty()) {
    state.SkipWithError("no packets");
    return;
  }
  bench::DecodingSetUp<C2KLogGenerator> setUp;
  log::setSink(bench::makeSink(bench::SinkKind::ErrorsOnly));
  bench::runUpdateState(state, setUp, packets);
  state.counters["packets_in_mix"] = static_cast<double>(packets.size());
}

void BM_CdmaUpdateStateMix(benchmark::State& state) { run(state, session()); }
BENCHMARK(BM_CdmaUpdateStateMix);

void BM_CdmaDecodeByCode(benchmark::State& state, std::uint32_t code) {
  std::vector<Bytes> packets;
  for (Bytes& packet : session()) {
    if (static_cast<std::uint32_t>(packet[3] | packet[4] << 8) == code) packets.push_back(std::move(packet));
  }
  run(state, packets);
}
BENCHMARK_CAPTURE(BM_CdmaDecodeByCode, 0x108a, 0x108au);
BENCHMARK_CAPTURE(BM_CdmaDecodeByCode, 0x1183, 0x1183u);
BENCHMARK_CAPTURE(BM_CdmaDecodeByCode, 0x1192, 0x1192u);
BENCHMARK_CAPTURE(BM_CdmaDecodeByCode, 0x119c, 0x119cu);
BENCHMARK_CAPTURE(BM_CdmaDecodeByCode, 0x119d, 0x119du);
BENCHMARK_CAPTURE(BM_CdmaDecodeByCode, 0x127e, 0x127eu);
BENCHMARK_CAPTURE(BM_CdmaDecodeByCode, 0x12b6, 0x12b6u);
BENCHMARK_CAPTURE(BM_CdmaDecodeByCode, 0x134f, 0x134fu);

}  // namespace
