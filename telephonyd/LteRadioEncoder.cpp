#include "telephonyd/LteRadioEncoder.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <cmath>
#include <memory>
#include <span>
#include <stdexcept>
#include <string>

#include "telephonyd/RecordWriter.h"

namespace corvane::telephonyd {

namespace {

using namespace std::chrono_literals;
using Access = SimulatedNetwork::Access;
using Cell = SimulatedNetwork::Cell;

// --- Record layouts: offsets from the packet's type byte ---

constexpr std::uint32_t kRecordVersion = 1;

// 0xB0C2, serving cell identity and carrier.
namespace cell_identity {
constexpr std::uint16_t kCode = 0xB0C2;
constexpr std::size_t kSize = 38;
constexpr RecordField kVersion{13, 1};
constexpr RecordField kPhysicalCellId{14, 2};
constexpr RecordField kDownlinkEarfcn{16, 2};
constexpr RecordField kUplinkEarfcn{18, 2};
constexpr RecordField kDownlinkBandwidth{20, 1};  // resource blocks
constexpr RecordField kUplinkBandwidth{21, 1};
constexpr RecordField kCellIdentity{22, 4};
constexpr RecordField kTrackingAreaCode{26, 2};
constexpr RecordField kBand{28, 4};
}  // namespace cell_identity

// 0xB0C1, antenna information; of the rest of the record nothing is read.
namespace antenna_info {
constexpr std::uint16_t kCode = 0xB0C1;
constexpr std::size_t kSize = 22;
constexpr RecordField kVersion{13, 1};
constexpr RecordField kTxAntennas{20, 1};
}  // namespace antenna_info

// 0xB17F, serving cell measurement.
namespace serving_measurement {
constexpr std::uint16_t kCode = 0xB17F;
constexpr std::size_t kSize = 33;
constexpr RecordField kVersion{13, 1};
constexpr RecordField kEarfcn{17, 2};
constexpr RecordField kPhysicalCellId{19, 2, 0, 8};
constexpr RecordField kLayerPriority{20, 1, 1, 4};
constexpr RecordField kMeasuredRsrp{21, 4, 0, 8};
constexpr RecordField kAverageRsrp{21, 4, 9, 17};
constexpr RecordField kMeasuredRsrq{21, 4, 18, 24};
constexpr RecordField kAverageRsrq{21, 4, 25, 31};
constexpr RecordField kRssi{25, 2, 0, 8};
constexpr RecordField kQrxlevmin{26, 1, 1, 6};
constexpr RecordField kPMax{25, 4, 15, 21};
constexpr RecordField kMaxUeTxPower{25, 4, 22, 27};
constexpr RecordField kSrxlev{29, 1, 0, 6};
constexpr RecordField kDrxCyclesBelowZero{29, 2, 7, 12};
constexpr RecordField kSIntraSearch{29, 4, 13, 18};
constexpr RecordField kSNonIntraSearch{29, 4, 19, 24};
constexpr RecordField kRulesUpdated{32, 1, 1, 1};
constexpr RecordField kRules{32, 1, 2, 5};
}  // namespace serving_measurement

// 0xB179, intra-frequency measurement: measured neighbours (6 bytes each from
// 29), then detected ones (2 bytes each).
namespace intra_frequency {
constexpr std::uint16_t kCode = 0xB179;
constexpr std::size_t kFirstCell = 29;
constexpr std::size_t kMeasuredSize = 6;
constexpr std::size_t kDetectedSize = 2;
constexpr RecordField kVersion{13, 1};
constexpr RecordField kEarfcn{17, 2};
constexpr RecordField kServingPhysicalCellId{19, 2};
constexpr RecordField kSubframeNumber{21, 2};
constexpr RecordField kServingFilteredRsrp{23, 2};
constexpr RecordField kServingFilteredRsrq{25, 2};
constexpr RecordField kMeasuredCount{27, 1};
constexpr RecordField kDetectedCount{28, 1};
// Within a measured neighbour:
constexpr RecordField kPhysicalCellId{0, 2};
constexpr RecordField kFilteredRsrp{2, 2};
constexpr RecordField kFilteredRsrq{4, 2};
// A detected neighbour:
constexpr RecordField kDetectedPhysicalCellId{0, 2};
}  // namespace intra_frequency

// 0xB180, neighbour measurement of one frequency: cells of 20 bytes from 21.
namespace neighbour_measurement {
constexpr std::uint16_t kCode = 0xB180;
constexpr std::size_t kFirstCell = 21;
constexpr std::size_t kCellSize = 20;
constexpr std::size_t kMostCells = 32;
constexpr RecordField kVersion{13, 1};
constexpr RecordField kEarfcn{17, 2};
constexpr RecordField kQrxlevmin{19, 1, 0, 5};
constexpr RecordField kCellsLessOne{19, 2, 6, 10};
// Within a cell:
constexpr RecordField kPhysicalCellId{0, 2, 0, 8};
constexpr RecordField kRssi{0, 4, 9, 16};
constexpr RecordField kMeasuredRsrp{0, 4, 17, 25};
constexpr RecordField kAverageRsrp{4, 2, 0, 8};
constexpr RecordField kMeasuredRsrq{4, 2, 9, 15};
constexpr RecordField kAverageRsrq{6, 1, 0, 6};
constexpr RecordField kSrxlev{4, 4, 23, 29};
constexpr RecordField kFrequencyOffset{8, 2};
constexpr RecordField kFrameOffset{12, 2, 0, 10};
constexpr RecordField kSampleOffset{12, 4, 11, 29};
}  // namespace neighbour_measurement

// 0xB186, reselection candidates: a 4-byte header per candidate from 21, the
// candidate's own fields behind it.
namespace reselection {
constexpr std::uint16_t kCode = 0xB186;
constexpr std::size_t kFirstCandidate = 21;
constexpr std::size_t kCandidateSize = 8;
constexpr RecordField kVersion{13, 1};
constexpr RecordField kServingEarfcn{15, 2};
constexpr RecordField kServingPhysicalCellId{17, 2};
constexpr RecordField kCount{19, 2};
// Within a candidate:
constexpr RecordField kPriority{0, 2};
constexpr RecordField kTechnology{2, 2};
constexpr RecordField kLteEarfcn{4, 2};
constexpr RecordField kLtePhysicalCellId{6, 2, 7, 15};
constexpr RecordField kUtranUarfcn{4, 2};
constexpr RecordField kUtranPsc{6, 2};
constexpr RecordField kGeranArfcn{4, 2};
constexpr RecordField kGeranBand{6, 1};
constexpr RecordField kGeranBsic{7, 1};
}  // namespace reselection

// --- Field values: the x that a decoder's "x × step + origin" turns into the value ---

std::uint32_t steps(double value, double origin, double step) {
  const double x = (value - origin) / step;
  if (x < 0 || x != std::floor(x)) {
    throw std::logic_error(std::to_string(value) + " is no whole number of " + std::to_string(step) +
                           " steps from " + std::to_string(origin));
  }
  return static_cast<std::uint32_t>(x);
}

// RSRP of the serving cell and of the connected-mode measurement, quarter-dB steps.
std::uint32_t rsrpField(double dbm) { return steps(dbm, -140, 0.25); }
// RSSI, and the RSRP of 0xB180's cells, half-dB steps.
std::uint32_t halfDbmField(double dbm) { return steps(dbm, -140, 0.5); }
// RSRQ of 0xB17F and 0xB180.
std::uint32_t rsrqField(double db) { return steps(db, -30, 0.25); }
// RSRQ of 0xB179.
std::uint32_t connectedRsrqField(double db) { return steps(db, -20, 0.125); }
// Srxlev, P-Max and the UE's maximum power.
std::uint32_t offset30Field(int dbm) { return steps(dbm, -30, 1); }
std::uint32_t qrxlevminField(int dbm) { return steps(dbm, -140, 2); }
// S-IntraSearch and S-NonIntraSearch, 2 dB steps.
std::uint32_t searchField(int db) { return steps(db, 0, 2); }

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
std::uint32_t subframeNumberAt(std::uint64_t timestamp) { return static_cast<std::uint32_t>(timestamp / 1000 % 10240); }

constexpr std::uint64_t periodsIn(std::chrono::milliseconds span) {
  return static_cast<std::uint64_t>(span / LogCodeSimulator::kPeriod);
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
      {cell_identity::kCode, 2000ms, &LteRadioEncoder::servingCellIdentity},
      {antenna_info::kCode, 2000ms, &LteRadioEncoder::antennaInfo},
      {serving_measurement::kCode, 320ms, &LteRadioEncoder::servingCellMeasurement},
      {intra_frequency::kCode, 640ms, &LteRadioEncoder::intraFrequencyMeasurement},
      {neighbour_measurement::kCode, 640ms, &LteRadioEncoder::neighbourMeasurement},
      {reselection::kCode, 1280ms, &LteRadioEncoder::reselectionCandidates},
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
    if (!cellChanged && period % periodsIn(report.every) != 0) continue;
    if (auto packet = (this->*report.build)(network, timestamp)) {
      out.push_back({std::make_shared<const Bytes>(std::move(*packet)), report.code});
    }
  }
}

// --- Records ---

std::optional<Bytes> LteRadioEncoder::servingCellIdentity(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace cell_identity;
  const Cell& serving = network.servingCell();
  RecordWriter record(kSize);
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
  using namespace antenna_info;
  RecordWriter record(kSize);
  record.put(kVersion, kRecordVersion);
  record.put(kTxAntennas, static_cast<std::uint32_t>(layerOf(network.servingCell()).txAntennas));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> LteRadioEncoder::servingCellMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace serving_measurement;
  const Cell& serving = network.servingCell();
  const Layer& layer = layerOf(serving);
  const int srxlev = srxlevOf(serving);
  reportsBelowZero_ = srxlev < 0 ? std::min(reportsBelowZero_ + 1, 63) : 0;
  // Bit 0: intra-frequency measurements are due; bit 1: those of the other
  // frequencies and technologies of equal or lower priority too.
  const std::uint32_t rules = (srxlev <= layer.sIntraSearch ? 1u : 0u) | (srxlev <= layer.sNonIntraSearch ? 2u : 0u);
  const bool rulesUpdated = rules != lastRules_;
  lastRules_ = rules;

  RecordWriter record(kSize);
  record.put(kVersion, kRecordVersion);
  record.put(kEarfcn, static_cast<std::uint32_t>(serving.channel));
  record.put(kPhysicalCellId, static_cast<std::uint32_t>(serving.code));
  record.put(kLayerPriority, static_cast<std::uint32_t>(layer.priority));
  record.put(kMeasuredRsrp, rsrpField(serving.rsrp));
  record.put(kAverageRsrp, rsrpField(serving.averageRsrp));
  record.put(kMeasuredRsrq, rsrqField(serving.rsrq));
  record.put(kAverageRsrq, rsrqField(serving.averageRsrq));
  record.put(kRssi, halfDbmField(serving.level));
  record.put(kQrxlevmin, qrxlevminField(layer.qrxlevmin));
  record.put(kPMax, offset30Field(layer.pMax));
  record.put(kMaxUeTxPower, offset30Field(kUePowerClassDbm));
  record.put(kSrxlev, offset30Field(srxlev));
  record.put(kDrxCyclesBelowZero, static_cast<std::uint32_t>(reportsBelowZero_));
  record.put(kSIntraSearch, searchField(layer.sIntraSearch));
  record.put(kSNonIntraSearch, searchField(layer.sNonIntraSearch));
  record.put(kRulesUpdated, rulesUpdated ? 1 : 0);
  record.put(kRules, rules);
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> LteRadioEncoder::intraFrequencyMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace intra_frequency;
  const Cell& serving = network.servingCell();
  const auto measured = neighboursOn(network, serving.channel, true);
  const auto detected = neighboursOn(network, serving.channel, false);
  RecordWriter record(kFirstCell + kMeasuredSize * measured.size() + kDetectedSize * detected.size());
  record.put(kVersion, kRecordVersion);
  record.put(kEarfcn, static_cast<std::uint32_t>(serving.channel));
  record.put(kServingPhysicalCellId, static_cast<std::uint32_t>(serving.code));
  record.put(kSubframeNumber, subframeNumberAt(timestamp));
  record.put(kServingFilteredRsrp, rsrpField(serving.averageRsrp));
  record.put(kServingFilteredRsrq, connectedRsrqField(serving.averageRsrq));
  record.put(kMeasuredCount, static_cast<std::uint32_t>(measured.size()));
  record.put(kDetectedCount, static_cast<std::uint32_t>(detected.size()));
  std::size_t entry = kFirstCell;
  for (const Cell* cell : measured) {
    record.put(kPhysicalCellId.at(entry), static_cast<std::uint32_t>(cell->code));
    record.put(kFilteredRsrp.at(entry), rsrpField(cell->averageRsrp));
    record.put(kFilteredRsrq.at(entry), connectedRsrqField(cell->averageRsrq));
    entry += kMeasuredSize;
  }
  for (const Cell* cell : detected) {
    record.put(kDetectedPhysicalCellId.at(entry), static_cast<std::uint32_t>(cell->code));
    entry += kDetectedSize;
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> LteRadioEncoder::neighbourMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace neighbour_measurement;
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

    RecordWriter record(kFirstCell + kCellSize * cells.size());
    record.put(kVersion, kRecordVersion);
    record.put(kEarfcn, static_cast<std::uint32_t>(channel));
    record.put(kQrxlevmin, qrxlevminField(layerOf(*cells.front()).qrxlevmin));
    record.put(kCellsLessOne, static_cast<std::uint32_t>(cells.size() - 1));
    std::size_t entry = kFirstCell;
    for (const Cell* cell : cells) {
      record.put(kPhysicalCellId.at(entry), static_cast<std::uint32_t>(cell->code));
      record.put(kRssi.at(entry), halfDbmField(cell->level));
      record.put(kMeasuredRsrp.at(entry), halfDbmField(cell->rsrp));
      record.put(kAverageRsrp.at(entry), halfDbmField(cell->averageRsrp));
      record.put(kMeasuredRsrq.at(entry), rsrqField(cell->rsrq));
      record.put(kAverageRsrq.at(entry), rsrqField(cell->averageRsrq));
      record.put(kSrxlev.at(entry), offset30Field(srxlevOf(*cell)));
      record.put(kFrequencyOffset.at(entry), frequencyOffsetOf(*cell));
      record.put(kFrameOffset.at(entry), frameOffsetOf(*cell));
      record.put(kSampleOffset.at(entry), sampleOffsetOf(*cell));
      entry += kCellSize;
    }
    return record.packet(kCode, timestamp);
  }
  return std::nullopt;
}

std::optional<Bytes> LteRadioEncoder::reselectionCandidates(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace reselection;
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

  RecordWriter writer(kFirstCandidate + (hasCandidate ? kCandidateSize : 0));
  writer.put(kVersion, kRecordVersion);
  writer.put(kServingEarfcn, static_cast<std::uint32_t>(serving.channel));
  writer.put(kServingPhysicalCellId, static_cast<std::uint32_t>(serving.code));
  writer.put(kCount, hasCandidate ? 1 : 0);
  const std::size_t at = kFirstCandidate;
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
    writer.put(kLtePhysicalCellId.at(at), static_cast<std::uint32_t>(strongest->code));
  }
  return writer.packet(kCode, timestamp);
}

}  // namespace corvane::telephonyd
