// The Quendra_LTE scenario's radio records, read by the LTE decoder itself:
// what it shows must be the simulated network's values, and the records must
// agree with each other and with the cell list as the network changes.

#include "telephonyd/LteRadioEncoder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <map>
#include <optional>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "platform/CellMonitor.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "platform/PropertyList.h"
#include "support/Values.h"
#include "telephonyd/LogCodeSimulator.h"
#include "telephonyd/ScenarioPeriods.h"

namespace corvane::telephonyd {
namespace {

using Cell = SimulatedNetwork::Cell;
using Access = SimulatedNetwork::Access;
using test::D;
using test::S;

// In the first minute of seed 3 the serving cell changes once, at 34 s, to
// another cell of its band-3 carrier; neighbours go unmeasured now and then.
constexpr std::uint64_t kSeed = 3;

// --- Reading the scenario period by period ---

using scenario::codesOf;
using scenario::findNode;
using scenario::kPeriodsPerSecond;
using scenario::listRows;
using scenario::Period;
using scenario::rowText;
using scenario::textIn;
constexpr std::uint64_t kStart = scenario::kScenarioStart;

// The Quendra_LTE scenario, period by period.
class PeriodReader : public scenario::PeriodReader {
 public:
  explicit PeriodReader(std::uint64_t seed) : scenario::PeriodReader(kLogChannelTechnologyQuendraLTE, seed) {}
};

Period periodNumber(std::uint64_t seed, std::uint64_t number) {
  PeriodReader reader(seed);
  for (;;) {
    Period period = reader.next();
    if (period.number == number) return period;
    if (period.number > number) throw std::runtime_error("no packets in period " + std::to_string(number));
  }
}

// --- Reading the display ---

// The LTE decoder, fed packet by packet.
class LteDecoder : public scenario::Decoder {
 public:
  LteDecoder() : Decoder(kLogChannelTechnologyQuendraLTE) {}
};

// --- Expected texts, written here as the display writes them ---

std::string dbm(double value) {
  char text[32];
  std::snprintf(text, sizeof text, "%4.2f dBm", value);
  return text;
}
std::string db(double value) {
  char text[32];
  std::snprintf(text, sizeof text, "%4.2f dB", value);
  return text;
}
std::string number(long long value) { return std::to_string(value); }

// What the cells of each band broadcast.
const std::map<int, int> kLayerPriority = {{3, 5}, {7, 6}, {20, 3}};
constexpr int kQrxlevmin = -124;
constexpr int kSIntraSearch = 46;
constexpr int kSNonIntraSearch = 10;

int srxlevOf(const Cell& cell) { return static_cast<int>(std::floor(cell.rsrp)) - kQrxlevmin; }

// The LTE neighbours on a channel, measured or not, strongest first.
std::vector<Cell> neighboursOn(const SimulatedNetwork& network, int channel, bool measured) {
  std::vector<Cell> cells;
  for (const Cell& cell : network.cells()) {
    if (!cell.serving && cell.channel == channel && cell.measured == measured) cells.push_back(cell);
  }
  std::stable_sort(cells.begin(), cells.end(), [](const Cell& a, const Cell& b) { return a.rsrp > b.rsrp; });
  return cells;
}

// The serving cell of the cell list in an 0xFF0001 packet.
Dictionary servingCellOfList(const SourcePacket& packet) {
  const Value cells = plist::parseOrThrow(std::span(*packet.data).subspan(13));
  return *cells.asArray()->at(0).asDictionary();
}

std::int64_t integerIn(const Dictionary& d, std::string_view key) {
  const Value* v = d.find(key);
  if (!v || !v->asInteger()) throw std::runtime_error("no integer under " + std::string(key));
  return *v->asInteger();
}

// --- One period, field by field ---

// 32 s into seed 3: every record is due, the network has stepped 32 times
// and the serving cell is still the first one.
constexpr std::uint64_t kEveryRecordPeriod = 800;

class LteRadioEncoderPeriod : public ::testing::Test {
 protected:
  LteRadioEncoderPeriod() : period(periodNumber(kSeed, kEveryRecordPeriod)), serving(period.network.servingCell()) {
    decoder.feed(period);
    display = decoder.display();
  }

