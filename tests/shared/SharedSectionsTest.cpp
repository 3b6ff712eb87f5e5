// The sections every log-code technology shares: SIM files, PDP contexts, and
// the two placeholders.

#include <gtest/gtest.h>

#include "LogGenerator/shared/CellChangeCounters.h"
#include "LogGenerator/shared/CodingScheme.h"
#include "LogGenerator/shared/PDPContextList.h"
#include "LogGenerator/shared/SimInfo.h"
#include "LogGenerator/gsm_umts/QND_GSMClassIndex.h"
#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "platform/Log.h"
#include "support/Packets.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::binaryBytes;
using test::D;
using test::extraCodePacket;
using test::S;

const std::vector<std::string> kSimRows = {
    "EF-ICCID", "EF-MSISDN", "EF-3GPP MAIL BOX DIALING NUMBER", "EF-HPPLMN SEARCH PERIOD", "EF-LOCI",
    "EF-GPRS/PS-LOCI", "EF-ACCESS CONTROL CLASS", "EF-ADMINISTRATIVE DATA", "EF-FPLMN", "EF-ACTING HPLMN",
    "EF-RAT MODE", "EF-PLMN NETWORK NAME", "EF-OPERATOR PLMN LIST", "EF-OPLMNAcT"};

// Made from the GSM/UMTS table, which holds all four.
template <class S>
std::shared_ptr<S> make(ClassDictionary& classDict, CodeDictionary& codeDict) {
  return std::static_pointer_cast<S>(
      Base::initWithDict(*findSection<S>(QND_GSMClassIndex::sections()), classDict, codeDict));
}

class Shared : public ::testing::Test {
 protected:
  ClassDictionary classDict_;
  CodeDictionary codeDict_;
};

TEST_F(Shared, SimInfoCopiesEveryFileUnderItsRow) {
  auto sim = make<SimInfo>(classDict_, codeDict_);
  Dictionary rows;
  sim->updateSectionRef(Value(rows));
  Dictionary payload;
  const std::vector<std::string> keys = {"kSimFile_ICCID", "kSimFile_MSISDN", "kSimFile_MBDN", "kSimFile_HPPLMN",
                                         "kSimFile_LOCI", "kSimFile_PSLOCI", "kSimFile_ACC", "kSimFile_AD",
                                         "kSimFile_FPLMN", "kSimFile_AHPLMN", "kSimFile_RATMODE", "kSimFile_PNN",
                                         "kSimFile_OPL", "kSimFile_OPLMNAcT"};
  for (std::size_t i = 0; i < keys.size(); ++i) payload.set(keys[i], S("value " + std::to_string(i)));
  sim->updateWithData(extraCodePacket(0, binaryBytes(Value(payload))), 0xFF0000);
  ASSERT_EQ(rows.size(), 14u);
  for (std::size_t i = 0; i < kSimRows.size(); ++i) {
    EXPECT_EQ(rows.entries()[i].first, kSimRows[i]);
    EXPECT_EQ(*rows.entries()[i].second.asString(), "value " + std::to_string(i));
  }
}

TEST_F(Shared, ARecordWithOnlyTheIccidLeavesTheOtherThirteenRowsAsTheyWere) {
  auto sim = make<SimInfo>(classDict_, codeDict_);
  Dictionary rows;
  for (const auto& r : kSimRows) rows.set(r, S("-"));
  sim->updateSectionRef(Value(rows));
  sim->updateWithData(extraCodePacket(0, binaryBytes(D({{"kSimFile_ICCID", S("8901260123456789012")}}))), 0xFF0000);
  EXPECT_EQ(*rows.find("EF-ICCID")->asString(), "8901260123456789012");
  for (std::size_t i = 1; i < kSimRows.size(); ++i) EXPECT_EQ(*rows.find(kSimRows[i])->asString(), "-") << kSimRows[i];
}

TEST_F(Shared, SimInfoIgnoresOtherCodesWithoutAMessage) {
  auto sim = make<SimInfo>(classDict_, codeDict_);
  Dictionary rows;
  sim->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  sim->updateWithData(extraCodePacket(1, binaryBytes(D({{"kSimFile_ICCID", S("x")}}))), 0xFF0001);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "SimInfo"}}));
}

TEST_F(Shared, AnUnparsableSimRecordIsLoggedAndThrown) {
  auto sim = make<SimInfo>(classDict_, codeDict_);
  Dictionary rows;
  sim->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  const Bytes garbage = {'n', 'o', 't', ' ', 'a', ' ', 'p', 'l', 'i', 's', 't'};
  EXPECT_THROW(sim->updateWithData(extraCodePacket(0, garbage), 0xFF0000), LogCode_0xFF0000::UnknownDataException);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "SimInfo"},
                                                     {log::kError, "SIM File dictionary data could not be constructed"}}));
  EXPECT_TRUE(rows.empty());
}

