#include "telephonyd/SimulatedNetwork.h"

#include <gtest/gtest.h>

#include <cmath>
#include <algorithm>
#include <cstdio>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>
#include <stdexcept>

#include "platform/CellMonitor.h"
#include "platform/LogChannelTechnology.h"

namespace corvane::telephonyd {
namespace {

using Access = SimulatedNetwork::Access;

const Dictionary& dictionary(const Value& value) {
  const Dictionary* d = value.asDictionary();
  if (!d) throw std::runtime_error("not a dictionary");
  return *d;
}

std::string text(const Dictionary& d, std::string_view key) {
  const Value* v = d.find(key);
  return v && v->asString() ? *v->asString() : std::string("<missing>");
}

std::int64_t integer(const Dictionary& d, std::string_view key) {
  const Value* v = d.find(key);
  if (!v || !v->asInteger()) throw std::runtime_error("no integer under " + std::string(key));
  return *v->asInteger();
}

std::vector<Dictionary> cellsOf(const SimulatedNetwork& network) {
  std::vector<Dictionary> cells;
  const Value list = network.cellList();
  for (const Value& cell : list.asArray()->elements()) cells.push_back(dictionary(cell));
  return cells;
}

// The keys that the sections read from a cell of each access technology, and
// the technology and type strings.
void expectCellKeys(const Dictionary& cell) {
  const std::string access = text(cell, CellMonitorCellRadioAccessTechnology);
  const std::string type = text(cell, CellMonitorCellType);
  EXPECT_TRUE(type == CellMonitorCellTypeServing || type == CellMonitorCellTypeNeighbor) << type;
  std::vector<std::string_view> keys = {CellMonitorMCC, CellMonitorMNC, CellMonitorCellId};
  if (access == CellMonitorRadioAccessTechnologyGSM) {
    keys.insert(keys.end(), {CellMonitorLAC, CellMonitorARFCN, CellMonitorRSSI});
  } else if (access == CellMonitorRadioAccessTechnologyUMTS || access == CellMonitorRadioAccessTechnologyUTRAN2) {
    keys.insert(keys.end(), {CellMonitorLAC, CellMonitorUARFCN, CellMonitorBandInfo, CellMonitorSCN, CellMonitorRSCP,
                             CellMonitorECN0});
  } else if (access == CellMonitorRadioAccessTechnologyLTE) {
    keys.insert(keys.end(), {CellMonitorTAC, CellMonitorPID, CellMonitorUARFCN, CellMonitorBandInfo, CellMonitorRSSI});
  } else {
    ADD_FAILURE() << "unexpected access technology " << access;
  }
  for (std::string_view key : keys) {
    const Value* value = cell.find(key);
    ASSERT_TRUE(value) << access << " cell without " << key;
    EXPECT_TRUE(value->asInteger()) << key << " is not an integer";
  }
  EXPECT_EQ(cell.size(), keys.size() + 2) << access;
}

std::set<std::string> accessesOf(const std::vector<Dictionary>& cells) {
  std::set<std::string> accesses;
  for (const Dictionary& cell : cells) accesses.insert(text(cell, CellMonitorCellRadioAccessTechnology));
  return accesses;
}

TEST(SimulatedNetworkTest, EachTechnologyReportsItsServingCellFirstAndNeighboursOfMatchingTechnologies) {
  struct Case {
    std::string_view technology;
    std::string_view serving;
    std::set<std::string> accesses;
  };
  const std::vector<Case> cases = {
      {kLogChannelTechnologyQuendraGSM, CellMonitorRadioAccessTechnologyUMTS,
       {std::string(CellMonitorRadioAccessTechnologyUMTS), std::string(CellMonitorRadioAccessTechnologyGSM)}},
      {kLogChannelTechnologyQuendraUTRAN2, CellMonitorRadioAccessTechnologyUTRAN2,
       {std::string(CellMonitorRadioAccessTechnologyUTRAN2), std::string(CellMonitorRadioAccessTechnologyGSM)}},
      {kLogChannelTechnologyQuendraLTE, CellMonitorRadioAccessTechnologyLTE,
       {std::string(CellMonitorRadioAccessTechnologyLTE)}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(std::string(c.technology));
    SimulatedNetwork network(c.technology, 5);
    const auto cells = cellsOf(network);
    ASSERT_GE(cells.size(), 5u);
    EXPECT_EQ(text(cells[0], CellMonitorCellType), CellMonitorCellTypeServing);
    EXPECT_EQ(text(cells[0], CellMonitorCellRadioAccessTechnology), c.serving);
    for (std::size_t i = 1; i < cells.size(); ++i) {
      EXPECT_EQ(text(cells[i], CellMonitorCellType), CellMonitorCellTypeNeighbor);
    }
    EXPECT_EQ(accessesOf(cells), c.accesses);
    for (const Dictionary& cell : cells) {
      expectCellKeys(cell);
      EXPECT_EQ(integer(cell, CellMonitorMCC), 1);
      EXPECT_EQ(integer(cell, CellMonitorMNC), 1);
    }
  }
}

TEST(SimulatedNetworkTest, ValuesLieInTheRangesOfTheirTechnology) {
  for (std::uint64_t seed = 1; seed <= 20; ++seed) {
    for (auto technology : {kLogChannelTechnologyQuendraGSM, kLogChannelTechnologyQuendraUTRAN2,
                            kLogChannelTechnologyQuendraLTE}) {
      SimulatedNetwork network(technology, seed);
      for (int step = 0; step < 50; ++step) network.step();
      for (const Dictionary& cell : cellsOf(network)) {
        const std::string access = text(cell, CellMonitorCellRadioAccessTechnology);
        if (access == CellMonitorRadioAccessTechnologyGSM) {
          EXPECT_GE(integer(cell, CellMonitorARFCN), 1);
          EXPECT_LE(integer(cell, CellMonitorARFCN), 124);
          EXPECT_LE(integer(cell, CellMonitorCellId), 65535);
          const auto rssi = integer(cell, CellMonitorRSSI);
          if (rssi != kCellMonitorNotMeasured) {
            EXPECT_GE(2 * rssi, -110);
            EXPECT_LE(2 * rssi, -48);
          }
        } else if (access == CellMonitorRadioAccessTechnologyUMTS) {
          EXPECT_GE(integer(cell, CellMonitorUARFCN), 10562);
          EXPECT_LE(integer(cell, CellMonitorUARFCN), 10838);
          EXPECT_EQ(integer(cell, CellMonitorBandInfo), 1);
          EXPECT_LE(integer(cell, CellMonitorSCN), 511);
        } else if (access == CellMonitorRadioAccessTechnologyUTRAN2) {
          const auto band = integer(cell, CellMonitorBandInfo);
          const auto uarfcn = integer(cell, CellMonitorUARFCN);
          EXPECT_TRUE((band == 34 && uarfcn >= 10054 && uarfcn <= 10121) ||
                      (band == 39 && uarfcn >= 9404 && uarfcn <= 9596))
              << band << " " << uarfcn;
          EXPECT_LE(integer(cell, CellMonitorSCN), 127);
        } else {
          const auto band = integer(cell, CellMonitorBandInfo);
          const auto earfcn = integer(cell, CellMonitorUARFCN);
          EXPECT_TRUE((band == 3 && earfcn >= 1200 && earfcn <= 1949) ||
                      (band == 7 && earfcn >= 2750 && earfcn <= 3449) ||
                      (band == 20 && earfcn >= 6150 && earfcn <= 6449))
              << band << " " << earfcn;
          EXPECT_LE(integer(cell, CellMonitorPID), 503);
          EXPECT_LE(integer(cell, CellMonitorCellId), 0xFFFFFFF);
        }
        if (access == CellMonitorRadioAccessTechnologyUMTS || access == CellMonitorRadioAccessTechnologyUTRAN2) {
          const auto rscp = integer(cell, CellMonitorRSCP);
          const auto ecn0 = integer(cell, CellMonitorECN0);
          EXPECT_EQ(rscp == kCellMonitorNotMeasured, ecn0 == kCellMonitorNotMeasured);
          if (rscp != kCellMonitorNotMeasured) {
            EXPECT_GE(rscp, -120);
            EXPECT_LE(rscp, -50);
            EXPECT_GE(ecn0, -24);
            EXPECT_LE(ecn0, 0);
          }
        }
      }
    }
  }
}

TEST(SimulatedNetworkTest, CodesAreDistinctAmongTheCellsOfOneTechnology) {
  for (std::uint64_t seed = 1; seed <= 30; ++seed) {
    SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, seed);
    std::set<int> codes;
    for (const auto& cell : network.cells()) EXPECT_TRUE(codes.insert(cell.code).second) << "seed " << seed;
  }
}

TEST(SimulatedNetworkTest, SameSeedGivesTheSameNetworkAndAnotherSeedAnother) {
  SimulatedNetwork a(kLogChannelTechnologyQuendraGSM, 9), b(kLogChannelTechnologyQuendraGSM, 9),
      c(kLogChannelTechnologyQuendraGSM, 10);
  for (int step = 0; step < 100; ++step) {
    a.step();
    b.step();
    c.step();
  }
  EXPECT_EQ(a.cellList(), b.cellList());
  EXPECT_EQ(a.simFiles(), b.simFiles());
  EXPECT_EQ(a.pdpContexts(), b.pdpContexts());
  EXPECT_NE(a.cellList(), c.cellList());
  EXPECT_NE(a.simFiles(), c.simFiles());
}

TEST(SimulatedNetworkTest, LevelsDriftAndNeighboursAreSometimesUnmeasured) {
  SimulatedNetwork network(kLogChannelTechnologyQuendraUTRAN2, 3);
  Value previous = network.cellList();
  int changedSteps = 0;
  bool unmeasuredSeen = false;
  for (int step = 0; step < 200; ++step) {
    network.step();
    const Value current = network.cellList();
    changedSteps += current != previous ? 1 : 0;
    for (const Dictionary& cell : cellsOf(network)) {
      if (integer(cell, text(cell, CellMonitorCellRadioAccessTechnology) == CellMonitorRadioAccessTechnologyGSM
                            ? CellMonitorRSSI
                            : CellMonitorRSCP) == kCellMonitorNotMeasured) {
        unmeasuredSeen = true;
        EXPECT_EQ(text(cell, CellMonitorCellType), CellMonitorCellTypeNeighbor)
            << "the serving cell is always measured";
      }
    }
    previous = current;
  }
  EXPECT_GT(changedSteps, 190);
  EXPECT_TRUE(unmeasuredSeen);
}

TEST(SimulatedNetworkTest, ServingCellChangesOverTimeAndStaysTheOnlyServingCell) {
  std::uint64_t changes = 0;
  for (std::uint64_t seed = 1; seed <= 10; ++seed) {
    SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, seed);
    for (int step = 0; step < 600; ++step) {
      network.step();
      int serving = 0;
      for (const auto& cell : network.cells()) serving += cell.serving ? 1 : 0;
      ASSERT_EQ(serving, 1);
      ASSERT_TRUE(network.servingCell().serving);
    }
    changes += network.cellChanges();
  }
  EXPECT_GT(changes, 0u);
}

TEST(SimulatedNetworkTest, SimFilesAreTheFourteenFilesAsStringsConsistentWithTheNetwork) {
  SimulatedNetwork network(kLogChannelTechnologyQuendraGSM, 12);
  const Value simFiles = network.simFiles();
  const Dictionary& files = dictionary(simFiles);
  const std::vector<std::string> keys = {
      "kSimFile_ICCID", "kSimFile_MSISDN", "kSimFile_MBDN",    "kSimFile_HPPLMN", "kSimFile_LOCI",
      "kSimFile_PSLOCI", "kSimFile_ACC",   "kSimFile_AD",      "kSimFile_FPLMN",  "kSimFile_AHPLMN",
      "kSimFile_RATMODE", "kSimFile_PNN",  "kSimFile_OPL",     "kSimFile_OPLMNAcT"};
  ASSERT_EQ(files.size(), keys.size());
  for (std::size_t i = 0; i < keys.size(); ++i) {
    EXPECT_EQ(files.entries()[i].first, keys[i]);
    EXPECT_TRUE(files.entries()[i].second.asString()) << keys[i];
  }

  // ICCID: 19 digits of the test network's issuer, with a valid Luhn check digit.
  const std::string iccid = text(files, "kSimFile_ICCID");
  ASSERT_EQ(iccid.size(), 19u);
  EXPECT_EQ(iccid.substr(0, 7), "8900101");
  int sum = 0;
  for (std::size_t i = 0; i < iccid.size(); ++i) {
    int d = iccid[iccid.size() - 1 - i] - '0';
    if (i % 2 == 1) d = d * 2 > 9 ? d * 2 - 9 : d * 2;
    sum += d;
  }
  EXPECT_EQ(sum % 10, 0) << iccid;

  // The location files hold the home PLMN 001-01 and the serving cell's LAC.
  char lac[5];
  std::snprintf(lac, sizeof lac, "%04X", network.servingCell().areaCode);
  const std::string loci = text(files, "kSimFile_LOCI");
  ASSERT_EQ(loci.size(), 22u);
  EXPECT_EQ(loci.substr(8, 10), std::string("00F110") + lac);
  EXPECT_EQ(loci.substr(18), "FF00");
  const std::string psloci = text(files, "kSimFile_PSLOCI");
  ASSERT_EQ(psloci.size(), 28u);
  EXPECT_EQ(psloci.substr(14, 10), std::string("00F110") + lac);
  EXPECT_EQ(text(files, "kSimFile_AHPLMN"), "00F110");
  // The access class is the IMSI's last digit.
  const int accessClass = network.imsi().back() - '0';
  EXPECT_EQ(std::stoi(text(files, "kSimFile_ACC"), nullptr, 16), 1 << accessClass);
  // "Test Network" in 7-bit characters, 4 spare bits in the last of 11 octets.
  EXPECT_EQ(text(files, "kSimFile_PNN").substr(0, 6), "430C84");
  EXPECT_EQ(text(files, "kSimFile_PNN").substr(6, 22), "D4F29C0E7296E9F7B77C0D");
  EXPECT_EQ(text(files, "kSimFile_MSISDN").substr(0, 2), "+1");
}

TEST(SimulatedNetworkTest, PdpContextsChangeRarelyAndHoldOnlyStrings) {
  SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, 4);
  const Value initialContexts = network.pdpContexts();
  const Array& initial = *initialContexts.asArray();
  ASSERT_EQ(initial.size(), 1u);
  EXPECT_EQ(text(dictionary(initial.at(0)), "APN"), "internet");
  std::uint64_t generation = network.pdpGeneration();
  int changes = 0;
  bool imsSeen = false;
  for (int step = 0; step < 600; ++step) {
    network.step();
    if (network.pdpGeneration() != generation) {
      generation = network.pdpGeneration();
      ++changes;
    }
    const Value contexts = network.pdpContexts();
    for (const Value& context : contexts.asArray()->elements()) {
      for (const auto& [key, value] : dictionary(context).entries()) EXPECT_TRUE(value.asString()) << key;
      imsSeen = imsSeen || text(dictionary(context), "APN") == "ims";
    }
  }
  EXPECT_GT(changes, 0);
  EXPECT_LT(changes, 60);
  EXPECT_TRUE(imsSeen);
}

