// corvane-tui: the application's screens in a terminal, for machines reached
// over SSH: the same drill-down tree of list screens, status line and save
// screen as corvane, drawn with curses.

#include <QCoreApplication>

#include <langinfo.h>
#include <unistd.h>

#include <clocale>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "LogGenerator/logcode/ClassIndex.h"
#include "app/Preferences.h"
#include "model/SocketModelEnvironment.h"
#include "platform/Assertion.h"
#include "platform/CommandLine.h"
#include "platform/DevicePaths.h"
#include "platform/Log.h"
#include "platform/SignalEvents.h"
#include "tui/TerminalApp.h"

namespace {

constexpr int kExitFailure = 1;

const corvane::ProgramUsage kProgram{
    "corvane-tui",
    "Usage: corvane-tui [--ascii] [--no-colour]\n",
    "\n"
    "Shows what the phone's baseband reports, as a drill-down tree of list\n"
    "screens in the terminal, from the log channel of the telephony service\n"
    "(corvane-telephonyd). The screen refreshes every 2 s.\n"
    "\n"
    "Keys:\n"
    "  Up, Down, PgUp, PgDn, Home, End  move the selection\n"
    "  Enter, Right                     open the selected section\n"
    "  Left, Backspace, Esc             back to the screen below\n"
    "  [ ]                              scroll the detail line sideways\n"
    "  /                                filter the rows of the screen\n"
    "  s                                save a snapshot (asks for a description)\n"
    "  q                                quit\n"
    "  ?                                show the keys\n"
    "The mouse selects and opens rows and its wheel scrolls, where the terminal\n"
    "reports them.\n"
    "\n"
    "Options:\n"
    "  -a, --ascii      draw with ASCII only (the default on a terminal that is\n"
    "                   not UTF-8)\n"
    "  -c, --no-colour  no colour (also when $NO_COLOR is set)\n"
    "  -h, --help       show this help\n"
    "  -V, --version    show the version\n"
    "\n"
    "The runtime directory is $CORVANE_RUNTIME_DIR, else $XDG_RUNTIME_DIR/corvane,\n"
    "else /tmp/corvane-$UID; the phone's paths are found below $CORVANE_DEVICE_ROOT,\n"
    "else /, and snapshots go to var/log/corvane/snapshots below it. While it runs,\n"
    "ZLShowGSMRSSI is true for the home screen, as corvane sets it.\n",
};

}  // namespace

int main(int argc, char** argv) {
  using namespace corvane;
  installTerminateHandler();

  bool ascii = false;
  bool colour = true;
  static constexpr CommandLineOption kOptions[] = {
      {"ascii", 'a', false},
      {"no-colour", 'c', false},
  };
  const ParsedCommandLine parsed =
      parseCommandLine(argc, argv, kOptions, [&](std::string_view name, const char*) -> std::string {
        if (name == "ascii") ascii = true;
        if (name == "no-colour") colour = false;
        return {};
      });
  if (const std::optional<int> status = answerCommandLine(parsed, kProgram)) return *status;
  if (!isatty(STDIN_FILENO) || !isatty(STDOUT_FILENO)) {
    std::fprintf(stderr, "corvane-tui: needs a terminal (for text dumps: corvane-monitor)\n");
    return kExitFailure;
  }

  std::setlocale(LC_ALL, "");
  tui::TerminalOptions options;
  options.unicode = !ascii && std::strcmp(nl_langinfo(CODESET), "UTF-8") == 0;
  const char* noColour = std::getenv("NO_COLOR");
  options.colour = colour && !(noColour && *noColour);
  options.deviceRoot = deviceRoot();

  QCoreApplication application(argc, argv);
  std::signal(SIGPIPE, SIG_IGN);
  std::string error;
  const std::unique_ptr<SocketModelEnvironment> platform = SocketModelEnvironment::create(error);
  if (!platform) {
    std::fprintf(stderr, "corvane-tui: %s\n", error.c_str());
    return kExitFailure;
  }
  // The system log only, and no teardown lines on standard output: both
  // would write over the screen.
  log::setSink(log::makeSystemLogSink());
  ClassIndex::setTeardownStream(nullptr);
  // A hang-up (the SSH connection dropped) ends it as cleanly as SIGINT and SIGTERM.
  std::vector<int> endingSignals = SignalEvents::terminationSignals();
  endingSignals.push_back(SIGHUP);
  const std::unique_ptr<SignalEvents> signalEvents = SignalEvents::watch(
      platform->runLoop(), endingSignals, [](int) { QCoreApplication::quit(); }, error);
  if (!signalEvents) {
    std::fprintf(stderr, "corvane-tui: %s\n", error.c_str());
    return kExitFailure;
  }
  platform->ports().interruptWaitsWhenReadable(signalEvents->pendingDescriptor());

  {
    Preferences preferences;
    PreferencesStore store(preferences);
    tui::TerminalApp app(platform->environment(), options, store, [] { QCoreApplication::quit(); });
    app.start();
    application.exec();
    app.stop();
  }
  return 0;
}
