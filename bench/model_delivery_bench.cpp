// Packets per second from corvane-telephonyd, over the real sockets, into the
// monitor model's generator: the service streams its simulator at full speed
// and is told to stop after a fixed number of packets, all of which must reach
// the generator. Two runs: a generator that only counts (the delivery path:
// sockets, event loop, port callback, model), and the real IFX decoder (the
// whole path including property-list decoding).

#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <QCoreApplication>
#include <QTimer>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "ServiceBenchCommandLine.h"
#include "model/CorvaneModel.h"
#include "platform/Log.h"
#include "platform/QtRunLoop.h"
#include "platform/RuntimeDirectory.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"
#include "platform/Uuid.h"

namespace {

using namespace corvane;
using Clock = std::chrono::steady_clock;

const ProgramUsage kProgram{
    "model_delivery_bench",
    "Usage: model_delivery_bench [PACKETS] [PATH-TO-corvane-telephonyd]\n",
    "\n"
    "Streams PACKETS packets (default 1000000) from corvane-telephonyd at full\n"
    "speed into the monitor model with a counting generator, then a twentieth\n"
    "of them with the IFX decoder, and prints packets per second; fails when\n"
    "any is lost.\n",
};

// Counts packets and the time from the first to the last; decodes with `inner` when given.
class TimingGenerator final : public LogGenerator {
 public:
  explicit TimingGenerator(std::unique_ptr<LogGenerator> inner) : inner_(std::move(inner)) {}
  void updateState(const Dictionary& state, std::span<const std::uint8_t> data) override {
    if (packets_ == 0) first_ = Clock::now();
    ++packets_;
    bytes_ += data.size();
    last_ = Clock::now();
    if (inner_) inner_->updateState(state, data);
    if (packets_ == target_) QCoreApplication::quit();
  }
  Value generateLogUsingState(const Dictionary& state) override {
    return inner_ ? inner_->generateLogUsingState(state) : Value();
  }
  Dictionary getStartCommand() override { return GSMLogGenerator().getStartCommand(); }
  Value getSaveContentsFromState(const Dictionary&) override { return Value(); }

  static inline unsigned long long target_ = 0;
  static inline unsigned long long packets_ = 0;
  static inline unsigned long long bytes_ = 0;
  static inline Clock::time_point first_, last_;

 private:
  std::unique_ptr<LogGenerator> inner_;
};

struct NoScreens final : CorvaneModelDelegate {
  void updateViewControllerFromModel() override {}
};

int run(const std::string& daemon, const std::filesystem::path& runtime, unsigned long long packets, bool decode) {
  TimingGenerator::target_ = packets;
  TimingGenerator::packets_ = TimingGenerator::bytes_ = 0;

  const pid_t pid = fork();
  if (pid == 0) {
    const std::string limit = std::to_string(packets);
    execl(daemon.c_str(), daemon.c_str(), "--rate", "max", "--packets", limit.c_str(), static_cast<char*>(nullptr));
    _exit(127);
  }
  const auto socket = runtime / "corvane-telephonyd.sock";
  for (int i = 0; i < 500 && !std::filesystem::exists(socket); ++i) usleep(10000);

  QtRunLoop loop;
  SocketPortSystem ports(runtime);
  SocketTelephonyClient telephony(ports);
  NoScreens screens;
  {
    CorvaneModel model(CorvaneModelEnvironment{loop, ports, telephony, &makeUUIDText,
                                               [decode](std::string_view) {
                                                 return std::make_unique<TimingGenerator>(
                                                     decode ? GSMLogGenerator::generator() : nullptr);
                                               }},
                       &screens);
    loop.dispatchAsync([&model] { model.startMonitor(); });
    QTimer::singleShot(120000, [] { QCoreApplication::quit(); });
    QCoreApplication::exec();
  }
  kill(pid, SIGTERM);
  waitpid(pid, nullptr, 0);

  const double seconds = std::chrono::duration<double>(TimingGenerator::last_ - TimingGenerator::first_).count();
  std::printf("%-22s %10llu of %llu packets, %6.1f MB, %7.3f s: %12.0f packets/s%s\n",
              decode ? "IFX decoder" : "counting generator", TimingGenerator::packets_, packets,
              static_cast<double>(TimingGenerator::bytes_) / 1e6, seconds,
              seconds > 0 ? static_cast<double>(TimingGenerator::packets_ - 1) / seconds : 0.0,
              TimingGenerator::packets_ == packets ? "" : "  (PACKETS LOST)");
  return TimingGenerator::packets_ == packets ? 0 : 1;
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
