// The Quendra_UTRAN2 scenario's radio records, read by the UTRAN decoder
// itself: a phone that moves through its RRC states, with a serving cell and
// neighbours that agree with the cell list and with the simulated network.

#include "telephonyd/UtranRadioEncoder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <string>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "telephonyd/LogCodeSimulator.h"
#include "telephonyd/ScenarioPeriods.h"

namespace corvane::telephonyd {
namespace {

using Cell = SimulatedNetwork::Cell;
using Access = SimulatedNetwork::Access;
using State = UtranRrcJourney::State;

using scenario::codesOf;
using scenario::findNode;
using scenario::kPeriodsPerSecond;
using scenario::Period;
using scenario::rowText;

constexpr std::uint64_t kSeed = 4;

class PeriodReader : public scenario::PeriodReader {
 public:
  explicit PeriodReader(std::uint64_t seed) : scenario::PeriodReader(kLogChannelTechnologyQuendraUTRAN2, seed) {}
};

bool has(const Period& period, std::uint32_t code) {
  const auto codes = codesOf(period);
  return std::find(codes.begin(), codes.end(), code) != codes.end();
}

// The UTRAN decoder, fed packet by packet.
class UtranDecoder : public scenario::Decoder {
 public:
  UtranDecoder() : Decoder(kLogChannelTechnologyQuendraUTRAN2) {}
};

std::vector<Dictionary> listRows(const Value& display, std::string_view section) {
  std::vector<Dictionary> rows;
  const Value* list = findNode(display, section);
  if (list && list->asArray()) {
    for (const Value& row : list->asArray()->elements()) rows.push_back(*row.asDictionary());
  }
  return rows;
}

std::string text(const Dictionary& row, std::string_view key) {
  const Value* v = row.find(key);
  return v && v->asString() ? *v->asString() : "<none>";
}

const char* stateText(State state) {
  static const char* const kTexts[] = {"Disconnected", "Connecting", "Cell Fach", "Cell DCH", "Cell PCH", "Cell URA PCH"};
  return kTexts[static_cast<int>(state)];
}

TEST(UtranRadioEncoder, TheRrcStateMovesAsAPhonesDoesThroughAllSixStates) {
  PeriodReader reader(kSeed);
  UtranDecoder decoder;
  std::vector<std::string> shown;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 120 * kPeriodsPerSecond) break;
    decoder.feed(period);
    if (!has(period, 0xD0E0)) continue;
    const std::string state = rowText(decoder.display(), "RRC Info", "State");
    EXPECT_EQ(state, stateText(period.network.utranRrc()->state())) << period.number;
    if (shown.empty() || shown.back() != state) shown.push_back(state);
  }
  const std::vector<std::string> cycle = {"Disconnected", "Connecting", "Cell Fach",
                                          "Cell DCH",     "Cell PCH",   "Cell URA PCH"};
  ASSERT_GE(shown.size(), 8u);
  for (std::size_t i = 0; i < shown.size(); ++i) EXPECT_EQ(shown[i], cycle[i % cycle.size()]) << i;
}

TEST(UtranRadioEncoder, TheServingCellOfTheRecordAgreesWithTheCellListAndTheNetwork) {
  PeriodReader reader(kSeed);
  UtranDecoder decoder;
  int checked = 0;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 60 * kPeriodsPerSecond) break;
    decoder.feed(period);
    if (!has(period, 0xD0E2)) continue;
    const Cell& serving = period.network.servingCell();
    const Value display = decoder.display();
    EXPECT_EQ(rowText(display, "Serving Cell Info", "Cell ID"), std::to_string(serving.cellId));
    EXPECT_EQ(rowText(display, "Serving Cell Info", "Downlink UARFCN"), std::to_string(serving.channel));
    EXPECT_EQ(rowText(display, "Serving Cell Info", "Uplink UARFCN"), std::to_string(serving.channel));
    EXPECT_EQ(rowText(display, "Serving Cell Info", "Allowed Access"), "All Calls");
    EXPECT_EQ(rowText(display, "Serving Cell Info", "URA ID"),
              std::to_string(period.network.utranRegistrationArea(serving)));
    ++checked;
  }
  EXPECT_GE(checked, 29);
}