  Period period;
  Cell serving;
  LteDecoder decoder;
  Value display;
};

TEST_F(LteRadioEncoderPeriod, ThePeriodHoldsEveryRecordOnceAfterTheExtraCodes) {
  EXPECT_EQ(codesOf(period), (std::vector<std::uint32_t>{0xFF0001, 0xB0C2, 0xB0C1, 0xB17F, 0xB179, 0xB180, 0xB186}));
  EXPECT_EQ(period.network.steps(), 32u);
  EXPECT_EQ(period.network.cellChanges(), 0u);
  for (const SourcePacket& packet : period.packets) {
    EXPECT_EQ(packet.data->at(0), *packet.code >= 0xFF0000 ? 0xFF : 0x01);
    EXPECT_EQ(packet.data->at(1) | packet.data->at(2) << 8, static_cast<int>(packet.data->size() - 1));
    EXPECT_EQ(static_cast<std::uint32_t>(packet.data->at(3) | packet.data->at(4) << 8), *packet.code & 0xFFFF);
  }
}

TEST_F(LteRadioEncoderPeriod, ServingCellInfoIsTheServingCellsIdentityAndCarrier) {
  ASSERT_EQ(serving.band, 3);
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Physical Cell ID"), number(serving.code));
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Download Frequency"), number(serving.channel));
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Upload Frequency"), number(serving.channel + 18000));
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Download Bandwidth"), "20 MHz");
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Upload Bandwidth"), "20 MHz");
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Cell Identity"), number(serving.cellId));
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Tracking Area Code"), number(serving.areaCode));
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Freq Band Indicator"), "3");
  EXPECT_EQ(rowText(display, "Serving Cell Info", "Num Tx Antennas"), "2");
}

TEST_F(LteRadioEncoderPeriod, ServingCellMeasurementsAreTheServingCellsLevelsAndItsLayersSettings) {
  const std::string section = "Serving Cell Measurements";
  const int srxlev = srxlevOf(serving);
  ASSERT_GT(srxlev, kSNonIntraSearch) << "this period's rules: intra-frequency measurements only";
  ASSERT_LE(srxlev, kSIntraSearch);
  EXPECT_EQ(rowText(display, section, "Version"), "1");
  EXPECT_EQ(rowText(display, section, "E-ARFCN"), number(serving.channel));
  EXPECT_EQ(rowText(display, section, "Physical Cell ID"), number(serving.code));
  EXPECT_EQ(rowText(display, section, "Serving Layer Priority"), "5");
  EXPECT_EQ(rowText(display, section, "Measured RSRP"), dbm(serving.rsrp));
  EXPECT_EQ(rowText(display, section, "Average RSRP"), dbm(serving.averageRsrp));
  EXPECT_EQ(rowText(display, section, "Measured RSRQ"), db(serving.rsrq));
  EXPECT_EQ(rowText(display, section, "Average RSRQ"), db(serving.averageRsrq));
  EXPECT_EQ(rowText(display, section, "Measured RSSI"), dbm(serving.level));
  EXPECT_EQ(rowText(display, section, "Qrxlevmin"), "-124 dBm");
  EXPECT_EQ(rowText(display, section, "P_Max"), "23 dBm");
  EXPECT_EQ(rowText(display, section, "Max UE Tx Power"), "23 dBm");
  EXPECT_EQ(rowText(display, section, "Srxlev"), number(srxlev) + " dBm");
  EXPECT_EQ(rowText(display, section, "Num of Consecutive DRX Cycles of S < 0"), "0");
  EXPECT_EQ(rowText(display, section, "S Intra Search"), "46 dB");
  EXPECT_EQ(rowText(display, section, "S Non Intra Search"), "10 dBm");
  EXPECT_EQ(rowText(display, section, "Measurement Rules"), "1");
}

TEST_F(LteRadioEncoderPeriod, IntraFrequencyMeasurementListsTheMeasuredAndTheDetectedNeighboursOfTheCarrier) {
  const std::string section = "Connected mode LTE Intra-frequency Measurement";
  EXPECT_EQ(rowText(display, section, "E-ARFCN"), number(serving.channel));
  EXPECT_EQ(rowText(display, section, "Serving Physical Cell ID"), number(serving.code));
  // The millisecond in the 10240 ms cycle of system frames.
  EXPECT_EQ(rowText(display, section, "Subframe Number"),
            number(static_cast<long long>((kStart / 1000 + kEveryRecordPeriod * 40) % 10240)));
  EXPECT_EQ(rowText(display, section, "Serving Filtered RSRP"), dbm(serving.averageRsrp));
  EXPECT_EQ(rowText(display, section, "Serving Filtered RSRQ"), db(serving.averageRsrq));

  const auto measured = neighboursOn(period.network, serving.channel, true);
  const auto rows = listRows(display, "Measured Neighbor Cells");
  ASSERT_EQ(rows.size(), measured.size());
  ASSERT_GE(rows.size(), 2u);
  for (std::size_t i = 0; i < rows.size(); ++i) {
    SCOPED_TRACE(i);
    EXPECT_EQ(textIn(rows[i], "Physical Cell ID"), number(measured[i].code));
    EXPECT_EQ(textIn(rows[i], "Filtered RSRP"), dbm(measured[i].averageRsrp));
    EXPECT_EQ(textIn(rows[i], "Filtered RSRQ"), db(measured[i].averageRsrq));
  }
  const auto detected = neighboursOn(period.network, serving.channel, false);
  const auto detectedRows = listRows(display, "Detected Cells");
  ASSERT_EQ(detectedRows.size(), detected.size());
  for (std::size_t i = 0; i < detectedRows.size(); ++i) {
    EXPECT_EQ(textIn(detectedRows[i], "Physical Cell ID"), number(detected[i].code));
  }
}

TEST_F(LteRadioEncoderPeriod, NeighbourMeasurementListsTheMeasuredCellsOfOneNeighbourFrequency) {
  const int channel = std::stoi(rowText(display, "Neighbor Measurements", "E-ARFCN"));
  EXPECT_EQ(rowText(display, "Neighbor Measurements", "Version"), "1");
  EXPECT_EQ(rowText(display, "Neighbor Measurements", "Qrxlevmin"), "-124 dBm");
  const auto measured = neighboursOn(period.network, channel, true);
  const auto rows = listRows(display, "Neighbor Cells List");
  ASSERT_FALSE(measured.empty()) << "E-ARFCN " << channel << " has no measured neighbour";
  ASSERT_EQ(rows.size(), measured.size());
  for (std::size_t i = 0; i < rows.size(); ++i) {
    SCOPED_TRACE(i);
    const Cell& cell = measured[i];
    EXPECT_EQ(textIn(rows[i], "Physical Cell ID"), number(cell.code));
    EXPECT_EQ(textIn(rows[i], "Measured RSSI"), dbm(cell.level));
    EXPECT_EQ(textIn(rows[i], "Measured RSRP"), dbm(cell.rsrp));
    EXPECT_EQ(textIn(rows[i], "Average RSRP"), dbm(cell.averageRsrp));
    EXPECT_EQ(textIn(rows[i], "Measured RSRQ"), db(cell.rsrq));
    EXPECT_EQ(textIn(rows[i], "Average RSRQ"), db(cell.averageRsrq));
    EXPECT_EQ(textIn(rows[i], "Srxlev"), number(srxlevOf(cell)) + " dBm");
    // Fixed per cell; the two antennas' rows read the same bits.
    EXPECT_EQ(textIn(rows[i], "Ant 0 Frame Offset"), textIn(rows[i], "Ant 1 Frame Offset"));
    EXPECT_LT(std::stoi(textIn(rows[i], "Ant 0 Frame Offset")), 1024);
    EXPECT_LT(std::stoi(textIn(rows[i], "Ant 0 Sample Offset")), 307200);
  }
}

TEST_F(LteRadioEncoderPeriod, ReselectionCandidateIsTheStrongestMeasuredNeighbour) {
  EXPECT_EQ(rowText(display, "Reselection Candidates", "Version"), "1");
  EXPECT_EQ(rowText(display, "Reselection Candidates", "Serving EARFCN"), number(serving.channel));
  EXPECT_EQ(rowText(display, "Reselection Candidates", "Serving Cell ID"), number(serving.code));
  const Cell* strongest = nullptr;
  for (const Cell& cell : period.network.cells()) {
    if (!cell.serving && cell.measured && (!strongest || cell.rsrp > strongest->rsrp)) strongest = &cell;
  }
  ASSERT_TRUE(strongest);
  const auto rows = listRows(display, "Reselection Candidates List");
  ASSERT_EQ(rows.size(), 1u);
  EXPECT_EQ(Value(rows[0]), D({{"Candidate Priority", S(number(kLayerPriority.at(strongest->band)))},
                               {"Candidate RAT Type", S("LTE")},
                               {"E ARFCN", S(number(strongest->channel))},
                               {"Cell ID", S(number(strongest->code))}}));
}

// Every fifth reselection record names an inter-RAT neighbour: the fifth
// record (at 5.12 s) the UTRAN cell, the tenth (at 11.52 s) the GERAN cell.
TEST(LteRadioEncoderTest, EveryFifthReselectionRecordNamesAnInterRatNeighbourInTurn) {
  struct Case {
    std::uint64_t period;
    Value row;
  };
  const SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, kSeed);
  const auto& interRat = network.interRatNeighbours();
  ASSERT_EQ(interRat.size(), 2u);
  ASSERT_EQ(interRat[0].access, Access::UMTS);
  ASSERT_EQ(interRat[1].access, Access::GSM);
  const std::vector<Case> cases = {
      {4 * 32, D({{"Candidate Priority", S("2")},
                  {"Candidate RAT Type", S("UTRAN")},
                  {"U ARFCN", S(number(interRat[0].channel))},
                  {"PSC", S(number(interRat[0].code))}})},
      {9 * 32, D({{"Candidate Priority", S("1")},
                  {"Candidate RAT Type", S("GERAN")},
                  {"ARFCN", S(number(interRat[1].channel))},
                  {"Band", S("0")},
                  {"BSIC ID", S(number(interRat[1].code))}})},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.period);
    const Period period = periodNumber(kSeed, c.period);
    ASSERT_EQ(period.network.cellChanges(), 0u);
    LteDecoder decoder;
    decoder.feed(period);
    const Value display = decoder.display();
    const auto rows = listRows(display, "Reselection Candidates List");
    ASSERT_EQ(rows.size(), 1u);
    EXPECT_EQ(Value(rows[0]), c.row);
  }
}

