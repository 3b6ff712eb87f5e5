// "Equivalent PLMN List": networks of six one-digit bytes each, one every 3
// bytes, so that neighbouring networks share three bytes.

#include "LogGenerator/gsm_umts/EquivalentPLMNList.h"

#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::logPacket;
using test::rowAt;
using test::rowText;
using test::S;

using EquivalentPlmns = test::GsmUmtsSectionTest<EquivalentPLMNList>;

// The count at 16, then the digit bytes from 17.
Bytes networksPacket(std::uint8_t count, std::initializer_list<std::uint8_t> digits) {
  Bytes p = logPacket(0x7150, 17 + digits.size());
  p[16] = count;
  std::size_t at = 17;
  for (std::uint8_t d : digits) p[at++] = d;
  return p;
}

// Network 0 reads bytes 17-22, network 1 bytes 20-25: MCC from the even
// bytes of its six, MNC from the odd ones.
const Bytes kTwoNetworks = networksPacket(2, {2, 0, 6, 0, 0, 1, 3, 5, 7});

TEST_F(EquivalentPlmns, RegistersUnderItsNameForItsOneCode) {
  EXPECT_EQ(classDict.at("Equivalent PLMN List"), section);
  EXPECT_EQ(section->getLogCodeArray(), std::vector<std::uint32_t>{0x7150});
  EXPECT_EQ(codeDict.keys(), std::vector<std::string>{"29008"});
}

TEST_F(EquivalentPlmns, TwoNetworksReadBytes17To22And20To25) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(kTwoNetworks, 0x7150);
  ASSERT_EQ(list.size(), 2u);
  // 17: 2, 19: 6, 21: 0 → 260; 18: 0, 20: 0, 22: 1 → 1.
  EXPECT_EQ(list.at(0), D({{"Mobile Country Code", S("260")}, {"Mobile Network Code", S("1")}}));
  // 20: 0, 22: 1, 24: 5 → 15; 21: 0, 23: 3, 25: 7 → 37.
  EXPECT_EQ(list.at(1), D({{"Mobile Country Code", S("15")}, {"Mobile Network Code", S("37")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Equivalent PLMN List"}));
}

TEST_F(EquivalentPlmns, TheSharedBytesCountForBothNetworks) {
  const Array list = attachList();
  Bytes p = kTwoNetworks;
  p[20] = 9;  // MNC tens of network 0, MCC hundreds of network 1
  feed(p, 0x7150);
  EXPECT_EQ(rowText(rowAt(list, 0), "Mobile Network Code"), "91");
  EXPECT_EQ(rowText(rowAt(list, 1), "Mobile Country Code"), "915");
  p = kTwoNetworks;
  p[17] = 4;  // network 0 only
  p[25] = 8;  // network 1 only
  feed(p, 0x7150);
  EXPECT_EQ(rowText(rowAt(list, 0), "Mobile Country Code"), "460");
  EXPECT_EQ(rowText(rowAt(list, 1), "Mobile Network Code"), "38");
  EXPECT_EQ(rowText(rowAt(list, 0), "Mobile Network Code"), "1");
}

TEST_F(EquivalentPlmns, DigitBytesAboveNineAreTakenAsTheyCome) {
  const Array list = attachList();
  feed(networksPacket(1, {255, 255, 255, 255, 255, 255}), 0x7150);
  EXPECT_EQ(rowText(rowAt(list, 0), "Mobile Country Code"), "28305");
  EXPECT_EQ(rowText(rowAt(list, 0), "Mobile Network Code"), "28305");
}

TEST_F(EquivalentPlmns, ACountOf0EmptiesTheList) {
  const Array list = attachList();
  feed(kTwoNetworks, 0x7150);
  feed(networksPacket(0, {2, 0, 6, 0, 0, 1}), 0x7150);
  EXPECT_TRUE(list.empty());
}

// A network reads 6 bytes: one that the packet does not hold whole is not
// shown, nor any behind it.
TEST_F(EquivalentPlmns, NetworksACountPlacesPastTheEndAreNotShown) {
  const Array list = attachList();
  Bytes p = kTwoNetworks;
  p[16] = 3;  // network 2 would read 23-28
  feed(p, 0x7150);
  EXPECT_EQ(list.size(), 2u);
  // Three bytes a network: the last one's digits run 3 bytes past the packet.
  feed(networksPacket(2, {2, 0, 6, 0, 0, 1}), 0x7150);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Mobile Country Code"), "260");
  feed(networksPacket(1, {2, 0, 6, 0, 0}), 0x7150);
  EXPECT_TRUE(list.empty());
}

TEST_F(EquivalentPlmns, TheAccessorGivesNoNetworkAtOrBeyondTheCountInsteadOfThrowing) {
  const PacketView packet(kTwoNetworks);
  EXPECT_EQ(EquivalentPLMNList::network(packet, 0), std::optional<std::size_t>(17));
  EXPECT_EQ(EquivalentPLMNList::network(packet, 1), std::optional<std::size_t>(20));
  EXPECT_EQ(EquivalentPLMNList::network(packet, 2), std::nullopt);
  EXPECT_EQ(EquivalentPLMNList::network(packet, 300), std::nullopt);
}

TEST_F(EquivalentPlmns, A16BytePacketLeavesTheListAndAnotherCodeIsLogged) {
  const Array list = attachList();
  feed(kTwoNetworks, 0x7150);
  log::ScopedCapture capture;
  Bytes p = kTwoNetworks;
  p.resize(16);
  feed(p, 0x7150);
  feed(kTwoNetworks, 0x7135);
  EXPECT_EQ(list.size(), 2u);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Equivalent PLMN List"},
                                                     {log::kWarning, "Equivalent PLMN List"},
                                                     {log::kError, "Received an unknown log message: 28981"}}));
}

}  // namespace
}  // namespace corvane
