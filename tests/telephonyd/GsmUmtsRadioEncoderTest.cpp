// The Quendra_GSM scenario's radio records, read by the GSM/UMTS decoder
// itself: the phone's journey from UMTS idle through FACH and DCH to GSM and
// back, every record agreeing with the cell list and with the simulated
// network as it moves.

#include "telephonyd/GsmUmtsRadioEncoder.h"

#include <gtest/gtest.h>

#include <algorithm>
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
#include "telephonyd/LogCodeSimulator.h"
#include "telephonyd/ScenarioPeriods.h"

namespace corvane::telephonyd {
namespace {

using Cell = SimulatedNetwork::Cell;
using Access = SimulatedNetwork::Access;
using Phase = SimulatedNetwork::Phase;

constexpr std::uint64_t kSeed = 2;

// --- Reading the scenario period by period ---

using scenario::codesOf;
using scenario::findNode;
using scenario::kPeriodsPerSecond;
using scenario::listRows;
using scenario::Period;
using scenario::rowText;
using scenario::textIn;
constexpr std::uint64_t kStart = scenario::kScenarioStart;

// The Quendra_GSM scenario, period by period.
class PeriodReader : public scenario::PeriodReader {
 public:
  explicit PeriodReader(std::uint64_t seed) : scenario::PeriodReader(kLogChannelTechnologyQuendraGSM, seed) {}
};

bool has(const Period& period, std::uint32_t code) {
  const auto codes = codesOf(period);
  return std::find(codes.begin(), codes.end(), code) != codes.end();
}

// --- Reading the display ---

std::vector<std::string> stringsIn(const Value& display, std::string_view section, std::string_view row) {
  const Value* rows = findNode(display, section);
  const Value* v = rows && rows->asDictionary() ? rows->asDictionary()->find(row) : nullptr;
  std::vector<std::string> out;
  if (v && v->asArray()) {
    for (const Value& e : v->asArray()->elements()) out.push_back(e.asString() ? *e.asString() : "<no text>");
  }
  return out;
}

// The GSM/UMTS decoder, fed packet by packet.
class GsmUmtsDecoder : public scenario::Decoder {
 public:
  GsmUmtsDecoder() : Decoder(kLogChannelTechnologyQuendraGSM) {}
};

std::string number(long long value) { return std::to_string(value); }

std::int64_t integerIn(const Dictionary& d, std::string_view key) {
  const Value* v = d.find(key);
  if (!v || !v->asInteger()) throw std::runtime_error("no integer under " + std::string(key));
  return *v->asInteger();
}

// The serving cell of the cell list in an 0xFF0001 packet.
std::optional<Dictionary> listedServingCell(const Period& period) {
  for (const SourcePacket& packet : period.packets) {
    if (*packet.code != 0xFF0001) continue;
    const Value cells = plist::parseOrThrow(std::span(*packet.data).subspan(13));
    return *cells.asArray()->at(0).asDictionary();
  }
  return std::nullopt;
}

const char* phaseName(Phase phase) {
  switch (phase) {
    case Phase::UmtsIdle: return "UMTS idle";
    case Phase::UmtsConnecting: return "connecting";
    case Phase::UmtsFach: return "FACH";
    case Phase::UmtsDch: return "DCH";
    case Phase::UmtsFading: return "fading";
    case Phase::GsmIdle: return "GSM idle";
    case Phase::GsmDedicated: return "GSM dedicated";
    case Phase::GsmLeaving: return "leaving GSM";
  }
  return "?";
}

// --- The journey ---

TEST(GsmUmtsRadioEncoderTest, ThePhoneGoesFromUmtsIdleThroughFachAndDchToGsmAndBackAgainAndAgain) {
  PeriodReader reader(kSeed);
  GsmUmtsDecoder decoder;
  std::vector<std::string> phases;       // each new one
  std::vector<std::string> rrcStates;    // as the display shows them, each new one
  std::vector<std::string> servingRats;  // as the cell list names them, each new one
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 150 * kPeriodsPerSecond) break;
    decoder.feed(period);
    const std::string phase = phaseName(period.network.phase());
    if (phases.empty() || phases.back() != phase) phases.push_back(phase);
    if (has(period, 0x4125)) {
      const std::string state = rowText(decoder.display(), "UMTS RR Info", "RRC State");
      if (rrcStates.empty() || rrcStates.back() != state) rrcStates.push_back(state);
    }
    if (auto serving = listedServingCell(period)) {
      const Value* access = serving->find(CellMonitorCellRadioAccessTechnology);
      const std::string rat = *access->asString();
      if (servingRats.empty() || servingRats.back() != rat) servingRats.push_back(rat);
    }
  }
  const std::vector<std::string> cycle = {"UMTS idle", "connecting", "FACH",          "DCH",
                                          "fading",    "GSM idle",   "GSM dedicated", "leaving GSM"};
  ASSERT_GE(phases.size(), 2 * cycle.size() + 1);
  for (std::size_t i = 0; i < phases.size(); ++i) EXPECT_EQ(phases[i], cycle[i % cycle.size()]) << i;
  // The RRC state as the decoder shows it: connection set-up, FACH, DCH, release; nothing of it on GSM.
  ASSERT_GE(rrcStates.size(), 9u);
  const std::vector<std::string> states = {"Disconnected", "Connecting", "CELL_FACH", "CELL_DCH"};
  for (std::size_t i = 0; i < rrcStates.size(); ++i) EXPECT_EQ(rrcStates[i], states[i % states.size()]) << i;
  // The cell list's serving cell follows: UMTS, GSM, UMTS ...
  ASSERT_GE(servingRats.size(), 5u);
  for (std::size_t i = 0; i < servingRats.size(); ++i) {
    EXPECT_EQ(servingRats[i], i % 2 == 0 ? CellMonitorRadioAccessTechnologyUMTS : CellMonitorRadioAccessTechnologyGSM);
  }
}