// --- A minute of the scenario ---

TEST(LteRadioEncoderTest, InAMinuteTheRecordsAgreeOnTheServingCellWhileLevelsDriftAndNeighboursComeAndGo) {
  PeriodReader reader(kSeed);
  LteDecoder decoder;
  std::optional<Dictionary> listedServing;
  std::set<std::string> measuredRsrps;
  std::vector<std::string> servingCells;  // each new one
  std::optional<std::string> lastRules;
  int rulesReports = 0;
  // Per neighbour: the states it went through in 0xB179, in order without repeats.
  std::map<std::string, std::string> states;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 60 * kPeriodsPerSecond) break;
    decoder.feed(period);
    const Value display = decoder.display();
    const auto codes = codesOf(period);
    auto has = [&](std::uint32_t code) { return std::find(codes.begin(), codes.end(), code) != codes.end(); };
    for (const SourcePacket& packet : period.packets) {
      if (*packet.code == 0xFF0001) listedServing = servingCellOfList(packet);
    }
    ASSERT_TRUE(listedServing);
    SCOPED_TRACE("period " + std::to_string(period.number));

    const Cell& serving = period.network.servingCell();
    const std::string pci = number(serving.code);
    const std::string earfcn = number(serving.channel);
    EXPECT_EQ(rowText(display, "Serving Cell Info", "Physical Cell ID"), pci);
    EXPECT_EQ(rowText(display, "Serving Cell Info", "Cell Identity"), number(serving.cellId));
    EXPECT_EQ(rowText(display, "Serving Cell Measurements", "Physical Cell ID"), pci);
    EXPECT_EQ(rowText(display, "Connected mode LTE Intra-frequency Measurement", "Serving Physical Cell ID"), pci);
    EXPECT_EQ(rowText(display, "Reselection Candidates", "Serving Cell ID"), pci);
    EXPECT_EQ(integerIn(*listedServing, CellMonitorPID), serving.code);
    EXPECT_EQ(integerIn(*listedServing, CellMonitorCellId), serving.cellId);
    EXPECT_EQ(rowText(display, "Serving Cell Info", "Download Frequency"), earfcn);
    EXPECT_EQ(rowText(display, "Serving Cell Measurements", "E-ARFCN"), earfcn);
    EXPECT_EQ(rowText(display, "Connected mode LTE Intra-frequency Measurement", "E-ARFCN"), earfcn);
    EXPECT_EQ(rowText(display, "Reselection Candidates", "Serving EARFCN"), earfcn);
    EXPECT_EQ(integerIn(*listedServing, CellMonitorUARFCN), serving.channel);
    // No neighbour list holds the serving cell.
    for (const char* list : {"Measured Neighbor Cells", "Detected Cells", "Neighbor Cells List"}) {
      for (const Dictionary& row : listRows(display, list)) EXPECT_NE(textIn(row, "Physical Cell ID"), pci) << list;
    }

    if (servingCells.empty() || servingCells.back() != pci) servingCells.push_back(pci);
    measuredRsrps.insert(rowText(display, "Serving Cell Measurements", "Measured RSRP"));
    if (has(0xB17F)) {
      // Updated when the rules differ from those of the report before.
      const std::string rules = rowText(display, "Serving Cell Measurements", "Measurement Rules");
      EXPECT_EQ(rowText(display, "Serving Cell Measurements", "Measurement Rules Updated"),
                !lastRules || rules != *lastRules ? "True" : "False");
      lastRules = rules;
      ++rulesReports;
    }
    if (has(0xB179)) {
      for (const Dictionary& row : listRows(display, "Measured Neighbor Cells")) {
        std::string& s = states[textIn(row, "Physical Cell ID")];
        if (s.empty() || s.back() != 'M') s += 'M';
      }
      for (const Dictionary& row : listRows(display, "Detected Cells")) {
        std::string& s = states[textIn(row, "Physical Cell ID")];
        if (s.empty() || s.back() != 'D') s += 'D';
      }
    }
  }
  EXPECT_EQ(servingCells.size(), 2u) << "one cell change";
  EXPECT_GT(measuredRsrps.size(), 15u);
  EXPECT_GT(rulesReports, 180);
  // Some neighbour was measured, then only detected, then measured again.
  int cameBack = 0;
  for (const auto& [cell, s] : states) cameBack += s.find("MDM") != std::string::npos ? 1 : 0;
  EXPECT_GE(cameBack, 1);
}

