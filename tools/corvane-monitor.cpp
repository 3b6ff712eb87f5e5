// corvane-monitor: the application without screens. Runs the monitor model
// against the telephony service and prints the display tree after every
// display update, for scripts, tests and SSH sessions.

#include <QCoreApplication>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "LogGenerator/logcode/ClassIndex.h"
#include "ToolOptions.h"
#include "TreePrinter.h"
#include "model/CorvaneModel.h"
#include "model/SocketModelEnvironment.h"
#include "platform/Assertion.h"
#include "platform/CommandLine.h"
#include "platform/DateText.h"
#include "platform/Log.h"
#include "platform/SignalEvents.h"

namespace {

constexpr int kExitFailure = 1;

const corvane::ProgramUsage kProgram{
    "corvane-monitor",
    "Usage: corvane-monitor [--format text|json] [--updates N] [--log]\n",
    "\n"
    "Connects to the telephony service (corvane-telephonyd), decodes the packets\n"
    "of its log channel and prints the display tree after every display update\n"
    "(at most every 2 s, when packets arrived). It retries every 5 s while the\n"
    "service is unreachable and keeps its history across reconnects.\n"
    "\n"
    "Options:\n"
    "  -f, --format FORMAT  text (an indented tree, followed by a blank line) or\n"
    "                       json (one compact JSON document per line)\n"
    "  -n, --updates N      stop after N display updates (default: run until\n"
    "                       interrupted)\n"
    "  -l, --log            also write the system-log lines to standard error as\n"
    "                       \"<priority> <text>\"\n"
    "  -h, --help           show this help\n"
    "  -V, --version        show the version\n"
    "\n"
    "The runtime directory is $CORVANE_RUNTIME_DIR, else $XDG_RUNTIME_DIR/corvane,\n"
    "else /tmp/corvane-$UID.\n",
};

class Monitor final : public corvane::CorvaneModelDelegate {
 public:
  Monitor(corvane::tools::TreeFormat format, long updates) : format_(format), remaining_(updates) {}
  void setModel(corvane::CorvaneModel* model) { model_ = model; }

  void updateViewControllerFromModel() override {
    corvane::NodeRef root = model_->topLevelNodes();
    if (!root) return;
    const std::string text = format_ == corvane::tools::TreeFormat::Json ? corvane::tools::treeAsJson(*root, true)
                                                                         : corvane::tools::treeAsText(*root) + "\n";
    std::fwrite(text.data(), 1, text.size(), stdout);
    std::fflush(stdout);
    if (remaining_ > 0 && --remaining_ == 0) QCoreApplication::quit();
  }

 private:
  corvane::tools::TreeFormat format_;
  long remaining_;  // 0: no limit
  corvane::CorvaneModel* model_ = nullptr;
};

}  // namespace

int main(int argc, char** argv) {
  using namespace corvane;
  installTerminateHandler();

  std::string format = "text";
  long updates = 0;
  bool logToStderr = false;

  static constexpr CommandLineOption kOptions[] = {
      {"format", 'f', true},
      {"updates", 'n', true},
      {"log", 'l', false},
  };
  const ParsedCommandLine parsed =
      parseCommandLine(argc, argv, kOptions, [&](std::string_view name, const char* value) -> std::string {
        if (name == "format") format = value;
        if (name == "log") logToStderr = true;
        if (name == "updates") {
          char* end = nullptr;
          errno = 0;
          updates = std::strtol(value, &end, 10);
          if (errno != 0 || end == value || *end != '\0' || updates < 1) {
            return std::string("--updates needs a whole number of at least 1, not \"") + value + "\"";
          }
        }
        return {};
      });
  if (const std::optional<int> status = answerCommandLine(parsed, kProgram)) return *status;
  const std::optional<tools::TreeFormat> treeFormat = tools::treeFormatNamed(format);
  if (!treeFormat) return usageError(kProgram, "unknown format \"" + format + "\" (text or json)");

  QCoreApplication app(argc, argv);
  std::string error;
  const std::unique_ptr<SocketModelEnvironment> platform = SocketModelEnvironment::create(error);
  if (!platform) {
    std::fprintf(stderr, "corvane-monitor: %s\n", error.c_str());
    return kExitFailure;
  }
  // Standard output carries the tree: the class indexes' teardown lines go
  // with the diagnostics under --log, and nowhere otherwise.
  ClassIndex::setTeardownStream(logToStderr ? stderr : nullptr);
  if (logToStderr) {
    tools::copyLogToStandardError();
  }

  // SIGINT and SIGTERM end the event loop, so that the model tears its ports
  // down before the program ends.
  const std::unique_ptr<SignalEvents> signalEvents = SignalEvents::watch(
      platform->runLoop(), SignalEvents::terminationSignals(), [](int) { QCoreApplication::quit(); }, error);
  if (!signalEvents) {
    std::fprintf(stderr, "corvane-monitor: %s\n", error.c_str());
    return kExitFailure;
  }
  // A port waiting on a silent peer gives up at once when a termination
  // signal is pending, so the signal is handled without delay.
  platform->ports().interruptWaitsWhenReadable(signalEvents->pendingDescriptor());
  std::signal(SIGPIPE, SIG_IGN);

  Monitor monitor(*treeFormat, updates);
  {
    CorvaneModel model(platform->environment(), &monitor);
    monitor.setModel(&model);
    platform->runLoop().dispatchAsync([&model] { model.restartMonitor(); });
    app.exec();
  }
  return 0;
}
