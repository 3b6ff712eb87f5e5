#pragma once

// What the application's tests share: a stand-in for the application object
// as the screens see it, node trees built from display objects, taps on rows,
// and the application itself on a virtual clock against the in-memory service.

#include <QApplication>
#include <QLabel>
#include <QTest>
#include <QToolButton>

#include <filesystem>
#include <memory>
#include <string>

#include "app/ActivityIndicator.h"
#include "app/CorvaneApp.h"
#include "app/CorvaneCell.h"
#include "app/CorvanePaneController.h"
#include "app/Preferences.h"
#include "app/ScreenHost.h"
#include "model/FakeTelephony.h"
#include "platform/DevicePaths.h"
#include "platform/VirtualRunLoop.h"
#include "support/Process.h"
#include "support/Values.h"

namespace corvane::test {

class FakeScreenHost final : public ScreenHost {
 public:
  bool allowSaveButton() const override { return allow_; }
  void showSaveView() override { ++shows_; }
  void closeSaveView() override { ++closes_; }

  bool allow_ = false;
  int shows_ = 0;
  int closes_ = 0;
};

// The node tree of a display object, as the model builds it.
inline NodeRef treeOf(const Value& display, PathDictionary* paths = nullptr) {
  PathDictionary own;
  return CorvaneModelNode::makeTreeFromObject(display, paths ? *paths : own);
}

inline CorvaneCell* cellAt(CorvanePaneController* screen, int row) {
  return static_cast<CorvaneCell*>(screen->tableView()->cellForRowAtIndexPath(IndexPath{0, row}));
}

// The row whose key reads `key`, or -1.
inline int rowWithKey(CorvanePaneController* screen, const QString& key) {
  for (int row = 0; row < screen->tableView()->numberOfRows(); ++row) {
    if (cellAt(screen, row)->key->text() == key) return row;
  }
  return -1;
}

inline void tapRow(CorvanePaneController* screen, int row) {
  QTest::mouseClick(cellAt(screen, row), Qt::LeftButton, Qt::NoModifier, QPoint(20, TableViewCell::kHeight / 2));
}

inline ActivityIndicator* indicatorOf(const ViewController* screen) {
  return qobject_cast<ActivityIndicator*>(screen->toolbarItems().at(0).widget.data());
}
inline QString statusTextOf(const ViewController* screen) {
  return qobject_cast<QLabel*>(screen->toolbarItems().at(1).widget.data())->text();
}

// A device root, a preferences folder and the application on a virtual clock.
class AppHarness {
 public:
  explicit AppHarness(bool withMarker = false)
      : root_(directory_.path() + "/device"), preferences_(QString::fromStdString(directory_.path() + "/config")) {
    std::filesystem::create_directories(root_);
    if (withMarker) std::filesystem::create_directories(devicePath(kSaveEnablingMarkerPath, root_));
  }

  CorvaneApp& app() {
    if (!app_) {
      app_ = std::make_unique<CorvaneApp>(CorvaneAppEnvironment{
          CorvaneModelEnvironment{loop_, service_, service_,
                                  [this]() -> std::optional<std::string> {
                                    return "00000000-0000-0000-0000-" + std::to_string(100000000000 + ++uuids_);
                                  }},
          preferences_, root_});
    }
    return *app_;
  }

  // Launches and lets the monitor start (it is dispatched for after the launch).
  void launch() {
    app().applicationDidFinishLaunching();
    loop_.runPending();
  }
  void send(const Value& packet) { service_.sendPacket(xmlBytes(packet)); }
  // One display tick, and the update it dispatches.
  void tick() {
    loop_.advanceBy(CorvaneModel::kDisplayUpdateInterval);
    loop_.runPending();
  }
  void terminate() { app_.reset(); }

  CorvanePaneController* top() {
    return qobject_cast<CorvanePaneController*>(app().navigationController()->topViewController());
  }
  std::size_t depth() { return app().navigationController()->viewControllers().size(); }

  // The value of a key in a domain's file, read afresh; an invalid QVariant when missing.
  QVariant storedPreference(const char* domain, const char* key) const {
    QSettings file(preferences_.fileForDomain(QString::fromLatin1(domain)), QSettings::IniFormat);
    return file.value(QString::fromLatin1(key));
  }
  void storePreference(const char* domain, const char* key, const QVariant& value) {
    std::filesystem::create_directories(directory_.path() + "/config");
    QSettings file(preferences_.fileForDomain(QString::fromLatin1(domain)), QSettings::IniFormat);
    file.setValue(QString::fromLatin1(key), value);
  }

  const std::filesystem::path& root() const { return root_; }
  VirtualRunLoop& loop() { return loop_; }
  FakeTelephony& service() { return service_; }

 private:
  TemporaryDirectory directory_;
  std::filesystem::path root_;
  Preferences preferences_;
  VirtualRunLoop loop_;
  FakeTelephony service_;
  int uuids_ = 0;
  std::unique_ptr<CorvaneApp> app_;
};

}  // namespace corvane::test
