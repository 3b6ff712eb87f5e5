// The application object on a virtual clock against the in-memory telephony
// service: launch, status line, updates of the stack, the status-bar
// preference, the save button and the save screen.

#include <QMessageBox>

#include "AppTestSupport.h"
#include "platform/DateText.h"
#include "platform/Log.h"

namespace corvane {

using test::D;
using test::S;

namespace {

// 2026-11-16 08:00:00 UTC; the tests run at UTC+3.
constexpr std::int64_t kSomeMorning = 1794816000;

Value servingCell(const std::string& arfcn, bool withBand) {
  Dictionary serving;
  serving.set("ARFCN", S(arfcn));
  serving.set("BSIC", S("5-3"));
  if (withBand) serving.set("Band", D({{"Name", S("GSM 900")}, {"Width", S("35 MHz")}}));
  return D({{"Network", D({{"MCC", S("001")}, {"MNC", S("01")}})}, {"Serving Cell", Value(serving)}});
}

}  // namespace

class CorvaneAppTest : public QObject {
  Q_OBJECT

 private slots:
  void init() {
    setDateSourceForTesting([] { return Date{kSomeMorning * 1'000'000}; });
  }
  void cleanup() { setDateSourceForTesting({}); }

  void theRootScreenBeforeAnyDataSaysConnectingAndTheMonitorStartsAfterTheLaunch() {
    test::AppHarness harness;
    harness.app().applicationDidFinishLaunching();
    // The monitor waits for the launch to return.
    QVERIFY(harness.service().channelRequests_.empty());

    QVERIFY(harness.app().window()->isVisible());
    QCOMPARE(harness.depth(), std::size_t{1});
    CorvanePaneController* root = harness.top();
    QCOMPARE(root->title(), QStringLiteral("Corvane"));
    QCOMPARE(root->path(), std::string("/"));
    QCOMPARE(root->tableView()->numberOfRows(), 0);
    QCOMPARE(test::statusTextOf(root), QStringLiteral("Connecting"));
    QVERIFY(test::indicatorOf(root)->isAnimating());
    QCOMPARE(harness.app().updateMessage(), QStringLiteral("Connecting..."));

    harness.loop().runPending();
    QCOMPARE(harness.service().channelRequests_.size(), std::size_t{1});
    QVERIFY(harness.app().model()->isConnected());
    // Still no data: nothing changes until the first update.
    QCOMPARE(test::statusTextOf(harness.top()), QStringLiteral("Connecting"));
  }

  void anUpdateFillsTheRootAndShowsItsLocalTime() {
    test::AppHarness harness;
    harness.launch();
    harness.send(servingCell("62", true));
    harness.tick();

    CorvanePaneController* root = harness.top();
    QCOMPARE(root->title(), QStringLiteral("Corvane"));
    QCOMPARE(root->tableView()->numberOfRows(), 2);
    QCOMPARE(test::cellAt(root, 0)->key->text(), QStringLiteral("Network"));
    QCOMPARE(harness.app().updateMessage(), QStringLiteral("Updated 2026-11-16 at 11:00:00"));
    QCOMPARE(test::statusTextOf(root), QStringLiteral("Updated 2026-11-16 at 11:00:00"));
    QVERIFY(!test::indicatorOf(root)->isAnimating());
  }

  void aScreenPushedOrUncoveredShowsTheCurrentStatusAtOnce() {
    test::AppHarness harness;
    harness.launch();
    harness.send(servingCell("62", true));
    harness.tick();
    CorvanePaneController* root = harness.top();
    root->setStatus(QStringLiteral("stale"), true);

    test::tapRow(root, test::rowWithKey(root, QStringLiteral("Serving Cell")));
    QCOMPARE(harness.depth(), std::size_t{2});
    QCOMPARE(test::statusTextOf(harness.top()), QStringLiteral("Updated 2026-11-16 at 11:00:00"));
    harness.app().navigationController()->popViewControllerAnimated(true);
    QCOMPARE(test::statusTextOf(harness.top()), QStringLiteral("Updated 2026-11-16 at 11:00:00"));
  }

  void everyScreenOfTheStackGetsItsFreshNode() {
    test::AppHarness harness;
    harness.launch();
    harness.send(servingCell("62", true));
    harness.tick();
    test::tapRow(harness.top(), test::rowWithKey(harness.top(), QStringLiteral("Serving Cell")));
    CorvanePaneController* serving = harness.top();
    QCOMPARE(test::cellAt(serving, 0)->value->text(), QStringLiteral("62"));

    harness.send(servingCell("70", true));
    harness.tick();
    QCOMPARE(harness.top(), serving);
    QCOMPARE(test::cellAt(serving, 0)->value->text(), QStringLiteral("70"));
  }