TEST(SimulatedNetworkTest, LteMeasurementsStayRealisticOnHalfDbStepsAndFollowTheLevel) {
  auto onHalfDbSteps = [](double value) { return value * 2 == std::floor(value * 2); };
  for (std::uint64_t seed = 1; seed <= 20; ++seed) {
    SCOPED_TRACE(seed);
    SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, seed);
    for (int step = 0; step <= 120; ++step) {
      if (step > 0) network.step();
      for (const auto& cell : network.cells()) {
        EXPECT_EQ(cell.uplinkChannel, cell.channel + 18000);
        EXPECT_EQ(cell.resourceBlocks, cell.band == 20 ? 50 : 100);
        for (double rsrp : {cell.rsrp, cell.averageRsrp}) {
          EXPECT_GE(rsrp, -125);
          EXPECT_LE(rsrp, -70);
          EXPECT_TRUE(onHalfDbSteps(rsrp)) << rsrp;
        }
        for (double rsrq : {cell.rsrq, cell.averageRsrq}) {
          EXPECT_GE(rsrq, -20);
          EXPECT_LE(rsrq, -3);
          EXPECT_TRUE(onHalfDbSteps(rsrq)) << rsrq;
        }
        // RSRP lies below RSSI by the spread over the carrier's resource
        // elements, give or take a dB, unless held at the edge of its range.
        const double below = cell.resourceBlocks == 100 ? 28 : 25;
        if (cell.rsrp > -125 && cell.rsrp < -70) {
          EXPECT_LE(std::abs(cell.level - below - cell.rsrp), 1.0) << cell.level << " " << cell.rsrp;
        }
      }
    }
  }
}

