// The real application against the real corvane-telephonyd process, on the Qt
// run loop over real sockets: the tree arrives, a section opens, the save
// screen saves. Each step is also kept as a picture in the build directory
// (and in docs/screenshots when CORVANE_UPDATE_SCREENSHOTS=1).

#include <QDir>
#include <QImage>

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <fstream>
#include <iterator>

#include "AppTestSupport.h"
#include "model/SocketModelEnvironment.h"
#include "platform/PropertyList.h"

namespace corvane {

namespace {

const std::string kService = CORVANE_TELEPHONYD_BINARY;
constexpr int kWindowWidth = 400;
constexpr int kWindowHeight = 720;

// The real service in a private runtime directory, with a device root that
// allows saving; stopped again when the object dies.
class LiveService {
 public:
  explicit LiveService(const std::vector<std::string>& options) {
    std::filesystem::create_directories(devicePath(kSaveEnablingMarkerPath, root_));
    std::filesystem::create_directories(devicePath(kSnapshotDirectoryPath, root_));
    ::setenv("CORVANE_RUNTIME_DIR", runtime_.c_str(), 1);
    platform_ = SocketModelEnvironment::create(error_);
    std::vector<std::string> argv{kService};
    argv.insert(argv.end(), options.begin(), options.end());
    pid_ = test::startProcess(argv, {"CORVANE_RUNTIME_DIR=" + runtime_}, directory_.path() + "/service.log");
  }
  ~LiveService() {
    if (pid_ > 0) test::stopProcess(pid_, SIGTERM);
    ::unsetenv("CORVANE_RUNTIME_DIR");
  }
  LiveService(const LiveService&) = delete;
  LiveService& operator=(const LiveService&) = delete;

  bool listening() const { return std::filesystem::exists(runtime_ + "/corvane-telephonyd.sock"); }
  QString configDirectory() const { return QString::fromStdString(directory_.path() + "/config"); }

  test::TemporaryDirectory directory_;
  const std::string runtime_ = directory_.path() + "/run";
  const std::filesystem::path root_ = directory_.path() + "/device";
  std::string error_;
  std::unique_ptr<SocketModelEnvironment> platform_;

 private:
  int pid_ = -1;
};

// Launches the application in a window of the screenshots' size; true once it is shown.
bool launch(CorvaneApp& app) {
  app.applicationDidFinishLaunching();
  app.window()->resize(kWindowWidth, kWindowHeight);
  return QTest::qWaitForWindowExposed(app.window());
}

// Walks the application's screens as a user taps through them.
struct Screens {
  NavigationController* navigation;

  CorvanePaneController* top() const {
    return qobject_cast<CorvanePaneController*>(navigation->topViewController());
  }
  // Taps the row with the key on the top screen; false when it has none.
  bool open(const QString& key) const {
    const int row = test::rowWithKey(top(), key);
    if (row < 0) return false;
    test::tapRow(top(), row);
    return true;
  }
  // From the root screen, a group and a section in it.
  bool openSection(const QString& group, const QString& section) const {
    navigation->popToViewController(navigation->viewControllers().front(), false);
    return open(group) && (section.isEmpty() || open(section));
  }
  QString valueOf(const QString& key) const {
    const int row = test::rowWithKey(top(), key);
    return row < 0 || !test::cellAt(top(), row)->value ? QString() : test::cellAt(top(), row)->value->text();
  }
  // Every row of the top screen, key and value; a list's rows open entries and have no value.
  QString rowsText() const {
    QStringList rows;
    for (int i = 0; i < top()->tableView()->numberOfRows(); ++i) {
      const CorvaneCell* cell = test::cellAt(top(), i);
      rows << cell->key->text() + QLatin1Char('=') + (cell->value ? cell->value->text() : QString());
    }
    return rows.join(QStringLiteral(", "));
  }
  // Rows that hold values hold decoded ones: none is empty or the template's "-".
  bool decoded() const {
    if (top()->tableView()->numberOfRows() == 0) return false;
    for (int i = 0; i < top()->tableView()->numberOfRows(); ++i) {
      const CorvaneCell* cell = test::cellAt(top(), i);
      if (cell->value && (cell->value->text().isEmpty() || cell->value->text() == QLatin1String("-"))) return false;
    }
    return true;
  }
};

}  // namespace

class ScreenshotTest : public QObject {
  Q_OBJECT

