#pragma once

// Preferences of application domains: one settings file per domain,
// "<domain>.conf" in the Corvane folder of the user's configuration directory.
// A change meant for another program is announced on the session bus (the
// signal AppPreferencesChanged(domain, key) of org.corvane.Preferences at
// /org/corvane/Preferences), so that the program can pick it up at once.

#include <QSettings>
#include <QString>
#include <QVariant>

#include <map>
#include <memory>

#include "presenter/SignalStrengthPreference.h"

namespace corvane {

inline constexpr const char* kPreferencesChangedPath = "/org/corvane/Preferences";
inline constexpr const char* kPreferencesChangedInterface = "org.corvane.Preferences";
inline constexpr const char* kPreferencesChangedSignal = "AppPreferencesChanged";

class Preferences {
 public:
  // `directory` holds the settings files; the default is "corvane" in the
  // user's configuration directory ($XDG_CONFIG_HOME, else ~/.config).
  explicit Preferences(QString directory = defaultDirectory());
  ~Preferences();
  Preferences(const Preferences&) = delete;
  Preferences& operator=(const Preferences&) = delete;

  static QString defaultDirectory();
  QString fileForDomain(const QString& domain) const;

  // The boolean under `key`; false when it is missing or not a boolean (true,
  // yes, or a non-zero number count as true).
  bool getAppBooleanValue(const QString& key, const QString& domain);
  void setAppValue(const QString& key, const QVariant& value, const QString& domain);
  // Writes the domain's pending changes to its file; false when that failed.
  bool synchronize(const QString& domain);
  // Tells the running owner of `domain` that `key` changed. Without a session
  // bus it only logs.
  void SendAppPreferencesChanged(const QString& domain, const QString& key);

 private:
  QSettings& settings(const QString& domain);

  QString directory_;
  std::map<QString, std::unique_ptr<QSettings>> settings_;
};

// Preferences as the store the presenter layer reads and writes.
class PreferencesStore final : public PreferenceStore {
 public:
  explicit PreferencesStore(Preferences& preferences) : preferences_(preferences) {}
  bool getAppBooleanValue(const std::string& key, const std::string& domain) override {
    return preferences_.getAppBooleanValue(QString::fromStdString(key), QString::fromStdString(domain));
  }
  void setAppValue(const std::string& key, bool value, const std::string& domain) override {
    preferences_.setAppValue(QString::fromStdString(key), value, QString::fromStdString(domain));
  }
  bool synchronize(const std::string& domain) override {
    return preferences_.synchronize(QString::fromStdString(domain));
  }
  void SendAppPreferencesChanged(const std::string& domain, const std::string& key) override {
    preferences_.SendAppPreferencesChanged(QString::fromStdString(domain), QString::fromStdString(key));
  }

 private:
  Preferences& preferences_;
};

}  // namespace corvane