TEST(GsmUmtsRadioEncoderTest, EachRecordIsSentOnlyWhereThePhoneIsAndAtItsCadence) {
  struct Cadence {
    std::uint32_t code;
    std::uint64_t periods;
    bool (*applies)(Phase phase, Access camped);
  };
  const std::vector<Cadence> cadences = {
      {0x7132, 25, [](Phase, Access) { return true; }},
      {0x7135, 125, [](Phase, Access) { return true; }},
      {0x7150, 250, [](Phase, Access) { return true; }},
      {0x7131, 25, [](Phase, Access) { return true; }},
      {0x7130, 25, [](Phase, Access) { return true; }},
      {0x4125, 50, [](Phase, Access a) { return a == Access::UMTS; }},
      {0x4127, 50, [](Phase, Access a) { return a == Access::UMTS; }},
      {0x4157, 50, [](Phase, Access a) { return a == Access::UMTS; }},
      {0x417A, 10, [](Phase, Access a) { return a == Access::UMTS; }},
      {0x4005, 32, [](Phase p, Access a) { return a == Access::UMTS && p != Phase::UmtsDch; }},
      {0x4031, 25,
       [](Phase p, Access) { return p == Phase::UmtsConnecting || p == Phase::UmtsFach || p == Phase::UmtsDch; }},
      {0x4116, 25, [](Phase p, Access) { return p == Phase::UmtsDch; }},
      {0x51FF, 50, [](Phase, Access a) { return a == Access::GSM; }},
      {0x5134, 50, [](Phase, Access a) { return a == Access::GSM; }},
      {0x5137, 12, [](Phase, Access a) { return a == Access::GSM; }},
      {0x51F8, 50, [](Phase p, Access) { return p == Phase::GsmDedicated; }},
      {0x5076, 12, [](Phase p, Access) { return p == Phase::GsmDedicated; }},
      {0x4221, 25, [](Phase p, Access) { return p == Phase::UmtsDch; }},
      {0x512C, 50, [](Phase, Access a) { return a == Access::GSM; }},
      {0x5072, 50, [](Phase, Access a) { return a == Access::GSM; }},
      {0x51F4, 50, [](Phase, Access a) { return a == Access::GSM; }},
      {0x51F5, 50, [](Phase, Access a) { return a == Access::GSM; }},
      {0x51F6, 50, [](Phase, Access a) { return a == Access::GSM; }},
      {0x51FB, 50, [](Phase, Access a) { return a == Access::GSM; }},
      {0x51FD, 50, [](Phase, Access a) { return a == Access::GSM; }},
  };
  PeriodReader reader(kSeed);
  std::map<std::uint32_t, int> sent;
  std::uint64_t lastChanges = 0;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 120 * kPeriodsPerSecond) break;
    const SimulatedNetwork& network = period.network;
    const std::uint64_t changes = network.cellChanges() + network.phaseChanges();
    const bool changed = period.number == 0 || changes != lastChanges;
    lastChanges = changes;
    SCOPED_TRACE("period " + std::to_string(period.number));
    for (const Cadence& cadence : cadences) {
      const bool applies = cadence.applies(network.phase(), network.servingCell().access);
      const bool due = applies && (changed || period.number % cadence.periods == 0);
      EXPECT_EQ(has(period, cadence.code), due) << std::hex << cadence.code;
      sent[cadence.code] += has(period, cadence.code) ? 1 : 0;
    }
  }
  for (const Cadence& cadence : cadences) EXPECT_GT(sent[cadence.code], 2) << std::hex << cadence.code;
}

