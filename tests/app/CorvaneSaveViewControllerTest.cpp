// The snapshot save screen: its list, the file it writes (read back by the
// property-list reader and by plistutil), and a write that fails.

#include <QMessageBox>
#include <QPushButton>
#include <QStandardPaths>

#include <fstream>
#include <iterator>

#include "AppTestSupport.h"
#include "app/CorvaneSaveViewController.h"
#include "platform/DateText.h"
#include "platform/Log.h"
#include "platform/PropertyList.h"

namespace corvane {

using test::A;
using test::D;
using test::S;

namespace {

constexpr std::int64_t kOpened = 1794816000;  // 2026-11-16 08:00:00 UTC
constexpr std::int64_t kSaved = kOpened + 75;

Date at(std::int64_t seconds) { return Date{seconds * 1'000'000}; }

Value readPlist(const std::string& file) {
  std::ifstream in(file, std::ios::binary);
  const Bytes bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  return plist::parseOrThrow(bytes);
}

// The value under `key` of the dictionary in `file`.
Value savedEntry(const std::string& file, std::string_view key) {
  const Value saved = readPlist(file);
  return saved.asDictionary() ? saved.asDictionary()->get(key) : Value();
}
std::string savedText(const std::string& file, std::string_view key) {
  const Value entry = savedEntry(file, key);
  return entry.asString() ? *entry.asString() : std::string("(not a string)");
}

std::vector<std::string> keysOf(const Value& value) {
  std::vector<std::string> keys;
  if (const Dictionary* dictionary = value.asDictionary()) {
    for (const auto& [key, entry] : dictionary->entries()) keys.push_back(key);
  }
  return keys;
}

Value twoSnapshots() {
  return A({D({{"Description", S("Snapshot (2026-11-16 07:59:58 +0000)")}, {"Display", D({{"ARFCN", S("62")}})}}),
            D({{"Description", S("Snapshot (2026-11-16 08:00:00 +0000)")}, {"Display", D({{"ARFCN", S("63")}})}}),
            D({{"Description", S("DLF binary (4 bytes)")}, {"DLF", Value(Bytes{1, 2, 3, 4})}})});
}

}  // namespace

class CorvaneSaveViewControllerTest : public QObject {
  Q_OBJECT

 private:
  // A save screen over `contents`, opened at kOpened, writing into a fresh directory.
  struct Fixture {
    explicit Fixture(const Value& contents, bool directoryExists = true)
        : directory_(std::filesystem::path(temporary_.path()) / "var/log/corvane/snapshots") {
      if (directoryExists) std::filesystem::create_directories(directory_);
      setDateSourceForTesting([] { return at(kOpened); });
      screen_ = std::make_unique<CorvaneSaveViewController>(contents, host_, loop_, directory_);
      setDateSourceForTesting([] { return at(kSaved); });
    }
    ~Fixture() { setDateSourceForTesting({}); }
    std::string savedFile() const {
      return directory_.string() + "/CorvaneSnapshot-" + std::to_string(kSaved) + ".corvane";
    }

    test::TemporaryDirectory temporary_;
    std::filesystem::path directory_;
    test::FakeScreenHost host_;
    VirtualRunLoop loop_;
    std::unique_ptr<CorvaneSaveViewController> screen_;
  };

 private slots:
  void everyEntryIsListedByItsDescriptionWithACheckMark() {
    Fixture fixture(twoSnapshots());
    TableView* table = fixture.screen_->saveContentTable();
    QCOMPARE(fixture.screen_->numberOfSectionsInTableView(*table), 1);
    QCOMPARE(table->numberOfRows(), 3);
    for (int row = 0; row < 3; ++row) {
      TableViewCell* cell = table->cellForRowAtIndexPath(IndexPath{0, row});
      QCOMPARE(cell->reuseIdentifier(), QStringLiteral("SaveHistoryContentCell"));
      QCOMPARE(cell->accessoryType(), TableViewCell::AccessoryType::Checkmark);
      QCOMPARE(cell->textLabel()->font().family(), QStringLiteral("Helvetica"));
      QCOMPARE(cell->textLabel()->font().pixelSize(), 13);
    }
    QCOMPARE(table->cellForRowAtIndexPath(IndexPath{0, 2})->textLabel()->text(), QStringLiteral("DLF binary (4 bytes)"));
    // A tap changes nothing: every entry is saved.
    QTest::mouseClick(table->cellForRowAtIndexPath(IndexPath{0, 1}), Qt::LeftButton);
    QCOMPARE(table->cellForRowAtIndexPath(IndexPath{0, 1})->accessoryType(), TableViewCell::AccessoryType::Checkmark);
  }

