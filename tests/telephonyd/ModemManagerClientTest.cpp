// The ModemManager client itself, in this process, on a Qt run loop: what it
// reads of the mock ModemManager (mock_modemmanager.py) on a private bus, when
// it tells the run loop, and how it follows ModemManager and the modem coming
// and going. Each test is a process of its own under ctest, so each meets a
// fresh system-bus connection.

#include "telephonyd/ModemManagerClient.h"

#include <gtest/gtest.h>
#include <stdlib.h>

#include <QCoreApplication>

#include <algorithm>
#include <chrono>
#include <optional>
#include <set>
#include <string>
#include <thread>
#include <variant>
#include <vector>

#include "MockModemManager.h"
#include "platform/Log.h"
#include "platform/QtRunLoop.h"

namespace corvane::telephonyd {
namespace {

using namespace std::chrono_literals;
using Part = ModemClient::Part;

const std::string kModemPath = "/org/freedesktop/ModemManager1/Modem/0";

QCoreApplication& application() {
  static int argc = 1;
  static char name[] = "corvane_modemmanager_client_tests";
  static char* argv[] = {name, nullptr};
  static QCoreApplication app(argc, argv);
  return app;
}

class ModemManagerClientTest : public ::testing::Test {
 protected:
  void SetUp() override {
    if (const std::string why = test::MockModemManagerBus::missing(); !why.empty()) GTEST_SKIP() << why;
    bus_.emplace(files_.path());
    ASSERT_TRUE(bus_->ready()) << bus_->busLog();
    ::setenv("DBUS_SYSTEM_BUS_ADDRESS", bus_->address().c_str(), 1);
  }
  void TearDown() override {
    client_.reset();
    ::unsetenv("DBUS_SYSTEM_BUS_ADDRESS");
  }

  void startClient(ModemManagerClient::Settings settings = {}) {
    client_.emplace(loop_, std::move(settings));
    client_->setChangeHandler([this](Part part) {
      told_.push_back(part);
      toldOnLoopThread_ = toldOnLoopThread_ && std::this_thread::get_id() == loopThread_;
    });
  }
  // Runs the run loop until `done` holds, for up to `limit`.
  bool runUntil(const std::function<bool()>& done, std::chrono::milliseconds limit = 5000ms) {
    return test::waitUntil(done, limit, [] { QCoreApplication::processEvents(QEventLoop::AllEvents, 10); });
  }
  bool toldOf(Part part) const { return std::find(told_.begin(), told_.end(), part) != told_.end(); }
  std::size_t linesSaying(const std::string& text) const {
    const std::vector<std::string> texts = log_.texts();
    return static_cast<std::size_t>(std::count_if(texts.begin(), texts.end(), [&](const std::string& line) {
      return line.find(text) != std::string::npos;
    }));
  }
  std::string logText() const {
    std::string all;
    for (const std::string& line : log_.texts()) all += line + "\n";
    return all;
  }

