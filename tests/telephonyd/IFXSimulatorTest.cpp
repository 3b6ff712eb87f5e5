#include "telephonyd/IFXSimulator.h"

#include <gtest/gtest.h>

#include <set>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "platform/PropertyList.h"

namespace corvane::telephonyd {
namespace {

using namespace std::chrono_literals;

std::vector<Bytes> firstPackets(std::uint64_t seed, std::size_t count, std::chrono::nanoseconds interval = 500ms) {
  IFXSimulator simulator(seed, interval);
  std::vector<Bytes> packets;
  for (std::size_t i = 0; i < count; ++i) packets.push_back(*simulator.nextPacket().data);
  return packets;
}

bool onlyContainersAndStrings(const Value& value) {
  if (value.isString()) return true;
  if (const Dictionary* d = value.asDictionary()) {
    for (const auto& [key, child] : d->entries()) {
      if (!onlyContainersAndStrings(child)) return false;
    }
    return true;
  }
  if (const Array* a = value.asArray()) {
    for (const auto& child : a->elements()) {
      if (!onlyContainersAndStrings(child)) return false;
    }
    return true;
  }
  return false;
}

TEST(IFXSimulatorTest, SameSeedGivesTheSamePackets) {
  EXPECT_EQ(firstPackets(42, 200), firstPackets(42, 200));
}

TEST(IFXSimulatorTest, DifferentSeedsGiveDifferentScenarios) {
  EXPECT_NE(firstPackets(1, 1), firstPackets(2, 1));
}

TEST(IFXSimulatorTest, ValuesWalkFromOneMeasurementPeriodToTheNext) {
  const auto packets = firstPackets(7, 40);
  std::size_t changes = 0;
  for (std::size_t i = 1; i < packets.size(); ++i) changes += packets[i] != packets[i - 1] ? 1 : 0;
  // Every packet of a 500 ms interval falls in a new 480 ms period.
  EXPECT_EQ(changes, packets.size() - 1);
}

TEST(IFXSimulatorTest, PacketsWithinOneMeasurementPeriodShareTheirBytes) {
  IFXSimulator simulator(3, 1ms);
  const auto first = simulator.nextPacket().data;
  const auto second = simulator.nextPacket().data;
  EXPECT_EQ(first.get(), second.get());
  for (int i = 2; i < 480; ++i) EXPECT_EQ(simulator.nextPacket().data.get(), first.get());
  EXPECT_EQ(simulator.measurementPeriod(), 0u);
  EXPECT_NE(simulator.nextPacket().data.get(), first.get());  // packet 480, at 480 ms: the next period
  EXPECT_EQ(simulator.measurementPeriod(), 1u);
}

TEST(IFXSimulatorTest, PacketsAreBinaryPropertyListsOfContainersAndStringsOnly) {
  IFXSimulator simulator(11, 480ms);
  for (int i = 0; i < 300; ++i) {
    const SourcePacket packet = simulator.nextPacket();
    EXPECT_FALSE(packet.code);
    ASSERT_TRUE(plist::isBinary(*packet.data));
    const auto value = plist::parse(*packet.data);
    ASSERT_TRUE(value);
    ASSERT_TRUE(onlyContainersAndStrings(*value));
  }
}

TEST(IFXSimulatorTest, TheIFXDecoderShowsTheServingCellAndSixNeighbours) {
  IFXSimulator simulator(5, 500ms);
  GSMLogGenerator generator;
  Dictionary state;
  for (int i = 0; i < 50; ++i) generator.updateState(state, *simulator.nextPacket().data);
  const Value display = generator.generateLogUsingState(state);
  const Dictionary* root = display.asDictionary();
  ASSERT_TRUE(root);
  const Value* serving = root->find("Serving Cell");
  ASSERT_TRUE(serving && serving->asDictionary());
  for (const char* key : {"LAC", "Cell ID", "ARFCN", "BSIC", "RxLev", "RxQual", "Timing Advance", "Band"}) {
    EXPECT_TRUE(serving->asDictionary()->contains(key)) << key;
  }
  const Value* neighbours = root->find("Neighbour Cells");
  ASSERT_TRUE(neighbours && neighbours->asArray());
  // The title element is left out by the decoder.
  EXPECT_EQ(neighbours->asArray()->size(), IFXSimulator::kNeighbourCount);
  const Value* network = root->find("Network");
  ASSERT_TRUE(network && network->asDictionary());
  EXPECT_EQ(network->asDictionary()->get("MCC"), Value("001"));
  EXPECT_EQ(network->asDictionary()->get("MNC"), Value("01"));
}

TEST(IFXSimulatorTest, NeighbourChannelsDifferFromTheServingChannelAndEachOther) {
  IFXSimulator simulator(9, 480ms);
  for (int i = 0; i < 500; ++i) simulator.nextPacket();
  const Value report = simulator.report();
  std::set<std::string> channels;
  channels.insert(*report.asDictionary()->find("Serving Cell")->asDictionary()->find("ARFCN")->asString());
  const Array neighbours = *report.asDictionary()->find("Neighbour Cells")->asArray();
  EXPECT_EQ(neighbours.at(0), Value("Neighbour Cells"));
  for (std::size_t i = 1; i < neighbours.size(); ++i) {
    channels.insert(*neighbours.at(i).asDictionary()->find("ARFCN")->asString());
  }
  EXPECT_EQ(channels.size(), IFXSimulator::kNeighbourCount + 1);
}

}  // namespace
}  // namespace corvane::telephonyd
