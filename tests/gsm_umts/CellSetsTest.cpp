// The four sections of the UMTS set log: "Active Set" lists the cells of set
// type 0 with an RSCP made of the record's wideband power and the cell's
// Ec/Io; "Detected Set", "Monitored Set" and "Virtual Active Set" walk the
// cells and list none.

#include <type_traits>

#include "LogGenerator/gsm_umts/ActiveSet.h"
#include "LogGenerator/gsm_umts/CellSetLog.h"
#include "LogGenerator/gsm_umts/DetectedSet.h"
#include "LogGenerator/gsm_umts/MonitoredSet.h"
#include "LogGenerator/gsm_umts/VirtualActiveSet.h"
#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::logPacket;
using test::put16;
using test::put32;
using test::rowAt;
using test::rowText;
using test::S;

struct SetCell {
  std::uint16_t scramblingWord = 0;  // bits 0-12 the code, 13-15 the set type
  std::uint32_t energies[3] = {0, 0, 0};
};

// 0x417A: the wideband power at 13 (16 bits, signed), the number of cells at
// 15, 15 bytes a cell from 16 (the scrambling word at +7), then 44 bytes an
// energy block (three 32-bit values at +32, +36, +40) right behind the cells.
Bytes setLogPacket(std::int16_t widebandPower, const std::vector<SetCell>& cells) {
  const std::size_t n = cells.size();
  Bytes p = logPacket(0x417A, 16 + 15 * n + 44 * n);
  put16(p, 13, static_cast<std::uint16_t>(widebandPower));
  p[15] = static_cast<std::uint8_t>(n);
  for (std::size_t i = 0; i < n; ++i) {
    const std::size_t cell = 16 + 15 * i;
    for (std::size_t b = 0; b < 15; ++b) p[cell + b] = 0xEE;  // not read
    put16(p, cell + 7, cells[i].scramblingWord);
    const std::size_t block = 16 + 15 * n + 44 * i;
    for (std::size_t b = 0; b < 32; ++b) p[block + b] = 0xEE;  // not read
    for (std::size_t k = 0; k < 3; ++k) put32(p, block + 32 + 4 * k, cells[i].energies[k]);
  }
  return p;
}

constexpr std::uint32_t kUnity = 524288;  // Ec/Io of 0 dB

// --- Active Set ---

using Active = test::GsmUmtsSectionTest<ActiveSet>;

TEST_F(Active, RegistersUnderItsNameForTheSetLog) {
  EXPECT_EQ(classDict.at("Active Set"), section);
  EXPECT_EQ(section->getLogCodeArray(), std::vector<std::uint32_t>{0x417A});
  EXPECT_EQ(codeDict.keys(), std::vector<std::string>{"16762"});
}

TEST_F(Active, EachActiveCellShowsItsCodeRscpAndEcIo) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(setLogPacket(-700, {{300, {132269, 0, 0}}, {(1 << 13) | 301, {kUnity, 0, 0}}, {302, {kUnity, 0, 0}}}),
       0x417A);
  ASSERT_EQ(list.size(), 2u);
  // (-700 + 512) / 10 = -18; -18 - 106 - 6 = -130.
  EXPECT_EQ(list.at(0), D({{"Scrambling Code", S("300")}, {"RSCP", S("-130 dB")}, {"Energy Per Chip", S("-6 dB")}}));
  EXPECT_EQ(list.at(1), D({{"Scrambling Code", S("302")}, {"RSCP", S("-124 dB")}, {"Energy Per Chip", S("0 dB")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"ActiveSet"}));
}

// (-1000 + 512) / 10 is -48, truncated toward zero; -48 - 106 + 0 = -154.
TEST_F(Active, AWidebandPowerOfMinus1000AndAnEcIoOfUnityGiveMinus154Db) {
  const Array list = attachList();
  feed(setLogPacket(-1000, {{17, {kUnity, 0, 0}}}), 0x417A);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(rowText(rowAt(list, 0), "RSCP"), "-154 dB");
  EXPECT_EQ(rowText(rowAt(list, 0), "Energy Per Chip"), "0 dB");
}

TEST_F(Active, ACellWhoseByte8Is0x20IsOfSetType1AndNotShown) {
  const Array list = attachList();
  Bytes p = setLogPacket(-1000, {{5, {kUnity, 0, 0}}, {6, {kUnity, 0, 0}}});
  p[16 + 8] = 0x20;
  feed(p, 0x417A);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Scrambling Code"), "6");
}

// The word's low 13 bits are the code, its top 3 bits the set type.
TEST_F(Active, TheScramblingWordE0FFHoldsCode255AndSetType7) {
  const Array list = attachList();
  feed(setLogPacket(-1000, {{0xE0FF, {kUnity, 0, 0}}, {0x00FF, {kUnity, 0, 0}}, {0x1FFF, {kUnity, 0, 0}}}), 0x417A);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Scrambling Code"), "255");
  EXPECT_EQ(rowText(rowAt(list, 1), "Scrambling Code"), "8191");
}

