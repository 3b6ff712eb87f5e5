// The eight CDMA2000 decoders, each over packets laid out byte by byte: the
// length checks, every field's text at the edges of its range, the lists and
// the memory kept in the state between packets.

#include "LogGenerator/cdma2000/C2KDecoders.h"

#include <cmath>
#include <cstdio>

#include "cdma2000/C2KTestSupport.h"

namespace corvane {
namespace {

using test::C2KTest;
using test::logPacket;
using test::put16;
using test::put32;
using test::subpacket;
using test::subpacketRecord;
using Lines = std::vector<std::string>;

std::vector<log::Line> errorLine(const std::string& text) { return {{3, text}}; }

// ---- 0x1183 EV-DO status

Bytes evdoStatus(std::uint8_t deviceState, std::size_t size = 50) {
  Bytes p = logPacket(0x1183, size);
  p[13] = 0x34;                    // channel bits 0-7
  p[14] = (1 << 3) | 0x5;          // band class 1, channel bits 8-10 = 5
  p[15] = 0x80;                    // Rx AGC 0: -128
  p[16] = 0xFB;                    // Rx AGC 1: -5
  p[17] = 0x0A;                    // Tx AGC: +10
  put16(p, 18, 5);                 // PN offset
  if (size > 36) p[36] = deviceState;
  if (size > 41) {
    p[37] = 4;                       // session open
    p[38] = 0x56;
    p[39] = 0x34;
    p[40] = 0x12;
    p[41] = 255;
  }
  return p;
}

TEST_F(C2KTest, EvdoStatusOf49Or51BytesIsRejected) {
  for (std::size_t size : {49u, 51u}) {
    log::ScopedCapture capture;
    feed(evdoStatus(5, size));
    EXPECT_EQ(capture.sink().lines(),
              errorLine("Log code 0x1183 is " + std::to_string(size) + " bytes long but should be 50 bytes."));
    EXPECT_EQ(row("kChannel"), "");
  }
}

TEST_F(C2KTest, EvdoStatusShowsAntenna1AndTransmitterFromTheAccessStateOn) {
  log::ScopedCapture quiet;
  feed(evdoStatus(3));
  EXPECT_EQ(row("k1xEVDODeviceState"), "Idle [3]");
  EXPECT_EQ(row("kRxAGC1"), "N/A");
  EXPECT_EQ(row("kTxAGC"), "N/A");
  feed(evdoStatus(4));
  EXPECT_EQ(row("k1xEVDODeviceState"), "Access [4]");
  EXPECT_EQ(row("kRxAGC1"), "-5 dBm");
  EXPECT_EQ(row("kTxAGC"), "+10 dBm");
}

TEST_F(C2KTest, EvdoStatusFieldsAndTheirTexts) {
  log::ScopedCapture quiet;
  feed(evdoStatus(5));
  EXPECT_EQ(row("kChannel"), "1332");  // 0x534
  EXPECT_EQ(row("k1xEVDODeviceState"), "Connected [5]");
  EXPECT_EQ(row("kBandClass"), "1.8 to 2.0GHz PCS band [1]");
  EXPECT_EQ(row("kRxAGC0"), "-128 dBm");
  EXPECT_EQ(row("kServingPNOffset"), "5 \xC3\x97 64chips");
  EXPECT_EQ(row("kSessionState"), "Open [4]");
  EXPECT_EQ(row("kUATI24"), "0x123456");
  EXPECT_EQ(row("kColorCode"), "255");
}

TEST_F(C2KTest, EvdoStatusAtTheEdgesOfItsFields) {
  Bytes p = evdoStatus(6);
  p[13] = 0xFF;
  p[14] = static_cast<std::uint8_t>((13 << 3) | 0x7);  // band class 13, channel 2047
  p[15] = 0x7F;
  put16(p, 18, 0xFFFF);
  p[37] = 5;
  p[38] = p[39] = p[40] = 0;
  log::ScopedCapture quiet;
  feed(p);
  EXPECT_EQ(row("kChannel"), "2047");
  EXPECT_EQ(row("kBandClass"), "[Bad Value 13]");
  EXPECT_EQ(row("k1xEVDODeviceState"), "[Reserved 6]");
  EXPECT_EQ(row("kSessionState"), "[Reserved 5]");
  EXPECT_EQ(row("kRxAGC0"), "+127 dBm");
  EXPECT_EQ(row("kServingPNOffset"), "Invalid Value");
  EXPECT_EQ(row("kUATI24"), "0x000000");
  p[15] = 0;
  p[14] = 12 << 3;
  feed(p);
  EXPECT_EQ(row("kRxAGC0"), "+0 dBm");
  EXPECT_EQ(row("kBandClass"), "800 MHz European PAMR band [12]");
}

// ---- 0x12b6 EV-DO active-set pilots

Bytes evdoPilots(std::uint8_t count, std::size_t size) {
  Bytes p = logPacket(0x12b6, size);
  p[15] = count;
  for (std::size_t i = 0; i < count && 25 + 12 * i + 4 <= size; ++i) {
    put16(p, 25 + 12 * i, static_cast<std::uint16_t>(100 + i));
    put16(p, 25 + 12 * i + 2, static_cast<std::uint16_t>(i == 0 ? 512 : 0));
  }
  return p;
}

TEST_F(C2KTest, EvdoPilotsOfTwoNeed49Bytes) {
  {
    log::ScopedCapture capture;
    feed(evdoPilots(2, 48));
    EXPECT_EQ(capture.sink().lines(), errorLine("Log code 0x12b6 is 48 bytes long, but has 2 substructs."));
    EXPECT_EQ(row("kActiveSetPilots"), "");
  }
  log::ScopedCapture capture;
  feed(evdoPilots(2, 49));
  EXPECT_TRUE(capture.texts().empty());
  EXPECT_EQ(list("kActiveSetPilots"), (Lines{"_sorted=_sorted", "0;100=+0.00 dB", "1;101=-inf dB"}));
}

TEST_F(C2KTest, EvdoPilotsShorterThan25BytesOrNoneAtAll) {
  log::ScopedCapture capture;
  feed(evdoPilots(0, 24));
  EXPECT_EQ(capture.sink().lines(), errorLine("Log code 0x12b6 is 24 bytes long but must be at least 25 bytes."));
  feed(evdoPilots(0, 25));
  EXPECT_EQ(row("kActiveSetPilots"), "(none)");
}

TEST_F(C2KTest, PilotEnergyAtItsLargestValue) {
  Bytes p = evdoPilots(1, 37);
  put16(p, 25, 0xFFFF);
  put16(p, 27, 0xFFFF);
  log::ScopedCapture quiet;
  feed(p);
  EXPECT_EQ(list("kActiveSetPilots"), (Lines{"_sorted=_sorted", "0;65535=+21.07 dB"}));
}

// ---- 0x108a finger C/I

Bytes fingers(std::initializer_list<std::pair<std::uint16_t, std::uint16_t>> pnAndCi) {
  Bytes p = logPacket(0x108a, 23 + 14 * pnAndCi.size());
  p[22] = static_cast<std::uint8_t>(pnAndCi.size());
  std::size_t entry = 23;
  for (const auto& [pn, ci] : pnAndCi) {
    put16(p, entry, pn);
    put16(p, entry + 6, ci);
    entry += 14;
  }
  return p;
}

TEST_F(C2KTest, AnUnassignedFingerAloneShowsNone) {
  log::ScopedCapture quiet;
  feed(fingers({{0xFFFF, 1024}}));
  EXPECT_EQ(row("kFingerC2I"), "(none)");
}

TEST_F(C2KTest, FingersSkipUnassignedOnesButKeepTheirIndex) {
  log::ScopedCapture quiet;
  feed(fingers({{0xFFFF, 512}, {7, 1024}, {0, 1}}));
  EXPECT_EQ(list("kFingerC2I"), (Lines{"_sorted=_sorted", "1;7=+3.01 dB", "2;0=-27.09 dB"}));
  feed(fingers({}));
  EXPECT_EQ(row("kFingerC2I"), "(none)");
}

TEST_F(C2KTest, FingerRecordsMustHaveExactlyTheirEntries) {
  log::ScopedCapture capture;
  feed(logPacket(0x108a, 24));
  EXPECT_EQ(capture.sink().lines(),
            errorLine("Log code 0x108a has bad length of 24 bytes, but has 0 substructs (size=23)."));
  capture.sink().clear();
  feed(logPacket(0x108a, 22));
  EXPECT_EQ(capture.sink().lines(), errorLine("Log code 0x108a is 22 bytes long but must be at least 23 bytes."));
  EXPECT_EQ(row("kFingerC2I"), "");
}

// ---- 0x119c 1x status

Bytes systemState(std::uint8_t state) {
  Bytes s = subpacket(1, 8);
  s[4] = state;
  return s;
}

Bytes radio(std::uint8_t band0, std::uint8_t band1, std::uint16_t channel0, std::uint16_t channel1,
            std::uint8_t agc0, std::uint8_t agc1, std::uint16_t tx) {
  Bytes s = subpacket(2, 14);
  s[4] = band0;
  s[5] = band1;
  put16(s, 6, channel0);
  put16(s, 8, channel1);
  s[10] = agc0;
  s[11] = agc1;
  put16(s, 12, tx);
  return s;
}

// N = 2, G = 1, X = 2, m = 0 (records 12 bytes apart, energy at +12):
// Ec/Io = 10 log10(2 E / 36 - 1/2); E = 27 gives 0 dB, E = 0 the floor. A
// record's energy lies where the next record's PN does.
Bytes activeSet() {
  Bytes s = subpacket(3, 12 + 12 + 14);
  put16(s, 4, 2);
  s[6] = 1;
  s[7] = 2;
  s[8] = 2;
  s[9] = 0;
  put16(s, 10, 10);
  put16(s, 12, 10);      // pilot 0: the reference pilot
  put16(s, 24, 27);      // its energy, and pilot 1's PN
  put16(s, 24 + 12, 0);  // pilot 1's energy
  return s;
}

Bytes oneXStatus(std::uint8_t state, Bytes radioPart) {
  return subpacketRecord(0x119c, {systemState(state), radioPart, activeSet(), subpacket(4, 4)});
}

TEST_F(C2KTest, OneXStatusInTrafficShowsBothChainsAndTheTransmitter) {
  log::ScopedCapture capture;
  feed(oneXStatus(8, radio(1, 13, 384, 1000, 0x00, 0x80, 0x8000)));
  EXPECT_TRUE(capture.texts().empty());
  EXPECT_EQ(row("k1xDeviceState"), "Traffic [8]");
  EXPECT_EQ(row("k1xRx0BandClass"), "1.8 to 2.0GHz PCS band [1]");
  EXPECT_EQ(row("k1xRx0ChanNum"), "384");
  EXPECT_EQ(row("k1xRxAGC0"), "-63.25 dBm");
  EXPECT_EQ(row("k1xRx1BandClass"), "[Bad Value 13]");
  EXPECT_EQ(row("k1xRx1ChanNum"), "1000");
  EXPECT_EQ(row("k1xRxAGC1"), "-106.00 dBm");
  EXPECT_EQ(row("k1xTxAGC"), "-3276.80 dBm");
  feed(oneXStatus(8, radio(0, 0, 0xFFFF, 0, 0x7F, 0x7F, 0x7FFF)));
  EXPECT_EQ(row("k1xRx0ChanNum"), "65535");
  EXPECT_EQ(row("k1xRxAGC0"), "-20.83 dBm");
  EXPECT_EQ(row("k1xTxAGC"), "+3276.70 dBm");
  feed(oneXStatus(8, radio(0, 0, 0, 0, 0, 0, 0)));
  EXPECT_EQ(row("k1xTxAGC"), "+0.00 dBm");
}

TEST_F(C2KTest, OneXStatusOutOfTrafficShowsNotApplicable) {
  log::ScopedCapture quiet;
  feed(oneXStatus(6, radio(0, 1, 283, 500, 0x10, 0x20, 100)));
  EXPECT_EQ(row("k1xDeviceState"), "Paging [6]");
  EXPECT_EQ(row("k1xRx0BandClass"), "800 MHz cellular band [0]");
  EXPECT_EQ(row("k1xRxAGC0"), "-57.90 dBm");
  for (const char* key : {"k1xRx1BandClass", "k1xRx1ChanNum", "k1xRxAGC1", "k1xTxAGC"}) EXPECT_EQ(row(key), "N/A");
  feed(oneXStatus(12, radio(0, 1, 283, 500, 0x10, 0x20, 100)));
  EXPECT_EQ(row("k1xDeviceState"), "[Bad Value 12]");
}

TEST_F(C2KTest, TheActiveSetListMarksTheReferencePilotAndFloorsAtMinus50) {
  log::ScopedCapture quiet;
  feed(oneXStatus(6, radio(0, 0, 0, 0, 0, 0, 0)));
  EXPECT_EQ(list("k1xActiveSetInfo"), (Lines{"_sorted=_sorted", "0;10=(ref pilot) +0.00 dB", "1;27=-50.00 dB"}));
}

TEST_F(C2KTest, ActiveSetPilotsLieAStrideApartAndTheListStopsAtTheEndOfThePacket) {
  // m = 1: records (6 + 15) & ~3 = 20 bytes apart, energy at +16. N = 1, G = 1,
  // X = 3: Ec/Io = 10 log10(8 E / 9 - 1); E = 9 gives 10 log10(7). Three pilots
  // are announced; the packet ends inside the third.
  Bytes set = subpacket(3, 12 + 20 + 18 + 4);
  put16(set, 4, 1);
  set[6] = 1;
  set[7] = 3;
  set[8] = 3;
  set[9] = 1;
  put16(set, 10, 99);
  put16(set, 12, 300);
  put16(set, 12 + 16, 9);
  put16(set, 32, 400);
  put16(set, 32 + 16, 0xFFFF);
  put16(set, 52, 500);
  const Bytes p = subpacketRecord(0x119c, {systemState(8), radio(0, 0, 0, 0, 0, 0, 0), subpacket(4, 4), set});
  log::ScopedCapture quiet;
  feed(p);
  EXPECT_EQ(list("k1xActiveSetInfo"), (Lines{"_sorted=_sorted", "0;300=+8.45 dB", "1;400=+47.65 dB"}));
  // With no pilots, only the marker.
  set[8] = 0;
  feed(subpacketRecord(0x119c, {systemState(8), radio(0, 0, 0, 0, 0, 0, 0), subpacket(4, 4), set}));
  EXPECT_EQ(list("k1xActiveSetInfo"), (Lines{"_sorted=_sorted"}));
}

TEST(C2KFormulas, ActiveSetEcIoAtItsEdges) {
  EXPECT_DOUBLE_EQ(c2k::activeSetEcIo(2, 1, 2, 27), 0.0);
  EXPECT_DOUBLE_EQ(c2k::activeSetEcIo(2, 1, 2, 0), -50.0);
  // No gain and no energy: 0 / 0 is no number, which takes the floor.
  EXPECT_DOUBLE_EQ(c2k::activeSetEcIo(0, 0, 0, 0), -50.0);
  EXPECT_DOUBLE_EQ(c2k::activeSetEcIo(1, 0, 0, 1), HUGE_VAL);
  // The largest fields stay finite in double precision.
  EXPECT_NEAR(c2k::activeSetEcIo(0xFFFF, 0xFF, 0xFF, 0xFFFF), 10 * std::log10(std::exp2(507.0) * 65535 /
                                                                              (9.0 * 255 * 65535.0 * 65535.0)),
              1e-9);
  EXPECT_EQ(c2k::energyDb(0), -HUGE_VAL);
  EXPECT_DOUBLE_EQ(c2k::energyDb(512), 0.0);
}

TEST_F(C2KTest, OneXStatusNeedsAllFourSubpackets) {
  log::ScopedCapture capture;
  feed(subpacketRecord(0x119c, {systemState(8), radio(0, 0, 0, 0, 0, 0, 0), activeSet()}));
  EXPECT_EQ(capture.sink().lines(),
            (std::vector<log::Line>{{4, "Log code 0x119c: missing subpacket (ss=1,rf=1,ai=1,fi=0)."}}));
  capture.sink().clear();
  feed(subpacketRecord(0x119c, {subpacket(4, 4)}));
  EXPECT_EQ(capture.sink().lines(),
            (std::vector<log::Line>{{4, "Log code 0x119c: missing subpacket (ss=0,rf=0,ai=0,fi=1)."}}));
  capture.sink().clear();
  feed(logPacket(0x119c, 16));
  EXPECT_EQ(capture.sink().lines(), errorLine("Log code 0x119c is 16 bytes long but must be at least 17 bytes."));
  EXPECT_EQ(row("k1xDeviceState"), "");
}

// ---- sub-packet search

TEST(C2KSubpackets, ASizeOfZeroKeepsTheSearchOnTheSameSubpacketUntilTheCountIsUsedUp) {
  // Three sub-packets announced; the first (id 2) says it is 0 bytes long, so
  // the search looks at it three times and never reaches the id 11 behind it.
  const Bytes p = subpacketRecord(0x119d, {subpacket(2, 4), subpacket(11, 28), subpacket(3, 4)});
  Bytes zero = p;
  zero[17 + 2] = 0;
  log::ScopedCapture capture;
  EXPECT_EQ(c2k::FindSubpacket(PacketView(zero), 11, zero.size()), std::nullopt);
  EXPECT_EQ(c2k::FindSubpacket(PacketView(zero), 2, zero.size()), std::optional<std::size_t>(17));
  EXPECT_TRUE(capture.texts().empty());
  EXPECT_EQ(c2k::FindSubpacket(PacketView(p), 11, p.size()), std::optional<std::size_t>(21));
  EXPECT_EQ(c2k::FindSubpacket(PacketView(p), 3, p.size()), std::optional<std::size_t>(49));
}

TEST(C2KSubpackets, ASizeReachingTheBoundFailsEvenForTheWantedSubpacket) {
  Bytes p = subpacketRecord(0x119d, {subpacket(1, 4), subpacket(11, 28)});
  // The bound is 17 + the packet's length: the second sub-packet may claim up
  // to 17 + 49 - 21 - 1 = 44 bytes.
  put16(p, 21 + 2, 45);
  log::ScopedCapture capture;
  EXPECT_EQ(c2k::FindSubpacket(PacketView(p), 11, p.size()), std::nullopt);
  EXPECT_EQ(capture.sink().lines(), errorLine("Log code error in subpkt#1: bad size (45)."));
  put16(p, 21 + 2, 44);
  EXPECT_EQ(c2k::FindSubpacket(PacketView(p), 11, p.size()), std::optional<std::size_t>(21));
  Bytes none = subpacketRecord(0x119d, {});
  EXPECT_EQ(c2k::FindSubpacket(PacketView(none), 11, none.size()), std::nullopt);
}

// ---- 0x119d 1x traffic frame-error rate

Bytes trafficFrame(bool error) {
  Bytes p = subpacketRecord(0x119d, {subpacket(1, 4), subpacket(11, 28)});
  p[21 + 24] = error ? 1 : 0;
  return p;
}

double percentIn(const std::string& text) { return std::stod(text.substr(0, text.find('%'))); }

TEST_F(C2KTest, FramesAllInErrorDriveTheRateTowards100Percent) {
  log::ScopedCapture quiet;
  feed(trafficFrame(true));
  EXPECT_EQ(row("k1xTrafficFER"), "1.56%");
  feed(trafficFrame(true));
  EXPECT_EQ(row("k1xTrafficFER"), "3.10%");
  double last = 3.10;
  for (int i = 0; i < 200; ++i) {
    feed(trafficFrame(true));
    const double now = percentIn(row("k1xTrafficFER"));
    EXPECT_GE(now, last);
    last = now;
  }
  for (int i = 0; i < 1000; ++i) feed(trafficFrame(true));
  EXPECT_EQ(row("k1xTrafficFER"), "100.00%");
  const Value fer = state.get("TrafficFER");
  ASSERT_NE(fer.asReal(), nullptr);
  EXPECT_LE(*fer.asReal(), 1.0);
}

TEST_F(C2KTest, AGoodFrameLowersTheRateByItsWeight) {
  log::ScopedCapture quiet;
  feed(trafficFrame(true));
  feed(trafficFrame(false));
  EXPECT_EQ(row("k1xTrafficFER"), "1.54%");
  const Value fer = state.get("TrafficFER");
  EXPECT_FLOAT_EQ(static_cast<float>(*fer.asReal()), 0.015625f * 0.984375f);
}

TEST_F(C2KTest, LeavingTrafficShowsTheLastRateOnceAsOldAndRestartsTheFilter) {
  log::ScopedCapture quiet;
  feed(trafficFrame(true));
  feed(oneXStatus(8, radio(0, 0, 0, 0, 0, 0, 0)));
  EXPECT_EQ(row("k1xTrafficFER"), "1.56%");
  EXPECT_TRUE(state.contains("TrafficFER"));
  feed(oneXStatus(6, radio(0, 0, 0, 0, 0, 0, 0)));
  EXPECT_EQ(row("k1xTrafficFER"), "1.56% (old)");
  EXPECT_FALSE(state.contains("TrafficFER"));
  feed(trafficFrame(true));
  EXPECT_EQ(row("k1xTrafficFER"), "1.56%");
}

TEST_F(C2KTest, TrafficFrameRecordsWithoutTheirSubpacketOrTooShort) {
  log::ScopedCapture capture;
  feed(subpacketRecord(0x119d, {subpacket(1, 4)}));
  EXPECT_EQ(capture.sink().lines(),
            (std::vector<log::Line>{{4, "Log code 0x119d: missing traffic demod subpacket."}}));
  capture.sink().clear();
  feed(logPacket(0x119d, 16));
  EXPECT_EQ(capture.sink().lines(), errorLine("Log code 0x119d is 16 bytes long but must be at least 17 bytes."));
  EXPECT_FALSE(state.contains("TrafficFER"));
}

TEST_F(C2KTest, ASubpacketPastTheRealEndReadsAsZero) {
  // The demodulation sub-packet claims 26 bytes, within the bound (17 + 27),
  // but the packet ends 10 bytes into it: its error byte reads as zero.
  Bytes p = subpacketRecord(0x119d, {subpacket(11, 10)});
  put16(p, 17 + 2, 26);
  p.back() = 1;
  log::ScopedCapture quiet;
  feed(p);
  EXPECT_EQ(row("k1xTrafficFER"), "0.00%");
}

// ---- 0x134f 1x system

Bytes oneXSystem(std::size_t size = 171, std::uint8_t version = 2) {
  Bytes p = logPacket(0x134f, size);
  p[13] = version;
  put32(p, 42, 1);
  put32(p, 46, 2);
  put16(p, 50, 4145);
  put16(p, 52, 65535);
  p[131] = 255;
  p[133] = 6;
  if (size >= 186) put16(p, 184, 0xFFFF);
  return p;
}

TEST_F(C2KTest, OneXSystemShowsIdentityAndReadsTheBaseIdOnlyWhenThePacketHoldsIt) {
  log::ScopedCapture capture;
  feed(oneXSystem());
  EXPECT_TRUE(capture.texts().empty());
  EXPECT_EQ(row("k1xRoamingHome"), "ON [1]");
  EXPECT_EQ(row("kSystemId"), "4145");
  EXPECT_EQ(row("kNetworkId"), "65535");
  EXPECT_EQ(row("kPacketZoneId"), "255");
  EXPECT_EQ(row("kProtocolRevision"), "6");
  EXPECT_EQ(row("kBaseId"), "0");
  feed(oneXSystem(186));
  EXPECT_EQ(row("kBaseId"), "65535");
}

TEST_F(C2KTest, RoamingIndicatorOutsideItsTableAndAnUnknownSystemType) {
  Bytes p = oneXSystem();
  put32(p, 42, 13);
  put32(p, 46, 1);
  log::ScopedCapture quiet;
  feed(p);
  EXPECT_EQ(row("k1xRoamingHome"), "ERI - 13");
  EXPECT_EQ(row("kSystemId"), "(unknown system type 1)");
  EXPECT_EQ(row("kNetworkId"), "(unknown system type 1)");
  put32(p, 42, 0xFFFFFFFF);
  put32(p, 46, 0xFFFFFFFF);
  feed(p);
  EXPECT_EQ(row("k1xRoamingHome"), "ERI - -1");
  EXPECT_EQ(row("kSystemId"), "(unknown system type -1)");
  put32(p, 42, 12);
  feed(p);
  EXPECT_EQ(row("k1xRoamingHome"), "Banner OFF [12]");
}

TEST_F(C2KTest, OneXSystemTooShortOrOfAnEarlyVersionIsDropped) {
  log::ScopedCapture capture;
  feed(oneXSystem(170));
  EXPECT_EQ(capture.sink().lines(), errorLine("Log code 0x134f is 170 bytes long but must be at least 171 bytes."));
  capture.sink().clear();
  feed(oneXSystem(171, 1));
  EXPECT_EQ(capture.sink().lines(),
            errorLine("Log code 0x134f has version=1; only version 2 or higher expected; dropping."));
  EXPECT_EQ(row("kSystemId"), "");
}

// ---- 0x1192 forward-link data rate

// The bits each forward-link counter stands for.
constexpr std::uint32_t kForwardBits[56] = {
    128, 256, 512,  1024, 0, 128,  256,  512, 1024, 0,    128, 256,  512,  1024, 0,    128,  256,  512,  1024,
    0,   128, 256,  512,  1024, 0, 512,  1024, 2048, 0, 128,  256, 512,  1024, 0,    512,  1024, 2048, 0,
    1024, 3072, 0, 512, 1024, 2048, 0, 4096, 0, 1024, 3072, 0, 4096, 0, 5120, 0, 5120, 0};

Bytes forwardRate(std::uint32_t sequence, std::initializer_list<std::pair<std::size_t, std::uint32_t>> counters,
                  std::size_t size = 241) {
  Bytes p = logPacket(0x1192, size);
  put32(p, 13, sequence);
  for (const auto& [i, value] : counters) put32(p, 17 + 4 * i, value);
  return p;
}

std::string kbps(double rate) {
  char text[64];
  std::snprintf(text, sizeof text, "%.2f kbps", rate);
  return text;
}

TEST_F(C2KTest, TheFirstForwardRecordPrimesTheCountersAndBlanksTheRate) {
  const Value lookup = state.get("Lookup");
  SetLookupValue("kFLDataRate", "stale", lookup.asDictionary());
  EXPECT_EQ(row("kFLDataRate"), "stale");
  log::ScopedCapture quiet;
  feed(forwardRate(100, {{0, 10}}));
  EXPECT_EQ(row("kFLDataRate"), "");
  EXPECT_EQ(state.get("FLDataSeqNum"), Value::integer(100));
  EXPECT_EQ(state.get("FLDataSent"), Value::integer(1280));
  EXPECT_EQ(extraInfo().get("FLDataSeqNum1"), Value::integer(100));
  EXPECT_EQ(extraInfo().get("FLDataSent1"), Value::integer(1280));
  EXPECT_FALSE(extraInfo().contains("FLDataSeqNum2"));

  feed(forwardRate(102, {{0, 26}}));  // 16 more counts of 128 bits over 2 steps
  EXPECT_EQ(row("kFLDataRate"), "1.00 kbps");
  EXPECT_EQ(extraInfo().get("FLDataSeqNum2"), Value::integer(100));
  EXPECT_EQ(extraInfo().get("FLDataSent2"), Value::integer(1280));
  EXPECT_EQ(extraInfo().get("FLDataSeqNum1"), Value::integer(102));
  EXPECT_EQ(extraInfo().get("FLDataSent1"), Value::integer(3328));
}

TEST_F(C2KTest, EachForwardCounterWeighsItsBits) {
  log::ScopedCapture quiet;
  for (std::size_t i = 0; i < 56; ++i) {
    feed(forwardRate(static_cast<std::uint32_t>(2 * i), {}));
    feed(forwardRate(static_cast<std::uint32_t>(2 * i + 1), {{i, 1}}));
    EXPECT_EQ(row("kFLDataRate"), kbps(kForwardBits[i] / 1024.0)) << "counter " << i;
  }
}

TEST_F(C2KTest, TwoForwardRecordsWithTheSameSequenceKeepTheRateAndRefreshTheCounters) {
  log::ScopedCapture quiet;
  feed(forwardRate(7, {}));
  feed(forwardRate(8, {{3, 1}}));
  EXPECT_EQ(row("kFLDataRate"), "1.00 kbps");
  feed(forwardRate(8, {{3, 5}}));
  EXPECT_EQ(row("kFLDataRate"), "1.00 kbps");
  EXPECT_EQ(state.get("FLDataSent"), Value::integer(5 * 1024));
  EXPECT_EQ(extraInfo().get("FLDataSent2"), Value::integer(1024));
  // A sequence that goes backwards leaves the rate too.
  feed(forwardRate(3, {}));
  EXPECT_EQ(row("kFLDataRate"), "1.00 kbps");
  EXPECT_EQ(state.get("FLDataSeqNum"), Value::integer(3));
}

TEST_F(C2KTest, AForwardSequenceThatWrapsStillCountsItsSteps) {
  log::ScopedCapture quiet;
  feed(forwardRate(0xFFFFFFFF, {}));
  EXPECT_EQ(state.get("FLDataSeqNum"), Value::integer(-1));
  feed(forwardRate(1, {{3, 4}}));  // two steps
  EXPECT_EQ(row("kFLDataRate"), "2.00 kbps");
}

TEST_F(C2KTest, ForwardCountersThatGoBackwardsGiveANegativeRate) {
  log::ScopedCapture quiet;
  feed(forwardRate(1, {{3, 4}}));
  feed(forwardRate(2, {{3, 3}}));
  EXPECT_EQ(row("kFLDataRate"), "-1.00 kbps");
}

TEST_F(C2KTest, ForwardCountersAtTheirLargestSumIn64Bits) {
  Bytes p = forwardRate(1, {});
  std::fill(p.begin() + 17, p.begin() + 241, 0xFF);
  log::ScopedCapture capture;
  feed(p);
  EXPECT_EQ(state.get("FLDataSent"), Value::integer(4294967295LL * 48896));
  feed(forwardRate(1, {}, 240));
  EXPECT_EQ(capture.sink().lines(), errorLine("Log code 0x1192 is 240 bytes long but must be at least 241 bytes."));
}

// ---- 0x127e reverse-link data rate

std::size_t reverseCounter(std::size_t block, std::size_t rate, std::size_t n) {
  return 18 + 288 * block + 24 * rate + 4 * n;
}

TEST_F(C2KTest, ReverseRateCountsTheFirstFourCountersOfEachRateInEveryBlock) {
  log::ScopedCapture quiet;
  Bytes first = logPacket(0x127e, 1750);
  put32(first, 14, 10);
  feed(first);
  EXPECT_EQ(row("kRLDataRate"), "");
  Bytes second = first;
  put32(second, 14, 11);
  put32(second, reverseCounter(5, 11, 3), 1);     // 12288 bits
  put32(second, reverseCounter(0, 0, 0), 2);      // 2 × 128 bits
  put32(second, reverseCounter(2, 3, 4), 1000);   // the fifth counter does not count
  put32(second, reverseCounter(3, 6, 5), 1000);
  feed(second);
  EXPECT_EQ(row("kRLDataRate"), "12.25 kbps");
  EXPECT_EQ(state.get("RLDataSent"), Value::integer(12544));
  EXPECT_EQ(state.get("RLDataSeqNum"), Value::integer(11));
  EXPECT_EQ(extraInfo().get("RLDataSeqNum2"), Value::integer(10));
  EXPECT_EQ(extraInfo().get("RLDataSent2"), Value::integer(0));
  EXPECT_EQ(extraInfo().get("RLDataSent1"), Value::integer(12544));
  // The forward link's memory is its own.
  EXPECT_FALSE(state.contains("FLDataSent"));
}

TEST_F(C2KTest, ReverseRateWeightsAndLargestCounters) {
  constexpr std::uint32_t kBits[12] = {128, 256, 512, 768, 1024, 1536, 2048, 3072, 4096, 6144, 8192, 12288};
  log::ScopedCapture capture;
  for (std::size_t r = 0; r < 12; ++r) {
    Bytes p = logPacket(0x127e, 1750);
    put32(p, 14, static_cast<std::uint32_t>(2 * r));
    feed(p);
    put32(p, 14, static_cast<std::uint32_t>(2 * r + 1));
    put32(p, reverseCounter(r % 6, r, r % 4), 1);
    feed(p);
    EXPECT_EQ(row("kRLDataRate"), kbps(kBits[r] / 1024.0)) << "rate " << r;
  }
  Bytes full = logPacket(0x127e, 1750);
  std::fill(full.begin() + 18, full.end(), 0xFF);
  feed(full);
  EXPECT_EQ(state.get("RLDataSent"), Value::integer(4294967295LL * 24 * 40064));
  feed(logPacket(0x127e, 1749));
  EXPECT_EQ(capture.sink().lines(), errorLine("Log code 0x127e is 1749 bytes long but must be at least 1750 bytes."));
}

}  // namespace
}  // namespace corvane
