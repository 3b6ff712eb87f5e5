// Throughput of the log channel: corvane-telephonyd streams its simulator at
// full speed into a local port of this process, exactly as the application
// receives packets (Qt event loop, port callback per packet). The service is
// told to send a fixed number of packets; all of them must arrive.

#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <QCoreApplication>
#include <QTimer>
#include <QUuid>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

#include "ServiceBenchCommandLine.h"
#include "platform/PropertyList.h"
#include "platform/QtRunLoop.h"
#include "platform/RuntimeDirectory.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"

extern char** environ;

namespace {

using namespace corvane;
using Clock = std::chrono::steady_clock;

const ProgramUsage kProgram{
    "transport_bench",
    "Usage: transport_bench [PACKETS] [PATH-TO-corvane-telephonyd]\n",
    "\n"
    "Streams PACKETS packets (default 2000000) from corvane-telephonyd at full\n"
    "speed into a local port and prints the throughput; fails when any is lost.\n",
};

int fail(const std::string& message) {
  std::fprintf(stderr, "transport_bench: %s\n", message.c_str());
  return 1;
}

Bytes command(const Dictionary& fields) { return plist::serializeOrThrow(Value(fields), plist::Format::XML); }

}  // namespace

int main(int argc, char** argv) {
  int exitStatus = 0;
  const auto options = bench::parseServiceBenchOptions(argc, argv, kProgram, 2'000'000ULL, exitStatus);
  if (!options) return exitStatus;
  const unsigned long long packets = options->packets;
  const std::string& daemon = options->daemon;

  char pattern[] = "/tmp/corvane-bench-XXXXXX";
  if (!::mkdtemp(pattern)) return fail("cannot make a temporary directory");
  const std::filesystem::path scratch = pattern;
  const std::string runtimePath = (scratch / "run").string();
  ::setenv("CORVANE_RUNTIME_DIR", runtimePath.c_str(), 1);
  const RuntimeDirectoryResult runtime = prepareRuntimeDirectory();
  if (!runtime) return fail(runtime.error);

  const std::string limit = std::to_string(packets);
  std::vector<std::string> arguments = {daemon, "--rate", "max", "--packets", limit};
  std::vector<char*> argvDaemon;
  for (auto& a : arguments) argvDaemon.push_back(a.data());
  argvDaemon.push_back(nullptr);
  pid_t child = 0;
  if (::posix_spawn(&child, daemon.c_str(), nullptr, nullptr, argvDaemon.data(), environ) != 0) {
    return fail("cannot start " + daemon);
  }

  int qtArgc = 1;
  QCoreApplication application(qtArgc, argv);
  QtRunLoop runLoop;
  SocketPortSystem ports(runtime.path);
  SocketTelephonyClient telephony(ports);

  std::unique_ptr<TelephonyConnection> connection;
  for (int i = 0; i < 200 && !connection; ++i) {
    connection = telephony.TelephonyServerConnectionCreate(nullptr);
    if (!connection) std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  auto finish = [&](int status) {
    ::kill(child, SIGTERM);
    ::waitpid(child, nullptr, 0);
    std::filesystem::remove_all(scratch);
    return status;
  };
  if (!connection) return finish(fail("the service did not come up"));

  unsigned long long received = 0;
  unsigned long long bytes = 0;
  bool wrongId = false;
  Clock::time_point first{};
  Clock::time_point last{};
  const std::string localName = "CorvaneApp." + QUuid::createUuid().toString(QUuid::WithoutBraces).toStdString();
  auto local = ports.createLocalPort(localName, [&](LocalMessagePort&, MessageId id, const Bytes& data) {
    if (received == 0) first = Clock::now();
    wrongId = wrongId || id != 0;
    bytes += data.size();
    if (++received == packets) {
      last = Clock::now();
      QCoreApplication::quit();
    }
    return std::optional<Bytes>();
  });
  if (!local) return finish(fail("cannot create the local port"));
  local->scheduleOn(runLoop);

  std::string remoteName;
  const TelephonyError error = connection->NetworkMonitorCreateLogChannel(localName, remoteName);
  connection.reset();
  if (error.code != 0) return finish(fail("log channel refused, code " + std::to_string(error.code)));
  auto remote = ports.createRemotePort(remoteName);
  if (!remote) return finish(fail("cannot reach the command port"));

  Dictionary query;
  query.set("GetTechnology", Value("GetTechnology"));
  std::optional<Bytes> reply;
  if (remote->sendRequest(0, command(query), 1.0, 1.0, &reply) != kPortSuccess || !reply) {
    return finish(fail("no answer to GetTechnology"));
  }
  Dictionary start;
  start.set("SetState", Value("Streaming"));
  if (remote->sendRequest(0, command(start), 1.0, 0.0, nullptr) != kPortSuccess) {
    return finish(fail("cannot send the start command"));
  }

  // Give up when the stream stalls, which would mean lost packets.
  unsigned long long seen = 0;
  QTimer watchdog;
  QObject::connect(&watchdog, &QTimer::timeout, [&] {
    if (received == seen) QCoreApplication::quit();
    seen = received;
  });
  watchdog.start(3000);
  QCoreApplication::exec();

  if (received != packets) {
    return finish(fail("stream stalled after " + std::to_string(received) + " of " + limit + " packets"));
  }
  if (wrongId) return finish(fail("a packet arrived with a message id other than 0"));
  const double seconds = std::chrono::duration<double>(last - first).count();
  std::printf("%llu packets (%.1f MB) in %.3f s: %.0f packets/s, no loss\n", received, bytes / 1e6, seconds,
              static_cast<double>(received - 1) / seconds);
  return finish(0);
}
