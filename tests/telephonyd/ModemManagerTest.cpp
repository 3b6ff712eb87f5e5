// corvane-telephonyd bridging the fake baseband's diagnostic port, with the
// SIM files, cell list and PDP contexts from a mock ModemManager
// (mock_modemmanager.py) on a private bus of the test's own, read back
// through corvane-monitor as a user sees them.

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <optional>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "MockModemManager.h"
#include "support/FakeBaseband.h"
#include "support/JsonTree.h"
#include "support/Process.h"

namespace corvane {
namespace {

using namespace std::chrono_literals;
using test::Background;
using test::fileText;
using test::waitUntil;

const std::string kService = CORVANE_TELEPHONYD_BINARY;
const std::string kMonitor = CORVANE_MONITOR_BINARY;

class ModemManagerTest : public ::testing::Test {
 protected:
  void SetUp() override {
    if (const std::string why = test::MockModemManagerBus::missing(); !why.empty()) GTEST_SKIP() << why;
    bus_.emplace(files_.path());
    ASSERT_TRUE(bus_->ready()) << bus_->busLog();
    std::filesystem::create_directory(runtime());
    std::filesystem::permissions(runtime(), std::filesystem::perms::owner_all);
  }

  std::string runtime() const { return files_.path() + "/runtime"; }
  std::vector<std::string> environment() const { return {bus_->systemBusVariable(), "CORVANE_RUNTIME_DIR=" + runtime()}; }

  void startModemManager(const std::string& parameters = "{}") { bus_->startModemManager(parameters); }
  void control(const std::string& command) {
    const auto result = bus_->control(command);
    ASSERT_EQ(result.exitCode, 0) << result.err;
  }

  void startService(const test::FakeBaseband& baseband) {
    service_ = Background({kService, "--diag", baseband.link(), "--technology", "Quendra_LTE", "--log-stderr"},
                          environment(), serviceLog());
    ASSERT_TRUE(waitUntil([&] { return std::filesystem::exists(runtime() + "/corvane-telephonyd.sock"); }, 5000ms))
        << fileText(serviceLog());
  }
  std::string serviceLog() const { return files_.path() + "/service.log"; }

  // corvane-monitor in the background; its display trees, one JSON document a line.
  void startMonitor() {
    monitor_ = Background({kMonitor, "--format", "json"}, environment(), monitorOutput());
  }
  std::string monitorOutput() const { return files_.path() + "/monitor.json"; }

  // The section in the latest display tree; null until there is one.
  test::JsonTree latestSection(const std::string& section) const {
    std::istringstream lines(fileText(monitorOutput()));
    std::string line;
    std::string last;
    while (std::getline(lines, line)) {
      if (!line.empty() && line.front() == '{') last = line;
    }
    const test::JsonTree tree = test::JsonTree::parse(last, nullptr, false);
    if (tree.is_discarded()) return nullptr;
    const test::JsonTree* node = test::findJsonNode(tree, section);
    return node ? *node : test::JsonTree(nullptr);
  }
  // The rows of the section in the latest display tree.
  std::map<std::string, std::string> rows(const std::string& section) const {
    const test::JsonTree node = latestSection(section);
    return node.is_null() ? std::map<std::string, std::string>{} : test::jsonRowsOf(node);
  }
  // Every value below the section in the latest tree, a line "path=value" each.
  std::string valuesBelow(const std::string& section) const {
    const test::JsonTree node = latestSection(section);
    std::vector<std::pair<std::string, std::string>> values;
    if (!node.is_null()) test::collectJsonValues(node, "", values);
    std::string out;
    for (const auto& [path, value] : values) out += path + "=" + value + "\n";
    return out;
  }
  bool waitForRow(const std::string& section, const std::string& row, const std::string& value,
                  std::chrono::milliseconds limit = 6000ms) const {
    return waitUntil([&] { return rows(section)[row] == value; }, limit);
  }

