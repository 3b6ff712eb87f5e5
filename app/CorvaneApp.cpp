#include "app/CorvaneApp.h"

#include <QGuiApplication>
#include <QIcon>
#include <QScreen>
#include <QVBoxLayout>

#include <algorithm>

#include "app/Theme.h"
#include "platform/DateText.h"
#include "platform/DevicePaths.h"
#include "presenter/SnapshotSaver.h"

namespace corvane {

namespace {

// A phone-like window on a desktop; the whole screen on a screen that small.
constexpr int kDesktopWidth = 400;
constexpr int kDesktopHeight = 720;
constexpr int kPhoneScreenWidth = 600;

const char* const kStyleSheet = R"(
#NavigationBar { background-color: #f4f6f8; border-bottom: 1px solid #c9cfd6; }
#Toolbar { background-color: #f4f6f8; border-top: 1px solid #c9cfd6; }
#NavigationTitle { color: #1b242e; }
#BackButton, #SaveButton, #CancelSnapshotButton, #SaveSnapshotButton {
  color: #0b63ce; background: transparent; border: none; padding: 6px 6px; }
#BackButton:pressed, #SaveButton:pressed, #CancelSnapshotButton:pressed, #SaveSnapshotButton:pressed { color: #6f9fd8; }
#SaveSnapshotButton { font-weight: bold; }
QLineEdit { background: #ffffff; border: 1px solid #c9cfd6; border-radius: 8px; padding: 2px 8px; }
QLineEdit:focus { border: 1px solid #0b63ce; }
#saveContentTable { border: 1px solid #d5dbe2; border-radius: 8px; background: #ffffff; }
)";

QIcon applicationIcon() { return QIcon(QStringLiteral(":/corvane/corvane.svg")); }

}  // namespace

CorvaneApp::CorvaneApp(CorvaneAppEnvironment environment)
    : preferenceStore_(environment.preferences), signalStrength_(preferenceStore_),
      environment_(std::move(environment)) {}

CorvaneApp::~CorvaneApp() {
  if (running_) applicationWillTerminate();
}

std::filesystem::path CorvaneApp::snapshotDirectory() const {
  return devicePath(kSnapshotDirectoryPath, environment_.deviceRoot);
}

void CorvaneApp::_setGSMRSSI(bool value) { signalStrength_.setGSMRSSI(value); }

void CorvaneApp::getSaveButtonPref() {
  _allowSaveButton = saveOffered(environment_.deviceRoot);
}

void CorvaneApp::getRSSIPref() { signalStrength_.applicationDidFinishLaunching(); }

void CorvaneApp::applicationDidFinishLaunching() {
  if (running_) return;
  running_ = true;
  getRSSIPref();
  getSaveButtonPref();

  _window = std::make_unique<QWidget>();
  _window->setObjectName(QStringLiteral("CorvaneWindow"));
  _window->setWindowTitle(QStringLiteral("Corvane"));
  _window->setWindowIcon(applicationIcon());
  _window->setStyleSheet(QString::fromLatin1(kStyleSheet));
  const QScreen* screen = QGuiApplication::primaryScreen();
  const QRect available = screen ? screen->availableGeometry() : QRect(0, 0, kDesktopWidth, kDesktopHeight);
  if (available.width() <= kPhoneScreenWidth) {
    _window->setGeometry(available);
  } else {
    _window->resize(kDesktopWidth, std::min(kDesktopHeight, std::max(480, available.height() - 40)));
  }

  _model = std::make_unique<CorvaneModel>(environment_.model, this);
  _statusLine = StatusLine();

  _screens = ScreenStack();
  _screens.setWillShow([this](const ScreenStack::Screen&) { followScreens(); });
  auto* root = new CorvanePaneController(nullptr, _screens.top().path, *this);
  const StatusState launching = StatusLine::launching();
  root->setStatus(QString::fromStdString(launching.text), launching.isLoading);

  _navController = new NavigationController(root);
  _navController->setDelegate(this);
  auto* layout = new QVBoxLayout(_window.get());
  layout->setContentsMargins(0, 0, 0, 0);
  layout->addWidget(_navController);
  _window->show();
  _window->activateWindow();

  // The monitor starts once the launch has returned.
  environment_.model.runLoop.dispatchAsync([self = QPointer<CorvaneApp>(this)] {
    if (self && self->_model) self->_model->restartMonitor();
  });
}

void CorvaneApp::applicationWillTerminate() {
  if (!running_) return;
  running_ = false;
  signalStrength_.applicationWillTerminate();

  _statusLine.setUpdateMessage({});
  _saveViewController = nullptr;

  if (_window) _window->hide();
  _navController = nullptr;
  _window.reset();

  _model.reset();
}

void CorvaneApp::showSaveView() {
  if (_saveViewController || !_navController || !_model) return;
  _saveViewController =
      new CorvaneSaveViewController(_model->getSaveContents(), *this, environment_.model.runLoop, snapshotDirectory());
  _navController->presentModalViewController(_saveViewController, true);
}

void CorvaneApp::closeSaveView() {
  if (!_saveViewController || !_navController) return;
  // The navigation controller deletes the screen it dismisses.
  _navController->dismissModalViewControllerAnimated(true);
  _saveViewController = nullptr;
}

void CorvaneApp::updateStatusForViewController(CorvanePaneController* viewController) {
  if (!viewController) return;
  const StatusState status = _statusLine.current(_model && _model->isConnected());
  viewController->setStatus(QString::fromStdString(status.text), status.isLoading);
}

void CorvaneApp::updateViewControllerFromModel() {
  if (!_navController || !_model) return;
  // The screen stack pops what has gone from the display; the panes follow it.
  _screens.reload(_model->topLevelNodes(), [this](const std::string& path) { return _model->nodeAtPath(path); });
  const std::vector<ViewController*>& panes = _navController->viewControllers();
  const std::vector<ScreenStack::Screen>& screens = _screens.screens();
  for (std::size_t i = 0; i < std::min(panes.size(), screens.size()); ++i) {
    if (auto* pane = qobject_cast<CorvanePaneController*>(panes[i])) pane->reloadWithNode(screens[i].node);
  }
  _statusLine.displayUpdated(_model->isConnected(), currentDate());
  updateStatusForViewController(qobject_cast<CorvanePaneController*>(_navController->topViewController()));
}

void CorvaneApp::navigationControllerWillShowViewController(NavigationController& navigationController,
                                                            ViewController* viewController, bool) {
  // A pane pushes the section it opens itself, and the back button pops; the
  // screen stack is told either way, so that both stay one stack.
  const std::vector<ViewController*>& panes = navigationController.viewControllers();
  const auto shown = std::find(panes.begin(), panes.end(), viewController);
  auto* pane = qobject_cast<CorvanePaneController*>(viewController);
  if (shown != panes.end()) {
    const auto depth = static_cast<std::size_t>(shown - panes.begin()) + 1;
    if (depth > _screens.depth()) {
      if (pane) _screens.openPath(pane->path());
    } else {
      _screens.popToDepth(depth);
    }
  }
  updateStatusForViewController(pane);
}

void CorvaneApp::followScreens() {
  if (!_navController) return;
  // The screen stack popped (its screen's row vanished): the panes above go too.
  const std::vector<ViewController*>& panes = _navController->viewControllers();
  if (panes.size() > _screens.depth()) _navController->popToViewController(panes[_screens.depth() - 1], true);
}

}  // namespace corvane
