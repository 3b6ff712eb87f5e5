// Cost of folding one IFX packet (a serving cell and six neighbours) into the
// state, in the XML and the binary property-list form.

#include <benchmark/benchmark.h>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "platform/Log.h"
#include "platform/PropertyList.h"

namespace {

using namespace corvane;

Value samplePacket() {
  Dictionary serving;
  for (const char* key : {"LAC", "Cell ID", "ARFCN", "BSIC", "RxLev", "C1", "C2", "Band", "RxQual", "Timing Advance"}) {
    serving.set(key, Value("12345"));
  }
  Array neighbours;
  neighbours.append(Value("LAC Cell ID ARFCN BSIC RxLev C1 C2"));
  for (int i = 0; i < 6; ++i) {
    Dictionary n;
    for (const char* key : {"LAC", "Cell ID", "ARFCN", "BSIC", "RxLev", "C1", "C2"}) n.set(key, Value("-77 dBm"));
    neighbours.append(Value(n));
  }
  Dictionary packet;
  packet.set("Serving Cell", Value(serving));
  packet.set("Neighbour Cells", Value(neighbours));
  return Value(packet);
}

void foldPackets(benchmark::State& state, plist::Format format) {
  log::setSink(std::make_shared<log::CapturingSink>());
  const Bytes packet = plist::serializeOrThrow(samplePacket(), format);
  GSMLogGenerator generator;
  Dictionary display;
  for (auto _ : state) generator.updateState(display, packet);
  state.SetItemsProcessed(state.iterations());
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(packet.size()));
}

void BM_IfxPacketXml(benchmark::State& state) { foldPackets(state, plist::Format::XML); }
void BM_IfxPacketBinary(benchmark::State& state) { foldPackets(state, plist::Format::Binary); }
BENCHMARK(BM_IfxPacketXml)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_IfxPacketBinary)->Unit(benchmark::kMicrosecond);

}  // namespace