TEST(SimulatedNetworkTest, LteRsrpAndRsrqDriftFromStepToStep) {
  SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, 3);
  std::set<double> rsrps, rsrqs;
  for (int step = 0; step < 60; ++step) {
    network.step();
    rsrps.insert(network.servingCell().rsrp);
    rsrqs.insert(network.servingCell().rsrq);
  }
  EXPECT_GT(rsrps.size(), 10u);
  EXPECT_GT(rsrqs.size(), 5u);
}

TEST(SimulatedNetworkTest, OnlyTheLteNetworkNamesAUtranAndAGeranCellForReselection) {
  for (std::uint64_t seed = 1; seed <= 10; ++seed) {
    SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, seed);
    const auto& neighbours = network.interRatNeighbours();
    ASSERT_EQ(neighbours.size(), 2u);
    EXPECT_EQ(neighbours[0].access, Access::UMTS);
    EXPECT_GE(neighbours[0].channel, 10562);
    EXPECT_LE(neighbours[0].channel, 10838);
    EXPECT_LE(neighbours[0].code, 511);
    EXPECT_EQ(neighbours[0].band, 1);
    EXPECT_EQ(neighbours[1].access, Access::GSM);
    EXPECT_GE(neighbours[1].channel, 512);
    EXPECT_LE(neighbours[1].channel, 885);
    EXPECT_LE(neighbours[1].code, 63);
    EXPECT_EQ(neighbours[1].band, 0);
    // Not measured on LTE, so not in the cell list.
    for (const Dictionary& cell : cellsOf(network)) {
      EXPECT_EQ(text(cell, CellMonitorCellRadioAccessTechnology), CellMonitorRadioAccessTechnologyLTE);
    }
  }
  for (auto technology : {kLogChannelTechnologyQuendraGSM, kLogChannelTechnologyQuendraUTRAN2}) {
    SimulatedNetwork network(technology, 1);
    EXPECT_TRUE(network.interRatNeighbours().empty()) << technology;
    for (const auto& cell : network.cells()) {
      EXPECT_EQ(cell.resourceBlocks, 0) << technology;
      EXPECT_EQ(cell.rsrp, 0) << technology;
    }
  }
}