TEST_F(Active, TheFirstEnergyValueThatIsNotZeroCounts) {
  const Array list = attachList();
  feed(setLogPacket(-1000, {{1, {0, 0, 417648}}, {2, {0, 331809, kUnity}}, {3, {0, 0, 0}}}), 0x417A);
  ASSERT_EQ(list.size(), 3u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Energy Per Chip"), "-1 dB");
  EXPECT_EQ(rowText(rowAt(list, 1), "Energy Per Chip"), "-2 dB");
  // All three 0: the Ec/Io table gives 0 dB for it.
  EXPECT_EQ(rowText(rowAt(list, 2), "Energy Per Chip"), "0 dB");
  EXPECT_EQ(rowText(rowAt(list, 0), "RSCP"), "-155 dB");
}

TEST_F(Active, ACountOf0EmptiesTheList) {
  const Array list = attachList();
  feed(setLogPacket(-1000, {{1, {kUnity, 0, 0}}}), 0x417A);
  feed(setLogPacket(-1000, {}), 0x417A);
  EXPECT_TRUE(list.empty());
}

// A cell is its entry and its energy block: the list stops at the first cell
// whose block the packet does not hold whole.
TEST_F(Active, CellsWhoseEnergyBlockLiesPastTheEndAreNotShown) {
  const Array list = attachList();
  Bytes p = setLogPacket(-1000, {{1, {kUnity, 0, 0}}, {2, {kUnity, 0, 0}}});
  p.pop_back();
  feed(p, 0x417A);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Scrambling Code"), "1");
  // A count of 3 over the bytes of two cells moves the blocks 15 bytes on:
  // only the first cell's block still lies inside.
  p = setLogPacket(-1000, {{1, {kUnity, 0, 0}}, {2, {kUnity, 0, 0}}});
  p[15] = 3;
  feed(p, 0x417A);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Scrambling Code"), "1");
}

TEST_F(Active, TheBoundedAccessorsThrowAtTheCount) {
  const Bytes p = setLogPacket(-1000, {{1, {kUnity, 0, 0}}, {2, {kUnity, 0, 0}}});
  const BoundedList cells = CellSetLog::cells(PacketView(p));
  const BoundedList blocks = CellSetLog::energyBlocks(PacketView(p));
  EXPECT_EQ(cells.entryOffset(1), 31u);
  EXPECT_EQ(blocks.entryOffset(0), 46u);
  EXPECT_EQ(blocks.entryOffset(1), 90u);
  EXPECT_THROW(cells.entryOffset(2), ArrayOutOfBoundsException);
  EXPECT_THROW(blocks.entryOffset(2), ArrayOutOfBoundsException);
}

TEST_F(Active, A15BytePacketLeavesTheListAndAnotherCodeIsLogged) {
  const Array list = attachList();
  feed(setLogPacket(-1000, {{1, {kUnity, 0, 0}}}), 0x417A);
  log::ScopedCapture capture;
  feed(logPacket(0x417A, 15), 0x417A);
  feed(setLogPacket(-1000, {}), 0x4005);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "ActiveSet"},
                                                     {log::kWarning, "ActiveSet"},
                                                     {log::kError, "Received an unknown log message: 16389"}}));
}

// --- Detected, Monitored and Virtual Active Set ---

template <class Section>
using Unlisted = test::GsmUmtsSectionTest<Section>;
using UnlistedSets = ::testing::Types<DetectedSet, MonitoredSet, VirtualActiveSet>;

class UnlistedNames {
 public:
  template <class Section>
  static std::string GetName(int) {
    if (std::is_same_v<Section, DetectedSet>) return "DetectedSet";
    if (std::is_same_v<Section, MonitoredSet>) return "MonitoredSet";
    return "VirtualActiveSet";
  }
};
TYPED_TEST_SUITE(Unlisted, UnlistedSets, UnlistedNames);

const char* traceOf(const Base& section) {
  if (dynamic_cast<const DetectedSet*>(&section)) return "DetectedSet";
  if (dynamic_cast<const MonitoredSet*>(&section)) return "MonitoredSet";
  return "VirtualActiveSet";
}

TYPED_TEST(Unlisted, RegistersForTheSetLog) {
  EXPECT_EQ(this->section->getLogCodeArray(), std::vector<std::uint32_t>{0x417A});
  EXPECT_EQ(this->codeDict.keys(), std::vector<std::string>{"16762"});
}

TYPED_TEST(Unlisted, ShowsAnEmptyListForAnySetLog) {
  const Array list = this->attachList();
  list.append(test::D({{"Scrambling Code", test::S("1")}}));
  log::ScopedCapture capture;
  for (std::uint16_t word : {std::uint16_t{0x0001}, std::uint16_t{0x2001}, std::uint16_t{0xE0FF}}) {
    list.append(test::D({}));
    this->feed(setLogPacket(-1000, {{word, {kUnity, 0, 0}}, {0, {0, 0, 0}}}), 0x417A);
    EXPECT_TRUE(list.empty()) << word;
  }
  EXPECT_EQ(capture.lines(), test::warnings({traceOf(*this->section), traceOf(*this->section),
                                             traceOf(*this->section)}));
}

TYPED_TEST(Unlisted, ShortPacketsAndCountsPastTheEndLeaveItEmptyToo) {
  const Array list = this->attachList();
  Bytes p = setLogPacket(-1000, {{1, {kUnity, 0, 0}}});
  p[15] = 200;
  list.append(test::D({}));
  this->feed(p, 0x417A);
  EXPECT_TRUE(list.empty());
  list.append(test::D({}));
  this->feed(logPacket(0x417A, 15), 0x417A);
  EXPECT_EQ(list.size(), 1u);
}

TYPED_TEST(Unlisted, AnotherCodeIsLoggedAsUnknown) {
  this->attachList();
  log::ScopedCapture capture;
  this->feed(setLogPacket(-1000, {}), 0x4005);
  EXPECT_EQ(capture.lines(),
            test::errorsAfter(traceOf(*this->section), {"Received an unknown log message: 16389"}));
}

}  // namespace
}  // namespace corvane