// --- Agreement with the cell list and the network ---

TEST(GsmUmtsRadioEncoderTest, EveryRecordAgreesWithTheCellListAndTheNetworkAsThePhoneMoves) {
  PeriodReader reader(kSeed);
  GsmUmtsDecoder decoder;
  int umtsChecks = 0, gsmChecks = 0, dchChecks = 0, hoppingChecks = 0;
  std::set<std::size_t> activeSetSizes;
  std::set<std::string> transmitPowers;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 150 * kPeriodsPerSecond) break;
    decoder.feed(period);
    const auto listed = listedServingCell(period);
    if (!listed) continue;  // a whole second: the cell list and everything due with it
    const Value display = decoder.display();
    const SimulatedNetwork& network = period.network;
    const Cell& serving = network.servingCell();
    SCOPED_TRACE("period " + std::to_string(period.number) + ", " + phaseName(network.phase()));

    EXPECT_EQ(integerIn(*listed, CellMonitorCellId), serving.cellId);
    EXPECT_EQ(integerIn(*listed, CellMonitorLAC), serving.areaCode);
    // Whichever of the cell list and 0x7135 wrote last: one network, one area.
    EXPECT_EQ(rowText(display, "Serving PLMN", "Location Area Code"), number(serving.areaCode));
    const std::string mcc = rowText(display, "Serving PLMN", "Mobile Country Code");
    const std::string mnc = rowText(display, "Serving PLMN", "Mobile Network Code");
    EXPECT_TRUE(mcc == "001" || mcc == "1") << mcc;
    EXPECT_TRUE(mnc == "01 " || mnc == "1") << mnc;
    for (const Dictionary& row : listRows(display, "Equivalent PLMN List")) {
      EXPECT_EQ(textIn(row, "Mobile Country Code"), "1");
      EXPECT_EQ(textIn(row, "Mobile Network Code"), "1");
    }

    if (serving.access == Access::UMTS) {
      ++umtsChecks;
      EXPECT_EQ(rowText(display, "UMTS RR Info", "Cell ID"), number(serving.cellId));
      EXPECT_EQ(rowText(display, "UMTS RR Info", "Scrambling Code"), number(serving.code));
      // The cell list's UARFCN row goes with each 0x4127 that follows it.
      const std::string downlink = rowText(display, "UMTS RR Info", "Downlink Frequency");
      EXPECT_EQ(downlink, number(serving.channel));
      EXPECT_EQ(rowText(display, "UMTS RR Info", "Uplink Frequency"), number(serving.channel - 950));
      EXPECT_EQ(rowText(display, "UMTS RR Info", "URA ID"), number(network.uraIdentity(serving)));
      const bool connected = network.phase() == Phase::UmtsConnecting || network.phase() == Phase::UmtsFach ||
                             network.phase() == Phase::UmtsDch;
      EXPECT_EQ(rowText(display, "UMTS RR Info", "Ciphering"), connected ? "Enabled" : "Disabled");

      if (!has(period, 0x417A)) continue;
      // The active set: the network's, serving cell first, its RSCP and Ec/Io those of the cell list.
      const auto active = network.activeSet();
      const auto rows = listRows(display, "Active Set");
      ASSERT_EQ(rows.size(), active.size());
      activeSetSizes.insert(rows.size());
      EXPECT_EQ(textIn(rows[0], "Scrambling Code"), number(serving.code));
      EXPECT_EQ(textIn(rows[0], "RSCP"), number(serving.level) + " dB");
      EXPECT_EQ(textIn(rows[0], "Energy Per Chip"), number(serving.quality) + " dB");
      EXPECT_EQ(integerIn(*listed, CellMonitorRSCP), serving.level);
      EXPECT_EQ(integerIn(*listed, CellMonitorECN0), serving.quality);
      for (std::size_t i = 0; i < rows.size(); ++i) {
        EXPECT_EQ(textIn(rows[i], "Scrambling Code"), number(active[i]->code));
        EXPECT_EQ(textIn(rows[i], "Energy Per Chip"), number(active[i]->quality) + " dB");
        EXPECT_EQ(active[i]->channel, serving.channel);
      }
      if (network.phase() == Phase::UmtsDch) {
        ++dchChecks;
        EXPECT_LE(rows.size(), 3u);
        const auto channels = listRows(display, "Transport Channels");
        ASSERT_EQ(channels.size(), 2u);
        EXPECT_EQ(textIn(channels[0], "Transport Channel ID"), "1");
        EXPECT_EQ(textIn(channels[0], "CRC Received"), "100");
        EXPECT_EQ(textIn(channels[1], "Transport Channel ID"), "2");
        EXPECT_EQ(textIn(channels[1], "CRC Received"), "25");
        EXPECT_LE(std::stoi(textIn(channels[0], "CRC Received in Error")), 10);
        EXPECT_EQ(rowText(display, "BLER", "Window Size"), "100");
        transmitPowers.insert(rowText(display, "UMTS RR Info", "Transmit Power"));
      } else {
        EXPECT_EQ(rows.size(), 1u) << "outside DCH the active set is the serving cell";
      }
    } else {
      ++gsmChecks;
      EXPECT_EQ(rowText(display, "GSM Serving Cell", "Cell ID"), number(serving.cellId));
      EXPECT_EQ(rowText(display, "GSM Serving Cell", "ARFCN"), number(serving.channel));
      EXPECT_EQ(rowText(display, "GSM Serving Cell", "BSIC"), number(serving.code));
      EXPECT_EQ(integerIn(*listed, CellMonitorARFCN), serving.channel);
      if (has(period, 0x5137)) {
        EXPECT_EQ(rowText(display, "GSM Serving Cell", "RSSI"), number(-serving.level) + " dBm");
        const int c1 = serving.level + 104;
        EXPECT_EQ(rowText(display, "GSM Serving Cell", "C1 Value"), number(c1 & 0xFFFF));
        EXPECT_EQ(rowText(display, "GSM Serving Cell", "C2 Value"), number((c1 + 4) & 0xFFFF));
      }
      if (network.phase() == Phase::GsmDedicated) {
        ++hoppingChecks;
        std::vector<std::string> allocation;
        for (int arfcn : serving.mobileAllocation) allocation.push_back(number(arfcn));
        EXPECT_EQ(stringsIn(display, "Mobile Allocation", "ARFCNs"), allocation);
        EXPECT_EQ(rowText(display, "Mobile Allocation", "HSN"), number(serving.hoppingSequence));
        const std::string hop = rowText(display, "GSM Serving Cell", "MA Dedicated ARFCN");
        EXPECT_NE(std::find(allocation.begin(), allocation.end(), hop), allocation.end()) << hop;
      }
    }
  }
  EXPECT_GT(umtsChecks, 60);
  EXPECT_GT(gsmChecks, 30);
  EXPECT_GT(dchChecks, 10);
  EXPECT_GT(hoppingChecks, 5);
  EXPECT_EQ(activeSetSizes, (std::set<std::size_t>{1, 2, 3}));
  EXPECT_GT(transmitPowers.size(), 3u);
}

