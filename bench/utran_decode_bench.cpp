// UTRAN decode throughput: packets per second on one core through the real
// UTRAN generator (its template found among the resources as at run time),
// its class index and its sections, into a display built from the template.
// The packets are the simulator's own: the Quendra_UTRAN2 scenario (seed 5)
// over its first 40 simulated seconds, through every RRC state to DCH, taken
// before the timed loop.
//
// As in the other decode benchmarks, the sections trace every packet (at
// level 4, "TRCH BLER" at level 5), so the figure depends on where those
// lines go:
//   Syslog          the production sink (syslog(3));
//   EveryLine       a sink that takes every line and drops it;
//   ErrorsOnly      a sink that takes only levels 0-3.
// BM_UtranDecodeMix holds the radio log codes alone;
// BM_UtranDecodeMixWithExtraCodes adds the SIM files, cell lists and PDP
// contexts that the scenario sends beside them. BM_UtranDecodeByCode shows
// each radio code alone and BM_UtranUpdateStateMix goes through updateState,
// which also keeps the raw packets for the DLF log.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <memory>
#include <utility>
#include <vector>

#include "DecodeBenchSinks.h"
#include "ScenarioPackets.h"
#include "LogGenerator/utran/UTRANLogGenerator.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"

namespace {

using namespace corvane;

constexpr std::uint64_t kSeed = 5;
constexpr std::uint64_t kSessionMicroseconds = 40'000'000;

// The scenario's packets of the session; with or without the extra codes.
std::vector<Bytes> session(bool extraCodes) {
  return bench::scenarioPackets(kLogChannelTechnologyQuendraUTRAN2, kSeed, kSessionMicroseconds, extraCodes);
}

// The UTRAN generator as its factory makes it (it searches for its template),
// in the shape the shared set-up drives.
class UtranGenerator {
 public:
  UtranGenerator() : owned_(UTRANLogGenerator::generator()) {}
  Value getDisplayFromState(const Dictionary& state) { return utran().getDisplayFromState(state); }
  void updateWithData(std::span<const std::uint8_t> data) { utran().updateWithData(data); }
  template <class... Args>
  decltype(auto) updateState(Args&&... args) {
    return owned_->updateState(std::forward<Args>(args)...);
  }
  template <class... Args>
  decltype(auto) generateLogUsingState(Args&&... args) {
    return owned_->generateLogUsingState(std::forward<Args>(args)...);
  }

 private:
  UTRANLogGenerator& utran() { return static_cast<UTRANLogGenerator&>(*owned_); }
  std::unique_ptr<LogGenerator> owned_;
};

using bench::makeSink;
using bench::runUpdateState;
using bench::SinkKind;

void runPackets(benchmark::State& state, const std::vector<Bytes>& packets, SinkKind sink) {
  bench::runPackets<UtranGenerator>(state, packets, sink);
}

void BM_UtranDecodeMix(benchmark::State& state, SinkKind sink) { runPackets(state, session(false), sink); }
BENCHMARK_CAPTURE(BM_UtranDecodeMix, Syslog, SinkKind::Syslog);
BENCHMARK_CAPTURE(BM_UtranDecodeMix, EveryLine, SinkKind::EveryLine);
BENCHMARK_CAPTURE(BM_UtranDecodeMix, ErrorsOnly, SinkKind::ErrorsOnly);

void BM_UtranDecodeMixWithExtraCodes(benchmark::State& state) { runPackets(state, session(true), SinkKind::ErrorsOnly); }
BENCHMARK(BM_UtranDecodeMixWithExtraCodes);

// Each radio code of the session alone.
void BM_UtranDecodeByCode(benchmark::State& state, std::uint32_t code) {
  runPackets(state, bench::packetsOfCode(session(false), code), SinkKind::ErrorsOnly);
}
BENCHMARK_CAPTURE(BM_UtranDecodeByCode, 0xD00A, 0xD00Au);
BENCHMARK_CAPTURE(BM_UtranDecodeByCode, 0xD00C, 0xD00Cu);
BENCHMARK_CAPTURE(BM_UtranDecodeByCode, 0xD00E, 0xD00Eu);
BENCHMARK_CAPTURE(BM_UtranDecodeByCode, 0xD0E0, 0xD0E0u);
BENCHMARK_CAPTURE(BM_UtranDecodeByCode, 0xD0E2, 0xD0E2u);

// Through updateState, which also appends each packet to the bytes kept for
// the DLF log. The display generation that hands those bytes over is left
// out of the timing.
void BM_UtranUpdateStateMix(benchmark::State& state) {
  const std::vector<Bytes> packets = session(false);
  bench::DecodingSetUp<UtranGenerator> setUp;
  log::setSink(makeSink(SinkKind::ErrorsOnly));
  runUpdateState(state, setUp, packets);
}
BENCHMARK(BM_UtranUpdateStateMix);

}  // namespace
