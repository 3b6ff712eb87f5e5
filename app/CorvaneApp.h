#pragma once

// The application object: builds the window and the stack of list screens,
// runs the monitor model, keeps the status line of the visible screen current,
// re-points every screen to the fresh display tree after each update, turns on
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

namespace corvane {

// The key of the preference that asks the status bar for the signal strength as a number.
inline constexpr const char* kShowGSMRSSIKey = "ZLShowGSMRSSI";

struct CorvaneAppEnvironment {
  CorvaneModelEnvironment model;  // its run loop is the main queue of the screens too
  Preferences& preferences;
  std::filesystem::path deviceRoot;  // under which the phone's absolute paths are found
};

// Formats dates in local time with a fixed pattern (Qt's date-format syntax).
class DateFormatter {
 public:
  explicit DateFormatter(QString pattern) : pattern_(std::move(pattern)) {}
  QString stringFromDate(const Date& date) const;

 private:
  QString pattern_;
};

class CorvaneApp final : public QObject,
                         public CorvaneModelDelegate,
                         public NavigationControllerDelegate,
                         public ScreenHost {
  Q_OBJECT

 public:
  static constexpr const char* kUpdatePattern = "'Updated' yyyy-MM-dd 'at' HH:mm:ss";

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
  const QString& updateMessage() const { return _updateMessage; }
  void setUpdateMessage(const QString& message) { _updateMessage = message; }

  NavigationController* navigationController() const { return _navController; }
  CorvaneModel* model() const { return _model.get(); }
  std::filesystem::path snapshotDirectory() const;

 private:
  std::unique_ptr<QWidget> _window;
  NavigationController* _navController = nullptr;  // owned by the window
  QPointer<CorvaneSaveViewController> _saveViewController;
  std::unique_ptr<CorvaneModel> _model;
  bool _unsetRSSI = false;
  bool _allowSaveButton = false;
  std::unique_ptr<DateFormatter> _dateFormatter;
  QString _updateMessage;

  CorvaneAppEnvironment environment_;
  bool running_ = false;
};

}  // namespace corvane