  void aScreenWhoseRowVanishedIsPoppedBackToTheScreenBelow() {
    test::AppHarness harness;
    harness.launch();
    harness.send(servingCell("62", true));
    harness.tick();
    test::tapRow(harness.top(), test::rowWithKey(harness.top(), QStringLiteral("Serving Cell")));
    CorvanePaneController* serving = harness.top();
    test::tapRow(serving, test::rowWithKey(serving, QStringLiteral("Band")));
    QCOMPARE(harness.depth(), std::size_t{3});
    QCOMPARE(harness.top()->path(), std::string("/Serving Cell/Band"));

    harness.send(servingCell("63", false));
    harness.tick();
    QCOMPARE(harness.depth(), std::size_t{2});
    QCOMPARE(harness.top(), serving);
    QCOMPARE(serving->path(), std::string("/Serving Cell"));
    QCOMPARE(serving->tableView()->numberOfRows(), 2);
    QCOMPARE(test::statusTextOf(serving), QStringLiteral("Updated 2026-11-16 at 11:00:00"));
  }

  void theScreenStackFollowsEveryPushBackAndVanishedRow() {
    test::AppHarness harness;
    harness.launch();
    harness.send(servingCell("62", true));
    harness.tick();
    const ScreenStack& screens = harness.app().screenStack();
    QCOMPARE(screens.depth(), harness.depth());

    const int servingRow = test::rowWithKey(harness.top(), QStringLiteral("Serving Cell"));
    test::tapRow(harness.top(), servingRow);
    QCOMPARE(screens.depth(), std::size_t{2});
    QCOMPARE(screens.top().path, std::string("/Serving Cell"));
    QCOMPARE(screens.screens()[0].selectedRow, static_cast<std::size_t>(servingRow));
    QCOMPARE(screens.top().node, harness.top()->node());

    harness.app().navigationController()->backButton()->click();
    QCOMPARE(screens.depth(), std::size_t{1});
    QCOMPARE(harness.depth(), std::size_t{1});

    test::tapRow(harness.top(), servingRow);
    test::tapRow(harness.top(), test::rowWithKey(harness.top(), QStringLiteral("Band")));
    QCOMPARE(screens.depth(), std::size_t{3});
    QCOMPARE(screens.title(), std::string("Band"));
    QCOMPARE(screens.backTitle(), std::string("Serving Cell"));

    // The row under the open screen vanishes: the stack and the panes pop together.
    harness.send(servingCell("63", false));
    harness.tick();
    QCOMPARE(screens.depth(), std::size_t{2});
    QCOMPARE(harness.depth(), std::size_t{2});
    QCOMPARE(screens.top().path, harness.top()->path());
    QCOMPARE(screens.top().node, harness.top()->node());
  }

  void whileDisconnectedTheTopScreenSaysConnectingWithDotsAndKeepsTheLastUpdateTime() {
    log::ScopedCapture log;
    test::AppHarness harness;
    harness.launch();
    harness.send(servingCell("62", true));
    harness.tick();
    test::tapRow(harness.top(), test::rowWithKey(harness.top(), QStringLiteral("Network")));

    // A packet, then the service goes away before the next tick.
    harness.send(servingCell("63", true));
    harness.service().alive_ = false;
    setDateSourceForTesting([] { return Date{(kSomeMorning + 60) * 1'000'000}; });
    harness.tick();

    QVERIFY(!harness.app().model()->isConnected());
    QCOMPARE(test::statusTextOf(harness.top()), QStringLiteral("Connecting..."));
    QVERIFY(test::indicatorOf(harness.top())->isAnimating());
    QCOMPARE(harness.app().updateMessage(), QStringLiteral("Updated 2026-11-16 at 11:00:00"));

    // Back again: the next update shows the new time.
    harness.service().alive_ = true;
    harness.loop().advanceBy(CorvaneModel::kRetryDelay);
    QVERIFY(harness.app().model()->isConnected());
    harness.send(servingCell("64", true));
    harness.tick();
    QCOMPARE(test::statusTextOf(harness.top()), QStringLiteral("Updated 2026-11-16 at 11:01:00"));
  }

  void theHomeScreenSignalPreferenceIsSwitchedOnWhileRunningAndBackAtExit() {
    log::ScopedCapture log;
    test::AppHarness harness;
    harness.launch();
    QCOMPARE(harness.storedPreference(kHomeScreenPreferencesDomain, "ZLShowGSMRSSI").toString(), QStringLiteral("true"));
    // Nobody listens on a session bus here: the change is only logged.
    QCOMPARE(log.sink().count("No session bus: the change of ZLShowGSMRSSI in org.corvane.HomeScreen is not announced"),
             std::size_t{1});
    // The application's own domain is read, never written.
    QVERIFY(!harness.storedPreference(kAppPreferencesDomain, "ZLShowGSMRSSI").isValid());

    harness.app().applicationWillTerminate();
    QCOMPARE(harness.storedPreference(kHomeScreenPreferencesDomain, "ZLShowGSMRSSI").toString(), QStringLiteral("false"));
    QCOMPARE(harness.app().window(), nullptr);
    QCOMPARE(harness.app().model(), nullptr);
    QCOMPARE(harness.app().updateMessage(), QString());
  }