TEST(GsmUmtsRadioEncoderTest, GsmMeasurementsListTheMeasuredNeighboursWithTheirBsicsAndC1) {
  PeriodReader reader(kSeed);
  GsmUmtsDecoder decoder;
  int checked = 0;
  std::map<int, int> bsics;  // of the last 0x51FF: ARFCN -> BSIC
  for (;;) {
    const Period period = reader.next();
    ASSERT_LT(period.number, 150 * kPeriodsPerSecond);
    decoder.feed(period);
    if (has(period, 0x51FF)) {
      bsics.clear();
      for (const Cell& cell : period.network.cells()) {
        if (cell.access == Access::GSM && !cell.serving && cell.measured) bsics[cell.channel] = cell.code;
      }
    }
    if (period.network.servingCell().access != Access::GSM || !has(period, 0x5137)) continue;
    // The cell list's neighbours come later in a second that has both; take the periods without it.
    if (has(period, 0xFF0001)) continue;
    std::vector<const Cell*> measured;
    for (const Cell& cell : period.network.cells()) {
      if (cell.access == Access::GSM && !cell.serving && cell.measured) measured.push_back(&cell);
    }
    std::stable_sort(measured.begin(), measured.end(), [](const Cell* a, const Cell* b) { return a->level > b->level; });
    const Value display = decoder.display();
    const auto rows = listRows(display, "Neighboring Cells");
    ASSERT_EQ(rows.size(), measured.size());
    for (std::size_t i = 0; i < rows.size(); ++i) {
      const Cell& cell = *measured[i];
      EXPECT_EQ(textIn(rows[i], "ARFCN"), number(cell.channel));
      EXPECT_EQ(textIn(rows[i], "RSSI"), number(-cell.level));
      EXPECT_EQ(textIn(rows[i], "C1 Value"), number(cell.level + 104));
      // A BSIC once an 0x51FF has named the cell's.
      EXPECT_EQ(textIn(rows[i], "BSIC"), bsics.count(cell.channel) ? number(bsics[cell.channel]) : "<none>");
      EXPECT_EQ(bsics.count(cell.channel) ? bsics[cell.channel] : cell.code, cell.code);
    }
    if (++checked == 40) break;
  }
}

