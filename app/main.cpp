// corvane: the application. It shows what the phone's baseband reports, as a
// drill-down tree of list screens, from the telephony service's log channel.
// It takes no arguments of its own (Qt's own, such as -platform, are Qt's).

#include <QApplication>
#include <QMessageBox>

#include <csignal>
#include <cstdio>
#include <memory>
#include <string>

#include "app/CorvaneApp.h"
#include "app/DisplayCheck.h"
#include "app/Preferences.h"
#include "model/SocketModelEnvironment.h"
#include "platform/Assertion.h"
#include "platform/DevicePaths.h"
#include "platform/SignalEvents.h"

namespace {

constexpr int kExitFailure = 1;
constexpr int kExitUsage = 2;

}  // namespace

int main(int argc, char** argv) {
  using namespace corvane;
  installTerminateHandler();

  if (!displayAvailable()) {
    std::fprintf(stderr, "corvane: %s\n", noDisplayMessage("corvane").c_str());
    return kExitFailure;
  }

  QApplication application(argc, argv);
  QApplication::setApplicationName(QStringLiteral("corvane"));
  QApplication::setApplicationDisplayName(QStringLiteral("Corvane"));
  QGuiApplication::setDesktopFileName(QStringLiteral("corvane"));
  if (application.arguments().size() > 1) {
    std::fprintf(stderr, "corvane: takes no arguments (got \"%s\")\n",
                 application.arguments().at(1).toLocal8Bit().constData());
    return kExitUsage;
  }

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

  Preferences preferences;
  CorvaneApp corvane(CorvaneAppEnvironment{platform->environment(), preferences, deviceRoot()});
  QObject::connect(&application, &QCoreApplication::aboutToQuit, &corvane,
                   [&corvane] { corvane.applicationWillTerminate(); });
  corvane.applicationDidFinishLaunching();
  return application.exec();
}
