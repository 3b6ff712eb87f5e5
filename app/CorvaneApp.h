#pragma once

// The application object: builds the window and the stack of list screens,
// runs the monitor model, keeps the status line of the visible screen current,
// keeps the panes and the presenter's screen stack one stack, re-points every
// screen to the fresh display tree after each update, turns on
// the numeric signal strength of the home screen's status bar while it runs,
// and opens and closes the save screen where saving is offered.

#include <QObject>
#include <QPointer>
#include <QString>
#include <QWidget>

#include <filesystem>
#include <memory>

#include "app/CorvanePaneController.h"
#include "app/CorvaneSaveViewController.h"
#include "app/NavigationController.h"
#include "app/Preferences.h"
#include "app/ScreenHost.h"
#include "model/CorvaneModel.h"
#include "presenter/ScreenStack.h"
#include "presenter/StatusLine.h"

namespace corvane {

struct CorvaneAppEnvironment {
  CorvaneModelEnvironment model;  // its run loop is the main queue of the screens too
  Preferences& preferences;
  std::filesystem::path deviceRoot;  // under which the phone's absolute paths are found
};

class CorvaneApp final : public QObject,
                         public CorvaneModelDelegate,
                         public NavigationControllerDelegate,
                         public ScreenHost {
  Q_OBJECT

 public:
  explicit CorvaneApp(CorvaneAppEnvironment environment);
  // Terminates first when the application was launched and not yet terminated.
  ~CorvaneApp() override;

  void _setGSMRSSI(bool value);
  void getSaveButtonPref();
  void getRSSIPref();
  void applicationDidFinishLaunching();
  void applicationWillTerminate();
  void showSaveView() override;
  void closeSaveView() override;
  void updateStatusForViewController(CorvanePaneController* viewController);
  void updateViewControllerFromModel() override;
  void navigationControllerWillShowViewController(NavigationController& navigationController,
                                                  ViewController* viewController, bool animated) override;

  QWidget* window() const { return _window.get(); }
  CorvaneSaveViewController* saveViewController() const { return _saveViewController; }
  bool allowSaveButton() const override { return _allowSaveButton; }
  QString updateMessage() const { return QString::fromStdString(_statusLine.updateMessage()); }
  void setUpdateMessage(const QString& message) { _statusLine.setUpdateMessage(message.toStdString()); }

  NavigationController* navigationController() const { return _navController; }
  // The stack of screens the panes show, shared in kind with the terminal front end.
  const ScreenStack& screenStack() const { return _screens; }
  CorvaneModel* model() const { return _model.get(); }
  std::filesystem::path snapshotDirectory() const;

 private:
  void followScreens();

  std::unique_ptr<QWidget> _window;
  NavigationController* _navController = nullptr;  // owned by the window
  QPointer<CorvaneSaveViewController> _saveViewController;
  std::unique_ptr<CorvaneModel> _model;
  PreferencesStore preferenceStore_;
  SignalStrengthPreference signalStrength_;
  bool _allowSaveButton = false;
  StatusLine _statusLine;
  ScreenStack _screens;

  CorvaneAppEnvironment environment_;
  bool running_ = false;
};

}  // namespace corvane
