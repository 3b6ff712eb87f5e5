#pragma once

// A private D-Bus bus of the test's own (dbus-daemon), with the mock
// ModemManager of mock_modemmanager.py (python3-dbusmock) started on it when
// the test asks, for the tests of the ModemManager client and of the service
// that uses it. The test target defines CORVANE_DBUS_DAEMON,
// CORVANE_DBUSMOCK_PYTHON and CORVANE_SOURCE_DIR.

#include <signal.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <functional>
#include <sstream>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "support/Process.h"

namespace corvane::test {

inline std::string fileText(const std::string& path) {
  std::ifstream in(path);
  std::stringstream text;
  text << in.rdbuf();
  return text.str();
}

// Polls `done` every 20 ms (running `between` before each look, when given) until it holds or `limit` has passed.
inline bool waitUntil(const std::function<bool()>& done, std::chrono::milliseconds limit,
                      const std::function<void()>& between = {}) {
  const auto giveUp = std::chrono::steady_clock::now() + limit;
  for (;;) {
    if (between) between();
    if (done()) return true;
    if (std::chrono::steady_clock::now() > giveUp) return false;
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
  }
}

// A process of the test, stopped with SIGTERM when it goes.
class Background {
 public:
  Background() = default;
  Background(const std::vector<std::string>& argv, const std::vector<std::string>& environment,
             const std::string& log)
      : pid_(startProcess(argv, environment, log)) {}
  ~Background() { stop(); }
  Background(Background&& other) noexcept : pid_(std::exchange(other.pid_, -1)) {}
  Background& operator=(Background&& other) noexcept {
    stop();
    pid_ = std::exchange(other.pid_, -1);
    return *this;
  }
  // The exit status, as stopProcess gives it; -1 when nothing runs.
  int stop() { return pid_ > 0 ? stopProcess(std::exchange(pid_, -1), SIGTERM) : -1; }

 private:
  int pid_ = -1;
};

class MockModemManagerBus {
 public:
  // Why the mock cannot run on this machine; empty when it can.
  static std::string missing() {
    if (!std::filesystem::exists(CORVANE_DBUS_DAEMON)) return "dbus-daemon is not installed (scripts/deps.sh)";
    if (runProcess({CORVANE_DBUSMOCK_PYTHON, "-c", "import dbusmock"}).exitCode != 0) {
      return std::string(CORVANE_DBUSMOCK_PYTHON) +
             " has no dbusmock module: python3-dbusmock is not installed (scripts/deps.sh)";
    }
    return {};
  }

  // Starts the bus; its files (socket, logs) go into `directory`.
  explicit MockModemManagerBus(std::string directory)
      : directory_(std::move(directory)), address_("unix:path=" + directory_ + "/bus") {
    bus_ = Background({CORVANE_DBUS_DAEMON, "--session", "--nofork", "--nopidfile", "--address=" + address_}, {},
                      directory_ + "/bus.log");
  }
  // Whether the bus has come up (within five seconds).
  bool ready() const {
    return waitUntil([&] { return std::filesystem::exists(directory_ + "/bus"); }, std::chrono::seconds(5));
  }
  std::string busLog() const { return fileText(directory_ + "/bus.log"); }

  // The bus's address, and the environment entry that makes it a program's system bus.
  const std::string& address() const { return address_; }
  std::string systemBusVariable() const { return "DBUS_SYSTEM_BUS_ADDRESS=" + address_; }

  // Starts ModemManager with the template's parameters (a JSON object, see mock_modemmanager.py).
  void startModemManager(const std::string& parameters = "{}") {
    modemManager_ = Background({CORVANE_DBUSMOCK_PYTHON, "-m", "dbusmock", "--system", "-t", script(), "-p",
                                parameters},
                               {systemBusVariable()}, directory_ + "/modemmanager.log");
  }
  // Tells the running mock to "remove-modem" or "add-modem".
  ProcessResult control(const std::string& command) const {
    return runProcess({CORVANE_DBUSMOCK_PYTHON, script(), command}, "", {systemBusVariable()});
  }

 private:
  static std::string script() { return std::string(CORVANE_SOURCE_DIR) + "/tests/telephonyd/mock_modemmanager.py"; }

  std::string directory_;
  std::string address_;
  Background bus_;
  Background modemManager_;
};

}  // namespace corvane::test
