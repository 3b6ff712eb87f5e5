// corvane-demo as a process: it refuses to start without a display, and it
// stops the telephony service whenever the application ends, whether the
// application quits or the demo itself is interrupted.

#include <gtest/gtest.h>

#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "platform/Version.h"
#include "support/FakeBaseband.h"
#include "support/Process.h"

namespace corvane {
namespace {

using namespace std::chrono_literals;

const std::string kDemo = CORVANE_DEMO_BINARY;

std::string readFile(const std::string& path) {
  std::ifstream in(path);
  std::stringstream text;
  text << in.rdbuf();
  return text.str();
}

// The processes whose parent is `parent`, with their command names.
std::vector<std::pair<int, std::string>> childrenOf(int parent) {
  std::vector<std::pair<int, std::string>> children;
  for (const auto& entry : std::filesystem::directory_iterator("/proc")) {
    const std::string name = entry.path().filename().string();
    if (name.find_first_not_of("0123456789") != std::string::npos) continue;
    const std::string stat = readFile(entry.path().string() + "/stat");
    // "pid (comm) state ppid ...": the command may hold blanks, so read from its closing parenthesis.
    const std::size_t close = stat.rfind(')');
    const std::size_t open = stat.find('(');
    if (close == std::string::npos || open == std::string::npos) continue;
    std::istringstream rest(stat.substr(close + 2));
    char state = 0;
    int ppid = 0;
    rest >> state >> ppid;
    if (ppid == parent && state != 'Z') children.emplace_back(std::stoi(name), stat.substr(open + 1, close - open - 1));
  }
  return children;
}

bool alive(int pid) {
  return pid > 0 && ::kill(pid, 0) == 0 &&
         readFile("/proc/" + std::to_string(pid) + "/stat").find(") Z") == std::string::npos;
}

template <typename Condition>
bool waitUntil(Condition condition, std::chrono::seconds limit = 20s) {
  const auto deadline = std::chrono::steady_clock::now() + limit;
  while (std::chrono::steady_clock::now() < deadline) {
    if (condition()) return true;
    std::this_thread::sleep_for(50ms);
  }
  return condition();
}

class DemoLauncher : public ::testing::Test {
 protected:
  std::vector<std::string> environment() const {
    return {"QT_QPA_PLATFORM=offscreen", "XDG_CONFIG_HOME=" + dir_.path() + "/config",
            "XDG_STATE_HOME=" + dir_.path() + "/state", "DBUS_SESSION_BUS_ADDRESS=unix:path=/nonexistent/bus"};
  }

  // Starts the demo and waits for the application and the service to run.
  void start(std::vector<std::string> options = {"--seed", "5"}) {
    std::vector<std::string> argv{kDemo, "--device-root", dir_.path() + "/device"};
    argv.insert(argv.end(), options.begin(), options.end());
    demo_ = test::startProcess(argv, environment(), output());
    // Both children, once each has become its program (between fork and exec a child still has the demo's name).
    ASSERT_TRUE(waitUntil([&] {
      app_ = service_ = -1;
      for (const auto& [pid, name] : childrenOf(demo_)) {
        if (name == "corvane") app_ = pid;
        if (name.rfind("corvane-teleph", 0) == 0) service_ = pid;  // the kernel keeps 15 characters
      }
      return app_ > 0 && service_ > 0;
    })) << readFile(output());
    ASSERT_GT(app_, 0);
    ASSERT_GT(service_, 0);
    ASSERT_TRUE(waitUntil([&] { return readFile(output()).find("snapshots are saved in") != std::string::npos; }));
    // The application has launched once it has switched the status-bar preference on.
    ASSERT_TRUE(waitUntil([&] { return homeScreenPreference().find("ZLShowGSMRSSI=true") != std::string::npos; }));
  }

  ~DemoLauncher() override {
    if (alive(demo_)) test::stopProcess(demo_, SIGKILL);
    for (int pid : {app_, service_}) {
      if (alive(pid)) ::kill(pid, SIGKILL);
    }
  }

  std::string output() const { return dir_.path() + "/demo.log"; }
  std::string homeScreenPreference() const {
    return readFile(dir_.path() + "/config/corvane/org.corvane.HomeScreen.conf");
  }

