#pragma once

// Runs a program for a test, with the given standard input, and collects its
// standard output, standard error and exit status.

#include <string>
#include <vector>

namespace corvane::test {

struct ProcessResult {
  int exitCode = -1;  // the exit status, or 128 + signal number when killed by a signal
  std::string out;
  std::string err;
};

ProcessResult runProcess(const std::vector<std::string>& argv, const std::string& input = "",
                         const std::vector<std::string>& extraEnvironment = {});

// Starts a program in the background with extra environment entries ("NAME=value");
// its standard output and error go to `logFile` when given, else to /dev/null.
int startProcess(const std::vector<std::string>& argv, const std::vector<std::string>& extraEnvironment = {},
                 const std::string& logFile = "");
// Sends the signal and waits for the process; returns its exit status as runProcess does.
int stopProcess(int pid, int signal);

// A fresh temporary directory, removed with everything in it when the object dies.
class TemporaryDirectory {
 public:
  TemporaryDirectory();
  ~TemporaryDirectory();
  TemporaryDirectory(const TemporaryDirectory&) = delete;
  TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;
  const std::string& path() const { return path_; }
  // Writes a file in the directory and returns its path.
  std::string write(const std::string& name, const std::string& contents) const;

 private:
  std::string path_;
};

}  // namespace corvane::test
