// corvane-decode on the sample UTRAN session (tools/samples/utran-session.hex,
// the simulator's Quendra_UTRAN2 scenario through every RRC state to DCH):
// all eight sections hold what the records and the extra codes give them, and
// they agree.

#include <gtest/gtest.h>

#include <map>
#include <stdexcept>
#include <string>
#include <vector>

#include "support/JsonTree.h"
#include "support/Process.h"

namespace corvane {
namespace {

using Json = test::JsonTree;

const std::string kDecode = CORVANE_DECODE_BINARY;
const std::string kSample = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/utran-session.hex";

class UtranSampleDecode : public ::testing::Test {
 protected:
  void SetUp() override {
    const auto r = test::runProcess({kDecode, "-q", "--technology", "Quendra_UTRAN2", "--format", "json", kSample});
    ASSERT_EQ(r.exitCode, 0) << r.err;
    ASSERT_EQ(r.err, "");
    tree_ = Json::parse(r.out.substr(0, r.out.rfind('}') + 1));
  }

  const Json& section(const std::string& name) {
    const Json* node = test::findJsonNode(tree_, name);
    if (!node) throw std::runtime_error("no section " + name);
    return *node;
  }
  std::vector<std::map<std::string, std::string>> listRows(const std::string& name) {
    std::vector<std::map<std::string, std::string>> rows;
    for (const Json& row : section(name).value("children", Json::array())) rows.push_back(test::jsonRowsOf(row));
    return rows;
  }

  Json tree_;
};

TEST_F(UtranSampleDecode, EverySectionHoldsDecodedValues) {
  for (const std::string name : {"RRC Info", "Serving Cell Info", "SIM Info"}) {
    std::vector<std::pair<std::string, std::string>> values;
    test::collectJsonValues(section(name), "", values);
    EXPECT_FALSE(values.empty()) << name;
    for (const auto& [path, value] : values) {
      EXPECT_NE(value, "-") << path << " kept the template's placeholder";
      EXPECT_NE(value, "") << path;
    }
  }
  for (const std::string name : {"Neighbor Cell List", "TRCH BLER", "CCTRCH SIR", "PDP Context Info"}) {
    EXPECT_FALSE(listRows(name).empty()) << name;
  }
  // Its records arrive, and the list stays empty all the same.
  EXPECT_TRUE(listRows("GSM Neighbor Cell List").empty());
}

TEST_F(UtranSampleDecode, ThePhoneIsOnDchAndTheServingCellAgreesWithTheNeighbourList) {
  EXPECT_EQ(test::jsonRowsOf(section("RRC Info")).at("State"), "Cell DCH");
  const auto serving = test::jsonRowsOf(section("Serving Cell Info"));
  EXPECT_EQ(serving.at("Uplink UARFCN"), serving.at("Downlink UARFCN"));
  EXPECT_EQ(serving.at("Allowed Access"), "All Calls");
  const auto cells = listRows("Neighbor Cell List");
  ASSERT_FALSE(cells.empty());
  EXPECT_EQ(cells[0].at("Status"), "ASET");
  EXPECT_EQ(cells[0].at("UARFCN"), serving.at("Downlink UARFCN"));
  EXPECT_EQ(cells[0].at("Cell ID"), serving.at("Cell Scrambling Code"));
  EXPECT_EQ(listRows("TRCH BLER").size(), 2u);
  const Json& firstCctrch = section("CCTRCH SIR")["children"][0];
  const Json* sir = test::findJsonNode(firstCctrch, "SIR");
  ASSERT_NE(sir, nullptr);
  EXPECT_EQ((*sir)["children"].size(), 6u);
}

}  // namespace
}  // namespace corvane
