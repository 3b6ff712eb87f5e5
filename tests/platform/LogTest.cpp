#include "platform/Log.h"

#include <gtest/gtest.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstring>

#include "support/Process.h"

namespace corvane {
namespace {

TEST(Log, CapturedLinesKeepPriorityAndExactText) {
  log::ScopedCapture capture;
  log::printf(log::kError, "_TSServerConnectionNetworkMonitorCreateLogChannel returns error: %ld!", 7L);
  log::write(16, " ***** raw");
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{
                                 {3, "_TSServerConnectionNetworkMonitorCreateLogChannel returns error: 7!"},
                                 {16, " ***** raw"},
                             }));
}

TEST(Log, ScopedCaptureRestoresThePreviousSink) {
  auto outer = std::make_shared<log::CapturingSink>();
  log::setSink(outer);
  {
    log::ScopedCapture inner;
    log::write(4, "inside");
    EXPECT_EQ(inner.sink().count("inside"), 1u);
  }
  log::write(4, "outside");
  EXPECT_EQ(outer->texts(), std::vector<std::string>{"outside"});
  log::setSink(log::makeSystemLogSink());
}

TEST(Log, TeeSinkWritesToEverySink) {
  auto a = std::make_shared<log::CapturingSink>();
  auto b = std::make_shared<log::CapturingSink>();
  log::TeeSink tee({a, b});
  tee.write(5, "both");
  EXPECT_EQ(a->lines(), b->lines());
  EXPECT_EQ(a->count("both"), 1u);
}

// Takes only failures (levels 0-3), as a sink that ignores traces would.
class ErrorsOnlySink final : public log::Sink {
 public:
  void write(int priority, std::string_view text) override { lines_.push_back({priority, std::string(text)}); }
  bool wants(int priority) const override { return priority <= log::kError; }
  std::vector<log::Line> lines_;
};

TEST(Log, LinesTheSinkDoesNotWantAreNeverHandedToIt) {
  auto errors = std::make_shared<ErrorsOnlySink>();
  auto previous = log::sink();
  log::setSink(errors);
  log::printf(log::kWarning, "trace %d", 1);
  log::write(log::kWarning, "trace");
  log::printf(log::kError, "failure %d", 2);
  log::write(log::kError, "failure");
  EXPECT_FALSE(log::wants(log::kWarning));
  EXPECT_TRUE(log::wants(log::kError));
  log::setSink(previous);
  EXPECT_EQ(errors->lines_, (std::vector<log::Line>{{3, "failure 2"}, {3, "failure"}}));
}

TEST(Log, ATeeWantsWhatAnyOfItsSinksWantsAndHandsEachOnlyThat) {
  auto all = std::make_shared<log::CapturingSink>();
  auto errors = std::make_shared<ErrorsOnlySink>();
  log::TeeSink tee({all, errors});
  EXPECT_TRUE(tee.wants(log::kWarning));
  tee.write(log::kWarning, "trace");
  tee.write(log::kError, "failure");
  EXPECT_EQ(all->texts(), (std::vector<std::string>{"trace", "failure"}));
  EXPECT_EQ(errors->lines_, (std::vector<log::Line>{{3, "failure"}}));
  EXPECT_FALSE(log::TeeSink({errors}).wants(log::kWarning));
}

// A clock that tests move by hand.
struct ManualClock {
  std::chrono::steady_clock::time_point now{std::chrono::hours(1)};
  log::SteadyClock function() {
    return [this] { return now; };
  }
};

TEST(Log, TheSyslogSinkWantsWhatTheSyslogMaskLetsThrough) {
  ManualClock clock;
  log::SyslogSink syslogSink([] { return true; }, clock.function());
  EXPECT_TRUE(syslogSink.wants(log::kWarning));
  EXPECT_TRUE(syslogSink.wants(16));
  const int previous = setlogmask(LOG_UPTO(LOG_ERR));
  EXPECT_FALSE(syslogSink.wants(log::kWarning));
  EXPECT_FALSE(syslogSink.wants(log::kNotice));
  EXPECT_TRUE(syslogSink.wants(log::kError));
  // 16 carries no level bits of its own: it is level 0 to the mask.
  EXPECT_TRUE(syslogSink.wants(16));
  setlogmask(previous);
}

