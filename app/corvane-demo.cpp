// corvane-demo: Corvane with its telephony service on one desktop. It starts
// corvane-telephonyd with the built-in simulator in a private runtime
// directory, then the application with a device root that holds the marker
// that offers saving, and stops the service (and removes the runtime
// directory) when the application quits, or when the demo is interrupted.

#include <fcntl.h>
#include <spawn.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>
#include <thread>
#include <vector>

#include "app/DisplayCheck.h"
#include "platform/CommandLine.h"
#include "platform/DevicePaths.h"

extern char** environ;

namespace {

namespace fs = std::filesystem;
using namespace std::chrono_literals;

constexpr int kExitFailure = 1;
constexpr auto kServiceStartLimit = 5s;
constexpr auto kServiceStopLimit = 3s;

const corvane::ProgramUsage kProgram{
    "corvane-demo",
    "Usage: corvane-demo [--technology NAME] [--seed N] [--device-root DIR]\n"
    "       corvane-demo --replay FILE [--technology NAME] [--speed X] [--loop] [--device-root DIR]\n"
    "       corvane-demo --diag DEVICE --technology NAME [--modem MODEM] [--device-root DIR]\n"
    "       corvane-demo --tui [OPTIONS]\n",
    "\n"
    "Starts the telephony service with its built-in simulator, playing a\n"
    "capture, or bridging a baseband's diagnostic port, and the Corvane\n"
    "application connected to it. Quitting the application, Ctrl-C or SIGTERM\n"
    "stop both.\n"
    "\n"
    "Options:\n"
    "  -t, --technology NAME  the simulated baseband (default: IFX)\n"
    "  -s, --seed N           the simulator's seed (default: 1)\n"
    "      --replay FILE      play a capture (DLF, framed stream, hex lines or a\n"
    "                         snapshot) instead of simulating; its technology is\n"
    "                         told by its log codes unless --technology is given\n"
    "      --speed X          play the capture at X times its pace (default: 1)\n"
    "      --loop             start the capture again after its end\n"
    "      --diag DEVICE      bridge a baseband's diagnostic port (needs --technology)\n"
    "      --modem MODEM      with --diag: the ModemManager modem that gives the\n"
    "                         SIM, cell list and PDP contexts, by index, object\n"
    "                         path or IMEI (default: the one with the port)\n"
    "  -d, --device-root DIR  the phone's file system for the application: it\n"
    "                         holds the marker that offers saving and the\n"
    "                         snapshots (default: $XDG_STATE_HOME/corvane/demo-device,\n"
    "                         else ~/.local/state/corvane/demo-device)\n"
    "      --tui              run corvane-tui, the screens in this terminal, instead\n"
    "                         of the window (no display needed); the service's\n"
    "                         messages go to var/log/corvane/corvane-telephonyd.log\n"
    "                         below the device root\n"
    "  -h, --help             show this help\n"
    "  -V, --version          show the version\n"
    "\n"
    "Needs a display, unless --tui; without one, run it under xvfb-run -a, use\n"
    "--tui, or use corvane-monitor.\n",
};

int fail(const std::string& message) {
  std::fprintf(stderr, "corvane-demo: %s\n", message.c_str());
  return kExitFailure;
}

fs::path defaultDeviceRoot() {
  const char* state = std::getenv("XDG_STATE_HOME");
  if (state && *state == '/') return fs::path(state) / "corvane" / "demo-device";
  const char* home = std::getenv("HOME");
  return fs::path(home && *home ? home : "/tmp") / ".local" / "state" / "corvane" / "demo-device";
}

// The programs live next to this one once installed; in the build tree the
// service is in its own directory.
fs::path findProgram(const std::string& name, const std::vector<fs::path>& candidates) {
  for (const fs::path& candidate : candidates) {
    std::error_code error;
    if (fs::is_regular_file(candidate, error) && ::access(candidate.c_str(), X_OK) == 0) return candidate;
  }
  return name;  // left to PATH
}

// Starts a program with the termination signals at their defaults and unblocked,
// and with `extra` ("NAME=value") added to the environment.
// `output`, when given, takes the child's standard output and error (appended).
pid_t spawn(const std::vector<std::string>& argv, const std::vector<std::string>& extra, std::string& error,
            const fs::path* output = nullptr) {
  std::vector<std::string> environment;
  for (char** entry = environ; *entry; ++entry) {
    const std::string text = *entry;
    bool replaced = false;
    for (const std::string& e : extra) {
      const std::string prefix = e.substr(0, e.find('=') + 1);  // "NAME="
      replaced |= text.rfind(prefix, 0) == 0;
    }
    if (!replaced) environment.push_back(text);
  }
  environment.insert(environment.end(), extra.begin(), extra.end());

  std::vector<char*> args;
  for (const std::string& a : argv) args.push_back(const_cast<char*>(a.c_str()));
  args.push_back(nullptr);
  std::vector<char*> env;
  for (const std::string& e : environment) env.push_back(const_cast<char*>(e.c_str()));
  env.push_back(nullptr);

  posix_spawnattr_t attributes;
  posix_spawnattr_init(&attributes);
  sigset_t none;
  sigemptyset(&none);
  sigset_t defaults;
  sigemptyset(&defaults);
  for (int s : {SIGINT, SIGTERM, SIGHUP, SIGCHLD, SIGPIPE}) sigaddset(&defaults, s);
  posix_spawnattr_setsigmask(&attributes, &none);
  posix_spawnattr_setsigdefault(&attributes, &defaults);
  posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF);
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  if (output) {
    posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, output->c_str(), O_WRONLY | O_CREAT | O_APPEND, 0644);
    posix_spawn_file_actions_adddup2(&actions, STDOUT_FILENO, STDERR_FILENO);
  }
  pid_t pid = -1;
  const int status = posix_spawnp(&pid, args[0], &actions, &attributes, args.data(), env.data());
  posix_spawn_file_actions_destroy(&actions);
  posix_spawnattr_destroy(&attributes);
  if (status != 0) {
    error = "cannot start " + argv[0] + ": " + std::strerror(status);
    return -1;
  }
  return pid;
}

