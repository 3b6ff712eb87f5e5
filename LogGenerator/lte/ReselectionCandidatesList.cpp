#include "LogGenerator/lte/ReselectionCandidatesList.h"

#include <array>

#include "LogGenerator/lte/LteConversions.h"
#include "LogGenerator/lte/LteLists.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using Candidate = ReselectionCandidatesList::Candidate;

constexpr std::size_t kMinimumLength = 21;

void setLteRows(const Candidate& candidate, lte::RowWriter& row) {
  const auto fields = candidate.lte();
  row.set("E ARFCN", lte::decimalText(fields.earfcn));
  row.set("Cell ID", lte::decimalText(fields.cellId));
}

void setUtranRows(const Candidate& candidate, lte::RowWriter& row) {
  const auto fields = candidate.utran();
  row.set("U ARFCN", lte::decimalText(fields.uarfcn));
  row.set("PSC", lte::decimalText(fields.psc));
}

void setGeranRows(const Candidate& candidate, lte::RowWriter& row) {
  const auto fields = candidate.geran();
  row.set("ARFCN", lte::decimalText(fields.arfcn));
  row.set("Band", lte::decimalText(fields.band));
  row.set("BSIC ID", lte::decimalText(fields.bsicId));
}

void setCdmaRows(const Candidate& candidate, lte::RowWriter& row) {
  const auto fields = candidate.cdma();
  row.set("Band", lte::decimalText(fields.band));
  row.set("Channel", lte::decimalText(fields.channel));
  row.set("Pilot", lte::decimalText(fields.pilot));
}

struct CandidateTechnology {
  std::uint32_t value;
  std::string_view ratType;
  // How far from the candidate's start its fields reach.
  std::size_t extent;
  void (*setRows)(const Candidate&, lte::RowWriter&);
  // Every row of such a candidate, in the order written.
  lte::RowShape shape;
};

const std::array<CandidateTechnology, 5> kTechnologies = {{
    {Candidate::kLte, "LTE", 8, setLteRows,
     {"Candidate Priority", "Candidate RAT Type", "E ARFCN", "Cell ID"}},
    {Candidate::kUtran, "UTRAN", 8, setUtranRows,
     {"Candidate Priority", "Candidate RAT Type", "U ARFCN", "PSC"}},
    {Candidate::kGeran, "GERAN", 8, setGeranRows,
     {"Candidate Priority", "Candidate RAT Type", "ARFCN", "Band", "BSIC ID"}},
    {Candidate::kCdma1xRtt, "CDMA1XRTT", 12, setCdmaRows,
     {"Candidate Priority", "Candidate RAT Type", "Band", "Channel", "Pilot"}},
    {Candidate::kCdmaHrpd, "CDMAHRPD", 12, setCdmaRows,
     {"Candidate Priority", "Candidate RAT Type", "Band", "Channel", "Pilot"}},
}};
// A technology the list does not know shows this and no further rows.
const CandidateTechnology kUnknownTechnology = {0, "??", Candidate::kHeaderSize, nullptr,
                                                {"Candidate Priority", "Candidate RAT Type"}};

const CandidateTechnology& technologyOf(const Candidate& candidate) {
  for (const auto& technology : kTechnologies) {
    if (technology.value == candidate.technology()) return technology;
  }
  return kUnknownTechnology;
}

}  // namespace

// --- Candidate ---

std::size_t Candidate::extent() const { return technologyOf(*this).extent; }

void Candidate::require(bool ownTechnology) const {
  if (!ownTechnology) throw ArrayOutOfBoundsException();
}

ReselectionCandidatesList::LteFields Candidate::lte() const {
  require(technology() == kLte);
  return {packet_.le16(offset_ + 4), packet_.bits16(offset_ + 6, 7, 15)};
}

ReselectionCandidatesList::UtranFields Candidate::utran() const {
  require(technology() == kUtran);
  return {packet_.le16(offset_ + 4), packet_.le16(offset_ + 6)};
}

ReselectionCandidatesList::GeranFields Candidate::geran() const {
  require(technology() == kGeran);
  return {packet_.le16(offset_ + 4), packet_.u8(offset_ + 6), packet_.u8(offset_ + 7)};
}

ReselectionCandidatesList::CdmaFields Candidate::cdma() const {
  require(technology() == kCdma1xRtt || technology() == kCdmaHrpd);
  return {packet_.u8(offset_ + 4), packet_.le16(offset_ + 8), packet_.le16(offset_ + 10)};
}

// --- The section ---

void ReselectionCandidatesList::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto accepted =
      acceptPacket("Reselection Candidates List", data, logCode, lte::kReselectionCandidatesCode, kMinimumLength);
  if (!accepted) return;
  const PacketView& packet = *accepted;
  const lte::SectionList list(*this);
  const Candidates candidates(packet);
  if (candidates.listedCount() == 0) return;
  std::vector<Value> rows;
  rows.reserve(candidates.listedCount());
  for (std::uint8_t i = 0; i < candidates.listedCount(); ++i) {
    const Candidate candidate = candidates.candidate(i);
    if (!lte::entryInside(packet, candidate.offset(), Candidate::kHeaderSize)) break;
    const CandidateTechnology& technology = technologyOf(candidate);
    if (!lte::entryInside(packet, candidate.offset(), technology.extent)) break;
    lte::RowWriter row = technology.shape.makeRow();
    row.set("Candidate Priority", lte::decimalText(candidate.priority()));
    row.set("Candidate RAT Type", technology.ratType);
    if (technology.setRows) technology.setRows(candidate, row);
    rows.push_back(row.value());
  }
  list.install(Array(std::move(rows)));
}

}  // namespace corvane
