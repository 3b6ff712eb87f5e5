// Preferences: one settings file per domain, booleans as a shell writes them,
// and the change announcement on a session bus of the test's own.

#include <QDBusConnection>
#include <QProcess>
#include <QSignalSpy>
#include <QStandardPaths>

#include <fstream>
#include <iterator>

#include "AppTestSupport.h"
#include "platform/Log.h"

namespace corvane {

class PreferencesTest : public QObject {
  Q_OBJECT

 public slots:
  void changed(const QString& domain, const QString& key) { announcements_ << domain + QLatin1Char(' ') + key; }

 private slots:
  void initTestCase() {
    // A private bus; it must be known before the first use of the session bus.
    const QString daemon = QStandardPaths::findExecutable(QStringLiteral("dbus-daemon"));
    if (daemon.isEmpty()) QFAIL("dbus-daemon is missing (Debian package dbus-daemon, see scripts/deps.sh)");
    bus_.start(daemon, {QStringLiteral("--session"), QStringLiteral("--nofork"), QStringLiteral("--nopidfile"),
                        QStringLiteral("--print-address=1")});
    QVERIFY(bus_.waitForStarted());
    QTRY_VERIFY(bus_.canReadLine());
    address_ = QString::fromUtf8(bus_.readLine()).trimmed();
    QVERIFY(!address_.isEmpty());
    qputenv("DBUS_SESSION_BUS_ADDRESS", address_.toUtf8());
  }

  void cleanupTestCase() {
    QDBusConnection::disconnectFromBus(QStringLiteral("watcher"));
    bus_.terminate();
    bus_.waitForFinished();
  }

  void aChangeIsAnnouncedOnTheSessionBus() {
    QDBusConnection watcher = QDBusConnection::connectToBus(address_, QStringLiteral("watcher"));
    QVERIFY(watcher.isConnected());
    QVERIFY(watcher.connect(QString(), QString::fromLatin1(kPreferencesChangedPath),
                            QString::fromLatin1(kPreferencesChangedInterface),
                            QString::fromLatin1(kPreferencesChangedSignal), this, SLOT(changed(QString, QString))));

    log::ScopedCapture log;
    test::TemporaryDirectory directory;
    Preferences preferences(QString::fromStdString(directory.path()));
    preferences.SendAppPreferencesChanged(QStringLiteral("org.corvane.HomeScreen"), QStringLiteral("ZLShowGSMRSSI"));
    QTRY_COMPARE(announcements_, QStringList{QStringLiteral("org.corvane.HomeScreen ZLShowGSMRSSI")});
    QVERIFY(log.texts().empty());
  }

  void eachDomainIsOneFileAndBooleansReadAsAShellWritesThem() {
    test::TemporaryDirectory directory;
    Preferences preferences(QString::fromStdString(directory.path() + "/prefs"));
    const QString domain = QStringLiteral("org.corvane.Corvane");
    QCOMPARE(preferences.fileForDomain(domain), QString::fromStdString(directory.path() + "/prefs/org.corvane.Corvane.conf"));
    QVERIFY(!preferences.getAppBooleanValue(QStringLiteral("ZLShowGSMRSSI"), domain));  // missing: false

    std::filesystem::create_directories(directory.path() + "/prefs");
    const std::vector<std::pair<std::string, bool>> cases{
        {"true", true}, {"YES", true}, {"1", true}, {"2.5", true}, {"false", false},
        {"0", false},   {"no", false}, {"", false}, {"maybe", false}};
    for (const auto& [text, expected] : cases) {
      std::ofstream(directory.path() + "/prefs/org.corvane.Corvane.conf") << "[General]\nZLShowGSMRSSI=" << text << "\n";
      QVERIFY2(preferences.getAppBooleanValue(QStringLiteral("ZLShowGSMRSSI"), domain) == expected, text.c_str());
    }

    preferences.setAppValue(QStringLiteral("ZLShowGSMRSSI"), true, QStringLiteral("org.corvane.HomeScreen"));
    QVERIFY(preferences.synchronize(QStringLiteral("org.corvane.HomeScreen")));
    std::ifstream written(directory.path() + "/prefs/org.corvane.HomeScreen.conf");
    const std::string text((std::istreambuf_iterator<char>(written)), std::istreambuf_iterator<char>());
    QVERIFY(text.find("ZLShowGSMRSSI=true") != std::string::npos);
  }

 private:
  QProcess bus_;
  QString address_;
  QStringList announcements_;
};

}  // namespace corvane

QTEST_MAIN(corvane::PreferencesTest)
#include "PreferencesTest.moc"