TEST(GsmUmtsRadioEncoderTest, RankedCellsAlternateBetweenTheUmtsAndTheGsmNeighbours) {
  PeriodReader reader(kSeed);
  GsmUmtsDecoder decoder;
  int umts = 0, gsm = 0;
  for (;;) {
    const Period period = reader.next();
    ASSERT_LT(period.number, 150 * kPeriodsPerSecond);
    decoder.feed(period);
    if (!has(period, 0x4005) || has(period, 0xFF0001)) continue;
    const Value display = decoder.display();
    const auto umtsRows = listRows(display, "UMTS Set");
    const auto gsmRows = listRows(display, "GSM Set");
    std::vector<const Cell*> expected;
    const Access ranked = umtsRows.empty() ? Access::GSM : Access::UMTS;
    for (const Cell& cell : period.network.cells()) {
      if (cell.access == ranked && !cell.serving && cell.measured) expected.push_back(&cell);
    }
    std::stable_sort(expected.begin(), expected.end(), [](const Cell* a, const Cell* b) { return a->level > b->level; });
    if (ranked == Access::UMTS) {
      ++umts;
      EXPECT_TRUE(gsmRows.empty());
      ASSERT_EQ(umtsRows.size(), expected.size());
      for (std::size_t i = 0; i < expected.size(); ++i) {
        const Cell& cell = *expected[i];
        char ecNo[32];
        std::snprintf(ecNo, sizeof ecNo, "%f dB", cell.quality * 1.0);
        EXPECT_EQ(Value(umtsRows[i]), Value([&] {
                    Dictionary d;
                    d.set("Scrambling Code", Value(number(cell.code)));
                    d.set("RSCP", Value(number(cell.level) + " dB"));
                    d.set("Energy Per Chip", Value(std::string(ecNo)));
                    d.set("Downlink Frequency", Value(number(cell.channel)));
                    d.set("Ranking Value", Value(number(cell.level - 3)));
                    d.set("Rank Cell RSCP", Value(number(cell.level) + " dB"));
                    return d;
                  }()));
      }
    } else {
      ++gsm;
      ASSERT_EQ(gsmRows.size(), expected.size());
      ASSERT_FALSE(gsmRows.empty());
      for (std::size_t i = 0; i < expected.size(); ++i) {
        EXPECT_EQ(textIn(gsmRows[i], "ARFCN"), number(expected[i]->channel));
        EXPECT_EQ(textIn(gsmRows[i], "BSIC"), number(expected[i]->code));
        EXPECT_EQ(textIn(gsmRows[i], "RSSI"), number(expected[i]->level) + " dBm");
        EXPECT_EQ(textIn(gsmRows[i], "Ranking Value"), number(expected[i]->level - 6));
      }
    }
    if (umts >= 5 && gsm >= 5) break;
  }
}

// --- Every section of the scenario's records ---

