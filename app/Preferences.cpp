#include "app/Preferences.h"

#include <QDBusConnection>
#include <QDBusMessage>
#include <QDir>
#include <QStandardPaths>

#include "platform/Log.h"

namespace corvane {

Preferences::Preferences(QString directory) : directory_(std::move(directory)) {}

Preferences::~Preferences() = default;

QString Preferences::defaultDirectory() {
  return QStandardPaths::writableLocation(QStandardPaths::GenericConfigLocation) + QStringLiteral("/corvane");
}

QString Preferences::fileForDomain(const QString& domain) const {
  return QDir(directory_).filePath(domain + QStringLiteral(".conf"));
}

QSettings& Preferences::settings(const QString& domain) {
  std::unique_ptr<QSettings>& slot = settings_[domain];
  if (!slot) slot = std::make_unique<QSettings>(fileForDomain(domain), QSettings::IniFormat);
  return *slot;
}

bool Preferences::getAppBooleanValue(const QString& key, const QString& domain) {
  QSettings& domainSettings = settings(domain);
  domainSettings.sync();  // another program may have changed the file
  const QVariant value = domainSettings.value(key);
  switch (value.typeId()) {
    case QMetaType::Bool: return value.toBool();
    case QMetaType::Int:
    case QMetaType::LongLong:
    case QMetaType::Double: return value.toDouble() != 0;
    case QMetaType::QString: {
      // The file keeps no types: a boolean comes back as its text.
      const QString text = value.toString().trimmed();
      bool isNumber = false;
      const double number = text.toDouble(&isNumber);
      if (isNumber) return number != 0;
      return text.compare(QLatin1String("true"), Qt::CaseInsensitive) == 0 ||
             text.compare(QLatin1String("yes"), Qt::CaseInsensitive) == 0;
    }
    default: return false;
  }
}

void Preferences::setAppValue(const QString& key, const QVariant& value, const QString& domain) {
  settings(domain).setValue(key, value);
}

bool Preferences::synchronize(const QString& domain) {
  QDir().mkpath(directory_);
  QSettings& domainSettings = settings(domain);
  domainSettings.sync();
  if (domainSettings.status() != QSettings::NoError) {
    log::printf(log::kError, "Could not write the preferences of %s to %s", domain.toUtf8().constData(),
                fileForDomain(domain).toUtf8().constData());
    return false;
  }
  return true;
}

void Preferences::SendAppPreferencesChanged(const QString& domain, const QString& key) {
  QDBusConnection bus = QDBusConnection::sessionBus();
  if (!bus.isConnected()) {
    log::printf(log::kWarning, "No session bus: the change of %s in %s is not announced", key.toUtf8().constData(),
                domain.toUtf8().constData());
    return;
  }
  QDBusMessage signal =
      QDBusMessage::createSignal(QString::fromLatin1(kPreferencesChangedPath),
                                 QString::fromLatin1(kPreferencesChangedInterface),
                                 QString::fromLatin1(kPreferencesChangedSignal));
  signal << domain << key;
  if (!bus.send(signal)) {
    log::printf(log::kWarning, "Could not announce the change of %s in %s: %s", key.toUtf8().constData(),
                domain.toUtf8().constData(), bus.lastError().message().toUtf8().constData());
  }
}

}  // namespace corvane
