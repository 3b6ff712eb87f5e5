// The two sections of the reselection record 0xB186: the serving cell it
// refers to, and the candidates, which begin 4 bytes apart and overlap.

#include "LogGenerator/lte/ReselectionCandidatesList.h"

#include <algorithm>

#include "LogGenerator/lte/ReselectionCandidatesMisc.h"
#include "lte/LteSectionFixture.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::D;
using test::logPacket;
using test::put16;
using test::rowAt;
using test::rowText;
using test::S;

using Candidate = ReselectionCandidatesList::Candidate;
using Candidates = ReselectionCandidatesList::Candidates;

// A record of `size` bytes with the given 16-bit count; candidates are poked in
// by the tests at 21 + 4 i.
Bytes reselectionPacket(std::uint16_t count, std::size_t size) {
  Bytes p = logPacket(0xB186, std::max<std::size_t>(size, 21));
  p[13] = 4;
  put16(p, 15, 5230);
  put16(p, 17, 88);
  put16(p, 19, count);
  p.resize(size);
  return p;
}

// --- Reselection Candidates ---

using ReselectionMisc = test::LteSectionTest<ReselectionCandidatesMisc>;

TEST_F(ReselectionMisc, WritesVersionServingEarfcnAndCellId) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(reselectionPacket(0, 21), 0xB186);
  EXPECT_EQ(Value(rows), D({{"Version", S("4")}, {"Serving EARFCN", S("5230")}, {"Serving Cell ID", S("88")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Reselection Candidates"}));
}

TEST_F(ReselectionMisc, A20BytePacketIsDroppedAndAnotherCodeLogged) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(reselectionPacket(0, 20), 0xB186);
  feed(reselectionPacket(0, 21), 0xB180);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Reselection Candidates"},
                                                     {log::kWarning, "Reselection Candidates"},
                                                     {log::kError, "Received an unknown log message: 45440"}}));
}

// --- Reselection Candidates List ---

using ReselectionList = test::LteSectionTest<ReselectionCandidatesList>;

TEST_F(ReselectionList, EachTechnologyShowsItsOwnRows) {
  const Array list = attachList();
  // Four candidates 12 bytes apart, so that none overlaps the next one read:
  // the list reads candidates 0, 3, 6 and 9 of a count of 10.
  Bytes p = reselectionPacket(10, 21 + 4 * 9 + 12);
  auto candidateAt = [&](std::size_t n) { return 21 + 4 * n; };
  const std::size_t lteAt = candidateAt(0), utranAt = candidateAt(3), geranAt = candidateAt(6),
                    cdmaAt = candidateAt(9);
  put16(p, lteAt, 7);
  put16(p, lteAt + 2, 0);
  put16(p, lteAt + 4, 1850);
  put16(p, lteAt + 6, static_cast<std::uint16_t>((300u << 7) | 0x7F));
  put16(p, utranAt, 5);
  put16(p, utranAt + 2, 1);
  put16(p, utranAt + 4, 10700);
  put16(p, utranAt + 6, 411);
  put16(p, geranAt, 3);
  put16(p, geranAt + 2, 2);
  put16(p, geranAt + 4, 512);
  p[geranAt + 6] = 1;
  p[geranAt + 7] = 63;
  put16(p, cdmaAt, 1);
  put16(p, cdmaAt + 2, 4);
  p[cdmaAt + 4] = 15;
  put16(p, cdmaAt + 8, 283);
  put16(p, cdmaAt + 10, 168);
  feed(p, 0xB186);
  ASSERT_EQ(list.size(), 10u);
  EXPECT_EQ(Value(rowAt(list, 0)), D({{"Candidate Priority", S("7")},
                                      {"Candidate RAT Type", S("LTE")},
                                      {"E ARFCN", S("1850")},
                                      {"Cell ID", S("300")}}));
  EXPECT_EQ(Value(rowAt(list, 3)), D({{"Candidate Priority", S("5")},
                                      {"Candidate RAT Type", S("UTRAN")},
                                      {"U ARFCN", S("10700")},
                                      {"PSC", S("411")}}));
  EXPECT_EQ(Value(rowAt(list, 6)), D({{"Candidate Priority", S("3")},
                                      {"Candidate RAT Type", S("GERAN")},
                                      {"ARFCN", S("512")},
                                      {"Band", S("1")},
                                      {"BSIC ID", S("63")}}));
  EXPECT_EQ(Value(rowAt(list, 9)), D({{"Candidate Priority", S("1")},
                                      {"Candidate RAT Type", S("CDMAHRPD")},
                                      {"Band", S("15")},
                                      {"Channel", S("283")},
                                      {"Pilot", S("168")}}));
}