  test::TemporaryDirectory dir_;
  int demo_ = -1;
  int app_ = -1;
  int service_ = -1;
};

TEST_F(DemoLauncher, WithoutADisplayItSaysSoInOneLineNamingTheHeadlessWays) {
  const test::ProcessResult result =
      test::runProcess({kDemo}, "", {"DISPLAY=", "WAYLAND_DISPLAY=", "QT_QPA_PLATFORM="});
  EXPECT_NE(result.exitCode, 0);
  EXPECT_EQ(result.out, "");
  ASSERT_FALSE(result.err.empty());
  EXPECT_EQ(result.err.find('\n'), result.err.size() - 1) << result.err;
  EXPECT_NE(result.err.find("xvfb-run"), std::string::npos);
  EXPECT_NE(result.err.find("corvane-monitor"), std::string::npos);

  // A platform that needs a display it does not have counts as none.
  const test::ProcessResult xcb = test::runProcess({kDemo}, "", {"DISPLAY=", "WAYLAND_DISPLAY=", "QT_QPA_PLATFORM=xcb"});
  EXPECT_NE(xcb.exitCode, 0);
  EXPECT_NE(xcb.err.find("xvfb-run"), std::string::npos);
}

TEST_F(DemoLauncher, RejectsArgumentsItDoesNotKnow) {
  const test::ProcessResult result = test::runProcess({kDemo, "--frobnicate"});
  EXPECT_EQ(result.exitCode, 2);
  EXPECT_EQ(result.err.rfind("corvane-demo: unknown option '--frobnicate'\nUsage: corvane-demo", 0), 0u)
      << result.err;
  EXPECT_EQ(test::runProcess({kDemo, "--seed", "many"}).exitCode, 2);
  EXPECT_EQ(test::runProcess({kDemo, "extra"}).exitCode, 2);
  const test::ProcessResult speed = test::runProcess({kDemo, "--speed", "2"});
  EXPECT_EQ(speed.exitCode, 2);
  EXPECT_EQ(speed.err.rfind("corvane-demo: --speed is for --replay\n", 0), 0u) << speed.err;
  const test::ProcessResult modem = test::runProcess({kDemo, "--modem", "0"});
  EXPECT_EQ(modem.exitCode, 2);
  EXPECT_EQ(modem.err.rfind("corvane-demo: --modem is for --diag\n", 0), 0u) << modem.err;
}

TEST_F(DemoLauncher, ABridgeHandsThePortAndTheModemToTheService) {
  const test::FakeBaseband baseband(dir_.path(), {});
  const std::string& port = baseband.link();
  ASSERT_NO_FATAL_FAILURE(start({"--diag", port, "--technology", "Quendra_LTE", "--modem", "2"}));
  std::string commandLine = readFile("/proc/" + std::to_string(service_) + "/cmdline");
  std::replace(commandLine.begin(), commandLine.end(), '\0', ' ');
  EXPECT_NE(commandLine.find(" --diag " + port + " --technology Quendra_LTE --modem 2"), std::string::npos)
      << commandLine;
  EXPECT_EQ(commandLine.find("--seed"), std::string::npos) << commandLine;
}

TEST_F(DemoLauncher, AReplayHandsTheCaptureToTheServiceByItsWholePath) {
  ASSERT_NO_FATAL_FAILURE(start({"--replay", CORVANE_SOURCE_DIR "/tools/samples/lte-session.hex", "--loop"}));
  std::string commandLine = readFile("/proc/" + std::to_string(service_) + "/cmdline");
  std::replace(commandLine.begin(), commandLine.end(), '\0', ' ');
  EXPECT_NE(commandLine.find(" --replay " CORVANE_SOURCE_DIR "/tools/samples/lte-session.hex --loop"),
            std::string::npos)
      << commandLine;
  EXPECT_EQ(commandLine.find("--seed"), std::string::npos) << commandLine;
  EXPECT_NE(readFile(output()).find("a replay of " CORVANE_SOURCE_DIR "/tools/samples/lte-session.hex"),
            std::string::npos);
}

TEST_F(DemoLauncher, HelpAndVersionNeedNoDisplayAndStartNothing) {
  const std::vector<std::string> headless{"DISPLAY=", "WAYLAND_DISPLAY=", "QT_QPA_PLATFORM="};
  const test::ProcessResult help = test::runProcess({kDemo, "--help"}, "", headless);
  EXPECT_EQ(help.exitCode, 0);
  EXPECT_EQ(help.out.rfind("Usage: corvane-demo", 0), 0u) << help.out;
  EXPECT_NE(help.out.find("--device-root DIR"), std::string::npos);
  const test::ProcessResult version = test::runProcess({kDemo, "--version"}, "", headless);
  EXPECT_EQ(version.exitCode, 0);
  EXPECT_EQ(version.out, std::string("corvane-demo ") + kVersion + "\n");
}

TEST_F(DemoLauncher, WhenTheApplicationQuitsTheServiceStopsToo) {
  ASSERT_NO_FATAL_FAILURE(start());
  // Saving is on: the device root holds the marker, and the snapshot directory is there.
  EXPECT_TRUE(std::filesystem::is_directory(dir_.path() +
                                            "/device/OstrelInternal/Library/PreferenceBundles/Carrier Settings.bundle"));
  EXPECT_TRUE(std::filesystem::is_directory(dir_.path() + "/device/var/log/corvane/snapshots"));
  EXPECT_NE(readFile(output()).find(dir_.path() + "/device/var/log/corvane/snapshots"), std::string::npos);

  ASSERT_GT(app_, 0);
  ::kill(app_, SIGTERM);  // as when its window closes: the application ends on its own
  ASSERT_TRUE(waitUntil([&] { return !alive(demo_); }));
  EXPECT_EQ(test::stopProcess(demo_, SIGKILL), 0);
  EXPECT_FALSE(alive(service_));
  EXPECT_FALSE(alive(app_));
  // The application ended cleanly: the status-bar preference is back.
  EXPECT_NE(homeScreenPreference().find("ZLShowGSMRSSI=false"), std::string::npos);
}

TEST_F(DemoLauncher, AnInterruptStopsTheApplicationAndTheService) {
  ASSERT_NO_FATAL_FAILURE(start());
  EXPECT_EQ(test::stopProcess(demo_, SIGINT), 0);
  EXPECT_TRUE(waitUntil([&] { return !alive(service_) && !alive(app_); }, 5s));
  EXPECT_NE(homeScreenPreference().find("ZLShowGSMRSSI=false"), std::string::npos);
}

}  // namespace
}  // namespace corvane
