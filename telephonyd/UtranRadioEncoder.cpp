#include "telephonyd/UtranRadioEncoder.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <memory>
#include <stdexcept>
#include <string>

#include "LogGenerator/utran/records/ChannelMeasurementRecord.h"
#include "LogGenerator/utran/records/GsmNeighborRecord.h"
#include "LogGenerator/utran/records/NeighborMeasurementRecord.h"
#include "LogGenerator/utran/records/RrcStateRecord.h"
#include "LogGenerator/utran/records/ServingCellRecord.h"
#include "telephonyd/RecordWriter.h"

namespace corvane::telephonyd {

namespace {

using namespace std::chrono_literals;
using namespace corvane::utran;
using Access = SimulatedNetwork::Access;
using Cell = SimulatedNetwork::Cell;

// The record layouts are the decoders' own (LogGenerator/utran/records/).

constexpr std::uint32_t kActiveSet = 0;
constexpr std::uint32_t kMonitoredSet = 1;
constexpr std::uint32_t kDetectedSet = 2;
// Cells of the serving carrier this close to it (dB) are detected jointly.
constexpr int kJointDetectionWindow = 9;

// The DCH's transport channels: a data channel and a signalling channel; on
// FACH the phone has one.
constexpr std::array<std::uint32_t, 2> kDchTransportChannels = {1, 32};
constexpr std::array<std::uint32_t, 1> kFachTransportChannels = {1};
// The downlink CCTrCHs and the timeslots they occupy (TS1 and up are
// downlink after the switching point here).
struct Cctrch {
  std::uint32_t id;
  std::uint32_t timeslot;
};
constexpr std::array<Cctrch, 2> kDchCctrchs = {{{1, 4}, {2, 5}}};
constexpr std::array<Cctrch, 1> kFachCctrchs = {{{1, 6}}};

// The RRC states are the state numbers of the record.
std::uint32_t stateNumber(UtranRrcJourney::State state) { return static_cast<std::uint32_t>(state); }

// The cells of an access technology other than the serving one, measured ones
// first, each part strongest first.
std::vector<const Cell*> neighboursOf(const SimulatedNetwork& network, Access access) {
  std::vector<const Cell*> cells;
  for (const Cell& cell : network.cells()) {
    if (cell.access == access && !cell.serving) cells.push_back(&cell);
  }
  std::stable_sort(cells.begin(), cells.end(), [](const Cell* a, const Cell* b) {
    if (a->measured != b->measured) return a->measured;
    return a->level > b->level;
  });
  return cells;
}

const UtranRrcJourney& rrcOf(const SimulatedNetwork& network) {
  const UtranRrcJourney* rrc = network.utranRrc();
  if (!rrc) throw std::logic_error("the UTRAN radio records need the UTRAN2 network");
  return *rrc;
}

}  // namespace

// --- Schedule ---

struct UtranRadioEncoder::Report {
  std::uint16_t code;
  std::chrono::milliseconds every;
  std::optional<Bytes> (UtranRadioEncoder::*build)(const SimulatedNetwork&, std::uint64_t timestamp);
};

std::span<const UtranRadioEncoder::Report> UtranRadioEncoder::reports() {
  static constexpr std::array<Report, 5> kReports = {{
      {rrc_state::kCode, 2000ms, &UtranRadioEncoder::rrcState},
      {serving_cell::kCode, 2000ms, &UtranRadioEncoder::servingCell},
      {neighbor_measurement::kCode, 640ms, &UtranRadioEncoder::utranNeighbours},
      {gsm_neighbor::kCode, 1280ms, &UtranRadioEncoder::gsmNeighbours},
      {channel_measurement::kCode, 1000ms, &UtranRadioEncoder::channelMeasurements},
  }};
  static_assert(std::all_of(kReports.begin(), kReports.end(),
                            [](const Report& r) { return r.every % LogCodeSimulator::kPeriod == 0ms; }),
                "reports fall on period starts");
  return kReports;
}

void UtranRadioEncoder::encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
                               std::vector<SourcePacket>& out) {
  const UtranRrcJourney& rrc = rrcOf(network);
  const bool changed = network.cellChanges() != reportedCellChanges_ || rrc.changes() != reportedStateChanges_;
  reportedCellChanges_ = network.cellChanges();
  reportedStateChanges_ = rrc.changes();
  for (const Report& report : reports()) {
    if (!changed && period % LogCodeSimulator::periodsIn(report.every) != 0) continue;
    if (auto packet = (this->*report.build)(network, timestamp)) {
      out.push_back({std::make_shared<const Bytes>(std::move(*packet)), report.code});
    }
  }
}

// --- Records ---