  void theSnapshotHoldsTheTimestampOfOpeningTheContentsAndTheDescription() {
    Fixture fixture(twoSnapshots());
    fixture.screen_->saveDescription()->setText(QStringLiteral("Handover at the bridge, café"));
    fixture.screen_->saveButton()->click();

    const Value saved = readPlist(fixture.savedFile());
    QCOMPARE(keysOf(saved), (std::vector<std::string>{"Timestamp", "Data", "Description"}));
    QCOMPARE(*saved.asDictionary()->find("Timestamp")->asString(), std::string("2026-11-16 08:00:00 +0000"));
    QVERIFY(*saved.asDictionary()->find("Data") == twoSnapshots());
    QCOMPARE(*saved.asDictionary()->find("Description")->asString(), std::string("Handover at the bridge, café"));
    // Written as XML.
    std::ifstream in(fixture.savedFile());
    std::string start(5, '\0');
    in.read(start.data(), 5);
    QCOMPARE(start, std::string("<?xml"));
  }

  void theTimestampIsTheMomentOfOpeningAndTheFileNameTheMomentOfSaving() {
    Fixture fixture(twoSnapshots());
    QCOMPARE(fixture.screen_->timeStamp(), at(kOpened));
    fixture.screen_->saveButton()->click();
    QVERIFY(std::filesystem::exists(fixture.savedFile()));
    QVERIFY(!std::filesystem::exists(fixture.directory_ / ("CorvaneSnapshot-" + std::to_string(kOpened) + ".corvane")));
    QCOMPARE(savedText(fixture.savedFile(), "Timestamp"), dateText(at(kOpened)));
    QCOMPARE(fixture.screen_->snapshotFileAt(Date{1794816000'999'999}),
             fixture.directory_.string() + "/CorvaneSnapshot-1794816000.corvane");
  }

  void anEmptyHistoryListsNothingAndSavesAnEmptyDataArray() {
    Fixture fixture{Value(Array())};
    QCOMPARE(fixture.screen_->saveContentTable()->numberOfRows(), 0);
    fixture.screen_->saveButton()->click();
    const Value saved = readPlist(fixture.savedFile());
    QCOMPARE(keysOf(saved), (std::vector<std::string>{"Timestamp", "Data", "Description"}));
    QVERIFY(*saved.asDictionary()->find("Data") == Value(Array()));
  }

  void anUntouchedDescriptionSavesTheFieldsEmptyText() {
    Fixture fixture(twoSnapshots());
    fixture.screen_->saveButton()->click();
    const Value saved = readPlist(fixture.savedFile());
    const Value* description = saved.asDictionary()->find("Description");
    QVERIFY(description && description->asString());
    QCOMPARE(*description->asString(), std::string());
  }

  void withoutSaveContentsTheFileHoldsOnlyTheTimestamp() {
    Fixture fixture{Value()};
    fixture.screen_->saveDescription()->setText(QStringLiteral("dropped with the missing data"));
    fixture.screen_->saveButton()->click();
    QCOMPARE(keysOf(readPlist(fixture.savedFile())), std::vector<std::string>{"Timestamp"});
  }

  void theContentsAreACopyTakenAtOpening() {
    const Value contents = twoSnapshots();
    Fixture fixture(contents);
    contents.asArray()->clear();
    fixture.screen_->saveButton()->click();
    QVERIFY(savedEntry(fixture.savedFile(), "Data") == twoSnapshots());
  }

  void aSecondSaveInTheSameSecondReplacesTheFirst() {
    Fixture fixture(twoSnapshots());
    fixture.screen_->saveDescription()->setText(QStringLiteral("first"));
    fixture.screen_->saveButton()->click();
    fixture.screen_->saveDescription()->setText(QStringLiteral("second"));
    fixture.screen_->saveButton()->click();
    QCOMPARE(savedText(fixture.savedFile(), "Description"), std::string("second"));
    QCOMPARE(
        std::distance(std::filesystem::directory_iterator(fixture.directory_), std::filesystem::directory_iterator()),
        1);
  }