TEST(LteRadioEncoderTest, ACellChangeIsReportedByEveryRecordInItsPeriod) {
  PeriodReader reader(kSeed);
  for (;;) {
    const Period period = reader.next();
    ASSERT_LT(period.number, 60 * kPeriodsPerSecond) << "no cell change in the first minute";
    if (period.network.cellChanges() == 0) continue;
    EXPECT_EQ(period.number, 34 * kPeriodsPerSecond);
    EXPECT_EQ(codesOf(period), (std::vector<std::uint32_t>{0xFF0001, 0xB0C2, 0xB0C1, 0xB17F, 0xB179, 0xB180, 0xB186}));
    break;
  }
}

TEST(LteRadioEncoderTest, RecordsAreDueAtTheirCadences) {
  PeriodReader reader(kSeed);
  std::map<std::uint32_t, std::vector<std::uint64_t>> periodsOf;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 20 * kPeriodsPerSecond) break;
    for (std::uint32_t code : codesOf(period)) periodsOf[code].push_back(period.number);
  }
  auto every = [](std::uint64_t step, std::uint64_t below) {
    std::vector<std::uint64_t> periods;
    for (std::uint64_t p = 0; p < below; p += step) periods.push_back(p);
    return periods;
  };
  const std::uint64_t end = 20 * kPeriodsPerSecond;
  EXPECT_EQ(periodsOf[0xB0C2], every(50, end));
  EXPECT_EQ(periodsOf[0xB0C1], every(50, end));
  EXPECT_EQ(periodsOf[0xB17F], every(8, end));
  EXPECT_EQ(periodsOf[0xB179], every(16, end));
  EXPECT_EQ(periodsOf[0xB180], every(16, end));
  EXPECT_EQ(periodsOf[0xB186], every(32, end));
  EXPECT_EQ(periodsOf[0xFF0001], every(25, end));
}