// --- LTE cells that the cell search finds beside the planned ones ---

// One found cell's life as the network showed it step by step.
struct FoundLife {
  int code = 0;
  int cellId = 0;
  int channel = 0;
  int servingChannelWhenFound = 0;
  int foundAt = 0;           // step
  std::string measured;      // per step: 'D' only detected, 'M' measured
  std::optional<int> goneAt; // step
  int firstDetectedSteps() const {
    const auto end = measured.find('M');
    return static_cast<int>(end == std::string::npos ? measured.size() : end);
  }
  bool wasMeasured() const { return measured.find('M') != std::string::npos; }
};

// The planned cells of an LTE network: those there from the start, by PCI and cell identity.
std::set<std::pair<int, int>> plannedLteCells(std::uint64_t seed) {
  const SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, seed);
  std::set<std::pair<int, int>> planned;
  for (const auto& cell : network.cells()) planned.insert({cell.code, cell.cellId});
  return planned;
}

// Steps an LTE network and follows every cell that was not there at the start.
// `each` sees the network after every step.
template <typename Each>
std::vector<FoundLife> followFoundCells(std::uint64_t seed, int steps, Each each) {
  SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, seed);
  const auto planned = plannedLteCells(seed);
  std::vector<FoundLife> lives;
  std::map<std::pair<int, int>, std::size_t> present;  // a found cell and its life
  for (int step = 1; step <= steps; ++step) {
    const int servingChannel = network.servingCell().channel;  // the carrier searched in this step
    network.step();
    std::map<std::pair<int, int>, std::size_t> now;
    for (const auto& cell : network.cells()) {
      const std::pair<int, int> key{cell.code, cell.cellId};
      if (planned.count(key)) continue;
      auto it = present.find(key);
      if (it == present.end()) {
        lives.push_back({cell.code, cell.cellId, cell.channel, servingChannel, step, "", {}});
        it = present.emplace(key, lives.size() - 1).first;
      }
      lives[it->second].measured += cell.measured ? 'M' : 'D';
      now.insert(*it);
    }
    for (const auto& [key, life] : present) {
      if (!now.count(key)) lives[life].goneAt = step;
    }
    present = std::move(now);
    each(network, step);
  }
  return lives;
}

