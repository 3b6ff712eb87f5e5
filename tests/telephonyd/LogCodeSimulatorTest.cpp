#include "telephonyd/LogCodeSimulator.h"

#include <gtest/gtest.h>

#include <stdexcept>

#include "platform/LogChannelTechnology.h"
#include "platform/PropertyList.h"
#include "telephonyd/LogRecord.h"

namespace corvane::telephonyd {
namespace {

constexpr std::uint64_t kStart = 1'800'000'000'000'000;  // microseconds: 2027-01-15 08:00 UTC

struct Record {
  std::uint8_t type = 0;
  std::uint32_t length = 0;
  std::uint32_t code = 0;
  std::uint64_t timestamp = 0;
  Bytes payload;
};

Record recordOf(const Bytes& packet) {
  if (packet.size() < 13) throw std::runtime_error("packet shorter than its header");
  Record r;
  r.type = packet[0];
  r.length = packet[1] | packet[2] << 8;
  r.code = packet[3] | packet[4] << 8;
  for (int i = 7; i >= 0; --i) r.timestamp = r.timestamp << 8 | packet[static_cast<std::size_t>(5 + i)];
  r.payload.assign(packet.begin() + 13, packet.end());
  return r;
}

// Microseconds from the scenario's start to a record's timestamp.
std::uint64_t sinceStart(const Record& record) {
  return static_cast<std::uint64_t>(
      (basebandMoment(record.timestamp) - BasebandMoment(std::chrono::microseconds(kStart))).count());
}

std::vector<SourcePacket> firstPackets(std::string_view technology, std::uint64_t seed, std::size_t count) {
  auto scenario = makeLogCodeScenario(technology, seed, kStart);
  std::vector<SourcePacket> packets;
  for (std::size_t i = 0; i < count; ++i) packets.push_back(scenario->nextPacket());
  return packets;
}

std::vector<Bytes> bytesOf(const std::vector<SourcePacket>& packets) {
  std::vector<Bytes> out;
  for (const auto& p : packets) out.push_back(*p.data);
  return out;
}

TEST(LogCodeSimulatorTest, PeriodZeroReportsSimFilesCellListAndPdpContextsAtTheClockStart) {
  auto scenario = makeLogCodeScenario(kLogChannelTechnologyQuendraLTE, 2, kStart);
  ASSERT_TRUE(scenario);
  EXPECT_EQ(scenario->technology(), "Quendra_LTE");
  // The payloads as the network reports them before its first step.
  SimulatedNetwork network(kLogChannelTechnologyQuendraLTE, 2);
  const std::vector<std::pair<std::uint32_t, Value>> expected = {
      {0, network.simFiles()}, {1, network.cellList()}, {2, network.pdpContexts()}};
  for (const auto& [n, value] : expected) {
    const SourcePacket packet = scenario->nextPacket();
    EXPECT_EQ(packet.code, kExtraCodeBase + n);
    EXPECT_EQ(*packet.data, encodeExtraCodePacket(static_cast<std::uint16_t>(n),
                                                  basebandTimestamp(BasebandMoment(std::chrono::microseconds(kStart))),
                                                  value));
  }
}

TEST(LogCodeSimulatorTest, EveryPacketIsAWellFramedExtraCodeRecordWithItsCode) {
  // Quendra_UTRAN2's extra codes, among its radio records.
  for (const SourcePacket& packet : firstPackets(kLogChannelTechnologyQuendraUTRAN2, 8, 1500)) {
    if (*packet.code < kExtraCodeBase) continue;
    const Record record = recordOf(*packet.data);
    EXPECT_EQ(record.type, kLogTypeExtraCode);
    EXPECT_EQ(record.length, packet.data->size() - 1);
    ASSERT_TRUE(packet.code);
    EXPECT_EQ(*packet.code, kExtraCodeBase + record.code);
    const auto payload = plist::parse(record.payload);
    ASSERT_TRUE(payload);
    EXPECT_TRUE(plist::isBinary(record.payload));
    EXPECT_EQ(payload->isDictionary(), record.code == 0) << record.code;
    EXPECT_EQ(payload->isArray(), record.code != 0) << record.code;
  }
}

TEST(LogCodeSimulatorTest, TimestampsAreTheBasebandsAndFollowTheSchedule) {
  std::vector<std::uint64_t> cellLists, simFiles, pdpContexts;
  std::vector<Record> records;
  for (const SourcePacket& packet : firstPackets(kLogChannelTechnologyQuendraUTRAN2, 1, 1200)) {
    if (*packet.code < kExtraCodeBase) continue;
    records.push_back(recordOf(*packet.data));
    if (records.size() > 1) {
      EXPECT_GE(records.back().timestamp, records[records.size() - 2].timestamp);
    }
  }
  // The packets of whole periods: the last period may have more to come.
  for (const Record& record : records) {
    if (record.timestamp == records.back().timestamp) break;
    // Whole 1.25 ms ticks: every period starts on one.
    EXPECT_EQ(record.timestamp & 0xFFFF, 0u);
    const std::uint64_t at = sinceStart(record);
    (record.code == 0 ? simFiles : record.code == 1 ? cellLists : pdpContexts).push_back(at);
  }
  ASSERT_GE(cellLists.size(), 100u);
  for (std::size_t i = 0; i < cellLists.size(); ++i) EXPECT_EQ(cellLists[i], i * 1'000'000);
  for (std::size_t i = 0; i < simFiles.size(); ++i) EXPECT_EQ(simFiles[i], i * 10'000'000);
  // Every 5 s, and in between when the contexts change.
  std::size_t regular = 0;
  for (std::uint64_t at : pdpContexts) {
    EXPECT_EQ(at % 1'000'000, 0u);
    regular += at % 5'000'000 == 0 ? 1 : 0;
  }
  EXPECT_EQ(regular, cellLists.size() / 5 + (cellLists.size() % 5 ? 1 : 0));
}

TEST(LogCodeSimulatorTest, PdpContextsAreReportedAsSoonAsTheyChange) {
  auto scenario = makeLogCodeScenario(kLogChannelTechnologyQuendraLTE, 4, kStart);
  std::uint64_t reported = 0;
  std::uint64_t atPreviousCellList = 0;
  int outOfTurn = 0;
  for (int i = 0; i < 2000; ++i) {
    const SourcePacket packet = scenario->nextPacket();
    const Record record = recordOf(*packet.data);
    const std::uint64_t generation = scenario->network().pdpGeneration();
    if (record.code == 2) {
      EXPECT_EQ(plist::parseOrThrow(record.payload), scenario->network().pdpContexts()) << "packet " << i;
      reported = generation;
      outOfTurn += sinceStart(record) % 5'000'000 != 0 ? 1 : 0;
    }
    if (record.code == 1) {
      // A change is reported in the period of the measurement step that made it.
      EXPECT_EQ(reported, atPreviousCellList) << "packet " << i;
      atPreviousCellList = generation;
    }
  }
  EXPECT_GT(outOfTurn, 0);
}

TEST(LogCodeSimulatorTest, SameSeedAndStartGiveTheSameBytesAndAnotherSeedOthers) {
  EXPECT_EQ(bytesOf(firstPackets(kLogChannelTechnologyQuendraLTE, 42, 100)),
            bytesOf(firstPackets(kLogChannelTechnologyQuendraLTE, 42, 100)));
  EXPECT_NE(bytesOf(firstPackets(kLogChannelTechnologyQuendraLTE, 42, 3)),
            bytesOf(firstPackets(kLogChannelTechnologyQuendraLTE, 43, 3)));
}

TEST(LogCodeSimulatorTest, CellListsDriftFromOneReportToTheNext) {
  std::vector<Bytes> payloads;
  for (const SourcePacket& packet : firstPackets(kLogChannelTechnologyQuendraUTRAN2, 6, 600)) {
    if (*packet.code == kExtraCodeBase + 1) payloads.push_back(recordOf(*packet.data).payload);
  }
  ASSERT_GT(payloads.size(), 50u);
  std::size_t changes = 0;
  for (std::size_t i = 1; i < payloads.size(); ++i) changes += payloads[i] != payloads[i - 1] ? 1 : 0;
  EXPECT_GT(changes, payloads.size() - 5);
}

// An encoder of the kind that each technology's radio log codes will have.
class EveryOtherPeriodEncoder final : public LogCodeSimulator::Encoder {
 public:
  void encode(const SimulatedNetwork&, std::uint64_t period, std::uint64_t timestamp,
              std::vector<SourcePacket>& out) override {
    if (period % 2 != 0) return;
    const Bytes payload{static_cast<std::uint8_t>(period)};
    out.push_back({std::make_shared<const Bytes>(encodeLogPacket(0xB0C2, timestamp, payload)), 0xB0C2});
  }
};

TEST(LogCodeSimulatorTest, FurtherEncodersJoinTheScheduleInPeriodOrder) {
  // Without the LTE scenario's radio encoder, so that the test encoder's are the only log codes.
  LogCodeSimulator scenario(kLogChannelTechnologyQuendraLTE, 1, kStart);
  scenario.addEncoder(std::make_unique<ExtraCodeEncoder>());
  scenario.addEncoder(std::make_unique<EveryOtherPeriodEncoder>());
  std::vector<std::uint32_t> codes;
  std::vector<std::uint64_t> times;
  for (int i = 0; i < 6; ++i) {
    const SourcePacket packet = scenario.nextPacket();
    codes.push_back(*packet.code);
    times.push_back(sinceStart(recordOf(*packet.data)));
  }
  EXPECT_EQ(codes, (std::vector<std::uint32_t>{0xFF0000, 0xFF0001, 0xFF0002, 0xB0C2, 0xB0C2, 0xB0C2}));
  EXPECT_EQ(times, (std::vector<std::uint64_t>{0, 0, 0, 0, 80'000, 160'000}));
}

TEST(LogCodeSimulatorTest, OnlyLogCodeTechnologiesHaveAScenario) {
  EXPECT_FALSE(makeLogCodeScenario(kLogChannelTechnologyIFX, 1, kStart));
  for (auto technology : {kLogChannelTechnologyQuendraGSM, kLogChannelTechnologyQuendraLTE,
                          kLogChannelTechnologyQuendraUTRAN2, kLogChannelTechnologyQuendraCDMA}) {
    auto scenario = makeLogCodeScenario(technology, 1, kStart);
    ASSERT_TRUE(scenario) << technology;
    EXPECT_EQ(scenario->technology(), technology);
  }
}

TEST(LogCodeSimulatorTest, ScenarioWithoutEncodersRefusesInsteadOfSpinning) {
  LogCodeSimulator bare(kLogChannelTechnologyQuendraGSM, 1, kStart);
  EXPECT_THROW(bare.nextPacket(), std::logic_error);
}

// What a channel's start command lets through, on a real scenario.
std::vector<std::uint32_t> streamedCodes(std::string_view technology, const Dictionary& command, int produced) {
  auto scenario = makeLogCodeScenario(technology, 11, kStart);
  const PacketFilter filter = PacketFilter::fromStartCommand(command);
  std::vector<std::uint32_t> codes;
  for (int i = 0; i < produced; ++i) {
    const SourcePacket packet = scenario->nextPacket();
    if (filter.accepts(packet)) codes.push_back(*packet.code);
  }
  return codes;
}

Value integers(std::initializer_list<std::int64_t> list) {
  Array array;
  for (auto n : list) array.append(Value::integer(n));
  return Value(array);
}

TEST(LogCodeSimulatorTest, StartCommandForExtraCodeOneStreamsOnlyCellLists) {
  Dictionary command;
  command.set("SetState", Value("Streaming"));
  command.set("SetQuendraLogCodes", integers({}));
  command.set("SetTsExtraCodes", integers({1}));
  // About 320 simulated seconds of the LTE scenario, radio records included.
  const auto codes = streamedCodes(kLogChannelTechnologyQuendraLTE, command, 3000);
  EXPECT_GT(codes.size(), 200u);
  for (std::uint32_t code : codes) EXPECT_EQ(code, 0xFF0001u);
}

TEST(LogCodeSimulatorTest, StartCommandWithOtherTechnologiesCodesStreamsNothingOfThem) {
  // A GSM/UMTS and a CDMA start command's log codes, asked of the LTE scenario.
  Dictionary command;
  command.set("SetState", Value("Streaming"));
  command.set("SetQuendraLogCodes", integers({0x5134, 0x5137, 0x4005, 0x417A, 0x1019, 0x108A}));
  command.set("SetTsExtraCodes", integers({}));
  EXPECT_TRUE(streamedCodes(kLogChannelTechnologyQuendraLTE, command, 300).empty());
  // With the SIM files asked for too, only they come.
  command.set("SetTsExtraCodes", integers({0}));
  const auto codes = streamedCodes(kLogChannelTechnologyQuendraLTE, command, 300);
  ASSERT_FALSE(codes.empty());
  for (std::uint32_t code : codes) EXPECT_EQ(code, 0xFF0000u);
}

}  // namespace
}  // namespace corvane::telephonyd