 private:
  // Grabs the window and keeps the picture; true when every copy was written.
  bool keep(QWidget* window, const QString& name) {
    QCoreApplication::processEvents();
    const QImage image = window->grab().toImage();
    if (image.isNull() || image.size() != QSize(kWindowWidth, kWindowHeight)) {
      qWarning("screenshot %s is %dx%d", qPrintable(name), image.width(), image.height());
      return false;
    }
    QStringList directories{QStringLiteral(CORVANE_SCREENSHOT_BUILD_DIR)};
    if (qEnvironmentVariable("CORVANE_UPDATE_SCREENSHOTS") == QLatin1String("1")) {
      directories << QStringLiteral(CORVANE_SOURCE_DIR "/docs/screenshots");
    }
    bool written = true;
    for (const QString& directory : directories) {
      QDir().mkpath(directory);
      written &= image.save(directory + QLatin1Char('/') + name + QStringLiteral(".png"));
    }
    return written;
  }

 private slots:
  void theApplicationShowsTheServicesTreeOpensASectionAndSavesASnapshot() {
    LiveService service({"--technology", "IFX", "--seed", "7", "--rate", "50"});
    QVERIFY2(service.platform_, service.error_.c_str());
    QTRY_VERIFY_WITH_TIMEOUT(service.listening(), 10000);
    const std::filesystem::path& root = service.root_;

    Preferences preferences(service.configDirectory());
    {
      CorvaneApp app(CorvaneAppEnvironment{service.platform_->environment(), preferences, root});
      QVERIFY(launch(app));
      QWidget* window = app.window();
      NavigationController* navigation = app.navigationController();
      auto top = [&] { return qobject_cast<CorvanePaneController*>(navigation->topViewController()); };

      // The first display update: the sections of the IFX scenario.
      QTRY_VERIFY_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 3, 20000);
      QVERIFY(app.model()->isConnected());
      QVERIFY(test::statusTextOf(top()).startsWith(QStringLiteral("Updated ")));
      QVERIFY(test::indicatorOf(top())->isHidden());
      QCOMPARE(test::cellAt(top(), 0)->key->text(), QStringLiteral("Network"));
      QVERIFY(keep(window, QStringLiteral("root")));
      // The window carries the application's icon (drawn from its SVG).
      const QPixmap icon = window->windowIcon().pixmap(128, 128);
      QVERIFY(!icon.isNull());
      QVERIFY(icon.save(QStringLiteral(CORVANE_SCREENSHOT_BUILD_DIR "/icon.png")));

      test::tapRow(top(), test::rowWithKey(top(), QStringLiteral("Serving Cell")));
      QCOMPARE(top()->path(), std::string("/Serving Cell"));
      QVERIFY(test::rowWithKey(top(), QStringLiteral("ARFCN")) >= 0);
      const int rxlev = test::rowWithKey(top(), QStringLiteral("RxLev"));
      QVERIFY(rxlev >= 0);
      QVERIFY(test::cellAt(top(), rxlev)->value->text().endsWith(QStringLiteral(" dBm")));
      // It stays current: the next update reloads it in place.
      const QString firstStatus = test::statusTextOf(top());
      QTRY_VERIFY_WITH_TIMEOUT(test::statusTextOf(top()) != firstStatus, 10000);
      QCOMPARE(top()->path(), std::string("/Serving Cell"));
      QVERIFY(keep(window, QStringLiteral("serving-cell")));

      app.showSaveView();
      CorvaneSaveViewController* save = app.saveViewController();
      QVERIFY(save);
      QVERIFY(save->saveContentTable()->numberOfRows() >= 1);
      save->saveDescription()->setText(QStringLiteral("Drive test, north ring road"));
      QVERIFY(keep(window, QStringLiteral("save")));

      save->saveButton()->click();
      QTRY_VERIFY(!app.saveViewController());
      const auto files = std::filesystem::directory_iterator(devicePath(kSnapshotDirectoryPath, root));
      const auto file = std::find_if(std::filesystem::begin(files), std::filesystem::end(files), [](const auto& entry) {
        return entry.path().filename().string().rfind("CorvaneSnapshot-", 0) == 0;
      });
      QVERIFY(file != std::filesystem::end(files));
      std::ifstream in(file->path(), std::ios::binary);
      const Bytes bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
      const Value snapshot = plist::parseOrThrow(bytes);
      QVERIFY(snapshot.asDictionary() && snapshot.asDictionary()->get("Data").isArray());
      QCOMPARE(*snapshot.asDictionary()->find("Description")->asString(), std::string("Drive test, north ring road"));
    }
  }