TEST(SimulatedNetworkTest, LteCellSearchFindsCellsOnTheServingCarrierThatStayDetectedAWhileThenAreMeasuredOrLost) {
  for (std::uint64_t seed = 1; seed <= 12; ++seed) {
    SCOPED_TRACE(seed);
    constexpr int kSteps = 600;
    std::vector<int> detectedCounts;  // found cells only detected, on the serving carrier, per step
    const auto planned = plannedLteCells(seed);
    const auto lives = followFoundCells(seed, kSteps, [&](const SimulatedNetwork& network, int) {
      int detected = 0;
      for (const auto& cell : network.cells()) {
        if (!planned.count({cell.code, cell.cellId}) && !cell.measured &&
            cell.channel == network.servingCell().channel) {
          ++detected;
        }
      }
      detectedCounts.push_back(detected);
    });

    ASSERT_FALSE(lives.empty());
    EXPECT_LE(lives.front().foundAt, 60) << "a cell is found in the first minute";
    int measured = 0, lost = 0;
    for (const FoundLife& life : lives) {
      SCOPED_TRACE("PCI " + std::to_string(life.code) + " found at " + std::to_string(life.foundAt));
      EXPECT_EQ(life.channel, life.servingChannelWhenFound) << "found on the serving carrier";
      EXPECT_EQ(life.measured.front(), 'D') << "detected before it is measured";
      if (!life.goneAt && !life.wasMeasured()) continue;  // still only detected at the end
      // Detected for a few seconds to some tens of seconds.
      EXPECT_GE(life.firstDetectedSteps(), 3);
      EXPECT_LE(life.firstDetectedSteps(), 40);
      if (life.wasMeasured()) {
        ++measured;
        if (life.goneAt) {
          EXPECT_GE(*life.goneAt - life.foundAt, life.firstDetectedSteps() + 15) << "measured a while";
        }
      } else {
        ++lost;
      }
    }
    EXPECT_GE(measured, 3);
    EXPECT_GE(lost, 3);

    // Found cells come and go again and again: the number only detected changes
    // often, and after the first no minute passes without one.
    int changes = 0;
    for (std::size_t i = 1; i < detectedCounts.size(); ++i) changes += detectedCounts[i] != detectedCounts[i - 1];
    EXPECT_GE(changes, 20);
    int quiet = 0, longestQuiet = 0;
    for (std::size_t i = static_cast<std::size_t>(lives.front().foundAt); i < detectedCounts.size(); ++i) {
      quiet = detectedCounts[i] > 0 ? 0 : quiet + 1;
      longestQuiet = std::max(longestQuiet, quiet);
    }
    EXPECT_LT(longestQuiet, 60);
    EXPECT_GT(std::count_if(detectedCounts.begin(), detectedCounts.end(), [](int n) { return n > 0; }), kSteps / 2);
  }
}