TEST(GsmUmtsRadioEncoderTest, EverySectionOfTheRecordsShowsValuesAtSomePoint) {
  // The sections these records feed. "Detected Set", "Monitored Set" and
  // "Virtual Active Set" list no cell whatever the record holds, and the
  // non-ranked sets and "UMTS RR Measurement" take no records at all.
  const std::vector<std::string> rowSections = {"Serving PLMN", "GSM Serving Cell", "UMTS RR Info", "Mobile Allocation",
                                                "BLER",         "Process CO",       "Process CS",   "Process PS",
                                                "GSM RR Info",  "GPRS Information", "HSDPA Info"};
  const std::vector<std::string> listSections = {"Equivalent PLMN List", "Neighboring Cells",    "Active Set",
                                                 "UMTS Set",             "GSM Set",              "Transport Channels",
                                                 "Primary HARQ Process", "Secondary HARQ Process"};
  std::map<std::string, std::set<std::string>> filledRows;  // section -> rows seen with a value
  std::set<std::string> filledLists;
  std::map<std::string, std::set<std::string>> templateRows;
  PeriodReader reader(kSeed);
  GsmUmtsDecoder decoder;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 120 * kPeriodsPerSecond) break;
    decoder.feed(period);
    if (period.number % 50 != 0) continue;  // the display every 2 s, as the application makes it
    const Value display = decoder.display();
    for (const std::string& section : rowSections) {
      const Dictionary& rows = *findNode(display, section)->asDictionary();
      for (const auto& [row, value] : rows.entries()) {
        templateRows[section].insert(row);
        const bool filled = value.asString() ? *value.asString() != "-" && !value.asString()->empty()
                                             : value.asArray() && value.asArray()->size() > 0;
        if (filled) filledRows[section].insert(row);
      }
    }
    for (const std::string& section : listSections) {
      const Value* list = findNode(display, section);
      if (list && list->asArray() && list->asArray()->size() > 0) filledLists.insert(section);
    }
  }
  for (const std::string& section : rowSections) {
    EXPECT_EQ(filledRows[section], templateRows[section]) << section;
    EXPECT_GE(filledRows[section].size(), 2u) << section;
  }
  EXPECT_EQ(filledLists, std::set<std::string>(listSections.begin(), listSections.end()));
}

// --- Mobility management, GSM radio resource and HSDPA ---

// The bytes of the first packet of a code in a period, if any.
std::optional<Bytes> recordIn(const Period& period, std::uint32_t code) {
  for (const SourcePacket& packet : period.packets) {
    if (*packet.code == code) return *packet.data;
  }
  return std::nullopt;
}

// Read from the bytes: 0x7132's service state at 13; 0x7131's and 0x7130's
// state, substate and update status at 13, 14 and 15; 0x512C's RR state at
// 13 and mode at 16; 0x5072's DTX at 19.
TEST(GsmUmtsRadioEncoderTest, MobilityStatesFollowTheJourneyWithAnAttachAndAnUpdateAtEachReselection) {
  PeriodReader reader(kSeed);
  std::optional<Access> camped;
  int updates = 0, calls = 0, serviceRequests = 0, settled = 0;
  bool updatingBefore = false;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 120 * kPeriodsPerSecond) break;
    SCOPED_TRACE("period " + std::to_string(period.number));
    const SimulatedNetwork& network = period.network;
    const Access access = network.servingCell().access;
    const auto service = recordIn(period, 0x7132);
    const auto mm = recordIn(period, 0x7131);
    const auto gmm = recordIn(period, 0x7130);
    const auto rr = recordIn(period, 0x512C);
    if (period.number == 0) {
      // The combined attach: MM waits for GMM, nothing updated yet.
      ASSERT_TRUE(service && mm && gmm);
      EXPECT_EQ((*service)[13], 2);                                             // REG_STATE_REGISTERING
      EXPECT_EQ(Bytes(mm->begin() + 13, mm->end()), (Bytes{23, 5, 1}));       // LOCATION_UPDATING_PENDING
      EXPECT_EQ(Bytes(gmm->begin() + 13, gmm->end()), (Bytes{2, 2, 1}));      // REGISTERED_INITIATED
    } else if (camped && *camped != access) {
      // A reselection to the other technology: a combined routing area update.
      ++updates;
      ASSERT_TRUE(service && mm && gmm);
      EXPECT_EQ((*service)[13], 2);
      EXPECT_EQ(Bytes(mm->begin() + 13, mm->end()), (Bytes{23, 8, 0}));
      EXPECT_EQ(Bytes(gmm->begin() + 13, gmm->end()), (Bytes{5, 8, 1}));      // ROUTING_AREA_UPDATE_INITIATED
      if (access == Access::GSM) {
        ASSERT_TRUE(rr);
        EXPECT_EQ((*rr)[13], 14);  // RR_W2G_INTERRAT_RESELECTION_PROGRESS
      }
      updatingBefore = true;
    } else if (gmm) {
      // Registered: the first state record after an update says so.
      if (updatingBefore) ++settled;
      updatingBefore = false;
      ASSERT_TRUE(service && mm);
      EXPECT_EQ((*service)[13], 1);  // REG_STATE_IDLE
      EXPECT_EQ((*gmm)[15], 0);      // GMM_GU1_UPDATED
      EXPECT_EQ((*mm)[15], 0);       // UPDATED
      switch (network.phase()) {
        case Phase::GsmDedicated:
          ++calls;
          EXPECT_TRUE((*mm)[13] == 6 || (*mm)[13] == 5) << int((*mm)[13]);  // a call: an MM connection
          EXPECT_EQ((*gmm)[13], 3);
          EXPECT_EQ((*gmm)[14], 7);  // GMM_SUSPENDED
          break;
        case Phase::UmtsConnecting:
          ++serviceRequests;
          EXPECT_EQ((*mm)[13], 19);
          EXPECT_EQ((*gmm)[13], 6);  // GMM_SERVICE_REQUEST_INITIATED
          break;
        default:
          EXPECT_EQ((*mm)[13], 19);  // MM_IDLE
          EXPECT_EQ((*gmm)[13], 3);  // GMM_REGISTERED
          EXPECT_EQ((*gmm)[14], 0);
          break;
      }
    }
    if (rr && !(camped && *camped != access)) {
      const bool inCall = network.phase() == Phase::GsmDedicated;
      EXPECT_EQ((*rr)[16], inCall ? 0 : 1);  // Voice in a call
      if (inCall) {
        EXPECT_TRUE((*rr)[13] == 9 || (*rr)[13] == 7) << int((*rr)[13]);
      } else {
        EXPECT_EQ((*rr)[13], 5);  // RR_IDLE
      }
    }
    if (const auto dtx = recordIn(period, 0x5072)) {
      EXPECT_EQ((*dtx)[19] != 0, network.phase() == Phase::GsmDedicated);
    }
    camped = access;
  }
  EXPECT_GE(updates, 3);
  EXPECT_EQ(settled, updates);
  EXPECT_GT(calls, 3);
  EXPECT_GT(serviceRequests, 0);
}