  test::TemporaryDirectory files_;
  std::optional<test::MockModemManagerBus> bus_;
  Background service_;
  Background monitor_;
};

TEST_F(ModemManagerTest, SimLteCellsAndConnectedBearerFillTheirScreens) {
  startModemManager(R"({"cells": "lte"})");
  test::FakeBaseband baseband(files_.path(), {"--silent"});
  startService(baseband);
  startMonitor();

  ASSERT_TRUE(waitForRow("SIM Info", "EF-ICCID", "89490200001234567890"))
      << valuesBelow("SIM Info") << fileText(serviceLog());
  const auto sim = rows("SIM Info");
  EXPECT_EQ(sim.at("EF-MSISDN"), "+491701234567");
  EXPECT_EQ(sim.at("EF-ACTING HPLMN"), "62F210");
  EXPECT_EQ(sim.at("EF-OPLMNAcT"), "62F210C080" "32F4010080");
  // What ModemManager cannot tell is not sent: those rows keep the screen's "-".
  EXPECT_EQ(sim.at("EF-LOCI"), "-");
  EXPECT_EQ(sim.at("EF-FPLMN"), "-");

  ASSERT_TRUE(waitForRow("Serving Cell Info", "Physical Cell ID", "301")) << valuesBelow("Serving Cell Info");
  const auto cell = rows("Serving Cell Info");
  EXPECT_EQ(cell.at("Tracking Area Code"), "23055");
  EXPECT_EQ(cell.at("Cell Identity"), "27447299");
  EXPECT_EQ(cell.at("Freq Band Indicator"), "3");
  EXPECT_EQ(cell.at("UARFCN"), "1300");

  ASSERT_TRUE(waitUntil([&] { return valuesBelow("PDP Context Info").find("10.64.12.7") != std::string::npos; },
                        6000ms))
      << valuesBelow("PDP Context Info");
  const std::string contexts = valuesBelow("PDP Context Info");
  EXPECT_NE(contexts.find("=internet\n"), std::string::npos) << contexts;
  EXPECT_NE(contexts.find("=ims\n"), std::string::npos) << contexts;
  EXPECT_NE(contexts.find("=10.64.12.7, 2001:db8:7::2\n"), std::string::npos) << contexts;
  EXPECT_NE(contexts.find("=IPv4v6\n"), std::string::npos) << contexts;
  EXPECT_NE(contexts.find("=Yes\n"), std::string::npos) << contexts;
  EXPECT_EQ(service_.stop(), 0) << fileText(serviceLog());
  EXPECT_NE(fileText(serviceLog()).find("Using the modem /org/freedesktop/ModemManager1/Modem/0 (356938035643809"),
            std::string::npos)
      << fileText(serviceLog());
}

TEST_F(ModemManagerTest, TheModemVanishingIsSaidAndItsCodesComeBackWithIt) {
  startModemManager(R"({"cells": "lte"})");
  test::FakeBaseband baseband(files_.path(), {"--silent"});
  startService(baseband);
  ASSERT_TRUE(waitUntil([&] { return fileText(serviceLog()).find("Using the modem") != std::string::npos; }, 5000ms))
      << fileText(serviceLog());
  control("remove-modem");
  ASSERT_TRUE(waitUntil([&] { return fileText(serviceLog()).find("has gone") != std::string::npos; }, 5000ms))
      << fileText(serviceLog());
  EXPECT_TRUE(waitUntil([&] { return fileText(serviceLog()).find("ModemManager knows no modem") != std::string::npos; },
                        5000ms))
      << fileText(serviceLog());
  // A monitor that starts now gets no SIM files, cells or contexts while there is no modem.
  startMonitor();
  std::this_thread::sleep_for(1500ms);
  EXPECT_EQ(fileText(monitorOutput()).find("89490200001234567890"), std::string::npos);
  EXPECT_EQ(fileText(monitorOutput()).find("10.64.12.7"), std::string::npos);
  control("add-modem");
  EXPECT_TRUE(waitForRow("Serving Cell Info", "Physical Cell ID", "301")) << fileText(serviceLog());
  EXPECT_TRUE(waitForRow("SIM Info", "EF-ICCID", "89490200001234567890", 12000ms)) << fileText(serviceLog());
}

TEST_F(ModemManagerTest, ModemManagerStartingAfterTheServiceIsPickedUp) {
  test::FakeBaseband baseband(files_.path(), {"--silent"});
  startService(baseband);
  ASSERT_TRUE(waitUntil([&] { return fileText(serviceLog()).find("ModemManager is not running") != std::string::npos; },
                        5000ms))
      << fileText(serviceLog());
  startMonitor();
  std::this_thread::sleep_for(1500ms);
  EXPECT_EQ(fileText(monitorOutput()).find("89490200001234567890"), std::string::npos);
  startModemManager(R"({"cells": "lte"})");
  EXPECT_TRUE(waitForRow("Serving Cell Info", "Physical Cell ID", "301")) << fileText(serviceLog());
  EXPECT_TRUE(waitForRow("SIM Info", "EF-ICCID", "89490200001234567890", 12000ms)) << fileText(serviceLog());
  // Said once, however long it was not running.
  const std::string log = fileText(serviceLog());
  EXPECT_EQ(log.find("ModemManager is not running"), log.rfind("ModemManager is not running")) << log;
}

TEST_F(ModemManagerTest, ACellWithMissingFieldsFillsOnlyTheRowsItHas) {
  startModemManager(R"({"cells": "partial"})");
  test::FakeBaseband baseband(files_.path(), {"--silent", "--technology", "Quendra_GSM"});
  service_ = Background({kService, "--diag", baseband.link(), "--technology", "Quendra_GSM", "--log-stderr"},
                        environment(), serviceLog());
  ASSERT_TRUE(waitUntil([&] { return std::filesystem::exists(runtime() + "/corvane-telephonyd.sock"); }, 5000ms));
  startMonitor();
  // The UMTS serving cell: its PLMN, LAC and UARFCN, nothing made up for the cell id and scrambling code it
  // lacks; the 5G NR neighbour has no cell-list technology and changes nothing.
  ASSERT_TRUE(waitForRow("Serving PLMN", "Location Area Code", "11111")) << valuesBelow("Serving PLMN");
  EXPECT_EQ(rows("Serving PLMN")["Mobile Country Code"], "262");
  EXPECT_EQ(rows("Serving PLMN")["Mobile Network Code"], "1");
  ASSERT_TRUE(waitForRow("UMTS RR Info", "UARFCN", "10836")) << valuesBelow("UMTS RR Info");
  EXPECT_EQ(rows("UMTS RR Info")["Cell ID"], "-");
  EXPECT_EQ(rows("UMTS RR Info")["Scrambling Code"], "-");
}

}  // namespace
}  // namespace corvane
