#pragma once

// A private runtime directory for one test, published through
// CORVANE_RUNTIME_DIR for as long as the test runs.

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include "platform/RuntimeDirectory.h"
#include "support/Process.h"

namespace corvane::test {

class RuntimeTestDirectory {
 public:
  RuntimeTestDirectory() : path_(temporary_.path() + "/run") {
    const char* previous = std::getenv("CORVANE_RUNTIME_DIR");
    hadPrevious_ = previous != nullptr;
    if (previous) previous_ = previous;
    ::setenv("CORVANE_RUNTIME_DIR", path_.c_str(), 1);
    result_ = prepareRuntimeDirectory();
  }
  ~RuntimeTestDirectory() {
    if (hadPrevious_) {
      ::setenv("CORVANE_RUNTIME_DIR", previous_.c_str(), 1);
    } else {
      ::unsetenv("CORVANE_RUNTIME_DIR");
    }
  }
  RuntimeTestDirectory(const RuntimeTestDirectory&) = delete;
  RuntimeTestDirectory& operator=(const RuntimeTestDirectory&) = delete;

  const std::string& path() const { return path_; }
  const RuntimeDirectoryResult& result() const { return result_; }
  // The environment entry that hands this directory to a child process.
  std::string environmentEntry() const { return "CORVANE_RUNTIME_DIR=" + path_; }

 private:
  TemporaryDirectory temporary_;
  std::string path_;
  bool hadPrevious_ = false;
  std::string previous_;
  RuntimeDirectoryResult result_;
};

// Leaves a socket file at `path` as a process that died leaves it: bound, never
// unlinked, with nobody listening. True when the file was made.
inline bool leaveStaleSocket(const std::string& path) {
  const int fd = ::socket(AF_UNIX, SOCK_SEQPACKET, 0);
  if (fd < 0) return false;
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::strncpy(address.sun_path, path.c_str(), sizeof address.sun_path - 1);
  const bool bound = ::bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
  ::close(fd);
  return bound;
}

}  // namespace corvane::test