int exitStatusOf(int status) {
  if (WIFEXITED(status)) return WEXITSTATUS(status);
  if (WIFSIGNALED(status)) return 128 + WTERMSIG(status);
  return kExitFailure;
}

// Waits up to `limit` for the process; true when it has ended.
bool waitFor(pid_t pid, std::chrono::milliseconds limit, int& status) {
  const auto deadline = std::chrono::steady_clock::now() + limit;
  for (;;) {
    const pid_t done = ::waitpid(pid, &status, WNOHANG);
    if (done == pid || (done < 0 && errno == ECHILD)) return true;
    if (std::chrono::steady_clock::now() >= deadline) return false;
    std::this_thread::sleep_for(20ms);
  }
}

void stopService(pid_t service) {
  if (service <= 0) return;
  int status = 0;
  ::kill(service, SIGTERM);
  if (!waitFor(service, kServiceStopLimit, status)) {
    ::kill(service, SIGKILL);
    waitFor(service, kServiceStopLimit, status);
  }
}

}  // namespace

int main(int argc, char** argv) {
  std::string technology = "IFX";
  std::string seed = "1";
  bool technologyGiven = false;
  std::optional<fs::path> replay;
  std::optional<std::string> speed;
  bool loop = false;
  std::optional<fs::path> diagPort;
  std::optional<std::string> modem;
  bool terminal = false;
  fs::path root = defaultDeviceRoot();

  static constexpr corvane::CommandLineOption kOptions[] = {
      {"technology", 't', true},
      {"seed", 's', true},
      {"device-root", 'd', true},
      {"replay", 0, true},
      {"speed", 0, true},
      {"loop", 0, false},
      {"diag", 0, true},
      {"modem", 0, true},
      {"tui", 0, false},
  };
  const corvane::ParsedCommandLine parsed = corvane::parseCommandLine(
      argc, argv, kOptions, [&](std::string_view name, const char* value) -> std::string {
        if (name == "technology") {
          technology = value;
          technologyGiven = true;
        }
        if (name == "device-root") root = fs::absolute(value);
        // The service checks the capture and the speed, and says what is wrong with them.
        if (name == "replay") replay = fs::absolute(value);
        if (name == "speed") speed = value;
        if (name == "loop") loop = true;
        if (name == "tui") terminal = true;
        if (name == "diag") diagPort = fs::absolute(value);
        if (name == "modem") modem = value;
        if (name == "seed") {
          char* end = nullptr;
          errno = 0;
          const unsigned long long number = std::strtoull(value, &end, 10);
          if (errno != 0 || end == value || *end != '\0' || value[0] == '-') {
            return std::string("--seed needs a whole number, not \"") + value + "\"";
          }
          seed = std::to_string(number);
        }
        return {};
      });
  if (const std::optional<int> status = corvane::answerCommandLine(parsed, kProgram)) return *status;
  if (!replay && (speed || loop)) {
    return corvane::usageError(kProgram, std::string(speed ? "--speed" : "--loop") + " is for --replay");
  }
  if (modem && !diagPort) return corvane::usageError(kProgram, "--modem is for --diag");

  if (!terminal && !corvane::displayAvailable()) return fail(corvane::noDisplayMessage("corvane-demo"));
  if (terminal && (!::isatty(STDIN_FILENO) || !::isatty(STDOUT_FILENO))) return fail("--tui needs a terminal");

  std::error_code error;
  const fs::path marker = corvane::devicePath(corvane::kSaveEnablingMarkerPath, root);
  const fs::path snapshots = corvane::devicePath(corvane::kSnapshotDirectoryPath, root);
  fs::create_directories(marker, error);
  if (!error) fs::create_directories(snapshots, error);
  if (error) return fail("cannot prepare the device root " + root.string() + ": " + error.message());

  char runtimeTemplate[] = "/tmp/corvane-demo-XXXXXX";
  if (!::mkdtemp(runtimeTemplate)) return fail(std::string("cannot make a runtime directory: ") + std::strerror(errno));
  const fs::path runtime = runtimeTemplate;

  // The termination signals and the children's ends are taken in turn below.
  sigset_t watched;
  sigemptyset(&watched);
  for (int s : {SIGINT, SIGTERM, SIGHUP, SIGCHLD}) sigaddset(&watched, s);
  sigprocmask(SIG_BLOCK, &watched, nullptr);

  const fs::path self = fs::read_symlink("/proc/self/exe", error).parent_path();
  const fs::path serviceProgram =
      findProgram("corvane-telephonyd", {self / "corvane-telephonyd", self.parent_path() / "telephonyd" / "corvane-telephonyd"});
  const fs::path appProgram = terminal ? findProgram("corvane-tui", {self / "corvane-tui", self.parent_path() / "tui" / "corvane-tui"})
                                       : findProgram("corvane", {self / "corvane"});
  // The terminal belongs to corvane-tui: the service writes into a file instead.
  const fs::path serviceLog = corvane::devicePath("/var/log/corvane/corvane-telephonyd.log", root);
  const std::vector<std::string> environment{"CORVANE_RUNTIME_DIR=" + runtime.string(),
                                             "CORVANE_DEVICE_ROOT=" + root.string()};

  const auto cleanUp = [&](pid_t service) {
    stopService(service);
    fs::remove_all(runtime, error);
  };

  std::string spawnError;
  std::vector<std::string> serviceArguments = {serviceProgram.string()};
  if (diagPort) {
    // The service says what is missing or wrong (a technology, the device).
    serviceArguments.insert(serviceArguments.end(), {"--diag", diagPort->string()});
    if (technologyGiven) serviceArguments.insert(serviceArguments.end(), {"--technology", technology});
    if (modem) serviceArguments.insert(serviceArguments.end(), {"--modem", *modem});
    if (replay) serviceArguments.insert(serviceArguments.end(), {"--replay", replay->string()});
  } else if (replay) {
    serviceArguments.insert(serviceArguments.end(), {"--replay", replay->string()});
    if (technologyGiven) serviceArguments.insert(serviceArguments.end(), {"--technology", technology});
    if (speed) serviceArguments.insert(serviceArguments.end(), {"--speed", *speed});
    if (loop) serviceArguments.push_back("--loop");
  } else {
    serviceArguments.insert(serviceArguments.end(), {"--technology", technology, "--seed", seed});
    // The log-code scenarios send several records per simulated second; this
    // pace plays them at about real time (the service's default suits the IFX
    // scenario's one report per half second).
    // The CDMA phone's call adds a traffic frame every 80 ms: about twice as many.
    if (technology != "IFX") {
      serviceArguments.insert(serviceArguments.end(), {"--rate", technology == "Quendra_CDMA" ? "20" : "10"});
    }
  }
  const pid_t service = spawn(serviceArguments, environment, spawnError, terminal ? &serviceLog : nullptr);
  if (service < 0) {
    cleanUp(-1);
    return fail(spawnError);
  }
  // The application connects at once when the service is up first (else it would retry 5 s later).
  const fs::path serviceSocket = runtime / "corvane-telephonyd.sock";
  const auto deadline = std::chrono::steady_clock::now() + kServiceStartLimit;
  int status = 0;
  while (!fs::exists(serviceSocket, error)) {
    if (::waitpid(service, &status, WNOHANG) == service) {
      fs::remove_all(runtime, error);
      return fail("the telephony service stopped at once (status " + std::to_string(exitStatusOf(status)) + ")");
    }
    if (std::chrono::steady_clock::now() >= deadline) {
      cleanUp(service);
      return fail("the telephony service did not start within 5 s");
    }
    std::this_thread::sleep_for(20ms);
  }

  const pid_t app = spawn({appProgram.string()}, environment, spawnError);
  if (app < 0) {
    cleanUp(service);
    return fail(spawnError);
  }
  if (terminal) {
    // Nothing more on the terminal while corvane-tui draws on it.
  } else if (diagPort) {
    std::printf("corvane-demo: Corvane and the bridge to %s are running; Ctrl-C stops both.\n", diagPort->c_str());
  } else if (replay) {
    std::printf("corvane-demo: Corvane and a replay of %s are running; Ctrl-C stops both.\n", replay->c_str());
  } else {
    std::printf("corvane-demo: Corvane and the %s simulator (seed %s) are running; Ctrl-C stops both.\n",
                technology.c_str(), seed.c_str());
  }
  if (!terminal) std::printf("corvane-demo: snapshots are saved in %s\n", snapshots.c_str());
  std::fflush(stdout);

  bool serviceRunning = true;
  bool stopping = false;
  int appStatus = 0;
  for (;;) {
    siginfo_t info;
    const int signal = ::sigwaitinfo(&watched, &info);
    if (signal < 0) continue;
    if (signal == SIGCHLD) {
      if (serviceRunning && ::waitpid(service, &status, WNOHANG) == service) {
        serviceRunning = false;
        std::fprintf(stderr, "corvane-demo: the telephony service stopped (status %d)\n", exitStatusOf(status));
      }
      if (::waitpid(app, &appStatus, WNOHANG) == app) break;
      continue;
    }
    // A second request does not wait for the application any longer.
    ::kill(app, stopping ? SIGKILL : SIGTERM);
    stopping = true;
  }

  cleanUp(serviceRunning ? service : -1);
  if (terminal) {
    std::printf("corvane-demo: snapshots are saved in %s; the service's messages are in %s\n", snapshots.c_str(),
                serviceLog.c_str());
  }
  return stopping ? 0 : exitStatusOf(appStatus);
}
