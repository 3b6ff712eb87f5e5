#include "telephonyd/LteRadioEncoder.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <cmath>
#include <memory>
#include <span>
#include <stdexcept>
#include <string>

#include "LogGenerator/lte/records/IntraFrequencyMeasurementRecord.h"
#include "LogGenerator/lte/records/NeighborMeasurementRecord.h"
#include "LogGenerator/lte/records/ReselectionCandidatesRecord.h"
#include "LogGenerator/lte/records/ServingCellIdentityRecord.h"
#include "LogGenerator/lte/records/ServingCellMeasurementRecord.h"
#include "telephonyd/LogRecord.h"
#include "telephonyd/RecordWriter.h"

namespace corvane::telephonyd {

namespace {

using namespace std::chrono_literals;
using Access = SimulatedNetwork::Access;
using Cell = SimulatedNetwork::Cell;

// The record layouts are the decoders' own (LogGenerator/lte/records/);
// values in dBm and dB go in through the fields' conversions.

constexpr std::uint32_t kRecordVersion = 1;

// --- The network's settings ---

// What the cells of each band broadcast for idle mode, and their antennas.
struct Layer {
  int band;
  int priority;  // cell reselection priority, 0-7
  int qrxlevmin;
  int pMax;
  int sIntraSearch;
  int sNonIntraSearch;
  int txAntennas;
};

constexpr std::array<Layer, 3> kLayers = {{
    // band, priority, Qrxlevmin dBm, P-Max dBm, S-IntraSearch dB, S-NonIntraSearch dB, Tx antennas
    {3, 5, -124, 23, 46, 10, 2},
    {7, 6, -124, 23, 46, 10, 2},
    {20, 3, -124, 23, 46, 10, 2},
}};

const Layer& layerOf(const Cell& cell) {
  for (const Layer& layer : kLayers) {
    if (layer.band == cell.band) return layer;
  }
  throw std::logic_error("no LTE layer settings for band " + std::to_string(cell.band));
}

constexpr int kUePowerClassDbm = 23;  // the UE's maximum output power, power class 3

// The technology values of 0xB186's candidates.
struct CandidateTechnology {
  Access access;
  std::uint32_t value;
};

constexpr std::array<CandidateTechnology, 3> kCandidateTechnologies = {{
    {Access::LTE, 0},
    {Access::UMTS, 1},
    {Access::GSM, 2},
}};

std::uint32_t candidateTechnology(Access access) {
  for (const CandidateTechnology& technology : kCandidateTechnologies) {
    if (technology.access == access) return technology.value;
  }
  throw std::logic_error("no reselection candidate technology for this access");
}

// The reselection priority of the other access technologies' layers, below LTE's.
struct InterRatLayer {
  Access access;
  int priority;
};

constexpr std::array<InterRatLayer, 2> kInterRatLayers = {{
    {Access::UMTS, 2},
    {Access::GSM, 1},
}};

int interRatPriority(Access access) {
  for (const InterRatLayer& layer : kInterRatLayers) {
    if (layer.access == access) return layer.priority;
  }
  throw std::logic_error("no reselection priority for this access");
}

constexpr std::uint64_t kInterRatCandidateEvery = 5;  // records

// Srxlev in whole dB: the RSRP, rounded down, above the layer's minimum.
int srxlevOf(const Cell& cell) { return static_cast<int>(std::floor(cell.rsrp)) - layerOf(cell).qrxlevmin; }

// The baseband's frequency and timing offsets of a neighbour, which the
// network does not model: each cell keeps a fixed set derived from its PCI.
std::uint32_t frequencyOffsetOf(const Cell& cell) { return static_cast<std::uint32_t>(cell.code * 37 % 200); }
std::uint32_t frameOffsetOf(const Cell& cell) { return static_cast<std::uint32_t>(cell.code * 389 % 1024); }
std::uint32_t sampleOffsetOf(const Cell& cell) { return static_cast<std::uint32_t>(cell.code * 7919 % 307200); }

// The LTE neighbours on a channel, strongest first; `measured` picks the
// measured ones or the unmeasured ones.
std::vector<const Cell*> neighboursOn(const SimulatedNetwork& network, int channel, bool measured) {
  std::vector<const Cell*> cells;
  for (const Cell& cell : network.cells()) {
    if (cell.access == Access::LTE && !cell.serving && cell.channel == channel && cell.measured == measured) {
      cells.push_back(&cell);
    }
  }
  std::stable_sort(cells.begin(), cells.end(), [](const Cell* a, const Cell* b) { return a->rsrp > b->rsrp; });
  return cells;
}

// The channels of the LTE neighbours, in the order of the network's cells.
std::vector<int> neighbourChannels(const SimulatedNetwork& network) {
  std::vector<int> channels;
  for (const Cell& cell : network.cells()) {
    if (cell.access != Access::LTE || cell.serving) continue;
    if (std::find(channels.begin(), channels.end(), cell.channel) == channels.end()) channels.push_back(cell.channel);
  }
  return channels;
}

// What the 0xB179 subframe counter shows: the millisecond within the
// 10240 ms cycle of system frames.
std::uint32_t subframeNumberAt(std::uint64_t timestamp) {
  const auto milliseconds =
      std::chrono::duration_cast<std::chrono::milliseconds>(basebandMoment(timestamp).time_since_epoch()).count();
  return static_cast<std::uint32_t>(milliseconds % 10240);
}

}  // namespace

// --- Schedule ---

struct LteRadioEncoder::Report {
  std::uint16_t code;
  std::chrono::milliseconds every;
  std::optional<Bytes> (LteRadioEncoder::*build)(const SimulatedNetwork&, std::uint64_t timestamp);
};

std::span<const LteRadioEncoder::Report> LteRadioEncoder::reports() {
  // In the order the records of one period go out.
  static constexpr std::array<Report, 6> kReports = {{
      {lte::cell_identity::kCode, 2000ms, &LteRadioEncoder::servingCellIdentity},
      {lte::antenna_info::kCode, 2000ms, &LteRadioEncoder::antennaInfo},
      {lte::serving_measurement::kCode, 320ms, &LteRadioEncoder::servingCellMeasurement},
      {lte::intra_frequency::kCode, 640ms, &LteRadioEncoder::intraFrequencyMeasurement},
      {lte::neighbor_measurement::kCode, 640ms, &LteRadioEncoder::neighbourMeasurement},
      {lte::reselection::kCode, 1280ms, &LteRadioEncoder::reselectionCandidates},
  }};
  static_assert(std::all_of(kReports.begin(), kReports.end(),
                            [](const Report& r) { return r.every % LogCodeSimulator::kPeriod == 0ms; }),
                "reports fall on period starts");
  return kReports;
}

void LteRadioEncoder::encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
                             std::vector<SourcePacket>& out) {
  const bool cellChanged = network.cellChanges() != reportedCellChanges_;
  reportedCellChanges_ = network.cellChanges();
  for (const Report& report : reports()) {
    if (!cellChanged && period % LogCodeSimulator::periodsIn(report.every) != 0) continue;
    if (auto packet = (this->*report.build)(network, timestamp)) {
      out.push_back({std::make_shared<const Bytes>(std::move(*packet)), report.code});
    }
  }
}

