// The real model against the real corvane-telephonyd process, over real
// sockets. Time in the model runs on a virtual clock (so the 5 s retry costs
// nothing); packets travel in real time.

#include <gtest/gtest.h>

#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <functional>
#include <thread>

#include "model/CorvaneModel.h"
#include "platform/Log.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"
#include "platform/Uuid.h"
#include "platform/VirtualRunLoop.h"
#include "support/Process.h"

namespace corvane {
namespace {

using namespace std::chrono_literals;

const std::string kService = CORVANE_TELEPHONYD_BINARY;

class CountingDelegate final : public CorvaneModelDelegate {
 public:
  void updateViewControllerFromModel() override { ++updates_; }
  int updates_ = 0;
};

class ServiceAndModel : public ::testing::Test {
 protected:
  ServiceAndModel()
      : ports_(dir_.path()),
        telephony_(ports_),
        model_(CorvaneModelEnvironment{loop_, ports_, telephony_, &makeUUIDText}, &delegate_) {}

  ~ServiceAndModel() override {
    if (service_ > 0) test::stopProcess(service_, SIGTERM);
  }

  void startService() {
    service_ = test::startProcess({kService, "--seed", "3", "--rate", "100"}, {"CORVANE_RUNTIME_DIR=" + dir_.path()},
                                  dir_.path() + "/service.log");
    ASSERT_TRUE(waitFor([&] { return std::filesystem::exists(dir_.path() + "/corvane-telephonyd.sock"); }));
  }

  // Lets real packets arrive while the virtual clock moves on, until the condition holds.
  bool waitFor(const std::function<bool()>& condition, std::chrono::seconds limit = 20s) {
    const auto deadline = std::chrono::steady_clock::now() + limit;
    while (std::chrono::steady_clock::now() < deadline) {
      if (condition()) return true;
      loop_.pollWatches();
      loop_.advanceBy(100ms);
      std::this_thread::sleep_for(5ms);
    }
    return condition();
  }

  std::string valueAt(const std::string& path) {
    NodeRef node = model_.nodeAtPath(path);
    return node && node->value() ? *node->value() : std::string();
  }

  std::size_t historySize() const {
    const Value* h = model_.state().find("History");
    return h && h->isArray() ? h->asArray()->size() : 0;
  }

  log::ScopedCapture log_;
  test::TemporaryDirectory dir_;
  VirtualRunLoop loop_;
  SocketPortSystem ports_;
  SocketTelephonyClient telephony_;
  CountingDelegate delegate_;
  CorvaneModel model_;
  int service_ = -1;
};

TEST_F(ServiceAndModel, TheTreeAppearsSurvivesTheServiceDyingAndComesBackWithItsHistory) {
  startService();
  model_.startMonitor();
  ASSERT_TRUE(model_.isRunning()) << testing::PrintToString(log_.texts());

  ASSERT_TRUE(waitFor([&] { return delegate_.updates_ > 0; }));
  EXPECT_EQ(valueAt("/Network/MCC"), "001");
  EXPECT_EQ(valueAt("/Network/Technology"), "GSM");
  EXPECT_NE(valueAt("/Serving Cell/ARFCN"), "");
  EXPECT_NE(model_.nodeAtPath("/Neighbour Cells/0"), nullptr);
  const std::size_t historyBefore = historySize();
  EXPECT_GE(historyBefore, 1u);

  // The service vanishes: the model notices on its next tick, logs, and keeps retrying.
  test::stopProcess(service_, SIGKILL);
  service_ = -1;
  ASSERT_TRUE(waitFor([&] { return log_.sink().count("Could not create the ports necessary") >= 2; }));
  bool invalidated = false;
  for (const auto& line : log_.texts()) invalidated |= line.rfind(" ***** INVALIDATED ", 0) == 0;
  EXPECT_TRUE(invalidated);
  EXPECT_FALSE(model_.isConnected());

  // It comes back: so does the tree, and the history from before is still there.
  const int updatesBefore = delegate_.updates_;
  startService();
  ASSERT_TRUE(waitFor([&] { return model_.isRunning() && delegate_.updates_ > updatesBefore; }));
  EXPECT_EQ(valueAt("/Network/MCC"), "001");
  EXPECT_GT(historySize(), historyBefore);
}

}  // namespace
}  // namespace corvane