  // Every LTE screen shows decoded values (no template placeholder left) and
  // they change from one display update to a later one.
  void theLteScenarioShowsLiveChangingValuesOnEveryLteScreen() {
    LiveService service({"--technology", "Quendra_LTE", "--seed", "3", "--rate", "10"});
    QVERIFY2(service.platform_, service.error_.c_str());
    QTRY_VERIFY_WITH_TIMEOUT(service.listening(), 10000);

    Preferences preferences(service.configDirectory());
    {
      CorvaneApp app(CorvaneAppEnvironment{service.platform_->environment(), preferences, service.root_});
      QVERIFY(launch(app));
      QWidget* window = app.window();
      NavigationController* navigation = app.navigationController();
      auto top = [&] { return qobject_cast<CorvanePaneController*>(navigation->topViewController()); };
      QTRY_VERIFY_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 4, 20000);
      QCOMPARE(test::cellAt(top(), 0)->key->text(), QStringLiteral("Serving Cell"));
      QVERIFY(keep(window, QStringLiteral("lte-root")));

      // The text of every row of the top screen, key and value.
      auto rowsOf = [&] {
        QStringList rows;
        for (int i = 0; i < top()->tableView()->numberOfRows(); ++i) {
          rows << test::cellAt(top(), i)->key->text() + QLatin1Char('=') + test::cellAt(top(), i)->value->text();
        }
        return rows;
      };
      // Rows all hold decoded values: none is empty or the template's "-".
      auto decoded = [&] {
        if (top()->tableView()->numberOfRows() == 0) return false;
        for (int i = 0; i < top()->tableView()->numberOfRows(); ++i) {
          const QString value = test::cellAt(top(), i)->value->text();
          if (value.isEmpty() || value == QLatin1String("-")) return false;
        }
        return true;
      };
      auto open = [&](const QString& key) {
        const int row = test::rowWithKey(top(), key);
        if (row < 0) return false;
        test::tapRow(top(), row);
        return true;
      };
      auto waitForUpdate = [&] {
        const QString status = test::statusTextOf(top());
        QTRY_VERIFY_WITH_TIMEOUT(test::statusTextOf(top()) != status, 10000);
      };

      struct Screen {
        QString group;
        QString section;
        const char* picture;
        bool list;
        bool moves;  // measurements: they change between updates
      };
      const Screen screens[] = {
          {QStringLiteral("Serving Cell"), QStringLiteral("Serving Cell Info"), "lte-serving-cell-info", false, false},
          {QStringLiteral("Serving Cell"), QStringLiteral("Serving Cell Measurements"), "lte-serving-cell-measurements",
           false, true},
          {QStringLiteral("Neighbours"), QStringLiteral("Connected mode LTE Intra-frequency Measurement"), nullptr,
           false, true},
          {QStringLiteral("Neighbours"), QStringLiteral("Measured Neighbor Cells"), nullptr, true, true},
          {QStringLiteral("Neighbours"), QStringLiteral("Neighbor Measurements"), nullptr, false, false},
          {QStringLiteral("Neighbours"), QStringLiteral("Neighbor Cells List"), "lte-neighbor-cells-list", true, true},
          {QStringLiteral("Reselection"), QStringLiteral("Reselection Candidates"), nullptr, false, false},
          {QStringLiteral("Reselection"), QStringLiteral("Reselection Candidates List"), "lte-reselection-candidates",
           true, false},
      };
      // "Detected Cells" lists only neighbours found but not measured, which
      // come and go; its screen opens whether or not it holds one now.
      navigation->popToViewController(navigation->viewControllers().front(), false);
      QVERIFY(open(QStringLiteral("Neighbours")));
      QVERIFY(open(QStringLiteral("Detected Cells")));
      QCOMPARE(top()->path(), std::string("/Neighbours/Detected Cells"));

      for (const Screen& screen : screens) {
        navigation->popToViewController(navigation->viewControllers().front(), false);
        QVERIFY2(open(screen.group), qPrintable(screen.group));
        QVERIFY2(open(screen.section), qPrintable(screen.section));
        // A list shows its first entry; rows show their values.
        if (screen.list) {
          QTRY_VERIFY2_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 1, qPrintable(screen.section), 10000);
          if (screen.picture) QVERIFY(keep(window, QString::fromLatin1(screen.picture) + QStringLiteral("-list")));
          QVERIFY(open(QStringLiteral("0")));
        }
        QTRY_VERIFY2_WITH_TIMEOUT(decoded(), qPrintable(screen.section + QStringLiteral(": ") +
                                                         rowsOf().join(QStringLiteral(", "))),
                                  10000);
        const QStringList before = rowsOf();
        if (screen.picture) QVERIFY(keep(window, QString::fromLatin1(screen.picture)));
        if (!screen.moves) continue;
        // Values move: within a few updates some row of this screen differs.
        bool changed = false;
        for (int i = 0; i < 5 && !changed; ++i) {
          waitForUpdate();
          changed = rowsOf() != before;
        }
        QVERIFY2(changed, qPrintable(screen.section + QStringLiteral(": ") + before.join(QStringLiteral(", "))));
      }
    }
  }

  // The GSM/UMTS phone's journey on the GSM/UMTS screens: each screen is
  // waited on until the phone is where that screen has something to show
  // (DCH for the active set and the RRC state, GSM for the serving cell and
  // its neighbours), then kept as a picture.
  void theGsmUmtsScenarioShowsTheJourneyOnTheGsmAndUmtsScreens() {
    // About 35 packets a second: some three simulated seconds for each real one.
    LiveService service({"--technology", "Quendra_GSM", "--seed", "2", "--rate", "35"});
    QVERIFY2(service.platform_, service.error_.c_str());
    QTRY_VERIFY_WITH_TIMEOUT(service.listening(), 10000);

    Preferences preferences(service.configDirectory());
    {
      CorvaneApp app(CorvaneAppEnvironment{service.platform_->environment(), preferences, service.root_});
      QVERIFY(launch(app));
      QWidget* window = app.window();
      NavigationController* navigation = app.navigationController();
      auto top = [&] { return qobject_cast<CorvanePaneController*>(navigation->topViewController()); };
      QTRY_VERIFY_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 4, 20000);
      QCOMPARE(test::cellAt(top(), 0)->key->text(), QStringLiteral("Serving Cell"));

      const Screens screens{navigation};
      // Several journeys at this pace.
      constexpr int kJourney = 60000;

      QVERIFY(screens.openSection(QStringLiteral("Serving Cell"), QStringLiteral("Serving PLMN")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded(), qPrintable(screens.rowsText()), kJourney);
      QVERIFY(screens.valueOf(QStringLiteral("Mobile Country Code")) == QLatin1String("1") ||
              screens.valueOf(QStringLiteral("Mobile Country Code")) == QLatin1String("001"));
      QVERIFY(keep(window, QStringLiteral("gsm-serving-plmn")));

      // CELL_DCH with soft handover: two or three cells in the active set.
      QVERIFY(screens.openSection(QStringLiteral("Neighbours"), QStringLiteral("Active Set")));
      QTRY_VERIFY2_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 2, qPrintable(screens.rowsText()), kJourney);
      QVERIFY(keep(window, QStringLiteral("gsm-active-set-list")));
      QVERIFY(screens.open(QStringLiteral("0")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded(), qPrintable(screens.rowsText()), 10000);
      QVERIFY(screens.valueOf(QStringLiteral("RSCP")).endsWith(QStringLiteral(" dB")));
      QVERIFY(keep(window, QStringLiteral("gsm-active-set")));

      QVERIFY(screens.openSection(QStringLiteral("Serving Cell"), QStringLiteral("UMTS RR Info")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded() && screens.valueOf(QStringLiteral("RRC State")) == QLatin1String("CELL_DCH") &&
                                    screens.valueOf(QStringLiteral("Ciphering")) == QLatin1String("Enabled"),
                                qPrintable(screens.rowsText()), kJourney);
      QVERIFY(screens.valueOf(QStringLiteral("Transmit Power")).endsWith(QStringLiteral(" dBm")));
      QVERIFY(keep(window, QStringLiteral("gsm-umts-rr-info")));

      // On GSM, on a hopping channel: every row of the serving cell filled.
      QVERIFY(screens.openSection(QStringLiteral("Serving Cell"), QStringLiteral("GSM Serving Cell")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded(), qPrintable(screens.rowsText()), kJourney);
      QVERIFY(screens.valueOf(QStringLiteral("RSSI")).endsWith(QStringLiteral(" dBm")));
      QVERIFY(keep(window, QStringLiteral("gsm-serving-cell")));

      // The neighbours of 0x5137 carry the BSICs of 0x51FF.
      QVERIFY(screens.openSection(QStringLiteral("Neighbours"), QStringLiteral("Neighboring Cells")));
      QTRY_VERIFY_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 1, kJourney);
      QVERIFY(screens.open(QStringLiteral("0")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded() && test::rowWithKey(top(), QStringLiteral("BSIC")) >= 0 &&
                                    test::rowWithKey(top(), QStringLiteral("C1 Value")) >= 0,
                                qPrintable(screens.rowsText()), kJourney);
      QVERIFY(keep(window, QStringLiteral("gsm-neighboring-cell")));
      navigation->popViewControllerAnimated(false);
      QVERIFY(top()->tableView()->numberOfRows() >= 1);
      QVERIFY(keep(window, QStringLiteral("gsm-neighboring-cells-list")));

      // Still on GSM: the radio resource layer and the cell's GPRS parameters.
      QVERIFY(screens.openSection(QStringLiteral("Radio Resource"), QStringLiteral("GSM RR Info")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded(), qPrintable(screens.rowsText()), kJourney);
      QVERIFY(screens.valueOf(QStringLiteral("DRX Used")).endsWith(QStringLiteral(" sec")));
      QVERIFY(keep(window, QStringLiteral("gsm-rr-info")));
      QVERIFY(screens.openSection(QStringLiteral("Packet Data"), QStringLiteral("GPRS Information")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded(), qPrintable(screens.rowsText()), kJourney);
      QVERIFY(keep(window, QStringLiteral("gsm-gprs-information")));

      // A call on GSM: an MM connection, and GPRS suspended meanwhile.
      QVERIFY(screens.openSection(QStringLiteral("Mobility"), QStringLiteral("Process CS")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded() && screens.valueOf(QStringLiteral("MM State")) == QLatin1String("MM_CONNECTION_ACTIVE"),
                                qPrintable(screens.rowsText()), kJourney);
      QVERIFY(keep(window, QStringLiteral("gsm-process-cs")));
      QVERIFY(screens.openSection(QStringLiteral("Mobility"), QStringLiteral("Process PS")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded() && screens.valueOf(QStringLiteral("MM Sub State")) == QLatin1String("GMM_SUSPENDED"),
                                qPrintable(screens.rowsText()), kJourney);
      QVERIFY(keep(window, QStringLiteral("gsm-process-ps")));

      // HSDPA from the last stay in CELL_DCH: its HARQ processes are list rows.
      QVERIFY(screens.openSection(QStringLiteral("Packet Data"), QStringLiteral("HSDPA Info")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.valueOf(QStringLiteral("Carrier Info")) == QLatin1String("Dual Carrier") &&
                                    test::rowWithKey(top(), QStringLiteral("Secondary HARQ Process")) >= 0,
                                qPrintable(screens.rowsText()), kJourney);
      QVERIFY(keep(window, QStringLiteral("gsm-hsdpa-info")));
      QVERIFY(screens.open(QStringLiteral("Primary HARQ Process")));
      QTRY_VERIFY2_WITH_TIMEOUT(top()->tableView()->numberOfRows() == 6, qPrintable(screens.rowsText()), 10000);
      QVERIFY(screens.open(QStringLiteral("0")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded(), qPrintable(screens.rowsText()), 10000);
      QVERIFY(keep(window, QStringLiteral("gsm-hsdpa-harq-process")));
    }
  }

  // The CDMA2000 phone's journey on its screens: the 1x screen during the
  // call, the EV-DO screen and the data rates during the data session.
  void theCdmaScenarioShowsTheCallAndTheDataSession() {
    LiveService service({"--technology", "Quendra_CDMA", "--seed", "4", "--rate", "40"});
    QVERIFY2(service.platform_, service.error_.c_str());
    QTRY_VERIFY_WITH_TIMEOUT(service.listening(), 10000);

    Preferences preferences(service.configDirectory());
    {
      CorvaneApp app(CorvaneAppEnvironment{service.platform_->environment(), preferences, service.root_});
      QVERIFY(launch(app));
      QWidget* window = app.window();
      NavigationController* navigation = app.navigationController();
      auto top = [&] { return qobject_cast<CorvanePaneController*>(navigation->topViewController()); };
      QTRY_VERIFY_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 4, 20000);
      QCOMPARE(test::cellAt(top(), 0)->key->text(), QStringLiteral("Summary"));

      const Screens screens{navigation};
      auto openGroup = [&](const QString& group) { return screens.openSection(group, QString()); };
      auto valueOf = [&](const QString& key) { return screens.valueOf(key); };
      // A whole journey at this pace, with room to spare.
      constexpr int kJourney = 60000;

      QVERIFY(openGroup(QStringLiteral("1x")));
      QTRY_VERIFY_WITH_TIMEOUT(valueOf(QStringLiteral("1x State")) == QLatin1String("Traffic [8]") &&
                                   valueOf(QStringLiteral("Tx AGC")).endsWith(QStringLiteral(" dBm")) &&
                                   valueOf(QStringLiteral("Traffic FER")).endsWith(QLatin1Char('%')) &&
                                   valueOf(QStringLiteral("Traffic FER")) != QLatin1String("0.00%"),
                               kJourney);
      QVERIFY(keep(window, QStringLiteral("cdma-1x")));

      QVERIFY(openGroup(QStringLiteral("EV-DO")));
      QTRY_VERIFY_WITH_TIMEOUT(valueOf(QStringLiteral("EV-DO State")) == QLatin1String("Connected [5]") &&
                                   valueOf(QStringLiteral("Tx AGC")).endsWith(QStringLiteral(" dBm")),
                               kJourney);
      QVERIFY(valueOf(QStringLiteral("Serving PN Offset")).endsWith(QStringLiteral("64chips")));
      QVERIFY(keep(window, QStringLiteral("cdma-evdo")));

      QVERIFY(openGroup(QStringLiteral("Data Rates")));
      QTRY_VERIFY_WITH_TIMEOUT(valueOf(QStringLiteral("Forward Link")).endsWith(QStringLiteral(" kbps")) &&
                                   valueOf(QStringLiteral("Forward Link")) != QLatin1String("0.00 kbps"),
                               kJourney);
      QVERIFY(valueOf(QStringLiteral("Reverse Link")).endsWith(QStringLiteral(" kbps")));
      QVERIFY(keep(window, QStringLiteral("cdma-data-rates")));
    }
  }

  // The UTRAN2 phone on the UTRAN screens: the RRC state once on DCH, the
  // serving cell, the neighbour cells and the CCTrCH SIR values of the
  // dedicated channels, each waited on until it shows decoded values.
  void theUtranScenarioShowsTheRrcStateTheCellsAndTheChannels() {
    // About 25 packets a second: some four simulated seconds for each real one.
    LiveService service({"--technology", "Quendra_UTRAN2", "--seed", "5", "--rate", "25"});
    QVERIFY2(service.platform_, service.error_.c_str());
    QTRY_VERIFY_WITH_TIMEOUT(service.listening(), 10000);

    Preferences preferences(service.configDirectory());
    {
      CorvaneApp app(CorvaneAppEnvironment{service.platform_->environment(), preferences, service.root_});
      QVERIFY(launch(app));
      QWidget* window = app.window();
      NavigationController* navigation = app.navigationController();
      auto top = [&] { return qobject_cast<CorvanePaneController*>(navigation->topViewController()); };
      QTRY_VERIFY_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 4, 20000);
      const Screens screens{navigation};
      // Several rounds of RRC states at this pace.
      constexpr int kJourney = 60000;

      QVERIFY(screens.openSection(QStringLiteral("Serving Cell"), QStringLiteral("RRC Info")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.valueOf(QStringLiteral("State")) == QLatin1String("Cell DCH"), qPrintable(screens.rowsText()),
                                kJourney);
      QVERIFY(keep(window, QStringLiteral("utran-rrc-info")));

      QVERIFY(screens.openSection(QStringLiteral("Serving Cell"), QStringLiteral("Serving Cell Info")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded(), qPrintable(screens.rowsText()), 10000);
      QCOMPARE(screens.valueOf(QStringLiteral("Uplink UARFCN")), screens.valueOf(QStringLiteral("Downlink UARFCN")));
      QVERIFY(keep(window, QStringLiteral("utran-serving-cell-info")));
      const QString scramblingCode = screens.valueOf(QStringLiteral("Cell Scrambling Code"));

      QVERIFY(screens.openSection(QStringLiteral("Neighbours"), QStringLiteral("Neighbor Cell List")));
      QTRY_VERIFY2_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 3, qPrintable(screens.rowsText()), 10000);
      QVERIFY(keep(window, QStringLiteral("utran-neighbor-cell-list")));
      QVERIFY(screens.open(QStringLiteral("0")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded(), qPrintable(screens.rowsText()), 10000);
      QCOMPARE(screens.valueOf(QStringLiteral("Status")), QStringLiteral("ASET"));
      QCOMPARE(screens.valueOf(QStringLiteral("Cell ID")), scramblingCode);
      QVERIFY(keep(window, QStringLiteral("utran-neighbor-cell")));

      QVERIFY(screens.openSection(QStringLiteral("Channel Quality"), QStringLiteral("CCTRCH SIR")));
      QTRY_VERIFY2_WITH_TIMEOUT(top()->tableView()->numberOfRows() >= 1, qPrintable(screens.rowsText()), kJourney);
      QVERIFY(screens.open(QStringLiteral("0")));
      QTRY_VERIFY2_WITH_TIMEOUT(screens.decoded() && test::rowWithKey(top(), QStringLiteral("SIR")) >= 0,
                                qPrintable(screens.rowsText()), 10000);
      QVERIFY(keep(window, QStringLiteral("utran-cctrch-sir")));
      QVERIFY(screens.open(QStringLiteral("SIR")));
      QTRY_VERIFY2_WITH_TIMEOUT(top()->tableView()->numberOfRows() == 6 && screens.decoded(), qPrintable(screens.rowsText()), 10000);
      QVERIFY(keep(window, QStringLiteral("utran-cctrch-sir-values")));
    }
  }
};

}  // namespace corvane

QTEST_MAIN(corvane::ScreenshotTest)
#include "ScreenshotTest.moc"