// --- Records ---

std::optional<Bytes> LteRadioEncoder::servingCellIdentity(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace lte::cell_identity;
  const Cell& serving = network.servingCell();
  RecordWriter record(kMinimumLength);
  record.put(kVersion, kRecordVersion);
  record.put(kPhysicalCellId, static_cast<std::uint32_t>(serving.code));
  record.put(kDownlinkEarfcn, static_cast<std::uint32_t>(serving.channel));
  record.put(kUplinkEarfcn, static_cast<std::uint32_t>(serving.uplinkChannel));
  record.put(kDownlinkBandwidth, static_cast<std::uint32_t>(serving.resourceBlocks));
  record.put(kUplinkBandwidth, static_cast<std::uint32_t>(serving.resourceBlocks));
  record.put(kCellIdentity, static_cast<std::uint32_t>(serving.cellId));
  record.put(kTrackingAreaCode, static_cast<std::uint32_t>(serving.areaCode));
  record.put(kBand, static_cast<std::uint32_t>(serving.band));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> LteRadioEncoder::antennaInfo(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace lte::antenna_info;
  RecordWriter record(kMinimumLength);
  record.put(kVersion, kRecordVersion);
  record.put(kTxAntennas, static_cast<std::uint32_t>(layerOf(network.servingCell()).txAntennas));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> LteRadioEncoder::servingCellMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace lte::serving_measurement;
  const Cell& serving = network.servingCell();
  const Layer& layer = layerOf(serving);
  const int srxlev = srxlevOf(serving);
  reportsBelowZero_ = srxlev < 0 ? std::min(reportsBelowZero_ + 1, 63) : 0;
  // Bit 0: intra-frequency measurements are due; bit 1: those of the other
  // frequencies and technologies of equal or lower priority too.
  const std::uint32_t rules = (srxlev <= layer.sIntraSearch ? 1u : 0u) | (srxlev <= layer.sNonIntraSearch ? 2u : 0u);
  const bool rulesUpdated = rules != lastRules_;
  lastRules_ = rules;

  RecordWriter record(kMinimumLength);
  record.put(kVersion, kRecordVersion);
  record.put(kEarfcn, static_cast<std::uint32_t>(serving.channel));
  record.put(kPhysicalCellId, static_cast<std::uint32_t>(serving.code));
  record.put(kLayerPriority, static_cast<std::uint32_t>(layer.priority));
  record.putValue(kMeasuredRsrp, serving.rsrp);
  record.putValue(kAverageRsrp, serving.averageRsrp);
  record.putValue(kMeasuredRsrq, serving.rsrq);
  record.putValue(kAverageRsrq, serving.averageRsrq);
  record.putValue(kRssi, serving.level);
  record.putValue(kQrxlevmin, layer.qrxlevmin);
  record.putValue(kPMax, layer.pMax);
  record.putValue(kMaxUeTxPower, kUePowerClassDbm);
  record.putValue(kSrxlev, srxlev);
  record.put(kDrxCyclesBelowZero, static_cast<std::uint32_t>(reportsBelowZero_));
  record.putValue(kSIntraSearch, layer.sIntraSearch);
  record.putValue(kSNonIntraSearch, layer.sNonIntraSearch);
  record.put(kRulesUpdated, rulesUpdated ? 1 : 0);
  record.put(kRules, rules);
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> LteRadioEncoder::intraFrequencyMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace lte::intra_frequency;
  const Cell& serving = network.servingCell();
  const auto measured = neighboursOn(network, serving.channel, true);
  const auto detected = neighboursOn(network, serving.channel, false);
  RecordWriter record(kMeasuredCells.first + kMeasuredCells.entrySize * measured.size() +
                      kDetectedCellSize * detected.size());
  record.put(kVersion, kRecordVersion);
  record.put(kEarfcn, static_cast<std::uint32_t>(serving.channel));
  record.put(kServingPhysicalCellId, static_cast<std::uint32_t>(serving.code));
  record.put(kSubframeNumber, subframeNumberAt(timestamp));
  record.putValue(kServingFilteredRsrp, serving.averageRsrp);
  record.putValue(kServingFilteredRsrq, serving.averageRsrq);
  record.put(kMeasuredCount, static_cast<std::uint32_t>(measured.size()));
  record.put(kDetectedCount, static_cast<std::uint32_t>(detected.size()));
  std::size_t entry = kMeasuredCells.first;
  for (const Cell* cell : measured) {
    record.put(kNeighborPhysicalCellId.at(entry), static_cast<std::uint32_t>(cell->code));
    record.putValue(kNeighborFilteredRsrp.at(entry), cell->averageRsrp);
    record.putValue(kNeighborFilteredRsrq.at(entry), cell->averageRsrq);
    entry += kMeasuredCells.entrySize;
  }
  for (const Cell* cell : detected) {
    record.put(kDetectedPhysicalCellId.at(entry), static_cast<std::uint32_t>(cell->code));
    entry += kDetectedCellSize;
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> LteRadioEncoder::neighbourMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace lte::neighbor_measurement;
  // The frequency after the one reported last that has a measured neighbour.
  const std::vector<int> channels = neighbourChannels(network);
  const auto last = lastNeighbourChannel_ ? std::find(channels.begin(), channels.end(), *lastNeighbourChannel_)
                                          : channels.end();
  const std::size_t next = last == channels.end() ? 0 : static_cast<std::size_t>(last - channels.begin()) + 1;
  for (std::size_t i = 0; i < channels.size(); ++i) {
    const int channel = channels[(next + i) % channels.size()];
    auto cells = neighboursOn(network, channel, true);
    if (cells.empty()) continue;
    if (cells.size() > kMostCells) cells.resize(kMostCells);
    lastNeighbourChannel_ = channel;

    RecordWriter record(kCells.first + kCells.entrySize * cells.size());
    record.put(kVersion, kRecordVersion);
    record.put(kEarfcn, static_cast<std::uint32_t>(channel));
    record.putValue(kQrxlevmin, layerOf(*cells.front()).qrxlevmin);
    record.put(kCellsLessOne, static_cast<std::uint32_t>(cells.size() - 1));
    std::size_t entry = kCells.first;
    for (const Cell* cell : cells) {
      record.put(kPhysicalCellId.at(entry), static_cast<std::uint32_t>(cell->code));
      record.putValue(kRssi.at(entry), cell->level);
      record.putValue(kMeasuredRsrp.at(entry), cell->rsrp);
      record.putValue(kAverageRsrp.at(entry), cell->averageRsrp);
      record.putValue(kMeasuredRsrq.at(entry), cell->rsrq);
      record.putValue(kAverageRsrq.at(entry), cell->averageRsrq);
      record.putValue(kSrxlev.at(entry), srxlevOf(*cell));
      record.put(kFrequencyOffset.at(entry), frequencyOffsetOf(*cell));
      record.put(kFrameOffset.at(entry), frameOffsetOf(*cell));
      record.put(kSampleOffset.at(entry), sampleOffsetOf(*cell));
      entry += kCells.entrySize;
    }
    return record.packet(kCode, timestamp);
  }
  return std::nullopt;
}

std::optional<Bytes> LteRadioEncoder::reselectionCandidates(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace lte::reselection;
  const Cell& serving = network.servingCell();
  const std::uint64_t number = reselectionRecords_++;
  const auto& interRat = network.interRatNeighbours();
  const SimulatedNetwork::InterRatNeighbour* otherAccess =
      !interRat.empty() && number % kInterRatCandidateEvery == kInterRatCandidateEvery - 1
          ? &interRat[(number / kInterRatCandidateEvery) % interRat.size()]
          : nullptr;
  const Cell* strongest = nullptr;
  for (const Cell& cell : network.cells()) {
    if (cell.access == Access::LTE && !cell.serving && cell.measured && (!strongest || cell.rsrp > strongest->rsrp)) {
      strongest = &cell;
    }
  }
  const bool hasCandidate = otherAccess || strongest;

  // A candidate of any of the technologies written here takes 8 bytes.
  RecordWriter writer(kCandidates.first + (hasCandidate ? kLteSize : 0));
  writer.put(kVersion, kRecordVersion);
  writer.put(kServingEarfcn, static_cast<std::uint32_t>(serving.channel));
  writer.put(kServingCellId, static_cast<std::uint32_t>(serving.code));
  writer.put(kCount, hasCandidate ? 1 : 0);
  const std::size_t at = kCandidates.first;
  if (otherAccess) {
    writer.put(kPriority.at(at), static_cast<std::uint32_t>(interRatPriority(otherAccess->access)));
    writer.put(kTechnology.at(at), candidateTechnology(otherAccess->access));
    if (otherAccess->access == Access::UMTS) {
      writer.put(kUtranUarfcn.at(at), static_cast<std::uint32_t>(otherAccess->channel));
      writer.put(kUtranPsc.at(at), static_cast<std::uint32_t>(otherAccess->code));
    } else {
      writer.put(kGeranArfcn.at(at), static_cast<std::uint32_t>(otherAccess->channel));
      writer.put(kGeranBand.at(at), static_cast<std::uint32_t>(otherAccess->band));
      writer.put(kGeranBsic.at(at), static_cast<std::uint32_t>(otherAccess->code));
    }
  } else if (strongest) {
    writer.put(kPriority.at(at), static_cast<std::uint32_t>(layerOf(*strongest).priority));
    writer.put(kTechnology.at(at), candidateTechnology(Access::LTE));
    writer.put(kLteEarfcn.at(at), static_cast<std::uint32_t>(strongest->channel));
    writer.put(kLteCellId.at(at), static_cast<std::uint32_t>(strongest->code));
  }
  return writer.packet(kCode, timestamp);
}

}  // namespace corvane::telephonyd