TEST(LteRadioEncoderTest, NoOtherScenarioSendsLteRecordsAndTheSameSeedTheSameOnes) {
  for (auto technology : {kLogChannelTechnologyQuendraGSM, kLogChannelTechnologyQuendraUTRAN2}) {
    auto scenario = makeLogCodeScenario(technology, kSeed, kStart);
    for (int i = 0; i < 200; ++i) EXPECT_NE(*scenario->nextPacket().code & 0xFF00, 0xB000u) << technology;
  }
  auto a = makeLogCodeScenario(kLogChannelTechnologyQuendraLTE, kSeed, kStart);
  auto b = makeLogCodeScenario(kLogChannelTechnologyQuendraLTE, kSeed, kStart);
  for (int i = 0; i < 500; ++i) ASSERT_EQ(*a->nextPacket().data, *b->nextPacket().data) << i;
}

// --- The sample session of corvane-decode ---

const std::string kSamplePath = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/lte-session.hex";
constexpr std::uint64_t kSampleSeconds = 4;

std::string sampleContents() {
  const std::string seed = std::to_string(kSeed);
  std::string text =
      "# The first " + std::to_string(kSampleSeconds) + " simulated seconds of corvane-telephonyd's Quendra_LTE scenario,\n"
      "# seed " + seed + ", clock start 1800000000 s, one packet per line: what\n"
      "#   corvane-telephonyd --technology Quendra_LTE --seed " + seed + " --clock-start 1800000000\n"
      "# streams first to a client whose start command asks for the LTE codes.\n"
      "# Written by corvane_telephonyd_tests --gtest_filter='LteSessionSample.*' with\n"
      "# CORVANE_UPDATE_SAMPLES=1; without it that test checks that this is still what\n"
      "# the scenario sends.\n";
  PeriodReader reader(kSeed);
  return text + scenario::hexLinesOfFirstSeconds(reader, kSampleSeconds);
}

TEST(LteSessionSample, IsWhatTheScenarioSendsInItsFirstSeconds) {
  const std::string expected = sampleContents();
  EXPECT_EQ(scenario::sampleFile(kSamplePath, expected), expected)
      << kSamplePath << ": renew it with CORVANE_UPDATE_SAMPLES=1";
}

}  // namespace
}  // namespace corvane::telephonyd
