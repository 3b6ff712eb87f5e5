// The Quendra_CDMA scenario's radio records, read by the CDMA2000 decoder
// itself: the phone's journey from 1x idle through a call and an EV-DO data
// session and back, every record agreeing with the cell list, with the
// simulated network and with the phone's session as they move.

#include "telephonyd/CdmaRadioEncoder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <set>
#include <string>
#include <vector>

#include "LogGenerator/cdma2000/C2KLogGenerator.h"
#include "platform/CellMonitor.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "platform/PropertyList.h"
#include "telephonyd/ScenarioPeriods.h"

namespace corvane::telephonyd {
namespace {

using Cell = SimulatedNetwork::Cell;
using Phase = CdmaSession::Phase;
using scenario::codesOf;
using scenario::kPeriodsPerSecond;
using scenario::Period;
constexpr std::uint64_t kStart = scenario::kScenarioStart;
constexpr std::uint64_t kSeed = 4;

class PeriodReader : public scenario::PeriodReader {
 public:
  explicit PeriodReader(std::uint64_t seed) : scenario::PeriodReader(kLogChannelTechnologyQuendraCDMA, seed) {}
};

// The scenario decoded as a client of the CDMA2000 generator sees it: only
// the radio codes, which its start command asks for.
class Decoded {
 public:
  Decoded() {
    log::ScopedCapture quiet;
    generator_ = std::make_unique<C2KLogGenerator>();
  }
  void feed(const Period& period) {
    log::ScopedCapture quiet;
    for (const SourcePacket& packet : period.packets) {
      if (*packet.code < kExtraCodeBase) generator_->updateState(state_, *packet.data);
    }
  }
  // The value under a lookup key: what its first row shows.
  Value value(const std::string& key) const {
    const Value lookup = state_.get("Lookup");
    const Value records = lookup.asDictionary()->get(key);
    const Value record = records.asArray()->at(0);
    const Value dict = record.asDictionary()->get("dict");
    const Value label = record.asDictionary()->get("key");
    return dict.asDictionary()->get(*label.asString());
  }
  std::string text(const std::string& key) const {
    const Value v = value(key);
    return v.asString() ? *v.asString() : "<list>";
  }
  // A per-pilot list's PN offsets, in list order.
  std::vector<int> pilots(const std::string& key) const {
    std::vector<int> pns;
    const Value v = value(key);
    if (const Dictionary* d = v.asDictionary()) {
      for (const auto& [k, text] : d->entries()) {
        if (k != "_sorted") pns.push_back(std::stoi(k.substr(k.find(';') + 1)));
      }
    }
    return pns;
  }
  const Dictionary& state() const { return state_; }

 private:
  std::unique_ptr<C2KLogGenerator> generator_;
  Dictionary state_;
};

std::vector<int> codesOfCells(const std::vector<const Cell*>& cells) {
  std::vector<int> codes;
  for (const Cell* cell : cells) codes.push_back(cell->code);
  return codes;
}

bool has(const Period& period, std::uint32_t code) {
  const auto codes = codesOf(period);
  return std::find(codes.begin(), codes.end(), code) != codes.end();
}

// The session as the encoder keeps it: replayed alongside, step for step.
class Journey {
 public:
  explicit Journey(std::uint64_t seed) : session_(seed) {}
  void follow(const Period& period) {
    if (period.network.steps() != steps_) {
      steps_ = period.network.steps();
      session_.step(period.network);
    }
  }
  const CdmaSession& session() const { return session_; }