TEST(Log, LinesLongerThanTheUsualAreFormattedWhole) {
  log::ScopedCapture capture;
  const std::string longText(1000, 'x');
  log::printf(log::kError, "%s|%d", longText.c_str(), 42);
  log::printf(log::kError, "%s", std::string(255, 'y').c_str());
  log::printf(log::kError, "%s", std::string(256, 'z').c_str());
  EXPECT_EQ(capture.texts(),
            (std::vector<std::string>{longText + "|42", std::string(255, 'y'), std::string(256, 'z')}));
}

TEST(Log, PointersShowAsHexWithNullAsZero) {
  EXPECT_EQ(log::pointerText(nullptr), "0x0");
  EXPECT_EQ(log::pointerText(reinterpret_cast<const void*>(0x55d0c0ffee10)), "0x55d0c0ffee10");
}

TEST(Log, WithoutALogDaemonTheSyslogSinkWantsNothingAndLooksForOneAtMostOnceASecond) {
  ManualClock clock;
  bool listening = false;
  int checks = 0;
  log::SyslogSink syslogSink(
      [&] {
        ++checks;
        return listening;
      },
      clock.function());
  EXPECT_EQ(checks, 1);
  for (int i = 0; i < 10000; ++i) {
    ASSERT_FALSE(syslogSink.wants(log::kError));
    syslogSink.write(log::kError, "nobody hears this");
    clock.now += std::chrono::microseconds(50);  // half a second in all
  }
  EXPECT_EQ(checks, 1);
  clock.now += std::chrono::milliseconds(500);
  EXPECT_FALSE(syslogSink.wants(log::kError));
  EXPECT_EQ(checks, 2);

  // A daemon that starts is found at the next check, a second on.
  listening = true;
  clock.now += std::chrono::milliseconds(999);
  EXPECT_FALSE(syslogSink.wants(log::kError));
  clock.now += std::chrono::milliseconds(1);
  EXPECT_TRUE(syslogSink.wants(log::kError));
  EXPECT_EQ(checks, 3);
  // While it listens it is still checked once a second, and no more.
  for (int i = 0; i < 1000; ++i) ASSERT_TRUE(syslogSink.wants(log::kWarning));
  EXPECT_EQ(checks, 3);

  // One that goes is noticed within the second.
  listening = false;
  clock.now += std::chrono::seconds(1);
  EXPECT_FALSE(syslogSink.wants(log::kError));
  EXPECT_EQ(checks, 4);
}

TEST(Log, WithoutALogDaemonTheSystemLogWantsNoLineSoNoneIsFormatted) {
  ManualClock clock;
  auto previous = log::sink();
  log::setSink(std::make_shared<log::RepeatCollapsingSink>(
      std::make_shared<log::SyslogSink>([] { return false; }, clock.function()), clock.function()));
  EXPECT_FALSE(log::wants(log::kError));
  EXPECT_FALSE(log::wants(log::kWarning));
  EXPECT_FALSE(log::wants(16));
  log::setSink(previous);
}

TEST(Log, ALogDaemonIsFoundOnItsSocketWhetherDatagramOrStream) {
  test::TemporaryDirectory directory;
  const std::string datagram = directory.path() + "/log-dgram";
  const std::string stream = directory.path() + "/log-stream";
  const std::string stale = directory.path() + "/log-stale";
  auto bound = [](int type, const std::string& path) {
    const int fd = ::socket(AF_UNIX, type | SOCK_CLOEXEC, 0);
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, path.c_str(), sizeof address.sun_path - 1);
    EXPECT_EQ(::bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    return fd;
  };
  const int datagramDaemon = bound(SOCK_DGRAM, datagram);
  const int streamDaemon = bound(SOCK_STREAM, stream);
  ASSERT_EQ(::listen(streamDaemon, 4), 0);
  ::close(bound(SOCK_DGRAM, stale));  // the file of a daemon that died
  EXPECT_TRUE(log::logDaemonListens(datagram.c_str()));
  EXPECT_TRUE(log::logDaemonListens(stream.c_str()));
  EXPECT_FALSE(log::logDaemonListens(stale.c_str()));
  EXPECT_FALSE(log::logDaemonListens((directory.path() + "/none").c_str()));
  ::close(datagramDaemon);
  ::close(streamDaemon);
  EXPECT_FALSE(log::logDaemonListens(datagram.c_str()));
  EXPECT_STREQ(log::systemLogSocket(), "/dev/log");
}