TEST_F(ReselectionList, A1xRttCandidateReadsLikeAnHrpdOne) {
  const Array list = attachList();
  Bytes p = reselectionPacket(1, 21 + 12);
  put16(p, 23, 3);
  p[25] = 2;
  put16(p, 29, 384);
  put16(p, 31, 12);
  feed(p, 0xB186);
  EXPECT_EQ(Value(rowAt(list, 0)), D({{"Candidate Priority", S("0")},
                                      {"Candidate RAT Type", S("CDMA1XRTT")},
                                      {"Band", S("2")},
                                      {"Channel", S("384")},
                                      {"Pilot", S("12")}}));
}

TEST_F(ReselectionList, TheSixteenBitCount0x0102ListsTwoCandidates) {
  const Array list = attachList();
  Bytes p = reselectionPacket(0x0102, 21 + 4 + 8);
  feed(p, 0xB186);
  EXPECT_EQ(list.size(), 2u);
}

TEST_F(ReselectionList, ACandidateOfTechnology7ShowsOnlyPriorityAndQuestionMarks) {
  const Array list = attachList();
  Bytes p = reselectionPacket(1, 21 + 12);
  put16(p, 21, 6);
  put16(p, 23, 7);
  put16(p, 25, 1850);
  feed(p, 0xB186);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(Value(rowAt(list, 0)), D({{"Candidate Priority", S("6")}, {"Candidate RAT Type", S("??")}}));
}

// Candidates begin 4 bytes apart: the second one's header is the first one's
// E ARFCN and Cell ID field.
TEST_F(ReselectionList, TheSecondOfTwoLteCandidatesTakesItsPriorityFromTheFirstOnesEArfcn) {
  const Array list = attachList();
  Bytes p = reselectionPacket(2, 21 + 4 + 8);
  put16(p, 21, 7);      // first: priority
  put16(p, 23, 0);      // first: LTE
  put16(p, 25, 1850);   // first: E ARFCN = second: priority
  put16(p, 27, 0);      // first: Cell ID bits = second: LTE
  put16(p, 29, 2600);   // second: E ARFCN
  put16(p, 31, 45u << 7);
  feed(p, 0xB186);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(rowText(rowAt(list, 0), "E ARFCN"), "1850");
  EXPECT_EQ(rowText(rowAt(list, 1), "Candidate Priority"), "1850");
  EXPECT_EQ(rowText(rowAt(list, 1), "Candidate RAT Type"), "LTE");
  EXPECT_EQ(rowText(rowAt(list, 1), "E ARFCN"), "2600");
  EXPECT_EQ(rowText(rowAt(list, 1), "Cell ID"), "45");
}

TEST_F(ReselectionList, ACountOfZeroEmptiesTheList) {
  const Array list = attachList();
  feed(reselectionPacket(1, 21 + 8), 0xB186);
  ASSERT_EQ(list.size(), 1u);
  log::ScopedCapture capture;
  feed(reselectionPacket(0x0100, 21 + 8), 0xB186);
  EXPECT_TRUE(list.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"Reselection Candidates List"}));
}

// The list stops at the last candidate whose fields lie wholly inside the
// packet; how far that is depends on the candidate's technology.
TEST_F(ReselectionList, CandidatesACountPlacesPastTheEndAreNotShown) {
  const Array list = attachList();
  // Candidate 0 (LTE) needs bytes 21-28, candidate 1 (CDMA) 25-36: one short.
  Bytes p = reselectionPacket(3, 36);
  put16(p, 23, 0);
  put16(p, 25, 9);
  put16(p, 27, 3);
  feed(p, 0xB186);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Candidate RAT Type"), "LTE");
  // One byte more holds the CDMA candidate and the LTE one behind it.
  p.push_back(0);
  feed(p, 0xB186);
  ASSERT_EQ(list.size(), 3u);
  EXPECT_EQ(rowText(rowAt(list, 1), "Candidate RAT Type"), "CDMA1XRTT");
  EXPECT_EQ(rowText(rowAt(list, 2), "Candidate RAT Type"), "LTE");
}