TEST(SimulatedNetworkTest, EveryLteCellHasAPhysicalCellIdOfItsOwnOnItsCarrierAsCellsComeAndGo) {
  for (std::uint64_t seed = 1; seed <= 12; ++seed) {
    SCOPED_TRACE(seed);
    std::size_t mostCells = 0;
    followFoundCells(seed, 600, [&](const SimulatedNetwork& network, int step) {
      std::set<std::pair<int, int>> codes;  // channel, PCI
      for (const auto& cell : network.cells()) {
        EXPECT_TRUE(codes.insert({cell.channel, cell.code}).second)
            << "PCI " << cell.code << " twice on E-ARFCN " << cell.channel << " at step " << step;
        EXPECT_GE(cell.code, 0);
        EXPECT_LE(cell.code, 503);
      }
      mostCells = std::max(mostCells, network.cells().size());
    });
    EXPECT_GT(mostCells, 6u) << "cells were found";
  }
}

TEST(SimulatedNetworkTest, FoundLteCellsAreWeakerThanTheServingCellAndNeverTakeOver) {
  for (std::uint64_t seed = 1; seed <= 12; ++seed) {
    SCOPED_TRACE(seed);
    const auto planned = plannedLteCells(seed);
    std::set<std::pair<int, int>> measuredBefore;  // found cells measured at some step so far
    int seen = 0;
    followFoundCells(seed, 900, [&](const SimulatedNetwork& network, int step) {
      const auto& serving = network.servingCell();
      EXPECT_TRUE(planned.count({serving.code, serving.cellId})) << "step " << step;
      for (const auto& cell : network.cells()) {
        const std::pair<int, int> key{cell.code, cell.cellId};
        if (planned.count(key)) continue;
        SCOPED_TRACE("PCI " + std::to_string(cell.code) + " at step " + std::to_string(step));
        ++seen;
        EXPECT_FALSE(cell.serving);
        EXPECT_EQ(cell.access, Access::LTE);
        EXPECT_LE(cell.level, serving.level);
        EXPECT_GE(cell.level, -100);
        EXPECT_EQ(cell.level % 2, 0);
        EXPECT_TRUE((cell.band == 3 && cell.channel >= 1200 && cell.channel <= 1949) ||
                    (cell.band == 7 && cell.channel >= 2750 && cell.channel <= 3449) ||
                    (cell.band == 20 && cell.channel >= 6150 && cell.channel <= 6449))
            << cell.band << " " << cell.channel;
        EXPECT_EQ(cell.uplinkChannel, cell.channel + 18000);
        EXPECT_EQ(cell.resourceBlocks, cell.band == 20 ? 50 : 100);
        EXPECT_LE(cell.cellId, 0xFFFFFFF);
        for (double rsrp : {cell.rsrp, cell.averageRsrp}) {
          EXPECT_GE(rsrp, -125);
          EXPECT_LE(rsrp, -70);
        }
        for (double rsrq : {cell.rsrq, cell.averageRsrq}) {
          EXPECT_GE(rsrq, -20);
          EXPECT_LE(rsrq, -3);
        }
        if (cell.measured && measuredBefore.insert(key).second) {
          // Measured for the first time: the filter starts with this measurement.
          EXPECT_EQ(cell.averageRsrp, cell.rsrp);
          EXPECT_EQ(cell.averageRsrq, cell.rsrq);
        }
      }
    });
    EXPECT_GT(seen, 0);
    EXPECT_FALSE(measuredBefore.empty());
  }
}

