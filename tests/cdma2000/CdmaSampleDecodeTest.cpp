// corvane-decode on the sample CDMA2000 session (tools/samples/cdma-session.hex,
// the simulator's Quendra_CDMA scenario through a call and into an EV-DO data
// session): every row of the template holds a decoded value, and the rows
// that show the same thing agree.

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
const std::string kSample = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/cdma-session.hex";

class CdmaSampleDecode : public ::testing::Test {
 protected:
  void SetUp() override {
    const auto r = test::runProcess({kDecode, "--technology", "Quendra_CDMA", "--format", "json", kSample});
    ASSERT_EQ(r.exitCode, 0) << r.err;
    // Every packet of the sample is read by a decoder.
    EXPECT_EQ(r.err.find("no section reads"), std::string::npos) << r.err;
    tree_ = Json::parse(r.out);
  }

  std::map<std::string, std::string> rows(const std::string& name) const {
    const Json* node = test::findJsonNode(tree_, name);
    return node ? test::jsonRowsOf(*node) : std::map<std::string, std::string>{};
  }
  std::vector<std::string> pilotNames(const std::string& name) const {
    std::vector<std::string> names;
    const Json* node = test::findJsonNode(tree_, name);
    if (node) {
      for (const Json& child : node->value("children", Json::array())) names.push_back(child["name"]);
    }
    return names;
  }

  Json tree_;
};

TEST_F(CdmaSampleDecode, EveryRowOfTheTemplateIsFilled) {
  std::vector<std::pair<std::string, std::string>> values;
  test::collectJsonValues(tree_, "", values);
  EXPECT_GE(values.size(), 38u);
  for (const auto& [path, value] : values) EXPECT_NE(value, "") << path;
  for (const char* list : {"Active Set (Ec/Io)", "Active Set Pilots", "Finger C/I"}) {
    EXPECT_FALSE(pilotNames(list).empty()) << list;
  }
}

TEST_F(CdmaSampleDecode, TheSessionEndsInEvdoAfterACallAndTheRowsAgree) {
  const auto summary = rows("Summary");
  const auto identity = rows("System Identity");
  const auto evdo = rows("EV-DO");
  EXPECT_EQ(summary.at("EV-DO State"), "Connected [5]");
  EXPECT_EQ(summary.at("1x State"), "Paging [6]");
  EXPECT_EQ(summary.at("SID"), identity.at("SID"));
  EXPECT_EQ(summary.at("NID"), identity.at("NID"));
  // The call is over: its frame-error rate shows as old.
  EXPECT_NE(summary.at("1x Traffic FER").find("% (old)"), std::string::npos);
  EXPECT_NE(summary.at("Forward Link Rate"), "0.00 kbps");
  EXPECT_NE(summary.at("Reverse Link Rate"), "0.00 kbps");
  // The serving pilot leads the EV-DO active set and is the 1x reference pilot.
  const std::string pn = evdo.at("Serving PN Offset").substr(0, evdo.at("Serving PN Offset").find(' '));
  ASSERT_FALSE(pilotNames("Active Set Pilots").empty());
  EXPECT_EQ(pilotNames("Active Set Pilots").front(), pn);
  const auto oneXSet = rows("Active Set (Ec/Io)");
  ASSERT_TRUE(oneXSet.count(pn));
  EXPECT_EQ(oneXSet.at(pn).rfind("(ref pilot) ", 0), 0u);
}

}  // namespace
}  // namespace corvane