// 0x4221 read from the bytes: p at 16 and s at 17, the carrier in bits 2-3
// of 15, entries of 9 bytes from 18 and from 18 + 162 p, each with New Tx at
// +5 and block errors at +7 (16 bits).
TEST(GsmUmtsRadioEncoderTest, HsdpaCountsGrowThroughEachStayInDchAndStartAgainWithTheNext) {
  PeriodReader reader(kSeed);
  std::vector<std::uint32_t> previous;
  std::uint64_t previousStay = 0;
  int records = 0, stays = 0;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 120 * kPeriodsPerSecond) break;
    const auto record = recordIn(period, 0x4221);
    if (!record) continue;
    SCOPED_TRACE("period " + std::to_string(period.number));
    ++records;
    const Bytes& p = *record;
    ASSERT_EQ(period.network.phase(), Phase::UmtsDch);
    EXPECT_EQ(p[15] >> 2 & 3, 2);  // Dual Carrier
    const std::size_t primary = p[16], secondary = p[17];
    ASSERT_EQ(primary, 6u);
    ASSERT_EQ(secondary, 6u);
    ASSERT_EQ(p.size(), 18 + 162 * primary + 9 * secondary);
    std::vector<std::uint32_t> newTx;
    for (std::size_t i = 0; i < primary + secondary; ++i) {
      const std::size_t at = i < primary ? 18 + 9 * i : 18 + 162 * primary + 9 * (i - primary);
      EXPECT_EQ(p[at], i % primary);
      const std::uint32_t fresh = p[at + 5] | p[at + 6] << 8;
      const std::uint32_t errors = p[at + 7] | p[at + 8] << 8;
      EXPECT_LT(errors, fresh / 3);
      newTx.push_back(fresh);
    }
    const bool sameStay = !previous.empty() && period.network.phaseChanges() == previousStay;
    stays += sameStay ? 0 : 1;
    for (std::size_t i = 0; sameStay && i < newTx.size(); ++i) EXPECT_GT(newTx[i], previous[i]) << i;
    for (std::size_t i = 0; !sameStay && i < newTx.size(); ++i) EXPECT_LT(newTx[i], 90u) << i;  // one record's worth
    previous = newTx;
    previousStay = period.network.phaseChanges();
  }
  EXPECT_GT(records, 10);
  EXPECT_GE(stays, 2);
}

