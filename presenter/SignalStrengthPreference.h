#pragma once

// The numeric signal strength in the home screen's status bar, turned on
// while the application runs. At launch the preference is read from the
// application's own domain; unless it says true there, "ZLShowGSMRSSI" is set
// to true in the home screen's domain (synchronised and announced), and set
// back to false when the application terminates.

#include <string>

namespace corvane {

// The key of the preference that asks the status bar for the signal strength as a number.
inline constexpr const char* kShowGSMRSSIKey = "ZLShowGSMRSSI";
// This application's own domain, and that of the home-screen process whose
// status bar shows the signal strength.
inline constexpr const char* kAppPreferencesDomain = "org.corvane.Corvane";
inline constexpr const char* kHomeScreenPreferencesDomain = "org.corvane.HomeScreen";

// Where preferences are kept; each front end gives one.
class PreferenceStore {
 public:
  virtual bool getAppBooleanValue(const std::string& key, const std::string& domain) = 0;
  virtual void setAppValue(const std::string& key, bool value, const std::string& domain) = 0;
  virtual bool synchronize(const std::string& domain) = 0;
  virtual void SendAppPreferencesChanged(const std::string& domain, const std::string& key) = 0;

 protected:
  ~PreferenceStore() = default;
};

class SignalStrengthPreference {
 public:
  explicit SignalStrengthPreference(PreferenceStore& store) : store_(store) {}

  void applicationDidFinishLaunching();
  void applicationWillTerminate();
  // Whether terminating sets the preference back.
  bool willUnset() const { return unsetRSSI_; }
  // Sets the home screen's preference, synchronises and announces it.
  void setGSMRSSI(bool value);

 private:

  PreferenceStore& store_;
  bool unsetRSSI_ = false;
};

}  // namespace corvane
