#include "presenter/SignalStrengthPreference.h"

namespace corvane {

void SignalStrengthPreference::setGSMRSSI(bool value) {
  store_.setAppValue(kShowGSMRSSIKey, value, kHomeScreenPreferencesDomain);
  store_.synchronize(kHomeScreenPreferencesDomain);
  store_.SendAppPreferencesChanged(kHomeScreenPreferencesDomain, kShowGSMRSSIKey);
}

void SignalStrengthPreference::applicationDidFinishLaunching() {
  // Read from this application's domain, written to the home screen's: unless
  // this application's own domain says true, the numeric display goes on at
  // every launch.
  if (!store_.getAppBooleanValue(kShowGSMRSSIKey, kAppPreferencesDomain)) {
    unsetRSSI_ = true;
    setGSMRSSI(true);
  }
}

void SignalStrengthPreference::applicationWillTerminate() {
  if (!unsetRSSI_) return;
  unsetRSSI_ = false;
  setGSMRSSI(false);
}

}  // namespace corvane
