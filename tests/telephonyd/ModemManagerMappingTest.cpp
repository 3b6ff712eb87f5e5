// The tables from ModemManager's values to the extra codes' dictionaries, cell type by cell type.

#include "telephonyd/ModemManagerMapping.h"

#include <gtest/gtest.h>

#include "platform/CellMonitor.h"
#include "telephonyd/SimFileCoding.h"

namespace corvane::telephonyd::modem {
namespace {

std::int64_t integerAt(const Dictionary& fields, std::string_view key) {
  const Value* value = fields.find(key);
  if (!value || !value->asInteger()) {
    ADD_FAILURE() << "no integer under " << key;
    return -1;
  }
  return *value->asInteger();
}

std::string textAt(const Dictionary& fields, std::string_view key) {
  const Value* value = fields.find(key);
  return value && value->asString() ? *value->asString() : "<none>";
}

std::vector<std::string> keys(const Dictionary& fields) {
  std::vector<std::string> names;
  for (const auto& [key, value] : fields.entries()) names.push_back(key);
  return names;
}

Fields cell(CellType type, bool serving) {
  return {{"cell-type", std::uint64_t{static_cast<std::uint32_t>(type)}}, {"serving", serving}};
}

TEST(ModemManagerMapping, GsmCellGivesItsIdentityChannelAndLevel) {
  Fields gsm = cell(CellType::Gsm, true);
  gsm.emplace("operator-id", std::string("00101"));
  gsm.emplace("lac", std::string("1F4"));
  gsm.emplace("ci", std::string("2A"));
  gsm.emplace("arfcn", std::uint64_t{62});
  gsm.emplace("rx-level", std::uint64_t{30});  // -80 dBm
  gsm.emplace("timing-advance", std::uint64_t{2});
  const auto fields = cellMonitorCell(gsm);
  ASSERT_TRUE(fields);
  EXPECT_EQ(textAt(*fields, CellMonitorCellRadioAccessTechnology), CellMonitorRadioAccessTechnologyGSM);
  EXPECT_EQ(textAt(*fields, CellMonitorCellType), CellMonitorCellTypeServing);
  EXPECT_EQ(integerAt(*fields, CellMonitorMCC), 1);
  EXPECT_EQ(integerAt(*fields, CellMonitorMNC), 1);
  EXPECT_EQ(integerAt(*fields, CellMonitorLAC), 500);
  EXPECT_EQ(integerAt(*fields, CellMonitorCellId), 42);
  EXPECT_EQ(integerAt(*fields, CellMonitorARFCN), 62);
  // The cell monitor's RSSI is half the level in dBm.
  EXPECT_EQ(integerAt(*fields, CellMonitorRSSI), -40);
  EXPECT_EQ(fields->size(), 8u);  // the timing advance has no key
}

TEST(ModemManagerMapping, UmtsCellGivesUarfcnScramblingCodeRscpAndEcio) {
  Fields umts = cell(CellType::Umts, false);
  umts.emplace("operator-id", std::string("310410"));
  umts.emplace("lac", std::string("2B67"));
  umts.emplace("ci", std::string("0C35A1F"));
  umts.emplace("uarfcn", std::uint64_t{10836});
  umts.emplace("psc", std::uint64_t{301});
  umts.emplace("rscp", -87.6);
  umts.emplace("ecio", -6.4);
  const auto fields = cellMonitorCell(umts);
  ASSERT_TRUE(fields);
  EXPECT_EQ(textAt(*fields, CellMonitorCellRadioAccessTechnology), CellMonitorRadioAccessTechnologyUMTS);
  EXPECT_EQ(textAt(*fields, CellMonitorCellType), CellMonitorCellTypeNeighbor);
  EXPECT_EQ(integerAt(*fields, CellMonitorMCC), 310);
  EXPECT_EQ(integerAt(*fields, CellMonitorMNC), 410);
  EXPECT_EQ(integerAt(*fields, CellMonitorLAC), 0x2B67);
  EXPECT_EQ(integerAt(*fields, CellMonitorCellId), 0xC35A1F);
  EXPECT_EQ(integerAt(*fields, CellMonitorUARFCN), 10836);
  EXPECT_EQ(integerAt(*fields, CellMonitorSCN), 301);
  EXPECT_EQ(integerAt(*fields, CellMonitorRSCP), -88);
  EXPECT_EQ(integerAt(*fields, CellMonitorECN0), -6);
}

TEST(ModemManagerMapping, TdscdmaCellIsAUtran2CellWithItsCellParameterIdAsScramblingCode) {
  Fields td = cell(CellType::Tdscdma, true);
  td.emplace("lac", std::string("10"));
  td.emplace("ci", std::string("FF"));
  td.emplace("uarfcn", std::uint64_t{10055});
  td.emplace("cell-parameter-id", std::uint64_t{77});
  td.emplace("rscp", -70.0);
  const auto fields = cellMonitorCell(td);
  ASSERT_TRUE(fields);
  EXPECT_EQ(textAt(*fields, CellMonitorCellRadioAccessTechnology), CellMonitorRadioAccessTechnologyUTRAN2);
  EXPECT_EQ(integerAt(*fields, CellMonitorLAC), 16);
  EXPECT_EQ(integerAt(*fields, CellMonitorCellId), 255);
  EXPECT_EQ(integerAt(*fields, CellMonitorUARFCN), 10055);
  EXPECT_EQ(integerAt(*fields, CellMonitorSCN), 77);
  EXPECT_EQ(integerAt(*fields, CellMonitorRSCP), -70);
  EXPECT_FALSE(fields->contains(CellMonitorMCC));  // no operator id given
}

TEST(ModemManagerMapping, LteCellGivesTacCellIdPciEarfcnAndTheBandOfTheEarfcn) {
  Fields lte = cell(CellType::Lte, true);
  lte.emplace("operator-id", std::string("26201"));
  lte.emplace("tac", std::string("5A0F"));
  lte.emplace("ci", std::string("1A2D003"));
  lte.emplace("physical-ci", std::string("12D"));
  lte.emplace("earfcn", std::uint64_t{1300});
  lte.emplace("rsrp", -94.5);
  lte.emplace("rsrq", -10.0);
  const auto fields = cellMonitorCell(lte);
  ASSERT_TRUE(fields);
  EXPECT_EQ(textAt(*fields, CellMonitorCellRadioAccessTechnology), CellMonitorRadioAccessTechnologyLTE);
  EXPECT_EQ(integerAt(*fields, CellMonitorMCC), 262);
  EXPECT_EQ(integerAt(*fields, CellMonitorMNC), 1);
  EXPECT_EQ(integerAt(*fields, CellMonitorTAC), 0x5A0F);
  EXPECT_EQ(integerAt(*fields, CellMonitorCellId), 0x1A2D003);
  EXPECT_EQ(integerAt(*fields, CellMonitorPID), 301);
  EXPECT_EQ(integerAt(*fields, CellMonitorUARFCN), 1300);
  EXPECT_EQ(integerAt(*fields, CellMonitorBandInfo), 3);
  // RSRP and RSRQ have no cell-monitor key: not put under another's.
  EXPECT_FALSE(fields->contains(CellMonitorRSSI));
  EXPECT_FALSE(fields->contains(CellMonitorRSCP));
}

TEST(ModemManagerMapping, CdmaCellGivesSidBaseStationAndPnOffsetWhereTheCdmaListHoldsThem) {
  Fields cdma = cell(CellType::Cdma, true);
  cdma.emplace("sid", std::string("10F"));
  cdma.emplace("nid", std::string("1"));
  cdma.emplace("base-station-id", std::string("3A9"));
  cdma.emplace("ref-pn", std::string("F0"));
  cdma.emplace("pilot-strength", std::uint64_t{20});
  const auto fields = cellMonitorCell(cdma);
  ASSERT_TRUE(fields);
  EXPECT_EQ(textAt(*fields, CellMonitorCellRadioAccessTechnology), CellMonitorRadioAccessTechnologyCDMA);
  EXPECT_EQ(integerAt(*fields, CellMonitorLAC), 0x10F);
  EXPECT_EQ(integerAt(*fields, CellMonitorCellId), 0x3A9);
  EXPECT_EQ(integerAt(*fields, CellMonitorPID), 0xF0);
  EXPECT_EQ(fields->size(), 5u);
}

TEST(ModemManagerMapping, NrAndUnknownCellsHaveNoCellMonitorTechnologyAndAreLeftOut) {
  Fields nr = cell(CellType::Nr5g, true);
  nr.emplace("nrarfcn", std::uint64_t{632628});
  EXPECT_FALSE(cellMonitorCell(nr));
  EXPECT_FALSE(cellMonitorCell(cell(CellType::Unknown, false)));
  EXPECT_FALSE(cellMonitorCell(Fields{{"serving", true}}));
}

TEST(ModemManagerMapping, ACellWithMissingOrUnreadableFieldsLeavesTheirKeysOut) {
  Fields umts = cell(CellType::Umts, true);
  umts.emplace("operator-id", std::string("2620"));  // too short for MCC and MNC
  umts.emplace("lac", std::string("XYZ"));          // not hex
  umts.emplace("ci", std::string("FFFFFFFFF"));     // beyond what the cell monitor reads
  umts.emplace("uarfcn", std::uint64_t{10836});
  const auto fields = cellMonitorCell(umts);
  ASSERT_TRUE(fields);
  EXPECT_EQ(keys(*fields), (std::vector<std::string>{std::string(CellMonitorCellRadioAccessTechnology),
                                                     std::string(CellMonitorCellType),
                                                     std::string(CellMonitorUARFCN)}));
  // A serving flag that is missing makes a neighbour.
  Fields bare{{"cell-type", std::uint64_t{static_cast<std::uint32_t>(CellType::Gsm)}}};
  const auto neighbour = cellMonitorCell(bare);
  ASSERT_TRUE(neighbour);
  EXPECT_EQ(textAt(*neighbour, CellMonitorCellType), CellMonitorCellTypeNeighbor);
  EXPECT_EQ(neighbour->size(), 2u);
}

TEST(ModemManagerMapping, TheListPutsServingCellsFirstAndLeavesOutCellsWithoutTechnology) {
  Fields neighbour = cell(CellType::Lte, false);
  neighbour.emplace("physical-ci", std::string("7B"));
  Fields nr = cell(CellType::Nr5g, false);
  Fields serving = cell(CellType::Lte, true);
  serving.emplace("physical-ci", std::string("12D"));
  const Array list = cellMonitorList({neighbour, nr, serving});
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(textAt(*list.at(0).asDictionary(), CellMonitorCellType), CellMonitorCellTypeServing);
  EXPECT_EQ(integerAt(*list.at(0).asDictionary(), CellMonitorPID), 301);
  EXPECT_EQ(integerAt(*list.at(1).asDictionary(), CellMonitorPID), 123);
}

TEST(ModemManagerMapping, PlmnIdentityIsCodedAsTheSimCodesIt) {
  EXPECT_EQ(plmnIdentity("00101"), "00F110");
  EXPECT_EQ(plmnIdentity("26201"), "62F210");
  EXPECT_EQ(plmnIdentity("310410"), "130014");
  EXPECT_FALSE(plmnIdentity("2620"));
  EXPECT_FALSE(plmnIdentity("26201A"));
}

TEST(ModemManagerMapping, LteBandsFollowTheEarfcnRanges) {
  EXPECT_EQ(lteBandOfEarfcn(0), 1);
  EXPECT_EQ(lteBandOfEarfcn(1949), 3);
  EXPECT_EQ(lteBandOfEarfcn(6300), 20);
  EXPECT_EQ(lteBandOfEarfcn(38000), 38);
  EXPECT_FALSE(lteBandOfEarfcn(5000));  // between bands 11 and 12
}

TEST(ModemManagerMapping, SimFilesHoldOnlyWhatModemManagerTells) {
  SimState sim;
  sim.iccid = "89490200001234567890";
  sim.ownNumbers = {"+491701234567", "", "+491709999999"};
  sim.operatorIdentifier = "26201";
  sim.preferredNetworks = {{"26201", kAccessLte | kAccessUmts | kAccessGsm}, {"bad", kAccessGsm},
                           {"310410", kAccess5gNr}};
  const Dictionary files = simFiles(sim);
  EXPECT_EQ(keys(files), (std::vector<std::string>{"kSimFile_ICCID", "kSimFile_MSISDN", "kSimFile_AHPLMN",
                                                   "kSimFile_OPLMNAcT"}));
  EXPECT_EQ(textAt(files, "kSimFile_ICCID"), "89490200001234567890");
  EXPECT_EQ(textAt(files, "kSimFile_MSISDN"), "+491701234567, +491709999999");
  EXPECT_EQ(textAt(files, "kSimFile_AHPLMN"), "62F210");
  EXPECT_EQ(textAt(files, "kSimFile_OPLMNAcT"), "62F210C080" "1300140800");

  EXPECT_TRUE(simFiles(SimState{}).empty());
}

TEST(ModemManagerMapping, PdpContextsJoinProfilesWithTheirBearersAndKeepBearersWithoutProfile) {
  Profile internet{1, "internet", kIpFamilyIpv4v6};
  Profile ims{2, "ims", kIpFamilyIpv6};
  Bearer connected;
  connected.profileId = 1;
  connected.connected = true;
  connected.interface = "wwan0";
  connected.ipv4Address = "10.64.12.7";
  connected.ipv6Address = "2001:db8:7::2";
  Bearer loose;
  loose.apn = "mms";
  loose.ipType = kIpFamilyIpv4;
  loose.ipv4Address = "10.1.1.1";  // not connected: no address shown
  const Array contexts = pdpContexts({ims, internet}, {connected, loose});
  ASSERT_EQ(contexts.size(), 3u);
  const Dictionary& first = *contexts.at(0).asDictionary();
  EXPECT_EQ(textAt(first, "Context ID"), "1");
  EXPECT_EQ(textAt(first, "APN"), "internet");
  EXPECT_EQ(textAt(first, "PDP Type"), "IPv4v6");
  EXPECT_EQ(textAt(first, "Connected"), "Yes");
  EXPECT_EQ(textAt(first, "PDP Address"), "10.64.12.7, 2001:db8:7::2");
  EXPECT_EQ(textAt(first, "Interface"), "wwan0");
  const Dictionary& second = *contexts.at(1).asDictionary();
  EXPECT_EQ(keys(second), (std::vector<std::string>{"Context ID", "APN", "PDP Type", "Connected"}));
  EXPECT_EQ(textAt(second, "Connected"), "No");
  const Dictionary& third = *contexts.at(2).asDictionary();
  EXPECT_EQ(keys(third), (std::vector<std::string>{"APN", "PDP Type", "Connected"}));
  EXPECT_EQ(textAt(third, "APN"), "mms");
  EXPECT_EQ(textAt(third, "PDP Type"), "IPv4");
}

TEST(ModemManagerMapping, TheModemIsChosenByIndexPathImeiOrDiagnosticPort) {
  const std::vector<ModemCandidate> modems{
      {"/org/freedesktop/ModemManager1/Modem/0", "356938035643809", {"ttyUSB0", "ttyUSB2"}},
      {"/org/freedesktop/ModemManager1/Modem/3", "490154203237518", {"wwan0qcdm0", "wwan0mbim0"}},
  };
  std::string why;
  EXPECT_EQ(chooseModem(modems, "3", {}, why), 1u);
  EXPECT_EQ(chooseModem(modems, "/org/freedesktop/ModemManager1/Modem/0", {}, why), 0u);
  EXPECT_EQ(chooseModem(modems, "490154203237518", {}, why), 1u);
  EXPECT_EQ(chooseModem(modems, "", {"wwan0qcdm0"}, why), 1u);
  EXPECT_EQ(chooseModem(modems, "", {"diag", "ttyUSB2"}, why), 0u);
  EXPECT_FALSE(chooseModem(modems, "7", {}, why));
  EXPECT_EQ(why, "ModemManager knows no modem 7");
  EXPECT_FALSE(chooseModem(modems, "", {"ttyACM0"}, why));
  EXPECT_NE(why.find("choose one with --modem"), std::string::npos) << why;
  EXPECT_EQ(chooseModem({modems[0]}, "", {"ttyACM0"}, why), 0u);  // the only one
  EXPECT_FALSE(chooseModem({}, "", {}, why));
  EXPECT_EQ(why, "ModemManager knows no modem");
}

}  // namespace
}  // namespace corvane::telephonyd::modem