TEST(SimulatedNetworkTest, TheCellListHoldsFoundLteCellsAsItHoldsEveryNeighbourUnmeasuredWhileOnlyDetected) {
  const auto planned = plannedLteCells(7);
  int detectedListed = 0;
  followFoundCells(7, 300, [&](const SimulatedNetwork& network, int) {
    const auto listed = cellsOf(network);
    ASSERT_EQ(listed.size(), network.cells().size());
    for (const auto& cell : network.cells()) {
      if (planned.count({cell.code, cell.cellId})) continue;
      const auto entry = std::find_if(listed.begin(), listed.end(), [&](const Dictionary& d) {
        return integer(d, CellMonitorPID) == cell.code && integer(d, CellMonitorCellId) == cell.cellId;
      });
      ASSERT_NE(entry, listed.end()) << "PCI " << cell.code;
      expectCellKeys(*entry);
      EXPECT_EQ(text(*entry, CellMonitorCellType), CellMonitorCellTypeNeighbor);
      EXPECT_EQ(integer(*entry, CellMonitorUARFCN), cell.channel);
      EXPECT_EQ(integer(*entry, CellMonitorRSSI), cell.measured ? cell.level / 2 : kCellMonitorNotMeasured);
      detectedListed += cell.measured ? 0 : 1;
    }
  });
  EXPECT_GT(detectedListed, 0);
}

TEST(SimulatedNetworkTest, SameSeedFindsTheSameLteCellsAndAnotherSeedOthers) {
  auto story = [](std::uint64_t seed) {
    std::string text;
    const auto lives = followFoundCells(seed, 600, [&](const SimulatedNetwork& network, int step) {
      for (const auto& cell : network.cells()) {
        text += std::to_string(step) + ":" + std::to_string(cell.code) + "/" + std::to_string(cell.level) + "/" +
                std::to_string(cell.rsrp) + (cell.measured ? "M " : "D ");
      }
      text += "\n";
    });
    for (const FoundLife& life : lives) {
      text += std::to_string(life.code) + " " + std::to_string(life.foundAt) + " " + life.measured + " " +
              (life.goneAt ? std::to_string(*life.goneAt) : "-") + "\n";
    }
    return std::pair{lives.size(), text};
  };
  for (std::uint64_t seed : {1u, 2u, 3u}) {
    const auto a = story(seed);
    EXPECT_GT(a.first, 10u);
    EXPECT_EQ(a.second, story(seed).second) << "seed " << seed;
    EXPECT_NE(a.second, story(seed + 10).second) << "seed " << seed;
  }
}

TEST(SimulatedNetworkTest, TechnologiesWithoutLogCodeCellsAreRefused) {
  EXPECT_THROW(SimulatedNetwork(kLogChannelTechnologyIFX, 1), std::invalid_argument);
}

}  // namespace
}  // namespace corvane::telephonyd