  void aUserWhoseOwnDomainAlreadySaysTrueIsLeftAlone() {
    test::AppHarness harness;
    harness.storePreference(kAppPreferencesDomain, "ZLShowGSMRSSI", true);
    harness.launch();
    QVERIFY(!harness.storedPreference(kHomeScreenPreferencesDomain, "ZLShowGSMRSSI").isValid());
    harness.terminate();
    QVERIFY(!harness.storedPreference(kHomeScreenPreferencesDomain, "ZLShowGSMRSSI").isValid());
  }

  void anOwnDomainThatSaysFalseStillSwitchesTheHomeScreenOn() {
    test::AppHarness harness;
    harness.storePreference(kAppPreferencesDomain, "ZLShowGSMRSSI", false);
    harness.launch();
    QCOMPARE(harness.storedPreference(kHomeScreenPreferencesDomain, "ZLShowGSMRSSI").toString(), QStringLiteral("true"));
  }

  void theSaveButtonIsOfferedOnlyWhereTheMarkerExists() {
    {
      test::AppHarness harness(false);
      harness.launch();
      QVERIFY(!harness.app().allowSaveButton());
      QCOMPARE(harness.top()->toolbarItems().size(), std::size_t{3});
    }
    {
      test::AppHarness harness(true);
      harness.launch();
      QVERIFY(harness.app().allowSaveButton());
      QCOMPARE(harness.top()->toolbarItems().size(), std::size_t{4});
      QCOMPARE(harness.app().snapshotDirectory(), harness.root() / "var/log/corvane/snapshots");
    }
  }

  void theSaveButtonOpensOneSaveScreenOnlyEvenWhenPressedTwice() {
    test::AppHarness harness(true);
    harness.launch();
    auto* save = qobject_cast<QToolButton*>(harness.top()->toolbarItems().at(3).widget.data());
    save->click();
    CorvaneSaveViewController* first = harness.app().saveViewController();
    QVERIFY(first);
    QCOMPARE(harness.app().navigationController()->modalViewController(), first);
    harness.app().showSaveView();
    QCOMPARE(harness.app().saveViewController(), first);
    QCOMPARE(harness.app().window()->findChildren<CorvaneSaveViewController*>().size(), 1);
  }

  void cancellingClosesTheSaveScreenOnTheMainQueue() {
    test::AppHarness harness(true);
    harness.launch();
    harness.app().showSaveView();
    QPointer<CorvaneSaveViewController> screen = harness.app().saveViewController();
    screen->cancelButton()->click();
    QVERIFY(harness.app().saveViewController());  // not yet: the close is dispatched
    harness.loop().runPending();
    QCOMPARE(harness.app().saveViewController(), nullptr);
    QCOMPARE(harness.app().navigationController()->modalViewController(), nullptr);
    QTRY_VERIFY(screen.isNull());
    // And it opens again.
    harness.app().showSaveView();
    QVERIFY(harness.app().saveViewController());
  }

  void aFailedSaveLeavesTheAlertOverTheStackAndStillClosesTheScreen() {
    log::ScopedCapture log;
    test::AppHarness harness(true);  // the marker, but no snapshot directory
    harness.launch();
    harness.app().showSaveView();
    harness.app().saveViewController()->saveButton()->click();
    harness.loop().runPending();

    QCOMPARE(harness.app().saveViewController(), nullptr);
    const auto alerts = harness.app().window()->findChildren<QMessageBox*>();
    QCOMPARE(alerts.size(), 1);
    QVERIFY(alerts[0]->isVisible());
    QCOMPARE(alerts[0]->windowTitle(), QStringLiteral("File Error"));
    const std::string file = (harness.root() / "var/log/corvane/snapshots").string() + "/CorvaneSnapshot-1794816000.corvane";
    QCOMPARE(log.sink().count("Unable to write snapshot to " + file), std::size_t{1});
  }

  void theSaveScreenListsTheModelsSaveContents() {
    test::AppHarness harness(true);
    harness.launch();
    harness.send(servingCell("62", true));
    harness.tick();
    harness.send(servingCell("63", true));
    harness.tick();
    harness.app().showSaveView();
    CorvaneSaveViewController* screen = harness.app().saveViewController();
    QCOMPARE(screen->saveContentTable()->numberOfRows(), 2);
    const QString description = screen->saveContentTable()->cellForRowAtIndexPath(IndexPath{0, 0})->textLabel()->text();
    QCOMPARE(description, QStringLiteral("Snapshot (2026-11-16 08:00:00 +0000)"));
  }
};

}  // namespace corvane

QTEST_MAIN(corvane::CorvaneAppTest)
#include "CorvaneAppTest.moc"