TEST(Log, ALineRepeatedWithinASecondIsWrittenOnceAndItsRepeatsCountedWhenADifferentLineComes) {
  ManualClock clock;
  auto behind = std::make_shared<log::CapturingSink>();
  log::RepeatCollapsingSink sink(behind, clock.function());
  for (int i = 0; i < 10000; ++i) {
    sink.write(log::kWarning, "Channel c: unknown command ignored");
    clock.now += std::chrono::microseconds(90);
  }
  EXPECT_EQ(behind->texts(), std::vector<std::string>{"Channel c: unknown command ignored"});
  sink.write(log::kError, "Port p dropped a connection");
  EXPECT_EQ(behind->lines(), (std::vector<log::Line>{
                                 {4, "Channel c: unknown command ignored"},
                                 {4, "Channel c: unknown command ignored (repeated 9999 more times)"},
                                 {3, "Port p dropped a connection"},
                             }));
}

TEST(Log, RepeatsAreCountedForOneSecondFromTheLineWrittenThenItIsWrittenAgain) {
  ManualClock clock;
  auto behind = std::make_shared<log::CapturingSink>();
  log::RepeatCollapsingSink sink(behind, clock.function());
  sink.write(log::kWarning, "again");
  clock.now += std::chrono::milliseconds(999);
  sink.write(log::kWarning, "again");
  clock.now += std::chrono::milliseconds(1);
  sink.write(log::kWarning, "again");
  clock.now += std::chrono::milliseconds(1001);
  sink.write(log::kWarning, "again");
  EXPECT_EQ(behind->texts(), (std::vector<std::string>{"again", "again (repeated 1 more time)", "again", "again"}));
}

TEST(Log, TheSameTextAtAnotherPriorityIsAnotherLine) {
  ManualClock clock;
  auto behind = std::make_shared<log::CapturingSink>();
  log::RepeatCollapsingSink sink(behind, clock.function());
  sink.write(log::kWarning, "same");
  sink.write(log::kError, "same");
  sink.write(log::kError, "same");
  sink.write(log::kWarning, "same");
  EXPECT_EQ(behind->lines(), (std::vector<log::Line>{
                                 {4, "same"}, {3, "same"}, {3, "same (repeated 1 more time)"}, {4, "same"}}));
}

TEST(Log, RepeatsStillCountedAreWrittenOnFlushAndWhenTheSinkGoes) {
  ManualClock clock;
  auto behind = std::make_shared<log::CapturingSink>();
  {
    auto collapsing = std::make_shared<log::RepeatCollapsingSink>(behind, clock.function());
    auto previous = log::sink();
    log::setSink(std::make_shared<log::TeeSink>(std::vector<std::shared_ptr<log::Sink>>{collapsing}));
    for (int i = 0; i < 3; ++i) log::printf(log::kError, "lost %d", 7);
    log::flush();
    EXPECT_EQ(behind->texts(), (std::vector<std::string>{"lost 7", "lost 7 (repeated 2 more times)"}));
    log::flush();  // nothing more to say
    EXPECT_EQ(behind->texts().size(), 2u);
    log::printf(log::kError, "lost %d", 7);
    log::printf(log::kError, "lost %d", 7);
    log::setSink(previous);
  }
  EXPECT_EQ(behind->texts(),
            (std::vector<std::string>{"lost 7", "lost 7 (repeated 2 more times)", "lost 7 (repeated 2 more times)"}));
}

TEST(Log, TheCollapsingSinkWantsWhatTheSinkBehindItWants) {
  ManualClock clock;
  auto errors = std::make_shared<ErrorsOnlySink>();
  log::RepeatCollapsingSink sink(errors, clock.function());
  EXPECT_FALSE(sink.wants(log::kWarning));
  EXPECT_TRUE(sink.wants(log::kError));
  auto previous = log::sink();
  log::setSink(std::make_shared<log::RepeatCollapsingSink>(errors, clock.function()));
  log::printf(log::kWarning, "trace %d", 1);
  log::printf(log::kError, "failure %d", 2);
  log::setSink(previous);
  EXPECT_EQ(errors->lines_, (std::vector<log::Line>{{3, "failure 2"}}));
}

TEST(Log, ACapturingSinkSeesEveryRepeat) {
  log::ScopedCapture capture;
  for (int i = 0; i < 3; ++i) log::printf(log::kWarning, "trace %d", 1);
  EXPECT_EQ(capture.texts(), (std::vector<std::string>{"trace 1", "trace 1", "trace 1"}));
}

