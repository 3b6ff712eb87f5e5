#pragma once

// corvane-fake-baseband in the background, for the tests that bridge its
// diagnostic port: its pseudo-terminal linked into a directory, its lines in
// a file there. The test target defines CORVANE_FAKE_BASEBAND_BINARY.

#include <signal.h>

#include <chrono>
#include <fstream>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "support/Process.h"

namespace corvane::test {

class FakeBaseband {
 public:
  FakeBaseband(const std::string& directory, std::vector<std::string> options)
      : link_(directory + "/diag"), log_(directory + "/baseband.log") {
    std::vector<std::string> argv{CORVANE_FAKE_BASEBAND_BINARY, "--link", link_};
    argv.insert(argv.end(), options.begin(), options.end());
    pid_ = startProcess(argv, {}, log_);
    waitFor("listening on");
  }
  ~FakeBaseband() { stopProcess(pid_, SIGTERM); }
  FakeBaseband(const FakeBaseband&) = delete;
  FakeBaseband& operator=(const FakeBaseband&) = delete;

  const std::string& link() const { return link_; }
  std::string lines() const {
    std::ifstream in(log_);
    std::stringstream text;
    text << in.rdbuf();
    return text.str();
  }
  bool waitFor(const std::string& text, std::chrono::milliseconds limit = std::chrono::milliseconds(5000)) const {
    const auto giveUp = std::chrono::steady_clock::now() + limit;
    while (lines().find(text) == std::string::npos) {
      if (std::chrono::steady_clock::now() > giveUp) return false;
      std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return true;
  }

 private:
  std::string link_;
  std::string log_;
  int pid_ = -1;
};

}  // namespace corvane::test
