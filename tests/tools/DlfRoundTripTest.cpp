// A DLF written by the application itself (the save contents of a log-code
// generator) read back by corvane-decode gives the display that the packets it
// came from give.

#include <gtest/gtest.h>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/logcode/QNDLogGenerator.h"
#include "PacketInput.h"
#include "platform/Log.h"
#include "platform/PropertyList.h"
#include "support/Packets.h"
#include "support/Process.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::binaryBytes;
using test::D;
using test::extraCodePacket;
using test::logPacket;
using test::put16;
using test::put32;
using test::S;

// An LTE session, laid out by hand: SIM files, PDP contexts, the serving cell's
// identity, its measurements and a neighbour report.
std::vector<Bytes> lteSession() {
  std::vector<Bytes> packets;
  packets.push_back(extraCodePacket(0, binaryBytes(D({{"kSimFile_ICCID", S("8949000000000000017")},
                                                      {"kSimFile_MSISDN", S("+15550100")}}))));
  packets.push_back(extraCodePacket(2, binaryBytes(A({D({{"APN", S("internet")}})}))));
  Bytes identity = logPacket(0xB0C2, 38);
  put16(identity, 14, 301);     // physical cell id
  put16(identity, 16, 1300);    // downlink channel
  put16(identity, 18, 19300);   // uplink channel
  identity[20] = 100;           // 20 MHz
  identity[21] = 50;            // 10 MHz
  put32(identity, 22, 0x01A2B3C);
  put16(identity, 26, 4660);
  put32(identity, 28, 3);
  packets.push_back(identity);
  for (int i = 0; i < 3; ++i) {
    Bytes serving = logPacket(0xB17F, 33);
    serving[13] = 4;
    put16(serving, 17, 1300);
    put16(serving, 19, 301);
    put32(serving, 21, static_cast<std::uint32_t>(200 + i) | (210u << 9) | (40u << 18) | (41u << 25));
    packets.push_back(serving);
  }
  Bytes neighbours = logPacket(0xB180, 21 + 2 * 20);
  neighbours[13] = 2;
  put16(neighbours, 17, 1300);
  put16(neighbours, 19, static_cast<std::uint16_t>(1u << 6));  // two neighbours
  put32(neighbours, 21, 302 | (150u << 9) | (180u << 17));
  put32(neighbours, 41, 303 | (140u << 9) | (170u << 17));
  packets.push_back(neighbours);
  packets.push_back(extraCodePacket(1, binaryBytes(A({}))));
  return packets;
}

Value displayOf(const std::vector<Bytes>& packets) {
  auto generator = LogGenerator::generatorFromTechnology("Quendra_LTE");
  Dictionary state;
  for (const Bytes& p : packets) generator->updateState(state, p);
  return generator->generateLogUsingState(state).deepCopy();
}

// The DLF that saving writes after the packets arrived over three display updates.
Bytes applicationDlf(const std::vector<Bytes>& packets) {
  auto generator = LogGenerator::generatorFromTechnology("Quendra_LTE");
  Dictionary state;
  const std::size_t cuts[] = {2, 5, packets.size()};
  std::size_t next = 0;
  for (std::size_t cut : cuts) {
    for (; next < cut; ++next) generator->updateState(state, packets[next]);
    generator->generateLogUsingState(state);
  }
  const Value contents = generator->getSaveContentsFromState(state);
  const Array& entries = *contents.asArray();
  return *entries.at(entries.size() - 1).asDictionary()->find("DLF")->asData();
}

TEST(DlfRoundTrip, TheApplicationsDlfGivesBackEveryPacketAndTheSameDisplay) {
  log::ScopedCapture quiet;
  const std::vector<Bytes> packets = lteSession();
  const Bytes dlf = applicationDlf(packets);
  EXPECT_EQ(dlf.size(), 161 + [&] {
    std::size_t n = 0;
    for (const Bytes& p : packets) n += p.size();
    return n - 3;  // one type byte dropped per display interval
  }());

  ASSERT_EQ(tools::detectInputFormat(dlf), tools::InputFormat::Dlf);
  tools::InputError error;
  auto read = tools::packetsFromContents(dlf, "saved.dlf", error);
  ASSERT_TRUE(read) << error.message;
  EXPECT_TRUE(read->warnings.empty());
  EXPECT_EQ(read->packets, packets);

  const Value original = displayOf(packets);
  ASSERT_TRUE(original.isDictionary());
  EXPECT_EQ(displayOf(read->packets), original);
}

TEST(DlfRoundTrip, TheDecodeToolPrintsTheSameTreeForTheDlfAsForThePackets) {
  log::ScopedCapture quiet;
  const std::vector<Bytes> packets = lteSession();
  test::TemporaryDirectory dir;
  const Bytes dlf = applicationDlf(packets);
  const std::string dlfPath = dir.write("saved.dlf", std::string(dlf.begin(), dlf.end()));
  std::string hex;
  for (const Bytes& p : packets) {
    for (std::uint8_t b : p) {
      hex += "0123456789abcdef"[b >> 4];
      hex += "0123456789abcdef"[b & 15];
    }
    hex += '\n';
  }
  const std::string hexPath = dir.write("packets.hex", hex);

  const auto fromDlf = test::runProcess({CORVANE_DECODE_BINARY, "--technology", "Quendra_LTE", dlfPath});
  const auto fromHex = test::runProcess({CORVANE_DECODE_BINARY, "--technology", "Quendra_LTE", hexPath});
  ASSERT_EQ(fromDlf.exitCode, 0) << fromDlf.err;
  ASSERT_EQ(fromHex.exitCode, 0) << fromHex.err;
  EXPECT_EQ(fromDlf.out, fromHex.out);
  EXPECT_NE(fromDlf.out.find("8949000000000000017"), std::string::npos);
  EXPECT_NE(fromDlf.out.find("20 MHz"), std::string::npos);
}

}  // namespace
}  // namespace corvane
