// The cost of one line of log::printf into the system log, with and without a
// log daemon listening:
//   SystemLog      the production sink (makeSystemLogSink: repeats collapsed,
//                  then syslog(3) over one kept connection, a daemon looked
//                  for at most once a second);
//   SyslogPerLine  the sink as it was before: syslog(3) per line, opened
//                  without LOG_NDELAY, wanting every line the mask lets
//                  through; without a daemon syslog(3) then makes, connects
//                  and closes a socket for every line.
// Each runs with distinct lines ("Distinct": a packet number in every line)
// and with one line repeated ("Repeated").
//   BM_LogPrintf/Unwanted  a line no sink wants, as a decoder's per-packet
//                  traces are when nobody reads them: what log::printf costs
//                  before it learns that, with nothing formatted.
//
// The bench plays the daemon itself, on /dev/log of a /dev of its own (a
// private mount namespace over a fresh tmpfs), so that the machine's own log
// is neither needed nor touched; a thread reads and drops every datagram, as
// fast as a daemon that writes nowhere. Making the namespace needs root; without
// it the cases with a daemon are skipped, and so are those without one if the
// machine has a log daemon of its own.

#include <benchmark/benchmark.h>
#include <poll.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <syslog.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string>
#include <thread>

#include "platform/Log.h"

namespace {

using namespace corvane;

// The sink before: syslog(3) for every line.
class SyslogPerLineSink final : public log::Sink {
 public:
  SyslogPerLineSink() { openlog("corvane", LOG_PID, LOG_USER); }
  void write(int priority, std::string_view text) override {
    syslog(priority, "%.*s", static_cast<int>(text.size()), text.data());
  }
  bool wants(int priority) const override { return (setlogmask(0) & LOG_MASK(LOG_PRI(priority))) != 0; }
};

// A log daemon on /dev/log that reads every datagram and drops it.
class DroppingLogDaemon {
 public:
  bool start() {
    fd_ = ::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, log::systemLogSocket(), sizeof address.sun_path - 1);
    if (fd_ < 0 || ::bind(fd_, reinterpret_cast<sockaddr*>(&address), sizeof address) != 0) return false;
    reader_ = std::thread([this] {
      char datagram[2048];
      while (!stopping_.load()) {
        pollfd p{fd_, POLLIN, 0};
        if (::poll(&p, 1, 10) == 1) {
          received_.fetch_add(1, std::memory_order_relaxed);
          [[maybe_unused]] const ssize_t n = ::recv(fd_, datagram, sizeof datagram, 0);
        }
      }
    });
    return true;
  }
  ~DroppingLogDaemon() {
    stopping_.store(true);
    if (reader_.joinable()) reader_.join();
    if (fd_ >= 0) {
      ::close(fd_);
      ::unlink(log::systemLogSocket());
    }
  }
  std::uint64_t received() const { return received_.load(); }

 private:
  int fd_ = -1;
  std::atomic<bool> stopping_{false};
  std::atomic<std::uint64_t> received_{0};
  std::thread reader_;
};

enum class Daemon { Absent, Listening };
enum class Sink { SystemLog, SyslogPerLine };
enum class Lines { Distinct, Repeated };

// Set in main: whether each case can be run here.
bool privateDev = false;
bool hostDaemon = false;

void logLines(benchmark::State& state, Daemon daemon, Sink sinkKind, Lines lines) {
  if (daemon == Daemon::Listening && !privateDev) {
    state.SkipWithError("no private /dev to play the log daemon in (needs root)");
    return;
  }
  if (daemon == Daemon::Absent && hostDaemon) {
    state.SkipWithError("this machine has a log daemon of its own");
    return;
  }
  std::unique_ptr<DroppingLogDaemon> server;
  if (daemon == Daemon::Listening) {
    server = std::make_unique<DroppingLogDaemon>();
    if (!server->start()) {
      state.SkipWithError("cannot play the log daemon");
      return;
    }
  }
  const auto previous = log::sink();
  log::setSink(sinkKind == Sink::SystemLog ? log::makeSystemLogSink() : std::make_shared<SyslogPerLineSink>());
  int packet = 0;
  for (auto _ : state) {
    log::printf(log::kError, "Channel corvane-telephonyd.channel.7: packet %d dropped for a slow client",
                lines == Lines::Distinct ? ++packet : 0);
  }
  log::setSink(previous);  // the sink goes, and writes the repeats it counted
  state.counters["lines_per_second"] =
      benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
  if (server) {
    state.counters["received_per_line"] =
        static_cast<double>(server->received()) / static_cast<double>(state.iterations());
  }
}

// Wants no line, as corvane-decode -q's sink.
class WantsNothingSink final : public log::Sink {
 public:
  void write(int, std::string_view) override {}
  bool wants(int) const override { return false; }
};

void unwantedLine(benchmark::State& state) {
  const auto previous = log::sink();
  log::setSink(std::make_shared<WantsNothingSink>());
  int packet = 0;
  for (auto _ : state) {
    log::printf(log::kWarning, "Number of neighboring cells being reported: %d", ++packet);
  }
  log::setSink(previous);
  state.counters["lines_per_second"] =
      benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

// A /dev of this process's own, empty, where /dev/log can be made and removed
// freely. Must run before any thread starts.
bool enterPrivateDev() {
  if (::unshare(CLONE_NEWNS) != 0) return false;
  if (::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) return false;
  return ::mount("tmpfs", "/dev", "tmpfs", 0, "mode=0755") == 0;
}

}  // namespace

int main(int argc, char** argv) {
  privateDev = enterPrivateDev();
  hostDaemon = !privateDev && log::logDaemonListens(log::systemLogSocket());
  if (!privateDev) std::fprintf(stderr, "log_bench: no private /dev: %s\n", std::strerror(errno));

  for (const Daemon daemon : {Daemon::Absent, Daemon::Listening}) {
    for (const Sink sink : {Sink::SystemLog, Sink::SyslogPerLine}) {
      for (const Lines lines : {Lines::Distinct, Lines::Repeated}) {
        const std::string name = std::string("BM_LogPrintf/") +
                                 (daemon == Daemon::Absent ? "NoDaemon/" : "Daemon/") +
                                 (sink == Sink::SystemLog ? "SystemLog/" : "SyslogPerLine/") +
                                 (lines == Lines::Distinct ? "Distinct" : "Repeated");
        benchmark::RegisterBenchmark(name.c_str(), logLines, daemon, sink, lines);
      }
    }
  }
  benchmark::RegisterBenchmark("BM_LogPrintf/Unwanted", unwantedLine);
  benchmark::Initialize(&argc, argv);
  if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
  benchmark::RunSpecifiedBenchmarks();
  benchmark::Shutdown();
  return 0;
}