std::optional<Bytes> UtranRadioEncoder::rrcState(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace rrc_state;
  RecordWriter record(kExpectedLength);
  record.put(kVersion, kUnderstoodVersion);
  record.put(kState, stateNumber(rrcOf(network).state()));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> UtranRadioEncoder::servingCell(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace serving_cell;
  const Cell& serving = network.servingCell();
  RecordWriter record(kMinimumLength);
  record.put(kAccessRestrictions, 0);
  record.put(kUraId, unsignedOf(network.utranRegistrationArea(serving)));
  // A TDD carrier: the same UARFCN up and down.
  record.put(kUplinkUarfcn, unsignedOf(serving.channel));
  record.put(kDownlinkUarfcn, unsignedOf(serving.channel));
  record.put(kCellId, unsignedOf(serving.cellId));
  record.put(kAllowedAccess, 0);  // all calls
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> UtranRadioEncoder::utranNeighbours(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace neighbor_measurement;
  const Cell& serving = network.servingCell();
  std::vector<const Cell*> cells = {&serving};
  for (const Cell* cell : neighboursOf(network, Access::UTRAN2)) cells.push_back(cell);
  RecordWriter record(kCells.first + kCells.entrySize * cells.size());
  record.put(kCount, static_cast<std::uint32_t>(cells.size()));
  for (std::size_t i = 0; i < cells.size(); ++i) {
    const Cell& cell = *cells[i];
    const std::size_t at = kCells.first + kCells.entrySize * i;
    const std::uint32_t set = cell.serving ? kActiveSet : cell.measured ? kMonitoredSet : kDetectedSet;
    const bool jointlyDetected = cell.measured && cell.channel == serving.channel &&
                                 cell.level >= serving.level - kJointDetectionWindow;
    record.put(kUarfcn.at(at), unsignedOf(cell.channel));
    record.put(kCellId.at(at), unsignedOf(cell.code));
    record.put(kFilteredRscp.at(at), cell.measured ? unsignedOf(-cell.level) : 0);
    record.put(kSet.at(at), set);
    record.put(kInJdcs.at(at), jointlyDetected ? 1 : 0);
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> UtranRadioEncoder::gsmNeighbours(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace gsm_neighbor;
  std::vector<const Cell*> cells;
  for (const Cell* cell : neighboursOf(network, Access::GSM)) {
    if (cell->measured) cells.push_back(cell);
  }
  RecordWriter record(kCells.first + kCells.entrySize * cells.size());
  record.put(kCount, static_cast<std::uint32_t>(cells.size()));
  for (std::size_t i = 0; i < cells.size(); ++i) {
    const Cell& cell = *cells[i];
    const std::size_t at = kCells.first + kCells.entrySize * i;
    record.put(kCellId.at(at), unsignedOf(cell.cellId));
    record.put(kBandIndicator.at(at), 0);  // GSM 900
    record.put(kBsicValid.at(at), 1);
    record.put(kNcc.at(at), unsignedOf(cell.code >> 3));
    record.put(kBcc.at(at), unsignedOf(cell.code & 7));
    record.put(kArfcn.at(at), unsignedOf(cell.channel));
    record.put(kRssi.at(at).field, kRssi.rawFor(cell.level));
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> UtranRadioEncoder::channelMeasurements(const SimulatedNetwork& network,
                                                            std::uint64_t timestamp) {
  using namespace channel_measurement;
  const UtranRrcJourney& rrc = rrcOf(network);
  if (!rrc.hasTransportChannels()) return std::nullopt;
  const bool dch = rrc.state() == UtranRrcJourney::State::Dch;
  const std::span<const std::uint32_t> channels = dch ? std::span<const std::uint32_t>(kDchTransportChannels)
                                                      : std::span<const std::uint32_t>(kFachTransportChannels);
  const std::span<const Cctrch> cctrchList =
      dch ? std::span<const Cctrch>(kDchCctrchs) : std::span<const Cctrch>(kFachCctrchs);
  const auto transportChannels = static_cast<std::uint32_t>(channels.size());
  const records::EntryList cctrchEntries = cctrchs(transportChannels);
  RecordWriter record(cctrchEntries.first + cctrchEntries.entrySize * cctrchList.size());
  record.put(kTransportChannelCount, transportChannels);
  record.put(kCctrchCount, static_cast<std::uint32_t>(cctrchList.size()));

  // Errors grow as the serving cell weakens: none above -80 dBm, some percent
  // below, with the record's own scatter; the SIR follows the Ec/N0.
  const Cell& serving = network.servingCell();
  const std::uint64_t n = channelRecords_++;
  const int weakness = std::max(0, -80 - serving.level);
  for (std::size_t i = 0; i < channels.size(); ++i) {
    const std::size_t at = kTransportChannels.first + kTransportChannels.entrySize * i;
    const int bler = std::min(100, weakness / 3 + static_cast<int>((n + i) % 3));
    record.put(kTrchId.at(at), channels[i]);
    record.put(kTrchBler.at(at), unsignedOf(bler));
  }
  for (std::size_t c = 0; c < cctrchList.size(); ++c) {
    const std::size_t at = cctrchEntries.first + cctrchEntries.entrySize * c;
    record.put(kCctrchId.at(at), cctrchList[c].id);
    record.put(kTimeslot.at(at), cctrchList[c].timeslot);
    for (std::size_t v = 0; v < kSirCount; ++v) {
      const int sir = std::clamp(serving.quality + 24 + static_cast<int>((n + c + v) % 4), 0, 40);
      record.put(kSir.at(at + kSirValues.first + kSirValues.entrySize * v), unsignedOf(sir));
    }
  }
  return record.packet(kCode, timestamp);
}

}  // namespace corvane::telephonyd