TEST_F(Shared, APdpRecordReplacesTheListWhole) {
  auto pdp = make<PDPContextList>(classDict_, codeDict_);
  Array list(std::vector<Value>{S("old")});
  pdp->updateSectionRef(Value(list));
  const Value contexts = A({D({{"APN", S("internet")}}), D({{"APN", S("ims")}})});
  pdp->updateWithData(extraCodePacket(2, binaryBytes(contexts)), 0xFF0002);
  EXPECT_EQ(Value(list), contexts);
}

TEST_F(Shared, APdpRecordHoldingADictionaryLeavesTheListAsItWas) {
  auto pdp = make<PDPContextList>(classDict_, codeDict_);
  Array list(std::vector<Value>{S("kept")});
  pdp->updateSectionRef(Value(list));
  log::ScopedCapture capture;
  pdp->updateWithData(extraCodePacket(2, binaryBytes(D({{"APN", S("internet")}}))), 0xFF0002);
  pdp->updateWithData(extraCodePacket(2, Bytes{1, 2, 3}), 0xFF0002);
  EXPECT_EQ(Value(list), A({S("kept")}));
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "PDPContextList"}, {log::kWarning, "PDPContextList"}}));
}

TEST_F(Shared, APdpRecordHoldingAnEmptyArrayEmptiesTheList) {
  auto pdp = make<PDPContextList>(classDict_, codeDict_);
  Array list(std::vector<Value>{S("old")});
  pdp->updateSectionRef(Value(list));
  pdp->updateWithData(extraCodePacket(2, binaryBytes(A({}))), 0xFF0002);
  EXPECT_TRUE(list.empty());
}

TEST_F(Shared, CodingSchemeTracesTheCountersNameForAnyRecord) {
  auto coding = make<CodingScheme>(classDict_, codeDict_);
  auto counters = make<CellChangeCounters>(classDict_, codeDict_);
  Dictionary rows = test::Dict({{"Static", S("x")}});
  coding->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  coding->updateWithData(test::logPacket(0x5134, 40), 0x5134);
  coding->updateWithData(Bytes{}, 0);
  counters->updateWithData(Bytes{}, 0);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "CellChangeCounters"},
                                                     {log::kWarning, "CellChangeCounters"},
                                                     {log::kWarning, "CellChangeCounters"}}));
  EXPECT_EQ(Value(rows), D({{"Static", S("x")}}));
}

TEST_F(Shared, PlaceholdersRegisterTheirNamesButNoCodes) {
  make<CodingScheme>(classDict_, codeDict_);
  make<CellChangeCounters>(classDict_, codeDict_);
  EXPECT_TRUE(classDict_.count("Coding Scheme"));
  EXPECT_TRUE(classDict_.count("Cell Change Counters"));
  EXPECT_EQ(codeDict_.size(), 0u);
}

TEST(ExtraCodePayloads, ACellListThatDoesNotParseIsLoggedAndHeldAsNothing) {
  log::ScopedCapture capture;
  CellInfoArray cells(extraCodePacket(1, Bytes{0xde, 0xad}));
  EXPECT_EQ(cells.array(), nullptr);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kError, "Cell Info Array data could not be constructed"}}));
}

TEST(ExtraCodePayloads, ARecordShorterThanItsHeaderHasNoPayload) {
  log::ScopedCapture capture;
  CellInfoArray cells(Bytes{0xFF, 0x01});
  EXPECT_EQ(cells.array(), nullptr);
  EXPECT_EQ(capture.texts().size(), 1u);
  EXPECT_EQ(LogCode_0xFF0002(Bytes{0xFF}).array(), nullptr);
  EXPECT_THROW(LogCode_0xFF0000(Bytes{}), LogCode_0xFF0000::UnknownDataException);
}

TEST(ExtraCodePayloads, CellNumbersReadAsSigned32BitIntegers) {
  const Dictionary cell = test::Dict({{"CellMonitorTAC", Value::integer(4660)},
                                      {"CellMonitorRSSI", Value::integer(-85)},
                                      {"Big", Value::integer(0x1'0000'0005)},
                                      {"Real", Value::real(12.7)},
                                      {"Text", S("12")}});
  EXPECT_EQ(CellInfoArray::integerValue(cell, "CellMonitorTAC"), 4660);
  EXPECT_EQ(CellInfoArray::integerValue(cell, "CellMonitorRSSI"), -85);
  EXPECT_EQ(CellInfoArray::integerValue(cell, "Big"), 5);
  EXPECT_EQ(CellInfoArray::integerValue(cell, "Real"), 12);
  EXPECT_EQ(CellInfoArray::integerValue(cell, "Text"), std::nullopt);
  EXPECT_EQ(CellInfoArray::integerValue(cell, "Missing"), std::nullopt);
}

TEST(ExtraCodePayloads, ACellListParsesFromABinaryPropertyList) {
  CellInfoArray cells(extraCodePacket(1, binaryBytes(A({D({{"CellMonitorCellType", S("CellMonitorCellTypeServing")}})}))));
  ASSERT_NE(cells.array(), nullptr);
  EXPECT_EQ(cells.array()->size(), 1u);
}

}  // namespace
}  // namespace corvane
