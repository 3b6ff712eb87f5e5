// corvane-decode on the sample GSM/UMTS session
// (tools/samples/gsm-umts-session.hex, the simulator's Quendra_GSM scenario
// from UMTS to GSM and back): every section that the scenario's records feed
// holds decoded values instead of the template's "-", and they agree.

#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <stdexcept>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "support/JsonTree.h"
#include "support/Process.h"

namespace corvane {
namespace {

using Json = test::JsonTree;

const std::string kDecode = CORVANE_DECODE_BINARY;
const std::string kSample = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/gsm-umts-session.hex";

const Json* findNode(const Json& node, const std::string& name) { return test::findJsonNode(node, name); }
std::map<std::string, std::string> rowsOf(const Json& section) { return test::jsonRowsOf(section); }
void collectValues(const Json& node, const std::string& path, std::vector<std::pair<std::string, std::string>>& out) {
  test::collectJsonValues(node, path, out);
}

class GsmUmtsSampleDecode : public ::testing::Test {
 protected:
  void SetUp() override {
    const auto r = test::runProcess({kDecode, "-q", "--technology", "Quendra_GSM", "--format", "json", kSample});
    ASSERT_EQ(r.exitCode, 0) << r.err;
    ASSERT_EQ(r.err, "");
    // The class indexes' teardown lines may follow the document on standard output.
    tree_ = Json::parse(r.out.substr(0, r.out.rfind('}') + 1));
  }

  const Json& section(const std::string& name) {
    const Json* node = findNode(tree_, name);
    if (!node) throw std::runtime_error("no section " + name);
    return *node;
  }

  Json tree_;
};

TEST_F(GsmUmtsSampleDecode, EverySectionOfTheRecordsHoldsDecodedValues) {
  // "Detected Set", "Monitored Set" and "Virtual Active Set" list no cell
  // whatever their record holds; the non-ranked sets and "UMTS RR
  // Measurement" take no records.
  const std::vector<std::string> rowSections = {"Serving PLMN", "GSM Serving Cell", "UMTS RR Info", "Mobile Allocation",
                                                "BLER",         "Process CO",       "Process CS",   "Process PS",
                                                "GSM RR Info",  "GPRS Information", "HSDPA Info"};
  const std::vector<std::string> listSections = {
      "Equivalent PLMN List", "Neighboring Cells", "Active Set",           "UMTS Set",
      "GSM Set",              "Transport Channels", "ARFCNs",              "Primary HARQ Process",
      "Secondary HARQ Process"};
  for (const auto& name : rowSections) {
    std::vector<std::pair<std::string, std::string>> values;
    collectValues(section(name), "", values);
    EXPECT_GE(values.size(), 2u) << name;
    for (const auto& [path, value] : values) {
      EXPECT_NE(value, "-") << path << " kept the template's placeholder";
      EXPECT_NE(value, "") << path;
    }
  }
  for (const auto& name : listSections) {
    const Json& list = section(name);
    ASSERT_TRUE(list.contains("children")) << name << " is empty";
    EXPECT_FALSE(list["children"].empty()) << name;
  }
  for (const auto& name : {"Detected Set", "Monitored Set", "Virtual Active Set"}) {
    EXPECT_TRUE(section(name).value("children", Json::array()).empty()) << name;
  }
}

TEST_F(GsmUmtsSampleDecode, ThePhoneIsBackOnUmtsAndTheSectionsAgree) {
  const auto plmn = rowsOf(section("Serving PLMN"));
  const auto umts = rowsOf(section("UMTS RR Info"));
  const auto gsm = rowsOf(section("GSM Serving Cell"));
  // 001-01, written last by the registration record of the last second (its
  // digits, the two-digit MNC's filler a blank), after the cell list.
  EXPECT_EQ(plmn.at("Mobile Country Code"), "001");
  EXPECT_EQ(plmn.at("Mobile Network Code"), "01 ");
  EXPECT_EQ(plmn.at("Service Type"), "CS_PS_SERVICE");
  EXPECT_EQ(plmn.at("PLMN Sel Mod"), "Automatic");
  EXPECT_EQ(umts.at("RRC State"), "Disconnected");
  EXPECT_EQ(umts.at("Ciphering"), "Disabled");
  EXPECT_EQ(std::stoi(umts.at("Uplink Frequency")), std::stoi(umts.at("Downlink Frequency")) - 950);
  // The active set in idle is the serving cell.
  const Json& active = section("Active Set")["children"];
  ASSERT_EQ(active.size(), 1u);
  EXPECT_EQ(rowsOf(active[0]).at("Scrambling Code"), umts.at("Scrambling Code"));
  // The GSM serving cell is the one the phone left: its hops lie in its mobile allocation.
  std::vector<std::string> allocation;
  for (const Json& arfcn : section("ARFCNs")["children"]) allocation.push_back(arfcn["value"].get<std::string>());
  EXPECT_GE(allocation.size(), 3u);
  EXPECT_NE(std::find(allocation.begin(), allocation.end(), gsm.at("MA Dedicated ARFCN")), allocation.end());
  EXPECT_EQ(gsm.at("RSSI").substr(gsm.at("RSSI").size() - 4), " dBm");
  // Registered and idle again after the update of the last reselection;
  // the GSM rows are those of the cell the phone left.
  const auto cs = rowsOf(section("Process CS"));
  const auto ps = rowsOf(section("Process PS"));
  EXPECT_EQ(rowsOf(section("Process CO")).at("MM State"), "MM_IDLE");
  EXPECT_EQ(cs.at("MM Service State"), "REG_STATE_IDLE");
  EXPECT_EQ(cs.at("LU Reject Cause"), "UPDATED");
  EXPECT_EQ(ps.at("MM State"), "GMM_REGISTERED");
  EXPECT_EQ(ps.at("Attach Reject Cause"), "GMM_GU1_UPDATED");
  const auto rr = rowsOf(section("GSM RR Info"));
  EXPECT_EQ(rr.at("Serving Rx Level") + " dBm", gsm.at("RSSI"));
  EXPECT_EQ(rr.at("DRX Used"), rowsOf(section("GPRS Information")).at("DRX Timer Max") + " sec");
  // Dual carrier: six processes a carrier, their counts summed over the stay in DCH.
  const auto hsdpa = rowsOf(section("HSDPA Info"));
  EXPECT_EQ(hsdpa.at("Carrier Info"), "Dual Carrier");
  EXPECT_EQ(section("Primary HARQ Process")["children"].size(), 6u);
  EXPECT_EQ(section("Secondary HARQ Process")["children"].size(), 6u);
  for (const Json& row : section("Equivalent PLMN List")["children"]) {
    EXPECT_EQ(rowsOf(row).at("Mobile Country Code"), "1");
    EXPECT_EQ(rowsOf(row).at("Mobile Network Code"), "1");
  }
}

}  // namespace
}  // namespace corvane
