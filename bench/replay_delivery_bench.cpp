// Packets per second from corvane-telephonyd replaying a capture as fast as
// possible, over the real sockets, into the monitor model (what the
// application and corvane-monitor run). The capture is a DLF of the
// simulator's LTE scenario, written first; every packet that the LTE
// generator's start command asks for must arrive. Two runs: a generator that
// only counts (reading the capture, pacing, sockets, event loop, model), and
// the LTE decoder on a fifth of the packets.

#include <QCoreApplication>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/logcode/ClassIndex.h"
#include "ModelDelivery.h"
#include "ServiceBenchCommandLine.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "platform/RuntimeDirectory.h"
#include "telephonyd/LogCodeSimulator.h"

namespace {

using namespace corvane;

const ProgramUsage kProgram{
    "replay_delivery_bench",
    "Usage: replay_delivery_bench [PACKETS] [PATH-TO-corvane-telephonyd]\n",
    "\n"
    "Writes a DLF of PACKETS packets (default 1000000) of the simulator's LTE\n"
    "scenario, has corvane-telephonyd replay it as fast as possible into the\n"
    "monitor model with a counting generator, then a fifth of it with the LTE\n"
    "decoder, and prints packets per second; fails when any is lost.\n",
};

constexpr std::uint64_t kClockStart = 1'800'000'000'000'000;  // microseconds since 1970

// The capture, and how many of its packets the LTE start command asks for.
unsigned long long writeCapture(const std::filesystem::path& path, unsigned long long packets,
                                const Dictionary& startCommand) {
  auto scenario = telephonyd::makeLogCodeScenario(kLogChannelTechnologyQuendraLTE, 3, kClockStart);
  const telephonyd::PacketFilter filter = telephonyd::PacketFilter::fromStartCommand(startCommand);
  std::ofstream out(path, std::ios::binary);
  unsigned long long wanted = 0;
  for (unsigned long long i = 0; i < packets; ++i) {
    const telephonyd::SourcePacket packet = scenario->nextPacket();
    // A DLF holds the records without their type byte.
    out.write(reinterpret_cast<const char*>(packet.data->data() + 1),
              static_cast<std::streamsize>(packet.data->size() - 1));
    wanted += filter.accepts(packet) ? 1 : 0;
  }
  return out.good() ? wanted : 0;
}

}  // namespace

int main(int argc, char** argv) {
  int exitStatus = 0;
  const auto options = bench::parseServiceBenchOptions(argc, argv, kProgram, 1'000'000ULL, exitStatus);
  if (!options) return exitStatus;
  // The system log, as corvane-monitor has it (its lines cost what they cost there).
  log::setSink(log::makeSystemLogSink());
  // Only the figures on standard output.
  ClassIndex::setTeardownStream(nullptr);

  char pattern[] = "/tmp/corvane-bench-XXXXXX";
  if (!mkdtemp(pattern)) return 1;
  const std::filesystem::path directory(pattern);
  const std::filesystem::path runtime = directory / "run";
  setenv("CORVANE_RUNTIME_DIR", runtime.c_str(), 1);
  const RuntimeDirectoryResult prepared = prepareRuntimeDirectory();
  if (!prepared) {
    std::fprintf(stderr, "replay_delivery_bench: %s\n", prepared.error.c_str());
    return 1;
  }
  const Dictionary startCommand =
      LogGenerator::generatorFromTechnology(kLogChannelTechnologyQuendraLTE)->getStartCommand();
  const std::filesystem::path capture = directory / "lte.dlf";
  const unsigned long long wanted = writeCapture(capture, options->packets, startCommand);
  if (wanted == 0) {
    std::fprintf(stderr, "replay_delivery_bench: cannot write %s\n", capture.c_str());
    return 1;
  }
  std::printf("capture: %llu packets, %.1f MB; %llu of them asked for by the LTE generator\n", options->packets,
              static_cast<double>(std::filesystem::file_size(capture)) / 1e6, wanted);

  QCoreApplication app(argc, argv);
  const std::string daemon = options->daemon;
  int failures = bench::runDelivery(daemon, {"--replay", capture.string(), "--as-fast-as-possible"}, prepared.path,
                                    wanted, "counting generator", [&startCommand] {
                                      return std::make_unique<bench::TimingGenerator>(nullptr, startCommand);
                                    });
  const unsigned long long fifth = wanted / 5 > 0 ? wanted / 5 : 1;
  failures += bench::runDelivery(
      daemon, {"--replay", capture.string(), "--as-fast-as-possible", "--packets", std::to_string(fifth)},
      prepared.path, fifth, "LTE decoder", [&startCommand] {
        return std::make_unique<bench::TimingGenerator>(
            LogGenerator::generatorFromTechnology(kLogChannelTechnologyQuendraLTE), startCommand);
      });
  std::filesystem::remove_all(directory);
  return failures;
}