  QCoreApplication& application_ = application();  // before the run loop, which needs it
  log::ScopedCapture log_;
  test::TemporaryDirectory files_;
  std::optional<test::MockModemManagerBus> bus_;
  QtRunLoop loop_;
  std::thread::id loopThread_ = std::this_thread::get_id();
  std::optional<ModemManagerClient> client_;
  std::vector<Part> told_;
  bool toldOnLoopThread_ = true;
};

template <typename T>
std::optional<T> fieldAs(const modem::Fields& fields, const std::string& key) {
  const auto found = fields.find(key);
  if (found == fields.end() || !std::holds_alternative<T>(found->second)) return std::nullopt;
  return std::get<T>(found->second);
}

TEST_F(ModemManagerClientTest, ReadsTheSimAndTheContextsAndTellsTheRunLoop) {
  bus_->startModemManager(R"({"cells": "lte"})");
  startClient();
  // The profiles and the bearers are listed apart: the contexts are told as each list comes.
  ASSERT_TRUE(runUntil([&] { return client_->sim() && client_->contexts() && !client_->contexts()->bearers.empty(); }))
      << logText();

  const modem::SimState sim = *client_->sim();
  EXPECT_EQ(sim.iccid, "89490200001234567890");
  EXPECT_EQ(sim.ownNumbers, std::vector<std::string>{"+491701234567"});
  EXPECT_EQ(sim.operatorIdentifier, "26201");
  const std::vector<modem::PreferredNetwork> preferred{
      {"26201", modem::kAccessLte | modem::kAccessUmts | modem::kAccessGsm}, {"23410", modem::kAccessGsm}};
  EXPECT_EQ(sim.preferredNetworks, preferred);

  const ModemClient::Contexts contexts = *client_->contexts();
  const std::vector<modem::Profile> profiles{{1, "internet", modem::kIpFamilyIpv4v6}, {2, "ims", modem::kIpFamilyIpv6}};
  EXPECT_EQ(contexts.profiles, profiles);
  ASSERT_EQ(contexts.bearers.size(), 1u);
  const modem::Bearer& bearer = contexts.bearers[0];
  EXPECT_EQ(bearer.profileId, 1);
  EXPECT_EQ(bearer.apn, "internet");
  EXPECT_EQ(bearer.ipType, modem::kIpFamilyIpv4v6);
  EXPECT_TRUE(bearer.connected);
  EXPECT_EQ(bearer.interface, "wwan0");
  EXPECT_EQ(bearer.ipv4Address, "10.64.12.7");
  EXPECT_EQ(bearer.ipv4Prefix, 30);
  EXPECT_EQ(bearer.ipv6Address, "2001:db8:7::2");
  EXPECT_EQ(bearer.ipv6Prefix, 64);

  EXPECT_TRUE(toldOf(Part::Sim));
  EXPECT_TRUE(toldOf(Part::Contexts));
  EXPECT_TRUE(toldOnLoopThread_);
  EXPECT_EQ(linesSaying("Using the modem " + kModemPath + " (356938035643809, connected)"), 1u) << logText();
}

TEST_F(ModemManagerClientTest, ReadsTheCellsOnlyWhenAskedAndKeepsTheirFieldsAsTheyCame) {
  bus_->startModemManager(R"({"cells": "lte"})");
  startClient();
  ASSERT_TRUE(runUntil([&] { return client_->sim().has_value(); })) << logText();
  // The cells are not watched: nothing until they are asked for.
  runUntil([] { return false; }, 300ms);
  EXPECT_FALSE(client_->cells().has_value());
  EXPECT_FALSE(toldOf(Part::Cells));

  client_->refresh(Part::Cells);
  ASSERT_TRUE(runUntil([&] { return client_->cells().has_value(); })) << logText();
  EXPECT_TRUE(toldOf(Part::Cells));
  const std::vector<modem::Fields> cells = *client_->cells();
  ASSERT_EQ(cells.size(), 3u);
  // Texts, numbers and truth values, each of its own kind.
  EXPECT_EQ(fieldAs<std::uint64_t>(cells[0], "cell-type"), static_cast<std::uint64_t>(modem::CellType::Lte));
  EXPECT_EQ(fieldAs<bool>(cells[0], "serving"), true);
  EXPECT_EQ(fieldAs<std::string>(cells[0], "tac"), "5A0F");
  EXPECT_EQ(fieldAs<std::uint64_t>(cells[0], "earfcn"), 1300u);
  EXPECT_EQ(fieldAs<double>(cells[0], "rsrp"), -94.5);
  // A neighbour says less, and nothing is made up for it.
  EXPECT_EQ(fieldAs<bool>(cells[1], "serving"), false);
  EXPECT_EQ(fieldAs<std::string>(cells[1], "physical-ci"), "7B");
  EXPECT_EQ(cells[1].count("tac"), 0u);
  EXPECT_EQ(cells[1].count("operator-id"), 0u);

  // Each request reads them again, and says so even when nothing changed.
  told_.clear();
  client_->refresh(Part::Cells);
  EXPECT_TRUE(runUntil([&] { return toldOf(Part::Cells); }));
  EXPECT_TRUE(toldOnLoopThread_);
}

TEST_F(ModemManagerClientTest, TheModemGoingEmptiesEveryPartAndItsReturnFillsThemAgain) {
  bus_->startModemManager(R"({"cells": "lte"})");
  startClient();
  ASSERT_TRUE(runUntil([&] { return client_->sim() && client_->contexts(); })) << logText();
  client_->refresh(Part::Cells);
  ASSERT_TRUE(runUntil([&] { return client_->cells().has_value(); })) << logText();

  told_.clear();
  ASSERT_EQ(bus_->control("remove-modem").exitCode, 0);
  ASSERT_TRUE(runUntil([&] { return !client_->sim() && !client_->contexts() && !client_->cells(); })) << logText();
  // Every part is told gone.
  EXPECT_TRUE(runUntil([&] { return toldOf(Part::Sim) && toldOf(Part::Cells) && toldOf(Part::Contexts); }));
  EXPECT_EQ(linesSaying("The modem " + kModemPath + " has gone"), 1u) << logText();
  EXPECT_TRUE(runUntil([&] { return linesSaying("ModemManager knows no modem") == 1; })) << logText();
  // Asking while there is no modem reads nothing.
  client_->refresh(Part::Cells);
  runUntil([] { return false; }, 300ms);
  EXPECT_FALSE(client_->cells().has_value());

  ASSERT_EQ(bus_->control("add-modem").exitCode, 0);
  ASSERT_TRUE(runUntil([&] { return client_->sim() && client_->contexts(); })) << logText();
  EXPECT_EQ(client_->sim()->iccid, "89490200001234567890");
  EXPECT_EQ(linesSaying("Using the modem " + kModemPath), 2u) << logText();
}

TEST_F(ModemManagerClientTest, WithoutModemManagerItSaysSoOnceAndPicksItUpWhenItStarts) {
  startClient();
  ASSERT_TRUE(runUntil([&] { return linesSaying("ModemManager is not running") == 1; })) << logText();
  runUntil([] { return false; }, 500ms);
  EXPECT_FALSE(client_->sim().has_value());
  EXPECT_TRUE(told_.empty());

  bus_->startModemManager(R"({"cells": "lte"})");
  ASSERT_TRUE(runUntil([&] { return client_->sim().has_value(); }, 10000ms)) << logText();
  EXPECT_TRUE(toldOf(Part::Sim));
  EXPECT_EQ(linesSaying("ModemManager is not running"), 1u) << logText();
}

TEST_F(ModemManagerClientTest, AModemNamedByItsImeiIsUsedAndOneThatIsNotThereIsSaidOnce) {
  bus_->startModemManager(R"({"cells": "lte"})");
  startClient({"356938035643809", ""});
  ASSERT_TRUE(runUntil([&] { return client_->sim().has_value(); })) << logText();
  client_.reset();

  startClient({"490154203237518", ""});
  ASSERT_TRUE(runUntil([&] { return linesSaying("490154203237518") > 0; })) << logText();
  runUntil([] { return false; }, 500ms);
  EXPECT_FALSE(client_->sim().has_value());
  EXPECT_FALSE(client_->contexts().has_value());
  EXPECT_EQ(linesSaying("490154203237518"), 1u) << logText();
}

TEST_F(ModemManagerClientTest, AnUnreachableBusIsSaidOnceAndTheClientStillEndsAtOnce) {
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", ("unix:path=" + files_.path() + "/no-bus").c_str(), 1);
  startClient();
  ASSERT_TRUE(runUntil([&] { return linesSaying("Cannot reach the system D-Bus") == 1; })) << logText();
  // The bus is tried again every two seconds; the same trouble is not said again.
  runUntil([] { return false; }, 2500ms);
  EXPECT_EQ(linesSaying("Cannot reach the system D-Bus"), 1u) << logText();
  EXPECT_FALSE(client_->sim().has_value());
  const auto before = std::chrono::steady_clock::now();
  client_.reset();
  EXPECT_LT(std::chrono::steady_clock::now() - before, 1s);
}

}  // namespace
}  // namespace corvane::telephonyd
