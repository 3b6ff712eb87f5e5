// LTE decode throughput: packets per second on one core through the real LTE
// generator, its class index and its sections, into a display built from the
// LTE template. The packets are a mix of the six LTE log codes as a phone in
// connected and idle mode sends them, built in memory before the timed loop.
//
// The sections trace every packet at level 4 through the system log, so the
// figure depends on where those lines go. The variants:
//   Syslog          the production sink (syslog(3));
//   EveryLine       a sink that takes every line and drops it: the cost of
//                   making the lines, without any I/O;
//   ErrorsOnly      a sink that takes only levels 0-3: level-4 lines are
//                   never made.
// BM_LteDecodeByCode shows each code alone, BM_LteUpdateStateMix goes through
// updateState, which also keeps the raw packets for the DLF log (both
// ErrorsOnly, so that they show the decoding itself).

#include <benchmark/benchmark.h>

#include <array>
#include <cstdint>
#include <memory>
#include <vector>

#include "LogGenerator/gsm_umts/QND_GSMLogGenerator.h"
#include "LogGenerator/lte/LTELogGenerator.h"
#include "LogGenerator/utran/UTRANLogGenerator.h"
#include "DecodeBenchSinks.h"
#include "platform/Log.h"

namespace {

using namespace corvane;

// --- Packets ---

Bytes logPacket(std::uint16_t code, std::size_t size) {
  Bytes p(size, 0);
  p[0] = 0x01;
  p[1] = static_cast<std::uint8_t>((size - 1) & 0xFF);
  p[2] = static_cast<std::uint8_t>((size - 1) >> 8);
  p[3] = static_cast<std::uint8_t>(code & 0xFF);
  p[4] = static_cast<std::uint8_t>(code >> 8);
  return p;
}

void put16(Bytes& p, std::size_t at, std::uint32_t v) {
  p[at] = static_cast<std::uint8_t>(v & 0xFF);
  p[at + 1] = static_cast<std::uint8_t>((v >> 8) & 0xFF);
}

void put32(Bytes& p, std::size_t at, std::uint32_t v) {
  put16(p, at, v & 0xFFFF);
  put16(p, at + 2, v >> 16);
}

// Values drift with n, so consecutive packets do not write the same texts.
Bytes carrierPacket(std::uint32_t n) {
  Bytes p = logPacket(0xB0C2, 38);
  put16(p, 14, 301 + n % 3);
  put16(p, 16, 6300);
  put16(p, 18, 24300);
  p[20] = 50;
  p[21] = 50;
  put32(p, 22, 26543617 + n % 3);
  put16(p, 26, 4660);
  put32(p, 28, 20);
  return p;
}

Bytes antennaPacket(std::uint32_t) {
  Bytes p = logPacket(0xB0C1, 22);
  p[20] = 2;
  return p;
}

Bytes servingMeasurementPacket(std::uint32_t n) {
  Bytes p = logPacket(0xB17F, 33);
  p[13] = 4;
  put16(p, 17, 6300);
  put16(p, 19, 301 | (5u << 9));
  put32(p, 21, (100 + n % 40) | ((110 + n % 20) << 9) | ((40 + n % 8) << 18) | ((42 + n % 4) << 25));
  put32(p, 25, (160 + n % 30) | (22u << 9) | (46u << 15) | (46u << 22));
  put32(p, 29, (30 + n % 25) | (2u << 7) | (31u << 13) | (8u << 19) | (1u << 25) | (3u << 26));
  return p;
}

// Three measured neighbours and two detected cells.
Bytes intraFrequencyPacket(std::uint32_t n) {
  Bytes p = logPacket(0xB179, 29 + 6 * 3 + 2 * 2);
  put16(p, 17, 6300);
  put16(p, 19, 301);
  put16(p, 21, n % 10);
  put16(p, 23, 180 + n % 20);
  put16(p, 25, 100 + n % 16);
  p[27] = 3;
  p[28] = 2;
  for (std::uint32_t i = 0; i < 3; ++i) {
    put16(p, 29 + 6 * i, 302 + i);
    put16(p, 31 + 6 * i, 150 + (n + i) % 30);
    put16(p, 33 + 6 * i, 90 + (n + i) % 12);
  }
  put16(p, 47, 410);
  put16(p, 49, 411);
  return p;
}

// Four neighbour cells.
Bytes neighborPacket(std::uint32_t n) {
  constexpr std::uint32_t kCells = 4;
  Bytes p = logPacket(0xB180, 21 + 20 * kCells);
  p[13] = 2;
  put16(p, 17, 1850);
  put16(p, 19, 23 | ((kCells - 1) << 6));
  for (std::uint32_t i = 0; i < kCells; ++i) {
    const std::size_t at = 21 + 20 * i;
    put32(p, at, (120 + i) | ((90 + (n + i) % 30) << 9) | ((140 + (n + i) % 40) << 17));
    put32(p, at + 4, (138 + i) | ((40 + n % 8) << 9) | ((44u) << 16) | ((20 + i) << 23));
    put16(p, at + 8, 65530 + i);
    put32(p, at + 12, (1500 + i) | ((300000 + n % 100) << 11));
  }
  return p;
}

// An LTE, a UTRAN and a GERAN candidate.
Bytes reselectionPacket(std::uint32_t n) {
  Bytes p = logPacket(0xB186, 21 + 4 * 2 + 8);
  p[13] = 4;
  put16(p, 15, 5230);
  put16(p, 17, 88 + n % 2);
  put16(p, 19, 3);
  put16(p, 21, 7);
  put16(p, 23, 0);
  put16(p, 25, 1);  // the LTE candidate's E ARFCN is the next one's priority
  put16(p, 27, 1);  // ... and its Cell ID field the next one's technology
  put16(p, 29, 2);
  put16(p, 31, 2);
  put16(p, 33, 512);
  p[35] = 1;
  p[36] = 40;
  return p;
}

// 20 packets: what a phone reports per measurement round, on average.
std::vector<Bytes> realisticMix() {
  std::vector<Bytes> mix;
  for (std::uint32_t round = 0; round < 16; ++round) {
    for (std::uint32_t i = 0; i < 6; ++i) mix.push_back(intraFrequencyPacket(round * 6 + i));
    for (std::uint32_t i = 0; i < 6; ++i) mix.push_back(servingMeasurementPacket(round * 6 + i));
    for (std::uint32_t i = 0; i < 4; ++i) mix.push_back(neighborPacket(round * 4 + i));
    for (std::uint32_t i = 0; i < 2; ++i) mix.push_back(reselectionPacket(round * 2 + i));
    mix.push_back(carrierPacket(round));
    mix.push_back(antennaPacket(round));
  }
  return mix;
}

using bench::makeSink;
using bench::runUpdateState;
using bench::SinkKind;

using DecodingSetUp = bench::DecodingSetUp<LTELogGenerator>;

void runPackets(benchmark::State& state, const std::vector<Bytes>& packets, SinkKind sink) {
  bench::runPackets<LTELogGenerator>(state, packets, sink);
}

void BM_LteDecodeMix(benchmark::State& state, SinkKind sink) { runPackets(state, realisticMix(), sink); }
BENCHMARK_CAPTURE(BM_LteDecodeMix, Syslog, SinkKind::Syslog);
BENCHMARK_CAPTURE(BM_LteDecodeMix, EveryLine, SinkKind::EveryLine);
BENCHMARK_CAPTURE(BM_LteDecodeMix, ErrorsOnly, SinkKind::ErrorsOnly);

void BM_LteDecodeByCode(benchmark::State& state, Bytes (*make)(std::uint32_t)) {
  std::vector<Bytes> packets;
  for (std::uint32_t n = 0; n < 32; ++n) packets.push_back(make(n));
  runPackets(state, packets, SinkKind::ErrorsOnly);
}
BENCHMARK_CAPTURE(BM_LteDecodeByCode, 0xB0C1, antennaPacket);
BENCHMARK_CAPTURE(BM_LteDecodeByCode, 0xB0C2, carrierPacket);
BENCHMARK_CAPTURE(BM_LteDecodeByCode, 0xB179, intraFrequencyPacket);
BENCHMARK_CAPTURE(BM_LteDecodeByCode, 0xB17F, servingMeasurementPacket);
BENCHMARK_CAPTURE(BM_LteDecodeByCode, 0xB180, neighborPacket);
BENCHMARK_CAPTURE(BM_LteDecodeByCode, 0xB186, reselectionPacket);

// Through updateState, which also appends each packet to the bytes kept for
// the DLF log. The display generation that hands those bytes over every 2 s
// is left out of the timing.
void BM_LteUpdateStateMix(benchmark::State& state) {
  const std::vector<Bytes> packets = realisticMix();
  DecodingSetUp setUp;
  log::setSink(makeSink(SinkKind::ErrorsOnly));
  runUpdateState(state, setUp, packets);
}
BENCHMARK(BM_LteUpdateStateMix);

}  // namespace
