#include "presenter/SignalStrengthPreference.h"

#include <gtest/gtest.h>

#include <map>
#include <vector>

namespace corvane {
namespace {

// Records every call, in order, over a map of (domain, key) to value.
class RecordingStore final : public PreferenceStore {
 public:
  std::map<std::pair<std::string, std::string>, bool> values;
  std::vector<std::string> calls;

  bool getAppBooleanValue(const std::string& key, const std::string& domain) override {
    calls.push_back("get " + domain + " " + key);
    const auto found = values.find({domain, key});
    return found != values.end() && found->second;
  }
  void setAppValue(const std::string& key, bool value, const std::string& domain) override {
    calls.push_back("set " + domain + " " + key + (value ? " true" : " false"));
    values[{domain, key}] = value;
  }
  bool synchronize(const std::string& domain) override {
    calls.push_back("synchronize " + domain);
    return true;
  }
  void SendAppPreferencesChanged(const std::string& domain, const std::string& key) override {
    calls.push_back("changed " + domain + " " + key);
  }
};

TEST(SignalStrengthPreference, LaunchTurnsTheHomeScreensNumberOnAndTerminateTurnsItOff) {
  RecordingStore store;
  SignalStrengthPreference preference(store);
  preference.applicationDidFinishLaunching();
  EXPECT_TRUE(preference.willUnset());
  preference.applicationWillTerminate();
  EXPECT_EQ(store.calls, (std::vector<std::string>{
                             "get org.corvane.Corvane ZLShowGSMRSSI",
                             "set org.corvane.HomeScreen ZLShowGSMRSSI true",
                             "synchronize org.corvane.HomeScreen",
                             "changed org.corvane.HomeScreen ZLShowGSMRSSI",
                             "set org.corvane.HomeScreen ZLShowGSMRSSI false",
                             "synchronize org.corvane.HomeScreen",
                             "changed org.corvane.HomeScreen ZLShowGSMRSSI",
                         }));
}

TEST(SignalStrengthPreference, OwnDomainSayingTrueLeavesTheHomeScreenAlone) {
  RecordingStore store;
  store.values[{"org.corvane.Corvane", "ZLShowGSMRSSI"}] = true;
  SignalStrengthPreference preference(store);
  preference.applicationDidFinishLaunching();
  preference.applicationWillTerminate();
  EXPECT_FALSE(preference.willUnset());
  EXPECT_EQ(store.calls, std::vector<std::string>{"get org.corvane.Corvane ZLShowGSMRSSI"});
}

TEST(SignalStrengthPreference, TerminatingTwiceSetsItBackOnce) {
  RecordingStore store;
  SignalStrengthPreference preference(store);
  preference.applicationDidFinishLaunching();
  preference.applicationWillTerminate();
  const std::size_t calls = store.calls.size();
  preference.applicationWillTerminate();
  EXPECT_EQ(store.calls.size(), calls);
  EXPECT_FALSE(store.values.at({"org.corvane.HomeScreen", "ZLShowGSMRSSI"}));
}

TEST(SignalStrengthPreference, HomeScreenSayingTrueAlreadyIsStillSetAndSetBack) {
  // Only this application's own domain counts; what the home screen holds is not read.
  RecordingStore store;
  store.values[{"org.corvane.HomeScreen", "ZLShowGSMRSSI"}] = true;
  SignalStrengthPreference preference(store);
  preference.applicationDidFinishLaunching();
  preference.applicationWillTerminate();
  EXPECT_FALSE(store.values.at({"org.corvane.HomeScreen", "ZLShowGSMRSSI"}));
}

}  // namespace
}  // namespace corvane
