// corvane-telephonyd: the telephony service that Corvane asks for log channels.

#include <QCoreApplication>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <memory>

#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "platform/QtRunLoop.h"
#include "platform/RuntimeDirectory.h"
#include "platform/SignalEvents.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"
#include "platform/Version.h"
#include "telephonyd/DiagPortSource.h"
#include "telephonyd/IFXSimulator.h"
#include "telephonyd/LogCodeSimulator.h"
#include "telephonyd/ModemExtraCodes.h"
#include "telephonyd/ModemManagerClient.h"
#include "telephonyd/ReplaySource.h"
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

std::unique_ptr<PacketSource> makeReplay(const ServiceOptions& options, std::string& error) {
  ReplaySource::Settings settings;
  settings.path = *options.replay;
  if (options.technologyGiven) settings.technology = options.technology;
  settings.speed = options.asFastAsPossible ? 0 : options.speed;
  settings.loop = options.loop;
  if (options.rate > 0) {
    settings.untimedInterval =
        std::chrono::duration_cast<std::chrono::nanoseconds>(std::chrono::duration<double>(1.0 / options.rate));
  } else {
    settings.untimedInterval = std::chrono::nanoseconds::zero();
  }
  return ReplaySource::open(std::move(settings), error);
}

// What the startup line says of the source.
std::string sourceText(const ServiceOptions& options, const PacketSource& source) {
  if (options.diag) {
    return log::format("bridging the diagnostic port %s (technology %s)", options.diag->c_str(),
                       options.technology.c_str());
  }
  if (!options.replay) {
    const std::string pace = options.rate > 0 ? log::format("%g packets/s", options.rate) : "full speed";
    return log::format("technology %s, seed %llu, %s", options.technology.c_str(),
                       static_cast<unsigned long long>(options.seed), pace.c_str());
  }
  const std::string pace = options.asFastAsPossible ? "as fast as possible" : log::format("speed %g", options.speed);
  return log::format("replaying %s (technology %.*s, %s%s)", options.replay->c_str(),
                     static_cast<int>(source.technology().size()), source.technology().data(), pace.c_str(),
                     options.loop ? ", in a loop" : "");
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
    log::setSink(std::make_shared<log::TeeSink>(
        std::vector<std::shared_ptr<log::Sink>>{log::makeSystemLogSink(), std::make_shared<log::StderrSink>()}));
  }

  std::string error;
  // A diagnostic port is opened once the run loop is there to watch it.
  std::unique_ptr<PacketSource> source;
  if (!options.diag) {
    source = options.replay ? makeReplay(options, error) : makeSimulator(options, error);
    if (!source) return fail(error);
  }
  const RuntimeDirectoryResult runtime = prepareRuntimeDirectory();
  if (!runtime) return fail(runtime.error);

  // Writes to a vanished client must fail with EPIPE, never end the service.
  std::signal(SIGPIPE, SIG_IGN);

  // Qt sees no options of ours: they are parsed above.
  int qtArgc = 1;
  QCoreApplication application(qtArgc, argv);
  QtRunLoop runLoop;
  SocketPortSystem ports(runtime.path);
  // The termination signals are caught before the service opens its sockets:
  // they end the loop, and shutdown runs as ordinary work that removes them.
  // A signal also ends at once whatever wait a silent or slow peer holds the
  // loop in, and from then on the ports wait for nothing.
  const std::unique_ptr<SignalEvents> signalEvents = SignalEvents::watch(
      runLoop, SignalEvents::terminationSignals(),
      [&ports](int signal) {
        log::printf(log::kNotice, "corvane-telephonyd stopping on signal %d", signal);
        ports.stopWaiting();
        QCoreApplication::quit();
      },
      error);
  if (!signalEvents) return fail(error);
  ports.interruptWaitsWhenReadable(signalEvents->pendingDescriptor());
  if (options.diag) {
    source = DiagPortSource::open(runLoop, *options.diag, options.technology, error);
    if (!source) return fail(error);
  }
  const std::string sourceLine = sourceText(options, *source);
  const double rate = options.replay && options.asFastAsPossible ? 0 : options.rate;
  TelephonyService service(ports, runLoop, std::move(source), {rate, options.packetLimit});
  if (options.diag) {
    // On a real modem the SIM files, cell list and PDP contexts come from ModemManager.
    service.setModemExtraCodes(std::make_unique<ModemExtraCodes>(
        runLoop, std::make_unique<ModemManagerClient>(runLoop, ModemManagerClient::Settings{options.modem,
                                                                                             *options.diag})));
  }
  if (!service.start(error)) {
    const std::string path = ports.socketPath(std::string(kTelephonyServicePortName)).string();
    if (ports.createSocketRemotePort(std::string(kTelephonyServicePortName))) {
      return fail("another corvane-telephonyd is already serving " + path);
    }
    return fail(error);
  }

  log::printf(log::kNotice, "corvane-telephonyd %s serving %s: %s", kVersion,
              ports.socketPath(std::string(kTelephonyServicePortName)).c_str(), sourceLine.c_str());
  const int status = QCoreApplication::exec();
  service.stop();
  // Repeats of the last line, counted but not yet written.
  log::flush();
  return status;
}
