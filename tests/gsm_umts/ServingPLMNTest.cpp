// "Serving PLMN": the registration record (PLMN identity in BCD, a big-endian
// location area code), the PLMN selection mode, and the serving cell of the
// cell-monitor list.

#include "LogGenerator/gsm_umts/ServingPLMN.h"

#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::I;
using test::logPacket;
using test::monitorCell;
using test::rowText;
using test::S;

using ServingPlmn = test::GsmUmtsSectionTest<ServingPLMN>;

// 0x7135 as the baseband sends it: service type at 14, the PLMN identity at
// 15-17, the location area code high byte first at 18-19, the routing area at 20.
Bytes registrationPacket(std::size_t size = 32) {
  Bytes p = logPacket(0x7135, size);
  p[14] = 3;
  p[15] = 0x62;
  p[16] = 0xF0;
  p[17] = 0x10;
  p[18] = 0x12;
  p[19] = 0x34;
  p[20] = 7;
  return p;
}

Bytes selectionModePacket(std::uint8_t mode, std::size_t size = 16) {
  Bytes p = logPacket(0x7132, size);
  p[14] = mode;
  return p;
}

TEST_F(ServingPlmn, RegistersUnderItsNameForRegistrationSelectionModeAndCellList) {
  EXPECT_EQ(classDict.at("Serving PLMN"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0x7135, 0x7132, 0xFF0001}));
  EXPECT_EQ(codeDict.keys(), (std::vector<std::string>{"28981", "28978", "16711681"}));
}