TEST(UtranRadioEncoder, TheNeighbourListHoldsEveryUtranCellServingFirstAndTheLevelsMove) {
  PeriodReader reader(kSeed);
  UtranDecoder decoder;
  std::set<std::string> levels;
  std::set<std::string> statuses;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 120 * kPeriodsPerSecond) break;
    decoder.feed(period);
    if (!has(period, 0xD00A)) continue;
    const auto rows = listRows(decoder.display(), "Neighbor Cell List");
    const Cell& serving = period.network.servingCell();
    const auto utranCells = std::count_if(period.network.cells().begin(), period.network.cells().end(),
                                          [](const Cell& c) { return c.access == Access::UTRAN2; });
    ASSERT_EQ(static_cast<long>(rows.size()), utranCells);
    EXPECT_EQ(text(rows[0], "Status"), "ASET");
    EXPECT_EQ(text(rows[0], "Cell ID"), std::to_string(serving.code));
    EXPECT_EQ(text(rows[0], "UARFCN"), std::to_string(serving.channel));
    for (const Dictionary& row : rows) {
      levels.insert(text(row, "Filter RSCP"));
      statuses.insert(text(row, "Status"));
    }
  }
  EXPECT_GT(levels.size(), 10u);
  EXPECT_TRUE(statuses.count("MSET"));
}

TEST(UtranRadioEncoder, ChannelMeasurementsComeOnlyWhileThePhoneHasChannelsOfItsOwn) {
  PeriodReader reader(kSeed);
  UtranDecoder decoder;
  int dchRecords = 0;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 120 * kPeriodsPerSecond) break;
    decoder.feed(period);
    const State state = period.network.utranRrc()->state();
    if (!has(period, 0xD00C)) continue;
    ASSERT_TRUE(state == State::Fach || state == State::Dch) << period.number;
    const Value display = decoder.display();
    const auto trch = listRows(display, "TRCH BLER");
    const auto cctrch = listRows(display, "CCTRCH SIR");
    EXPECT_EQ(trch.size(), state == State::Dch ? 2u : 1u);
    EXPECT_EQ(cctrch.size(), state == State::Dch ? 2u : 1u);
    ASSERT_FALSE(cctrch.empty());
    EXPECT_EQ(cctrch[0].find("SIR")->asArray()->size(), 6u);
    dchRecords += state == State::Dch;
  }
  EXPECT_GT(dchRecords, 5);
}

TEST(UtranRadioEncoder, TheGsmNeighboursAreSentAlthoughTheDecoderNeverListsThem) {
  PeriodReader reader(kSeed);
  UtranDecoder decoder;
  int records = 0;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= 20 * kPeriodsPerSecond) break;
    decoder.feed(period);
    if (!has(period, 0xD00E)) continue;
    ++records;
    EXPECT_TRUE(listRows(decoder.display(), "GSM Neighbor Cell List").empty());
  }
  EXPECT_GE(records, 15);
}

// --- The sample session of corvane-decode ---

const std::string kSamplePath = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/utran-session.hex";
// Seed 5's phone goes through all six RRC states, connects again at 34 s and
// is on DCH for the last seconds, so that every list the records feed shows
// values at the end.
constexpr std::uint64_t kSampleSeed = 5;
constexpr std::uint64_t kSampleSeconds = 40;

std::string sampleContents() {
  const std::string seed = std::to_string(kSampleSeed);
  std::string text =
      "# The first " + std::to_string(kSampleSeconds) + " simulated seconds of corvane-telephonyd's Quendra_UTRAN2 scenario,\n"
      "# seed " + seed + ", clock start 1800000000 s, one packet per line: what\n"
      "#   corvane-telephonyd --technology Quendra_UTRAN2 --seed " + seed + " --clock-start 1800000000\n"
      "# streams first to a client whose start command asks for the UTRAN codes.\n"
      "# The phone goes from idle through connection set-up, FACH, DCH, CELL_PCH and\n"
      "# URA_PCH back to idle and connects again.\n"
      "# Written by corvane_telephonyd_tests --gtest_filter='UtranSessionSample.*' with\n"
      "# CORVANE_UPDATE_SAMPLES=1; without it that test checks that this is still what\n"
      "# the scenario sends.\n";
  PeriodReader reader(kSampleSeed);
  return text + scenario::hexLinesOfFirstSeconds(reader, kSampleSeconds);
}

TEST(UtranSessionSample, IsWhatTheScenarioSendsInItsFirstSeconds) {
  const std::string expected = sampleContents();
  EXPECT_EQ(scenario::sampleFile(kSamplePath, expected), expected)
      << kSamplePath << ": renew it with CORVANE_UPDATE_SAMPLES=1";
}

TEST(UtranSessionSample, GoesThroughEveryRrcStateAndEndsConnected) {
  PeriodReader reader(kSampleSeed);
  std::set<State> states;
  State last = State::Disconnected;
  for (;;) {
    const Period period = reader.next();
    if (period.number >= kSampleSeconds * kPeriodsPerSecond) break;
    last = period.network.utranRrc()->state();
    states.insert(last);
  }
  EXPECT_EQ(states.size(), 6u);
  EXPECT_EQ(last, State::Dch);
}

}  // namespace
}  // namespace corvane::telephonyd
