// corvane: the application. It shows what the phone's baseband reports, as a
// drill-down tree of list screens, from the telephony service's log channel.
// It takes no arguments of its own but --help and --version (Qt's own, such as
// -platform, are Qt's).

#include <QApplication>
#include <QMessageBox>

#include <csignal>
#include <cstdio>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "app/CorvaneApp.h"
#include "app/DisplayCheck.h"
#include "app/Preferences.h"
#include "model/SocketModelEnvironment.h"
#include "platform/Assertion.h"
#include "platform/CommandLine.h"
#include "platform/DevicePaths.h"
#include "platform/SignalEvents.h"

namespace {

constexpr int kExitFailure = 1;

const corvane::ProgramUsage kProgram{
    "corvane",
    "Usage: corvane\n",
    "\n"
    "Shows what the phone's baseband reports, as a drill-down tree of list\n"
    "screens, from the log channel of the telephony service (corvane-telephonyd).\n"
    "\n"
    "Options:\n"
    "  -h, --help     show this help\n"
    "  -V, --version  show the version\n"
    "Qt's own options, such as -platform NAME, are Qt's.\n"
    "\n"
    "The runtime directory is $CORVANE_RUNTIME_DIR, else $XDG_RUNTIME_DIR/corvane,\n"
    "else /tmp/corvane-$UID; the phone's paths are found below $CORVANE_DEVICE_ROOT,\n"
    "else /.\n",
};

corvane::ParsedCommandLine parseArguments(int argc, char** argv) {
  return corvane::parseCommandLine(argc, argv, {}, [](std::string_view, const char*) { return std::string(); });
}

}  // namespace

int main(int argc, char** argv) {
  using namespace corvane;
  installTerminateHandler();

  // --help and --version need no display. What this first reading does not
  // know may be one of Qt's own options, which only QApplication takes out; it
  // reads a copy, since getopt reorders what it reads.
  std::vector<char*> arguments(argv, argv + argc);
  const ParsedCommandLine early = parseArguments(argc, arguments.data());
  if (early.request == ParsedCommandLine::Request::Help || early.request == ParsedCommandLine::Request::Version) {
    return *answerCommandLine(early, kProgram);
  }

  if (!displayAvailable()) {
    std::fprintf(stderr, "corvane: %s\n", noDisplayMessage("corvane").c_str());
    return kExitFailure;
  }

  QApplication application(argc, argv);  // leaves in argv what is not Qt's
  QApplication::setApplicationName(QStringLiteral("corvane"));
  QApplication::setApplicationDisplayName(QStringLiteral("Corvane"));
  QGuiApplication::setDesktopFileName(QStringLiteral("corvane"));
  if (const std::optional<int> status = answerCommandLine(parseArguments(argc, argv), kProgram)) return *status;

  std::signal(SIGPIPE, SIG_IGN);

  std::string error;
  const std::unique_ptr<SocketModelEnvironment> platform = SocketModelEnvironment::create(error);
  if (!platform) {
    std::fprintf(stderr, "corvane: %s\n", error.c_str());
    QMessageBox::critical(nullptr, QStringLiteral("Corvane"),
                          QStringLiteral("Corvane cannot reach the telephony service: %1").arg(QString::fromStdString(error)));
    return kExitFailure;
  }
  // SIGINT and SIGTERM end the event loop, so that the application terminates
  // as it does when its window closes: the status-bar preference goes back and
  // the model tears its ports down.
  const std::unique_ptr<SignalEvents> signalEvents = SignalEvents::watch(
      platform->runLoop(), SignalEvents::terminationSignals(), [](int) { QCoreApplication::quit(); }, error);
  if (!signalEvents) {
    std::fprintf(stderr, "corvane: %s\n", error.c_str());
    return kExitFailure;
  }
  // A port waiting on a silent peer gives up at once when a termination
  // signal is pending, so the signal is handled without delay.
  platform->ports().interruptWaitsWhenReadable(signalEvents->pendingDescriptor());

  Preferences preferences;
  CorvaneApp corvane(CorvaneAppEnvironment{platform->environment(), preferences, deviceRoot()});
  QObject::connect(&application, &QCoreApplication::aboutToQuit, &corvane,
                   [&corvane] { corvane.applicationWillTerminate(); });
  corvane.applicationDidFinishLaunching();
  return application.exec();
}
