// corvane-telephonyd: the telephony service that Corvane asks for log channels.

#include <sys/signalfd.h>
#include <unistd.h>

#include <QCoreApplication>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <memory>

#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "platform/QtRunLoop.h"
#include "platform/RuntimeDirectory.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"
#include "platform/Version.h"
#include "telephonyd/IFXSimulator.h"
#include "telephonyd/LogCodeSimulator.h"
#include "telephonyd/ServiceOptions.h"
#include "telephonyd/TelephonyService.h"

namespace {

using namespace corvane;
using namespace corvane::telephonyd;

// Simulated time between packets when streaming at full speed: the scenario
// then moves on as if the baseband reported every millisecond.
constexpr std::chrono::milliseconds kFullSpeedPacketInterval{1};

int fail(const std::string& message) {
  std::fprintf(stderr, "corvane-telephonyd: %s\n", message.c_str());
  return 1;
}

// The simulator scenario of a technology; more scenarios join here as they are written.
std::unique_ptr<PacketSource> makeSimulator(const ServiceOptions& options, std::string& error) {
  const auto interval =
      options.rate > 0
          ? std::chrono::duration_cast<std::chrono::nanoseconds>(std::chrono::duration<double>(1.0 / options.rate))
          : std::chrono::nanoseconds(kFullSpeedPacketInterval);
  if (options.technology == kLogChannelTechnologyIFX) return std::make_unique<IFXSimulator>(options.seed, interval);
  const std::uint64_t clockStart =
      options.clockStart ? *options.clockStart * 1'000'000
                         : static_cast<std::uint64_t>(std::chrono::duration_cast<std::chrono::microseconds>(
                                                          std::chrono::system_clock::now().time_since_epoch())
                                                          .count());
  if (auto scenario = makeLogCodeScenario(options.technology, options.seed, clockStart)) return scenario;
  error = "no simulator scenario for technology " + options.technology + " yet";
  return nullptr;
}

}  // namespace

int main(int argc, char** argv) {
  const ParsedOptions parsed = parseServiceOptions(argc, argv);
  if (parsed.exit) {
    if (!parsed.output.empty()) std::fputs(parsed.output.c_str(), stdout);
    if (!parsed.error.empty()) std::fprintf(stderr, "corvane-telephonyd: %s\n", parsed.error.c_str());
    return parsed.exitCode;
  }
  const ServiceOptions& options = parsed.options;
  if (options.logToStandardError) {
    log::setSink(std::make_shared<log::TeeSink>(std::vector<std::shared_ptr<log::Sink>>{
        std::make_shared<log::SyslogSink>(), std::make_shared<log::StderrSink>()}));
  }

  std::string error;
  auto source = makeSimulator(options, error);
  if (!source) return fail(error);
  const RuntimeDirectoryResult runtime = prepareRuntimeDirectory();
  if (!runtime) return fail(runtime.error);

  // The termination signals arrive as readable data on the run loop, so that
  // shutdown runs as ordinary loop work and can remove the socket files. They
  // are blocked before Qt starts any thread, so that no thread takes them.
  sigset_t termination;
  sigemptyset(&termination);
  sigaddset(&termination, SIGTERM);
  sigaddset(&termination, SIGINT);
  pthread_sigmask(SIG_BLOCK, &termination, nullptr);
  const int signalFd = ::signalfd(-1, &termination, SFD_NONBLOCK | SFD_CLOEXEC);
  if (signalFd < 0) return fail("cannot watch for termination signals");
  // Writes to a vanished client must fail with EPIPE, never end the service.
  std::signal(SIGPIPE, SIG_IGN);

  // Qt sees no options of ours: they are parsed above.
  int qtArgc = 1;
  QCoreApplication application(qtArgc, argv);
  QtRunLoop runLoop;
  SocketPortSystem ports(runtime.path);
  TelephonyService service(ports, runLoop, std::move(source), {options.rate, options.packetLimit});
  if (!service.start(error)) {
    const std::string path = ports.socketPath(std::string(kTelephonyServicePortName)).string();
    if (ports.createSocketRemotePort(std::string(kTelephonyServicePortName))) {
      return fail("another corvane-telephonyd is already serving " + path);
    }
    return fail(error);
  }

  runLoop.watchReadable(signalFd, [&] {
    signalfd_siginfo info{};
    if (::read(signalFd, &info, sizeof info) != static_cast<ssize_t>(sizeof info)) return;
    log::printf(log::kNotice, "corvane-telephonyd stopping on signal %u", info.ssi_signo);
    service.stop();
    QCoreApplication::quit();
  });

  const std::string pace = options.rate > 0 ? log::format("%g packets/s", options.rate) : "full speed";
  log::printf(log::kNotice, "corvane-telephonyd %s serving %s: technology %s, seed %llu, %s", kVersion,
              ports.socketPath(std::string(kTelephonyServicePortName)).c_str(), options.technology.c_str(),
              static_cast<unsigned long long>(options.seed), pace.c_str());
  const int status = QCoreApplication::exec();
  service.stop();
  ::close(signalFd);
  return status;
}