// The GSM RR info and GPRS information rows, through the decoder: the receive
// level is the serving cell's, the GPRS parameters are the serving cell's own.
TEST(GsmUmtsRadioEncoderTest, TheGsmRadioResourceAndGprsRowsFollowTheServingGsmCell) {
  PeriodReader reader(kSeed);
  GsmUmtsDecoder decoder;
  int checks = 0;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 120 * kPeriodsPerSecond) break;
    decoder.feed(period);
    const Cell& serving = period.network.servingCell();
    if (serving.access != Access::GSM || !has(period, 0x51F6) || !has(period, 0x5137)) continue;
    SCOPED_TRACE("period " + std::to_string(period.number));
    ++checks;
    const Value display = decoder.display();
    EXPECT_EQ(rowText(display, "GSM RR Info", "Serving Rx Level"), number(-serving.level));
    EXPECT_EQ(rowText(display, "GSM RR Info", "Rx Quality Full"), number(serving.level + 104));  // C1
    EXPECT_EQ(rowText(display, "GSM RR Info", "DRX Used"), "2 sec");
    EXPECT_EQ(rowText(display, "GPRS Information", "DRX Timer Max"), "2");
    EXPECT_EQ(rowText(display, "GPRS Information", "Network Operating Mode"), "Class 1");
    const char* t3192[] = {"500 ms", "80 ms", "1000 ms"};
    EXPECT_EQ(rowText(display, "GPRS Information", "T3192"), t3192[serving.cellId % 3]);
    EXPECT_EQ(rowText(display, "GPRS Information", "SI13 Position"),
              serving.cellId % 4 == 3 ? "Located on Extended BCCH" : "Located on BCCH");
    EXPECT_EQ(rowText(display, "GPRS Information", "Cell Reselect Hysteresis"),
              serving.cellId % 2 == 0 ? "Applied" : "Not Applied");
  }
  EXPECT_GT(checks, 5);
}

// --- Determinism ---

TEST(GsmUmtsRadioEncoderTest, TheSameSeedGivesTheSameBytesAndAnotherSeedOthers) {
  auto a = makeLogCodeScenario(kLogChannelTechnologyQuendraGSM, kSeed, kStart);
  auto b = makeLogCodeScenario(kLogChannelTechnologyQuendraGSM, kSeed, kStart);
  auto c = makeLogCodeScenario(kLogChannelTechnologyQuendraGSM, kSeed + 1, kStart);
  int differ = 0;
  for (int i = 0; i < 3000; ++i) {
    const SourcePacket pa = a->nextPacket();
    ASSERT_EQ(*pa.data, *b->nextPacket().data) << i;
    differ += *pa.data != *c->nextPacket().data ? 1 : 0;
  }
  EXPECT_GT(differ, 1500);
}

// --- The sample session of corvane-decode ---

const std::string kSamplePath = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/gsm-umts-session.hex";
// Seed 6's phone is on UMTS until 29 s (DCH from 13 s to 22 s), on GSM until
// 43 s (dedicated from 33 s to 40 s) and back on UMTS after: a whole journey.
// Its last second ends on a ranking of the GSM neighbours followed by a cell
// list, so that every section the records feed shows values at the end.
constexpr std::uint64_t kSampleSeed = 6;
constexpr std::uint64_t kSampleSeconds = 46;

std::string sampleContents() {
  const std::string seed = std::to_string(kSampleSeed);
  std::string text =
      "# The first " + std::to_string(kSampleSeconds) + " simulated seconds of corvane-telephonyd's Quendra_GSM scenario,\n"
      "# seed " + seed + ", clock start 1800000000 s, one packet per line: what\n"
      "#   corvane-telephonyd --technology Quendra_GSM --seed " + seed + " --clock-start 1800000000\n"
      "# streams first to a client whose start command asks for the GSM/UMTS codes.\n"
      "# The phone camps on UMTS (idle, FACH, DCH), reselects to GSM (idle, then a\n"
      "# call on a hopping channel) and returns to UMTS.\n"
      "# Written by corvane_telephonyd_tests --gtest_filter='GsmUmtsSessionSample.*' with\n"
      "# CORVANE_UPDATE_SAMPLES=1; without it that test checks that this is still what\n"
      "# the scenario sends.\n";
  PeriodReader reader(kSampleSeed);
  return text + scenario::hexLinesOfFirstSeconds(reader, kSampleSeconds);
}

TEST(GsmUmtsSessionSample, IsWhatTheScenarioSendsInItsFirstSeconds) {
  const std::string expected = sampleContents();
  EXPECT_EQ(scenario::sampleFile(kSamplePath, expected), expected)
      << kSamplePath << ": renew it with CORVANE_UPDATE_SAMPLES=1";
}

TEST(GsmUmtsSessionSample, CoversAWholeJourneyFromUmtsToGsmAndBack) {
  PeriodReader reader(kSampleSeed);
  std::vector<Access> camped;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= kSampleSeconds * kPeriodsPerSecond) break;
    const Access access = period.network.servingCell().access;
    if (camped.empty() || camped.back() != access) camped.push_back(access);
  }
  EXPECT_EQ(camped, (std::vector<Access>{Access::UMTS, Access::GSM, Access::UMTS}));
}

}  // namespace
}  // namespace corvane::telephonyd
