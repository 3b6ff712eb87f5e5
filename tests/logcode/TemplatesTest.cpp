// The display templates of the log-code technologies, as installed with the
// application: every section of a technology appears exactly once, and every
// section of the index finds its container of the kind it writes.

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>
#include <map>
#include <set>

#include "LogGenerator/gsm_umts/QND_GSMLogGenerator.h"
#include "LogGenerator/lte/LTELogGenerator.h"
#include "LogGenerator/utran/UTRANLogGenerator.h"
#include "platform/Log.h"
#include "platform/PropertyList.h"
#include "platform/ResourceLocator.h"

namespace corvane {
namespace {

const std::vector<std::string> kGsmSections = {
    "Active Set", "Coding Scheme", "GPRS Information", "GSM Serving Cell", "Mobile Allocation",
    "Neighboring Cells", "PDP Context Info", "Process PS", "UMTS RR Measurement", "Cell Change Counters",
    "Detected Set", "GSM Set", "Non-Ranked GSM Set", "Process CO", "Serving PLMN", "UMTS Set",
    "Equivalent PLMN List", "GSM RR Info", "Monitored Set", "Non-Ranked UMTS Set", "Process CS", "UMTS RR Info",
    "BLER", "Virtual Active Set", "SIM Info", "HSDPA Info"};
const std::vector<std::string> kLteSections = {
    "Serving Cell Info", "Connected mode LTE Intra-frequency Measurement", "Measured Neighbor Cells",
    "Detected Cells", "Serving Cell Measurements", "Neighbor Measurements", "Neighbor Cells List",
    "Reselection Candidates", "Reselection Candidates List", "SIM Info", "PDP Context Info"};
const std::vector<std::string> kUtranSections = {"RRC Info", "Serving Cell Info", "Neighbor Cell List",
                                                 "GSM Neighbor Cell List", "TRCH BLER", "CCTRCH SIR",
                                                 "PDP Context Info", "SIM Info"};

void countKeys(const Value& node, std::map<std::string, int>& counts) {
  if (const Dictionary* d = node.asDictionary()) {
    for (const auto& [key, value] : d->entries()) {
      ++counts[key];
      countKeys(value, counts);
    }
  } else if (const Array* a = node.asArray()) {
    for (const Value& element : a->elements()) countKeys(element, counts);
  }
}

bool onlyDictionariesArraysAndStrings(const Value& node) {
  if (node.isString()) return true;
  if (const Dictionary* d = node.asDictionary()) {
    for (const auto& entry : d->entries()) {
      if (!onlyDictionariesArraysAndStrings(entry.second)) return false;
    }
    return true;
  }
  if (const Array* a = node.asArray()) {
    for (const Value& element : a->elements()) {
      if (!onlyDictionariesArraysAndStrings(element)) return false;
    }
    return true;
  }
  return false;
}

Value loadTemplate(const std::string& name) {
  const auto path = resources::pathForResource(name, "plist");
  if (!path) return Value();
  std::ifstream in(*path, std::ios::binary);
  const Bytes contents((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  auto parsed = plist::parse(contents);
  return parsed ? *parsed : Value();
}

struct TechnologyTemplate {
  std::string name;
  const std::vector<std::string>* sections;
};

class Templates : public ::testing::TestWithParam<TechnologyTemplate> {};

TEST_P(Templates, HoldEverySectionNameExactlyOnceAndOnlySupportedTypes) {
  const Value root = loadTemplate(GetParam().name);
  ASSERT_TRUE(root.isDictionary()) << GetParam().name;
  EXPECT_TRUE(onlyDictionariesArraysAndStrings(root));
  std::map<std::string, int> counts;
  countKeys(root, counts);
  for (const std::string& section : *GetParam().sections) EXPECT_EQ(counts[section], 1) << section;
}

INSTANTIATE_TEST_SUITE_P(LogCodeTechnologies, Templates,
                         ::testing::Values(TechnologyTemplate{"QND_GSM", &kGsmSections},
                                           TechnologyTemplate{"LTE", &kLteSections},
                                           TechnologyTemplate{"UTRAN", &kUtranSections}),
                         [](const auto& param) { return param.param.name; });

// Sections that write a list of row dictionaries; all others write rows.
const std::set<std::string> kListSections = {
    "PDP Context Info", "Active Set", "Monitored Set", "Detected Set", "Virtual Active Set", "UMTS Set",
    "GSM Set", "Neighboring Cells", "Equivalent PLMN List", "Measured Neighbor Cells", "Detected Cells",
    "Neighbor Cells List", "Reselection Candidates List", "Neighbor Cell List", "GSM Neighbor Cell List",
    "TRCH BLER", "CCTRCH SIR", "Non-Ranked GSM Set", "Non-Ranked UMTS Set"};

TEST(Templates, EverySectionOfEachIndexGetsAContainerOfItsKind) {
  log::ScopedCapture quiet;
  for (auto technology : {std::string("Quendra_GSM"), std::string("Quendra_LTE"), std::string("Quendra_UTRAN2")}) {
    auto gen = LogGenerator::generatorFromTechnology(technology);
    auto* logCode = dynamic_cast<QNDLogGenerator2*>(gen.get());
    ASSERT_NE(logCode, nullptr);
    ASSERT_NE(logCode->classIndex(), nullptr) << technology;
    Dictionary state;
    logCode->getDisplayFromState(state);
    ASSERT_TRUE(state.contains("Display")) << technology;
    for (const std::string& name : logCode->classIndex()->sectionNames()) {
      Base* section = logCode->classIndex()->getClass(name);
      if (kListSections.count(name)) {
        EXPECT_TRUE(section->sectionArray().has_value()) << technology << ": " << name;
      } else {
        EXPECT_TRUE(section->sectionDictionary().has_value()) << technology << ": " << name;
      }
    }
  }
}

}  // namespace
}  // namespace corvane
