#include "support/Process.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>

namespace corvane::test {

namespace {
std::string readFile(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  std::ostringstream s;
  s << in.rdbuf();
  return s.str();
}
}  // namespace

TemporaryDirectory::TemporaryDirectory() {
  std::string pattern = (std::filesystem::temp_directory_path() / "corvane-test-XXXXXX").string();
  if (!mkdtemp(pattern.data())) throw std::runtime_error("cannot make a temporary directory");
  path_ = pattern;
}

TemporaryDirectory::~TemporaryDirectory() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

std::string TemporaryDirectory::write(const std::string& name, const std::string& contents) const {
  const std::string p = path_ + "/" + name;
  std::ofstream(p, std::ios::binary) << contents;
  return p;
}

namespace {
// Forks a child that reads standard input from `in` and writes standard output
// and error to `out` and `err` (appending), with the extra environment entries.
pid_t spawn(const std::vector<std::string>& argv, const std::vector<std::string>& extraEnvironment,
            const std::string& in, const std::string& out, const std::string& err) {
  const pid_t pid = fork();
  if (pid < 0) throw std::runtime_error("fork failed");
  if (pid > 0) return pid;
  const int inFd = open(in.c_str(), O_RDONLY);
  const int outFd = open(out.c_str(), O_WRONLY | O_CREAT | O_APPEND, 0600);
  const int errFd = out == err ? outFd : open(err.c_str(), O_WRONLY | O_CREAT | O_APPEND, 0600);
  if (inFd < 0 || outFd < 0 || errFd < 0) _exit(127);
  dup2(inFd, 0);
  dup2(outFd, 1);
  dup2(errFd, 2);
  for (const auto& e : extraEnvironment) putenv(const_cast<char*>(e.c_str()));
  std::vector<char*> args;
  for (const auto& a : argv) args.push_back(const_cast<char*>(a.c_str()));
  args.push_back(nullptr);
  execv(args[0], args.data());
  _exit(127);
}

int exitStatus(int status) { return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status); }
}  // namespace

ProcessResult runProcess(const std::vector<std::string>& argv, const std::string& input,
                         const std::vector<std::string>& extraEnvironment) {
  TemporaryDirectory dir;
  const std::string in = dir.write("stdin", input);
  const std::string out = dir.path() + "/stdout";
  const std::string err = dir.path() + "/stderr";
  const pid_t pid = spawn(argv, extraEnvironment, in, out, err);
  int status = 0;
  waitpid(pid, &status, 0);
  ProcessResult result;
  result.exitCode = exitStatus(status);
  result.out = readFile(out);
  result.err = readFile(err);
  return result;
}

int startProcess(const std::vector<std::string>& argv, const std::vector<std::string>& extraEnvironment,
                 const std::string& logFile) {
  const std::string log = logFile.empty() ? "/dev/null" : logFile;
  return spawn(argv, extraEnvironment, "/dev/null", log, log);
}

int stopProcess(int pid, int signal) {
  kill(pid, signal);
  int status = 0;
  waitpid(pid, &status, 0);
  return exitStatus(status);
}

}  // namespace corvane::test