  void savingAndCancellingCloseTheScreenThroughTheMainQueue() {
    Fixture fixture(twoSnapshots());
    fixture.screen_->saveButton()->click();
    QCOMPARE(fixture.host_.closes_, 0);
    fixture.loop_.runPending();
    QCOMPARE(fixture.host_.closes_, 1);

    Fixture cancelled(twoSnapshots());
    cancelled.screen_->cancelButton()->click();
    cancelled.loop_.runPending();
    QCOMPARE(cancelled.host_.closes_, 1);
    QVERIFY(std::filesystem::is_empty(cancelled.directory_));
  }

  void aFailedWriteLogsShowsTheFileErrorAlertAndStillCloses() {
    log::ScopedCapture log;
    Fixture fixture(twoSnapshots(), false);
    fixture.screen_->saveButton()->click();

    QCOMPARE(log.lines(), (std::vector<log::Line>{{3, "Unable to write snapshot to " + fixture.savedFile()}}));
    QMessageBox* alert = nullptr;
    for (QWidget* widget : QApplication::topLevelWidgets()) {
      if (auto* box = qobject_cast<QMessageBox*>(widget); box && box->isVisible()) alert = box;
    }
    QVERIFY(alert);
    QCOMPARE(alert->windowTitle(), QStringLiteral("File Error"));
    QCOMPARE(alert->text(), QStringLiteral("Unable to write file to disk"));
    QCOMPARE(alert->buttons().size(), 1);
    QCOMPARE(alert->buttons()[0]->text(), QStringLiteral("Close"));

    fixture.loop_.runPending();
    QCOMPARE(fixture.host_.closes_, 1);
    QVERIFY(!std::filesystem::exists(fixture.savedFile()));

    QPointer<QMessageBox> closing = alert;
    alert->buttons()[0]->click();
    QTRY_VERIFY(closing.isNull());  // the button only dismisses it
  }

  void plistutilReadsTheSnapshotBack() {
    Fixture fixture(twoSnapshots());
    fixture.screen_->saveDescription()->setText(QStringLiteral("Drive test, route 7"));
    fixture.screen_->saveButton()->click();

    const QString plistutil = QStandardPaths::findExecutable(QStringLiteral("plistutil"));
    if (plistutil.isEmpty()) QFAIL("plistutil is missing (Debian package libplist-utils, see scripts/deps.sh)");
    const test::ProcessResult result =
        test::runProcess({plistutil.toStdString(), "-i", fixture.savedFile(), "-f", "xml", "-o", "-"});
    QCOMPARE(result.exitCode, 0);
    for (const char* expected : {"<key>Timestamp</key>", "<string>2026-11-16 08:00:00 +0000</string>",
                                 "<key>Data</key>", "<key>Description</key>", "<string>Drive test, route 7</string>",
                                 "<string>DLF binary (4 bytes)</string>", "<key>DLF</key>"}) {
      QVERIFY2(result.out.find(expected) != std::string::npos, expected);
    }
    // And what plistutil writes back is the same property list.
    const Value reread = plist::parseOrThrow(Bytes(result.out.begin(), result.out.end()));
    QVERIFY(reread == readPlist(fixture.savedFile()));
  }

  void returnAndTapsOnTheBackgroundOnlyPutTheKeyboardAway() {
    Fixture fixture(twoSnapshots());
    fixture.screen_->show();
    QVERIFY(QTest::qWaitForWindowExposed(fixture.screen_.get()));
    fixture.screen_->activateWindow();
    QLineEdit* field = fixture.screen_->saveDescription();
    field->setFocus();
    QTRY_VERIFY(field->hasFocus());
    QTest::keyClicks(field, QStringLiteral("kept"));
    QTest::keyClick(field, Qt::Key_Return);
    QVERIFY(!field->hasFocus());
    QCOMPARE(field->text(), QStringLiteral("kept"));
    QVERIFY(fixture.screen_->textFieldShouldReturn(field));

    field->setFocus();
    QTRY_VERIFY(field->hasFocus());
    QTest::mouseClick(fixture.screen_.get(), Qt::LeftButton, Qt::NoModifier, QPoint(5, fixture.screen_->height() - 5));
    QVERIFY(!field->hasFocus());
    QCOMPARE(fixture.host_.closes_, 0);
    QCOMPARE(fixture.loop_.timerCount() + fixture.loop_.delayedCount(), std::size_t{0});
    QVERIFY(std::filesystem::is_empty(fixture.directory_));
  }
};

}  // namespace corvane

QTEST_MAIN(corvane::CorvaneSaveViewControllerTest)
#include "CorvaneSaveViewControllerTest.moc"
