// GSM/UMTS decode throughput: packets per second on one core through the real
// QND_GSM generator, its class index and its sections, into a display built
// from the QND_GSM template. The packets are the simulator's own: the
// Quendra_GSM scenario (seed 2) over one whole journey, from UMTS idle through
// FACH and DCH to GSM idle and dedicated and back to UMTS (its first 45
// simulated seconds), taken before the timed loop: every radio code of the
// technology's 26 sections that the scenario sends.
//
// As in lte_decode_bench, the sections trace every packet at level 4, so the
// figure depends on where those lines go:
//   Syslog          the production sink (syslog(3));
//   EveryLine       a sink that takes every line and drops it;
//   ErrorsOnly      a sink that takes only levels 0-3.
// BM_GsmUmtsDecodeMix holds the radio log codes alone, as the LTE mix does;
// BM_GsmUmtsDecodeMixWithExtraCodes adds the SIM files, cell lists and PDP
// contexts that the scenario sends beside them (property lists, parsed per
// packet). BM_GsmUmtsDecodeByCode shows each radio code alone and
// BM_GsmUmtsUpdateStateMix goes through updateState, which also keeps the raw
// packets for the DLF log.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <memory>
#include <vector>

#include "LogGenerator/gsm_umts/QND_GSMLogGenerator.h"
#include "DecodeBenchSinks.h"
#include "ScenarioPackets.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"

namespace {

using namespace corvane;

constexpr std::uint64_t kSeed = 2;
constexpr std::uint64_t kJourneyMicroseconds = 45'000'000;

// The scenario's packets of one journey; with or without the extra codes.
std::vector<Bytes> journey(bool extraCodes) {
  return bench::scenarioPackets(kLogChannelTechnologyQuendraGSM, kSeed, kJourneyMicroseconds, extraCodes);
}

using bench::makeSink;
using bench::runUpdateState;
using bench::SinkKind;

using DecodingSetUp = bench::DecodingSetUp<QND_GSMLogGenerator>;

void runPackets(benchmark::State& state, const std::vector<Bytes>& packets, SinkKind sink) {
  bench::runPackets<QND_GSMLogGenerator>(state, packets, sink);
}

void BM_GsmUmtsDecodeMix(benchmark::State& state, SinkKind sink) { runPackets(state, journey(false), sink); }
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeMix, Syslog, SinkKind::Syslog);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeMix, EveryLine, SinkKind::EveryLine);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeMix, ErrorsOnly, SinkKind::ErrorsOnly);

void BM_GsmUmtsDecodeMixWithExtraCodes(benchmark::State& state) {
  runPackets(state, journey(true), SinkKind::ErrorsOnly);
}
BENCHMARK(BM_GsmUmtsDecodeMixWithExtraCodes);

// Each radio code of the journey alone.
void BM_GsmUmtsDecodeByCode(benchmark::State& state, std::uint32_t code) {
  runPackets(state, bench::packetsOfCode(journey(false), code), SinkKind::ErrorsOnly);
}
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x4005, 0x4005u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x4031, 0x4031u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x4116, 0x4116u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x4125, 0x4125u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x4127, 0x4127u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x4157, 0x4157u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x417A, 0x417Au);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x5076, 0x5076u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x5134, 0x5134u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x5137, 0x5137u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x51F8, 0x51F8u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x51FF, 0x51FFu);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x7132, 0x7132u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x7135, 0x7135u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x7150, 0x7150u);
// Mobility management, GSM radio resource, GPRS and HSDPA.
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x7130, 0x7130u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x7131, 0x7131u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x512C, 0x512Cu);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x5072, 0x5072u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x51F4, 0x51F4u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x51F5, 0x51F5u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x51F6, 0x51F6u);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x51FB, 0x51FBu);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x51FD, 0x51FDu);
BENCHMARK_CAPTURE(BM_GsmUmtsDecodeByCode, 0x4221, 0x4221u);

// Through updateState, which also appends each packet to the bytes kept for
// the DLF log. The display generation that hands those bytes over is left
// out of the timing.
void BM_GsmUmtsUpdateStateMix(benchmark::State& state) {
  const std::vector<Bytes> packets = journey(false);
  DecodingSetUp setUp;
  log::setSink(makeSink(SinkKind::ErrorsOnly));
  runUpdateState(state, setUp, packets);
}
BENCHMARK(BM_GsmUmtsUpdateStateMix);

}  // namespace