 private:
  CdmaSession session_;
  std::uint64_t steps_ = 0;
};

TEST(CdmaRadioEncoderTest, ThePhoneGoesFromIdleToACallToEvdoAndBack) {
  PeriodReader reader(kSeed);
  Journey journey(kSeed);
  std::vector<Phase> phases;
  while (true) {
    const Period period = reader.next();
    if (period.number >= 90 * kPeriodsPerSecond) break;
    journey.follow(period);
    const Phase phase = journey.session().phase();
    if (phases.empty() || phases.back() != phase) phases.push_back(phase);
  }
  ASSERT_GE(phases.size(), 6u);
  EXPECT_EQ(std::vector<Phase>(phases.begin(), phases.begin() + 6),
            (std::vector<Phase>{Phase::OneXIdle, Phase::OneXTraffic, Phase::OneXIdle, Phase::EvdoAccess,
                                Phase::EvdoConnected, Phase::OneXIdle}));
}

TEST(CdmaRadioEncoderTest, EveryRecordAgreesWithTheNetworkTheSessionAndTheCellList) {
  PeriodReader reader(kSeed);
  Journey journey(kSeed);
  Decoded decoded;
  std::set<std::size_t> evdoSetSizes;
  std::set<std::size_t> oneXSetSizes;
  std::set<std::string> forwardRates;
  int framesSeen = 0;
  while (true) {
    const Period period = reader.next();
    if (period.number >= 80 * kPeriodsPerSecond) break;
    journey.follow(period);
    decoded.feed(period);
    const Cell& serving = period.network.servingCell();
    const std::vector<const Cell*> set = journey.session().activeSet(period.network, CdmaSession::Link::Evdo);
    const std::vector<const Cell*> oneXSet = journey.session().activeSet(period.network, CdmaSession::Link::OneX);
    for (const auto* s : {&set, &oneXSet}) {
      ASSERT_GE(s->size(), 1u);
      ASSERT_LE(s->size(), 3u);
      EXPECT_EQ(s->front(), &serving);
    }
    if (journey.session().phase() != Phase::OneXTraffic) {
      EXPECT_EQ(oneXSet.size(), 1u);
    }
    if (journey.session().phase() != Phase::EvdoConnected) {
      EXPECT_EQ(set.size(), 1u);
    }
    if (has(period, 0x134f)) {
      EXPECT_EQ(decoded.text("kSystemId"), std::to_string(serving.areaCode));
      EXPECT_EQ(decoded.text("kBaseId"), std::to_string(serving.cellId));
      EXPECT_EQ(decoded.text("kNetworkId"), std::to_string(journey.session().networkId()));
    }
    if (has(period, 0x1183)) {
      EXPECT_EQ(decoded.text("kServingPNOffset"), std::to_string(serving.code) + " \xC3\x97 64chips");
      EXPECT_EQ(decoded.text("kRxAGC0"), (serving.level >= 0 ? "+" : "") + std::to_string(serving.level) + " dBm");
      EXPECT_EQ(decoded.pilots("kActiveSetPilots"), codesOfCells(set));
      evdoSetSizes.insert(set.size());
    }
    if (has(period, 0x119c)) {
      const std::vector<int> oneX = decoded.pilots("k1xActiveSetInfo");
      EXPECT_EQ(oneX, codesOfCells(oneXSet));
      oneXSetSizes.insert(oneXSet.size());
      EXPECT_EQ(decoded.text("k1xRx0ChanNum"), std::to_string(serving.channel));
      EXPECT_EQ(decoded.text("k1xDeviceState"),
                journey.session().phase() == Phase::OneXTraffic ? "Traffic [8]" : "Paging [6]");
      // The reference pilot is the serving one, its Ec/Io that of the cell list within rounding.
      const Value list = decoded.value("k1xActiveSetInfo");
      const Value servingPilot = list.asDictionary()->get("0;" + std::to_string(serving.code));
      ASSERT_TRUE(servingPilot.isString());
      const std::string serving0 = *servingPilot.asString();
      ASSERT_EQ(serving0.rfind("(ref pilot) ", 0), 0u) << serving0;
      EXPECT_NEAR(std::stod(serving0.substr(12)), serving.quality, 0.02) << serving0;
    }
    if (has(period, 0x1192)) {
      if (period.number > 0) {
        forwardRates.insert(decoded.text("kFLDataRate"));
        EXPECT_EQ(decoded.text("kFLDataRate"), std::to_string(journey.session().forwardRate()) + ".00 kbps");
        EXPECT_EQ(decoded.text("kRLDataRate"), std::to_string(journey.session().reverseRate()) + ".00 kbps");
      } else {
        EXPECT_EQ(decoded.text("kFLDataRate"), "");
      }
    }
    if (has(period, 0x119d)) {
      ++framesSeen;
      EXPECT_EQ(journey.session().phase(), Phase::OneXTraffic);
    }
    // The cell list names the same serving cell: SID, base id, PN offset.
    const Value cells = period.network.cellList();
    const Value first = cells.asArray()->at(0);
    EXPECT_EQ(first.asDictionary()->get(CellMonitorLAC), Value::integer(serving.areaCode));
    EXPECT_EQ(first.asDictionary()->get(CellMonitorCellId), Value::integer(serving.cellId));
    EXPECT_EQ(first.asDictionary()->get(CellMonitorPID), Value::integer(serving.code));
    EXPECT_EQ(first.asDictionary()->get(CellMonitorCellRadioAccessTechnology),
              Value(CellMonitorRadioAccessTechnologyCDMA));
  }
  EXPECT_GT(evdoSetSizes.size(), 1u) << "the EV-DO active set never grew beyond one pilot";
  EXPECT_GT(oneXSetSizes.size(), 1u) << "the 1x active set never grew beyond one pilot";
  EXPECT_GT(forwardRates.size(), 3u) << "the forward rate hardly moved";
  EXPECT_GT(framesSeen, 100);
}

TEST(CdmaRadioEncoderTest, TheFrameErrorRateRisesAndFallsDuringACall) {
  PeriodReader reader(kSeed);
  Journey journey(kSeed);
  Decoded decoded;
  std::vector<double> rates;
  while (true) {
    const Period period = reader.next();
    if (period.number >= 60 * kPeriodsPerSecond) break;
    journey.follow(period);
    decoded.feed(period);
    if (has(period, 0x119d)) {
      const Value fer = decoded.state().get("TrafficFER");
      rates.push_back(*fer.asReal());
    }
  }
  ASSERT_FALSE(rates.empty());
  const auto peak = std::max_element(rates.begin(), rates.end());
  EXPECT_GT(*peak, 0.01);
  EXPECT_LT(*std::min_element(peak, rates.end()), *peak) << "it never fell again";
  // Once the call is over the last value shows as old.
  EXPECT_NE(decoded.text("k1xTrafficFER").find("(old)"), std::string::npos);
}

TEST(CdmaRadioEncoderTest, TheSameSeedGivesTheSameBytesAndAnotherSeedOthers) {
  auto a = makeLogCodeScenario(kLogChannelTechnologyQuendraCDMA, kSeed, kStart);
  auto b = makeLogCodeScenario(kLogChannelTechnologyQuendraCDMA, kSeed, kStart);
  auto c = makeLogCodeScenario(kLogChannelTechnologyQuendraCDMA, kSeed + 1, kStart);
  int differ = 0;
  for (int i = 0; i < 2000; ++i) {
    const SourcePacket pa = a->nextPacket();
    ASSERT_EQ(*pa.data, *b->nextPacket().data) << i;
    differ += *pa.data != *c->nextPacket().data ? 1 : 0;
  }
  EXPECT_GT(differ, 1000);
}

// --- The sample session of corvane-decode ---

const std::string kSamplePath = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/cdma-session.hex";
// Seed 4's phone is in a call from about 6 s to 18 s and has EV-DO connected
// from about 23 s: the sample ends in the data session.
constexpr std::uint64_t kSampleSeed = kSeed;
constexpr std::uint64_t kSampleSeconds = 26;

std::string sampleContents() {
  const std::string seed = std::to_string(kSampleSeed);
  std::string text =
      "# The first " + std::to_string(kSampleSeconds) + " simulated seconds of corvane-telephonyd's Quendra_CDMA scenario,\n"
      "# seed " + seed + ", clock start 1800000000 s, one packet per line: what\n"
      "#   corvane-telephonyd --technology Quendra_CDMA --seed " + seed + " --clock-start 1800000000\n"
      "# streams first to a client whose start command asks for the eight CDMA2000 codes.\n"
      "# The phone is in 1x idle, makes a call, returns to idle and opens an EV-DO\n"
      "# data session.\n"
      "# Written by corvane_telephonyd_tests --gtest_filter='CdmaSessionSample.*' with\n"
      "# CORVANE_UPDATE_SAMPLES=1; without it that test checks that this is still what\n"
      "# the scenario sends.\n";
  PeriodReader reader(kSampleSeed);
  while (true) {
    const Period period = reader.next();
    if (period.number >= kSampleSeconds * kPeriodsPerSecond) break;
    for (const SourcePacket& packet : period.packets) {
      if (*packet.code < kExtraCodeBase) text += scenario::hexLine(*packet.data) + "\n";
    }
  }
  return text;
}

TEST(CdmaSessionSample, IsWhatTheScenarioSendsInItsFirstSeconds) {
  const std::string expected = sampleContents();
  EXPECT_EQ(scenario::sampleFile(kSamplePath, expected), expected)
      << kSamplePath << ": renew it with CORVANE_UPDATE_SAMPLES=1";
}

TEST(CdmaSessionSample, EndsInTheDataSessionAfterACall) {
  PeriodReader reader(kSampleSeed);
  Journey journey(kSampleSeed);
  std::set<Phase> seen;
  Phase last = Phase::OneXIdle;
  while (true) {
    const Period period = reader.next();
    if (period.number >= kSampleSeconds * kPeriodsPerSecond) break;
    journey.follow(period);
    last = journey.session().phase();
    seen.insert(last);
  }
  EXPECT_TRUE(seen.count(Phase::OneXTraffic));
  EXPECT_EQ(last, Phase::EvdoConnected);
}

}  // namespace
}  // namespace corvane::telephonyd