// The whole way to a log daemon, as syslog(3) takes it: in a child process
// with a /dev of its own (a private mount namespace), where the test plays the
// daemon on /dev/log. Needs the right to make namespaces (root in CI).
class FakeLogDaemon {
 public:
  bool start() {
    fd_ = ::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strcpy(address.sun_path, "/dev/log");
    return ::bind(fd_, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
  }
  void stop() {
    ::close(fd_);
    ::unlink("/dev/log");
  }
  std::vector<std::string> received() {
    std::vector<std::string> lines;
    char buffer[2048];
    for (ssize_t n; (n = ::recv(fd_, buffer, sizeof buffer, 0)) > 0;) lines.emplace_back(buffer, n);
    return lines;
  }

 private:
  int fd_ = -1;
};

// What the child found wrong, or "" when all went as it should.
std::string throughALogDaemonThatRestartsAndGoes() {
  if (::unshare(CLONE_NEWNS) != 0) return "skip: no mount namespace: " + std::string(std::strerror(errno));
  if (::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0 ||
      ::mount("tmpfs", "/dev", "tmpfs", 0, "mode=0755") != 0) {
    return "skip: cannot mount a private /dev: " + std::string(std::strerror(errno));
  }
  const std::string tag = "corvane[" + std::to_string(::getpid()) + "]: ";
  auto has = [&](const std::vector<std::string>& lines, const std::string& text) {
    return lines.size() == 1 && lines[0].rfind("<11>", 0) == 0 && lines[0].find(tag + text) != std::string::npos;
  };
  ManualClock clock;
  FakeLogDaemon daemon;
  if (!daemon.start()) return "cannot play the daemon";
  log::SyslogSink sink([] { return log::logDaemonListens(log::systemLogSocket()); }, clock.function());
  if (!sink.wants(log::kError)) return "the daemon was not found";
  sink.write(log::kError, "one");
  if (auto lines = daemon.received(); !has(lines, "one")) return "first line not received";

  // The daemon restarts: a new socket in the old one's place.
  daemon.stop();
  FakeLogDaemon restarted;
  if (!restarted.start()) return "cannot restart the daemon";
  sink.write(log::kError, "two");
  if (auto lines = restarted.received(); !has(lines, "two")) return "no line after the daemon restarted";

  // It goes: a second on, the sink wants nothing.
  restarted.stop();
  clock.now += std::chrono::seconds(1);
  if (sink.wants(log::kError)) return "the daemon's going was not noticed";
  sink.write(log::kError, "unheard");

  // It comes back: a second on, lines go to it again.
  FakeLogDaemon back;
  if (!back.start()) return "cannot start the daemon again";
  clock.now += std::chrono::seconds(1);
  if (!sink.wants(log::kError)) return "the daemon's return was not noticed";
  sink.write(log::kError, "three");
  if (auto lines = back.received(); !has(lines, "three")) return "no line after the daemon came back";
  back.stop();
  return "";
}

TEST(Log, TheSyslogSinkKeepsReachingALogDaemonThatRestartsGoesAndComesBack) {
  int report[2];
  ASSERT_EQ(::pipe(report), 0);
  const pid_t child = ::fork();
  ASSERT_GE(child, 0);
  if (child == 0) {
    const std::string outcome = throughALogDaemonThatRestartsAndGoes();
    [[maybe_unused]] const ssize_t written = ::write(report[1], outcome.data(), outcome.size());
    ::_exit(0);
  }
  ::close(report[1]);
  std::string outcome;
  char buffer[512];
  for (ssize_t n; (n = ::read(report[0], buffer, sizeof buffer)) > 0;) outcome.append(buffer, n);
  ::close(report[0]);
  int status = 0;
  ASSERT_EQ(::waitpid(child, &status, 0), child);
  ASSERT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
  if (outcome.rfind("skip: ", 0) == 0) GTEST_SKIP() << outcome;
  EXPECT_EQ(outcome, "");
}

}  // namespace
}  // namespace corvane

namespace corvane {
namespace {

TEST(Log, TheMessageLogNeverGoesToTheSystemLogAndTheMessageSinkTakesNothingElse) {
  log::SyslogSink syslog([] { return true; }, std::chrono::steady_clock::now);
  EXPECT_FALSE(syslog.wants(log::kMessage));
  log::MessageLogSink messages;
  EXPECT_TRUE(messages.wants(log::kMessage));
  EXPECT_FALSE(messages.wants(log::kWarning));
  EXPECT_FALSE(messages.wants(16));
}

}  // namespace
}  // namespace corvane
