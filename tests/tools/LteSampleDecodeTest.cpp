// corvane-decode on the sample LTE session (tools/samples/lte-session.hex, a
// few seconds of the simulator's Quendra_LTE scenario): the whole LTE tree,
// every section holding decoded values instead of the template's "-".

#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "support/JsonTree.h"
#include "support/Process.h"

namespace corvane {
namespace {

using Json = test::JsonTree;

const std::string kDecode = CORVANE_DECODE_BINARY;
const std::string kSample = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/lte-session.hex";

const Json* findNode(const Json& node, const std::string& name) { return test::findJsonNode(node, name); }
std::map<std::string, std::string> rowsOf(const Json& section) { return test::jsonRowsOf(section); }
void collectValues(const Json& node, const std::string& path, std::vector<std::pair<std::string, std::string>>& out) {
  test::collectJsonValues(node, path, out);
}

class LteSampleDecode : public ::testing::Test {
 protected:
  void SetUp() override {
    const auto r = test::runProcess({kDecode, "-q", "--technology", "Quendra_LTE", "--format", "json", kSample});
    ASSERT_EQ(r.exitCode, 0) << r.err;
    ASSERT_EQ(r.err, "");
    // The class indexes' teardown lines may follow the document on standard output.
    tree_ = Json::parse(r.out.substr(0, r.out.rfind('}') + 1));
  }

  Json tree_;
};

TEST_F(LteSampleDecode, EverySectionHoldsDecodedValues) {
  const std::vector<std::string> rowSections = {"Serving Cell Info",
                                                "Serving Cell Measurements",
                                                "Connected mode LTE Intra-frequency Measurement",
                                                "Neighbor Measurements",
                                                "Reselection Candidates",
                                                "SIM Info"};
  const std::vector<std::string> listSections = {"Measured Neighbor Cells", "Neighbor Cells List",
                                                 "Reselection Candidates List", "PDP Context Info"};
  for (const auto& name : rowSections) {
    const Json* section = findNode(tree_, name);
    ASSERT_TRUE(section) << name;
    EXPECT_GE(rowsOf(*section).size(), 3u) << name;
  }
  for (const auto& name : listSections) {
    const Json* section = findNode(tree_, name);
    ASSERT_TRUE(section) << name;
    ASSERT_TRUE(section->contains("children")) << name << " is empty";
    EXPECT_FALSE((*section)["children"].empty()) << name;
    for (const Json& row : (*section)["children"]) EXPECT_GE(rowsOf(row).size(), 2u) << name;
  }
  std::vector<std::pair<std::string, std::string>> values;
  collectValues(tree_, "", values);
  EXPECT_GT(values.size(), 100u);
  for (const auto& [path, value] : values) {
    EXPECT_NE(value, "-") << path << " kept the template's placeholder";
    EXPECT_NE(value, "") << path;
  }
}

TEST_F(LteSampleDecode, TheSectionsAgreeOnTheServingCell) {
  const auto info = rowsOf(*findNode(tree_, "Serving Cell Info"));
  const auto measurements = rowsOf(*findNode(tree_, "Serving Cell Measurements"));
  const auto intraFrequency = rowsOf(*findNode(tree_, "Connected mode LTE Intra-frequency Measurement"));
  const auto reselection = rowsOf(*findNode(tree_, "Reselection Candidates"));
  const std::string pci = info.at("Physical Cell ID");
  const std::string earfcn = info.at("Download Frequency");
  EXPECT_EQ(measurements.at("Physical Cell ID"), pci);
  EXPECT_EQ(intraFrequency.at("Serving Physical Cell ID"), pci);
  EXPECT_EQ(reselection.at("Serving Cell ID"), pci);
  EXPECT_EQ(measurements.at("E-ARFCN"), earfcn);
  EXPECT_EQ(intraFrequency.at("E-ARFCN"), earfcn);
  EXPECT_EQ(reselection.at("Serving EARFCN"), earfcn);
  EXPECT_EQ(info.at("UARFCN"), earfcn) << "the cell list's serving cell";
  EXPECT_EQ(std::stoi(info.at("Upload Frequency")), std::stoi(earfcn) + 18000);
  const double rsrp = std::stod(measurements.at("Measured RSRP"));
  EXPECT_GE(rsrp, -125.0);
  EXPECT_LE(rsrp, -70.0);
  EXPECT_EQ(measurements.at("Measured RSRP").substr(measurements.at("Measured RSRP").size() - 4), " dBm");
  // No neighbour row is the serving cell.
  for (const char* list : {"Measured Neighbor Cells", "Neighbor Cells List"}) {
    for (const Json& row : (*findNode(tree_, list))["children"]) EXPECT_NE(rowsOf(row).at("Physical Cell ID"), pci);
  }
}

}  // namespace
}  // namespace corvane