TEST_F(ServingPlmn, ARegistrationRecordSetsItsFiveRowsInOrder) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(registrationPacket(), 0x7135);
  EXPECT_EQ(Value(rows), D({{"Mobile Country Code", S("260")},
                            {"Mobile Network Code", S("01 ")},
                            {"Location Area Code", S("4660")},
                            {"Routing Area Code", S("7")},
                            {"Service Type", S("CS_PS_SERVICE")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Serving PLMN"}));
}

// A two-digit MNC has the filler 0xF as digit 3, which shows as a trailing blank.
TEST_F(ServingPlmn, IdentityBytes62F010ShowMcc260AndMnc01WithATrailingBlank) {
  const Dictionary rows = attachRows();
  feed(registrationPacket(), 0x7135);
  EXPECT_EQ(rowText(rows, "Mobile Country Code"), "260");
  EXPECT_EQ(rowText(rows, "Mobile Network Code"), "01 ");
}

TEST_F(ServingPlmn, ANibbleOfTenOrMoreShowsAsABlank) {
  const Dictionary rows = attachRows();
  Bytes p = registrationPacket();
  p[15] = 0xA1;  // MCC digit 1 = 1, digit 2 = 0xA
  p[16] = 0x52;  // MCC digit 3 = 2, MNC digit 3 = 5
  p[17] = 0xFB;  // MNC digits 1 and 2 both no digit
  feed(p, 0x7135);
  EXPECT_EQ(rowText(rows, "Mobile Country Code"), "1 2");
  EXPECT_EQ(rowText(rows, "Mobile Network Code"), "  5");
}

TEST_F(ServingPlmn, TheLocationAreaCodeIsBigEndian) {
  const Dictionary rows = attachRows();
  feed(registrationPacket(), 0x7135);
  EXPECT_EQ(rowText(rows, "Location Area Code"), "4660");  // 0x1234, not 0x3412 = 13330
  Bytes p = registrationPacket();
  p[18] = 0xFF;
  p[19] = 0x00;
  feed(p, 0x7135);
  EXPECT_EQ(rowText(rows, "Location Area Code"), "65280");
}

TEST_F(ServingPlmn, EveryServiceTypeHasItsTextAndOthersAreUnknown) {
  const Dictionary rows = attachRows();
  const std::vector<std::pair<std::uint8_t, std::string>> table = {
      {0, "NO_SERVICE"}, {1, "CS_ONLY"}, {2, "PS_ONLY"}, {3, "CS_PS_SERVICE"}, {4, "LIMITED_SERVICE"},
      {5, "Unknown"},    {255, "Unknown"}};
  for (const auto& [value, text] : table) {
    Bytes p = registrationPacket();
    p[14] = value;
    feed(p, 0x7135);
    EXPECT_EQ(rowText(rows, "Service Type"), text) << int(value);
  }
}

TEST_F(ServingPlmn, TheSelectionModeIsReadFromTheSameByteAsTheServiceType) {
  const Dictionary rows = attachRows();
  const std::vector<std::pair<std::uint8_t, std::string>> table = {
      {0, "Automatic"}, {1, "Manual"}, {2, "Limited"}, {3, "LIMITED_ROUTINE_ACQ"}, {4, "LIMITED_MANUAL_ACQ"}};
  for (const auto& [value, text] : table) {
    feed(selectionModePacket(value), 0x7132);
    EXPECT_EQ(rowText(rows, "PLMN Sel Mod"), text) << int(value);
  }
  EXPECT_EQ(test::keysOf(rows), std::vector<std::string>{"PLMN Sel Mod"});
}

TEST_F(ServingPlmn, ASelectionModeOf5OrMoreIsUnknown) {
  const Dictionary rows = attachRows();
  for (std::uint8_t value : {5, 6, 128, 255}) {
    feed(selectionModePacket(0), 0x7132);
    feed(selectionModePacket(value), 0x7132);
    EXPECT_EQ(rowText(rows, "PLMN Sel Mod"), "Unknown") << int(value);
  }
}

TEST_F(ServingPlmn, ShortRecordsAreDroppedSilently) {
  const Dictionary rows = test::Dict({{"PLMN Sel Mod", S("-")}, {"Mobile Country Code", S("-")}});
  section->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  feed(selectionModePacket(1, 15), 0x7132);
  feed(registrationPacket(31), 0x7135);
  EXPECT_EQ(Value(rows), D({{"PLMN Sel Mod", S("-")}, {"Mobile Country Code", S("-")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Serving PLMN", "Serving PLMN"}));
}

TEST_F(ServingPlmn, AnyOtherCodeIsLoggedAsUnknown) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(registrationPacket(), 0x7150);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::errorsAfter("Serving PLMN", {"Received an unknown log message: 29008"}));
}

TEST_F(ServingPlmn, TheUmtsServingCellOfTheCellListSetsTheCodesAsPlainNumbers) {
  const Dictionary rows = attachRows();
  feed(registrationPacket(), 0x7135);
  feed(selectionModePacket(1), 0x7132);
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kNeighbor, {{CellMonitorMCC, I(999)}}),
                             monitorCell(test::kUmts, test::kServing,
                                         {{CellMonitorMCC, I(262)}, {CellMonitorMNC, I(2)}, {CellMonitorLAC, I(4660)}}),
                             monitorCell(test::kGsm, test::kServing, {{CellMonitorMCC, I(111)}})}),
       0xFF0001);
  EXPECT_EQ(Value(rows), D({{"Mobile Country Code", S("262")},
                            {"Mobile Network Code", S("2")},
                            {"Location Area Code", S("4660")},
                            {"Routing Area Code", S("7")},
                            {"Service Type", S("CS_PS_SERVICE")},
                            {"PLMN Sel Mod", S("Manual")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Serving PLMN"}));
}

TEST_F(ServingPlmn, AGsmServingCellCountsAndCellsWithoutTechnologyOrTypeOrOfLteDoNot) {
  const Dictionary rows = attachRows();
  Dictionary untyped;
  untyped.set(CellMonitorCellRadioAccessTechnology, S(test::kUmts));
  untyped.set(CellMonitorMCC, I(1));
  feed(test::cellListPacket({Value(untyped), monitorCell(test::kLte, test::kServing, {{CellMonitorMCC, I(2)}}),
                             monitorCell(test::kGsm, test::kServing,
                                         {{CellMonitorMCC, I(310)}, {CellMonitorMNC, I(260)}, {CellMonitorLAC, I(1)}})}),
       0xFF0001);
  EXPECT_EQ(rowText(rows, "Mobile Country Code"), "310");
  EXPECT_EQ(rowText(rows, "Mobile Network Code"), "260");
  EXPECT_EQ(rowText(rows, "Location Area Code"), "1");
}

TEST_F(ServingPlmn, AMissingValueIsLoggedAndTheOthersAreStillSet) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kServing,
                                         {{CellMonitorMCC, I(262)}, {CellMonitorMNC, S("two")}, {CellMonitorLAC, I(9)}})}),
       0xFF0001);
  EXPECT_EQ(Value(rows), D({{"Mobile Country Code", S("262")}, {"Location Area Code", S("9")}}));
  EXPECT_EQ(capture.lines(), test::errorsAfter("Serving PLMN", {"ServingPLMN: Failed to retrieve MNC\n"}));
  capture.sink().clear();
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kServing, {})}), 0xFF0001);
  EXPECT_EQ(capture.lines(), test::errorsAfter("Serving PLMN", {"ServingPLMN: Failed to retrieve MCC\n",
                                                                "ServingPLMN: Failed to retrieve MNC\n",
                                                                "ServingPLMN: Failed to retrieve LAC\n"}));
}

TEST_F(ServingPlmn, ACellListThatDoesNotParseIsLoggedTwiceAndChangesNothing) {
  const Dictionary rows = attachRows();
  feed(registrationPacket(), 0x7135);
  log::ScopedCapture capture;
  feed(test::brokenCellListPacket(), 0xFF0001);
  EXPECT_EQ(rowText(rows, "Mobile Country Code"), "260");
  EXPECT_EQ(capture.lines(), test::errorsAfter("Serving PLMN", {"Cell Info Array data could not be constructed",
                                                                "Failed to get Cell Array\n"}));
}

TEST_F(ServingPlmn, AnEmptyCellListOrOneWithoutAServingCellChangesNothing) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(test::cellListPacket({}), 0xFF0001);
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kNeighbor, {{CellMonitorMCC, I(1)}})}), 0xFF0001);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"Serving PLMN", "Serving PLMN"}));
}

}  // namespace
}  // namespace corvane
