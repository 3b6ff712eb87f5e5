#include "telephonyd/SimulatedNetwork.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <set>
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

TEST(SimulatedNetworkTest, TechnologiesWithoutLogCodeCellsAreRefused) {
  EXPECT_THROW(SimulatedNetwork(kLogChannelTechnologyIFX, 1), std::invalid_argument);
  EXPECT_THROW(SimulatedNetwork(kLogChannelTechnologyQuendraCDMA, 1), std::invalid_argument);
}

}  // namespace
}  // namespace corvane::telephonyd
