// Packets per second from corvane-telephonyd, over the real sockets, into the
// monitor model's generator: the service streams its simulator at full speed
// and is told to stop after a fixed number of packets, all of which must reach
// the generator. Two runs: a generator that only counts (the delivery path:
// sockets, event loop, port callback, model), and the real IFX decoder (the
// whole path including property-list decoding).

#include <QCoreApplication>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "ModelDelivery.h"
#include "ServiceBenchCommandLine.h"
#include "platform/Log.h"
#include "platform/RuntimeDirectory.h"

namespace {

using namespace corvane;

const ProgramUsage kProgram{
    "model_delivery_bench",
    "Usage: model_delivery_bench [PACKETS] [PATH-TO-corvane-telephonyd]\n",
    "\n"
    "Streams PACKETS packets (default 1000000) from corvane-telephonyd at full\n"
    "speed into the monitor model with a counting generator, then a twentieth\n"
    "of them with the IFX decoder, and prints packets per second; fails when\n"
    "any is lost.\n",
};

int run(const std::string& daemon, const std::filesystem::path& runtime, unsigned long long packets, bool decode) {
  const std::string limit = std::to_string(packets);
  return bench::runDelivery(daemon, {"--rate", "max", "--packets", limit}, runtime, packets,
                            decode ? "IFX decoder" : "counting generator", [decode] {
                              return std::make_unique<bench::TimingGenerator>(
                                  decode ? GSMLogGenerator::generator() : nullptr,
                                  GSMLogGenerator().getStartCommand());
                            });
}

}  // namespace

int main(int argc, char** argv) {
  int exitStatus = 0;
  const auto options = bench::parseServiceBenchOptions(argc, argv, kProgram, 1'000'000ULL, exitStatus);
  if (!options) return exitStatus;
  const unsigned long long packets = options->packets;
  const std::string& daemon = options->daemon;
  log::setSink(std::make_shared<log::CapturingSink>());

  char pattern[] = "/tmp/corvane-bench-XXXXXX";
  if (!mkdtemp(pattern)) return 1;
  const std::filesystem::path runtime = std::filesystem::path(pattern) / "run";
  setenv("CORVANE_RUNTIME_DIR", runtime.c_str(), 1);
  const RuntimeDirectoryResult prepared = prepareRuntimeDirectory();
  if (!prepared) {
    std::fprintf(stderr, "model_delivery_bench: %s\n", prepared.error.c_str());
    return 1;
  }
  QCoreApplication app(argc, argv);
  int failures = run(daemon, prepared.path, packets, false);
  failures += run(daemon, prepared.path, packets / 20, true);
  std::filesystem::remove_all(pattern);
  return failures;
}
