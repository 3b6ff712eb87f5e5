#include "LogGenerator/lte/ReselectionCandidatesList.h"

#include <array>

#include "LogGenerator/logcode/Rows.h"

namespace corvane {

namespace {

using namespace lte::reselection;
using Candidate = ReselectionCandidatesList::Candidate;

constexpr RowField kLteRows[] = {{"E ARFCN", kLteEarfcn}, {"Cell ID", kLteCellId}};
constexpr RowField kUtranRows[] = {{"U ARFCN", kUtranUarfcn}, {"PSC", kUtranPsc}};
constexpr RowField kGeranRows[] = {{"ARFCN", kGeranArfcn}, {"Band", kGeranBand}, {"BSIC ID", kGeranBsic}};
constexpr RowField kCdmaRows[] = {{"Band", kCdmaBand}, {"Channel", kCdmaChannel}, {"Pilot", kCdmaPilot}};

// Every row begins with these two.
constexpr std::string_view kPriorityRow = "Candidate Priority";
constexpr std::string_view kRatTypeRow = "Candidate RAT Type";

RowShape shapeOf(std::span<const RowField> rows) {
  std::vector<RowField> all = {{kPriorityRow, kPriority}, {kRatTypeRow, kTechnology}};
  all.insert(all.end(), rows.begin(), rows.end());
  return RowShape(all);
}

struct CandidateTechnology {
  std::uint32_t value;
  std::string_view ratType;
  // How far from the candidate's start its fields reach.
  std::size_t extent;
  std::span<const RowField> rows;
  // Every row of such a candidate, in the order written.
  RowShape shape;
};

const std::array<CandidateTechnology, 5> kTechnologies = {{
    {kLte, "LTE", kLteSize, kLteRows, shapeOf(kLteRows)},
    {kUtran, "UTRAN", kUtranSize, kUtranRows, shapeOf(kUtranRows)},
    {kGeran, "GERAN", kGeranSize, kGeranRows, shapeOf(kGeranRows)},
    {kCdma1xRtt, "CDMA1XRTT", kCdmaSize, kCdmaRows, shapeOf(kCdmaRows)},
    {kCdmaHrpd, "CDMAHRPD", kCdmaSize, kCdmaRows, shapeOf(kCdmaRows)},
}};
// A technology the list does not know shows this and no further rows.
const CandidateTechnology kUnknownTechnology = {0, "??", kHeaderSize, {}, shapeOf({})};

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
  return {kLteEarfcn.raw(packet_, offset_), kLteCellId.raw(packet_, offset_)};
}

ReselectionCandidatesList::UtranFields Candidate::utran() const {
  require(technology() == kUtran);
  return {kUtranUarfcn.raw(packet_, offset_), kUtranPsc.raw(packet_, offset_)};
}

ReselectionCandidatesList::GeranFields Candidate::geran() const {
  require(technology() == kGeran);
  return {kGeranArfcn.raw(packet_, offset_), kGeranBand.raw(packet_, offset_), kGeranBsic.raw(packet_, offset_)};
}

ReselectionCandidatesList::CdmaFields Candidate::cdma() const {
  require(technology() == kCdma1xRtt || technology() == kCdmaHrpd);
  return {kCdmaBand.raw(packet_, offset_), kCdmaChannel.raw(packet_, offset_), kCdmaPilot.raw(packet_, offset_)};
}

// --- The section ---

void ReselectionCandidatesList::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("Reselection Candidates List", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  const Candidates candidates(*packet);
  if (candidates.listedCount() == 0) return;
  std::vector<Value> rows;
  rows.reserve(candidates.listedCount());
  for (std::uint8_t i = 0; i < candidates.listedCount(); ++i) {
    const Candidate candidate = candidates.candidate(i);
    if (!entryInside(*packet, candidate.offset(), kHeaderSize)) break;
    const CandidateTechnology& technology = technologyOf(candidate);
    if (!entryInside(*packet, candidate.offset(), technology.extent)) break;
    RowWriter row = technology.shape.makeRow();
    row.set(kPriorityRow, decimalText(candidate.priority()));
    row.set(kRatTypeRow, technology.ratType);
    writeRows(row, technology.rows, *packet, candidate.offset());
    rows.push_back(row.value());
  }
  list.install(Array(std::move(rows)));
}

}  // namespace corvane