TEST_F(ReselectionList, ARecordWithNoCandidateBytesShowsNone) {
  const Array list = attachList();
  feed(reselectionPacket(1, 21 + 8), 0xB186);
  ASSERT_EQ(list.size(), 1u);
  feed(reselectionPacket(1, 21), 0xB186);
  EXPECT_TRUE(list.empty());
}

TEST_F(ReselectionList, A20BytePacketLeavesTheListAndAnotherCodeIsLogged) {
  const Array list = attachList();
  feed(reselectionPacket(1, 21 + 8), 0xB186);
  log::ScopedCapture capture;
  feed(reselectionPacket(1, 20), 0xB186);
  feed(reselectionPacket(1, 21 + 8), 0xB17F);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Reselection Candidates List"},
                                                     {log::kWarning, "Reselection Candidates List"},
                                                     {log::kError, "Received an unknown log message: 45439"}}));
}

// --- The bounded candidate accessor ---

TEST(ReselectionCandidateAccessor, ThrowsAtOrBeyondTheFullSixteenBitCount) {
  const Bytes p = reselectionPacket(0x0102, 21);
  const Candidates candidates{PacketView(p)};
  EXPECT_EQ(candidates.count(), 0x0102u);
  EXPECT_EQ(candidates.listedCount(), 2u);
  EXPECT_EQ(candidates.candidate(0x0101).offset(), 21u + 4u * 0x0101u);
  EXPECT_THROW(candidates.candidate(0x0102), ArrayOutOfBoundsException);
  EXPECT_THROW(candidates.candidate(0xFFFF), ArrayOutOfBoundsException);
}

TEST(ReselectionCandidateAccessor, ThrowsForTheFieldsOfAnotherTechnology) {
  Bytes p = reselectionPacket(5, 21 + 4 * 4 + 12);
  for (std::uint16_t i = 0; i < 5; ++i) put16(p, 21 + 4 * i + 2, i);
  // Candidate i's technology, at 23 + 4 i, is also the field at +6 of the
  // candidate before it; the five candidates are of technologies 0 to 4.
  const Candidates candidates{PacketView(p)};
  const Candidate lte = candidates.candidate(0);
  ASSERT_EQ(lte.technology(), Candidate::kLte);
  EXPECT_NO_THROW(lte.lte());
  EXPECT_THROW(lte.utran(), ArrayOutOfBoundsException);
  EXPECT_THROW(lte.geran(), ArrayOutOfBoundsException);
  EXPECT_THROW(lte.cdma(), ArrayOutOfBoundsException);
  const Candidate utran = candidates.candidate(1);
  ASSERT_EQ(utran.technology(), Candidate::kUtran);
  EXPECT_NO_THROW(utran.utran());
  EXPECT_THROW(utran.lte(), ArrayOutOfBoundsException);
  const Candidate geran = candidates.candidate(2);
  ASSERT_EQ(geran.technology(), Candidate::kGeran);
  EXPECT_NO_THROW(geran.geran());
  EXPECT_THROW(geran.cdma(), ArrayOutOfBoundsException);
  EXPECT_NO_THROW(candidates.candidate(3).cdma());
  EXPECT_NO_THROW(candidates.candidate(4).cdma());
  EXPECT_THROW(candidates.candidate(4).geran(), ArrayOutOfBoundsException);
}

TEST(ReselectionCandidateAccessor, AnUnknownTechnologyHasNoFieldsAtAll) {
  Bytes p = reselectionPacket(1, 21 + 12);
  put16(p, 23, 9);
  const Candidate unknown = Candidates{PacketView(p)}.candidate(0);
  EXPECT_EQ(unknown.extent(), Candidate::kHeaderSize);
  EXPECT_THROW(unknown.lte(), ArrayOutOfBoundsException);
  EXPECT_THROW(unknown.utran(), ArrayOutOfBoundsException);
  EXPECT_THROW(unknown.geran(), ArrayOutOfBoundsException);
  EXPECT_THROW(unknown.cdma(), ArrayOutOfBoundsException);
}

}  // namespace
}  // namespace corvane
