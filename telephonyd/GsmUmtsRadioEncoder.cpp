#include "telephonyd/GsmUmtsRadioEncoder.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <memory>
#include <stdexcept>
#include <string>

#include "LogGenerator/gsm_umts/records/ArfcnBsicRecord.h"
#include "LogGenerator/gsm_umts/records/BlerRecord.h"
#include "LogGenerator/gsm_umts/records/CellSetRecord.h"
#include "LogGenerator/gsm_umts/records/CipheringRecord.h"
#include "LogGenerator/gsm_umts/records/DedicatedMobileAllocationRecord.h"
#include "LogGenerator/gsm_umts/records/DtxRecord.h"
#include "LogGenerator/gsm_umts/records/EquivalentPlmnRecord.h"
#include "LogGenerator/gsm_umts/records/GmmStateRecord.h"
#include "LogGenerator/gsm_umts/records/GprsCellAccessRecord.h"
#include "LogGenerator/gsm_umts/records/GprsCellOptionsRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellIdentityRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellMeasurementRecord.h"
#include "LogGenerator/gsm_umts/records/HsdpaStatisticsRecord.h"
#include "LogGenerator/gsm_umts/records/MmStateRecord.h"
#include "LogGenerator/gsm_umts/records/MobileAllocationRecord.h"
#include "LogGenerator/gsm_umts/records/PacketSystemInfoRecord.h"
#include "LogGenerator/gsm_umts/records/PbcchRecord.h"
#include "LogGenerator/gsm_umts/records/PlmnSelectionModeRecord.h"
#include "LogGenerator/gsm_umts/records/RankedCellsRecord.h"
#include "LogGenerator/gsm_umts/records/RegistrationRecord.h"
#include "LogGenerator/gsm_umts/records/RrStateRecord.h"
#include "LogGenerator/gsm_umts/records/RrcStateRecord.h"
#include "LogGenerator/gsm_umts/records/Si13PositionRecord.h"
#include "LogGenerator/gsm_umts/records/TransmitPowerRecord.h"
#include "LogGenerator/gsm_umts/records/UmtsCellRecord.h"
#include "LogGenerator/records/EcIoTable.h"
#include "telephonyd/RecordWriter.h"

namespace corvane::telephonyd {

namespace {

using namespace std::chrono_literals;
using namespace corvane::gsm_umts;
using Access = SimulatedNetwork::Access;
using Cell = SimulatedNetwork::Cell;
using Phase = SimulatedNetwork::Phase;

// The record layouts are the decoders' own (LogGenerator/gsm_umts/records/);
// values in dBm and dB go in through the fields' conversions, negative ones
// through the signed fields' rawFor.

// --- Values of the records' tables ---

constexpr std::uint32_t kAutomaticSelection = 0;  // 0x7132
constexpr std::uint32_t kCsPsService = 3;         // 0x7135: CS_PS_SERVICE

struct RrcStateOfPhase {
  Phase phase;
  std::uint32_t state;  // 0x4125
};
constexpr std::array<RrcStateOfPhase, 5> kRrcStates = {{
    {Phase::UmtsIdle, 0},        // Disconnected
    {Phase::UmtsConnecting, 1},  // Connecting
    {Phase::UmtsFach, 2},        // CELL_FACH
    {Phase::UmtsDch, 3},         // CELL_DCH
    {Phase::UmtsFading, 0},      // released: Disconnected
}};

std::uint32_t rrcStateOf(Phase phase) {
  for (const RrcStateOfPhase& entry : kRrcStates) {
    if (entry.phase == phase) return entry.state;
  }
  throw std::logic_error("no RRC state while camped on GSM");
}

// --- Mobility management, GSM radio resource, GPRS and HSDPA ---

// 0x7132's registration service states, and the network operating mode of 0x7135.
constexpr std::uint32_t kServiceIdle = 1;         // REG_STATE_IDLE
constexpr std::uint32_t kServiceRegistering = 2;  // REG_STATE_REGISTERING
constexpr std::uint32_t kNetworkOperatingModeI = 0;  // "Class 1"

// 0x7131: MM states, substates and update statuses.
constexpr std::uint32_t kMmWaitForOutgoingConnection = 5;
constexpr std::uint32_t kMmConnectionActive = 6;
constexpr std::uint32_t kMmIdle = 19;
constexpr std::uint32_t kMmLocationUpdatingPending = 23;
constexpr std::uint32_t kMmLocationUpdateNeeded = 5;
constexpr std::uint32_t kMmNormalService = 8;
constexpr std::uint32_t kMmUpdated = 0;
constexpr std::uint32_t kMmNotUpdated = 1;

// 0x7130: GMM states, substates and update statuses.
constexpr std::uint32_t kGmmRegisteredInitiated = 2;
constexpr std::uint32_t kGmmRegistered = 3;
constexpr std::uint32_t kGmmRoutingAreaUpdateInitiated = 5;
constexpr std::uint32_t kGmmServiceRequestInitiated = 6;
constexpr std::uint32_t kGmmNormalService = 0;
constexpr std::uint32_t kGmmAttachNeeded = 2;
constexpr std::uint32_t kGmmSuspended = 7;
constexpr std::uint32_t kGmmUpdateNeeded = 8;
constexpr std::uint32_t kGmmUpdated = 0;
constexpr std::uint32_t kGmmNotUpdated = 1;

// 0x512C: RR states and modes.
constexpr std::uint32_t kRrIdle = 5;
constexpr std::uint32_t kRrConnectionPending = 7;
constexpr std::uint32_t kRrDataTransfer = 9;
constexpr std::uint32_t kRrReselectionFromUmts = 14;  // RR_W2G_INTERRAT_RESELECTION_PROGRESS
constexpr std::uint32_t kRrVoice = 0;
constexpr std::uint32_t kRrData = 1;

// The GPRS parameters that all GSM cells broadcast alike: packet flow
// contexts not supported, priority classes 1 to 4 may access, the network
// controls no reselection, DRX_TIMER_MAX 2 s, 8-bit access bursts, no PBCCH
// (so no PSI messages) and packet SI status supported.
constexpr std::uint32_t kPfcNotSupported = 0;
constexpr std::uint32_t kPriorityClasses1To4 = 6;
constexpr std::uint32_t kNetworkControlOrder0 = 0;
constexpr std::uint32_t kDrxTimerMaxSeconds = 2;
constexpr std::uint32_t kEightBitAccessBursts = 0;
constexpr std::uint32_t kPacketSiStatusSupported = 1;
// And those each cell sets for itself, chosen by its cell id: T3192 (500,
// 80 or 1000 ms), where SI13 goes (every fourth cell on the extended BCCH)
// and whether the reselection hysteresis applies (every other cell).
constexpr std::array<std::uint32_t, 3> kT3192Codes = {0, 4, 1};
std::uint32_t t3192Of(const Cell& cell) {
  return kT3192Codes[static_cast<std::size_t>(cell.cellId) % kT3192Codes.size()];
}
std::uint32_t si13PositionOf(const Cell& cell) { return cell.cellId % 4 == 3 ? 1 : 0; }
std::uint32_t hysteresisOf(const Cell& cell) { return cell.cellId % 2 == 0 ? 1 : 0; }

// HSDPA in CELL_DCH: dual carrier, six HARQ processes a carrier, 500
// sub-frames of 2 ms a record. A process is scheduled in most of its
// sub-frames; a tenth of its first transmissions fail while the cell is good
// (the usual target), more as its Ec/Io falls; a block holds more bits the
// better the Ec/Io.
constexpr std::uint32_t kHsdpaVersion = 2;
constexpr std::uint32_t kDualCarrier = 2;
constexpr std::size_t kHarqProcessesPerCarrier = 6;
constexpr std::uint32_t kSubFramesPerRecord = 500;
std::uint32_t bitsPerBlock(const Cell& cell) {
  return static_cast<std::uint32_t>(3000 + 800 * std::clamp(cell.quality + 20, 0, 20));
}

bool onUmts(const SimulatedNetwork& network) { return network.servingCell().access == Access::UMTS; }
bool rrcConnected(Phase phase) {
  return phase == Phase::UmtsConnecting || phase == Phase::UmtsFach || phase == Phase::UmtsDch;
}

// 0x417A set types besides the active set (0), which is the only one the decoders tell apart.
constexpr std::uint32_t kMonitoredSetType = 1;
constexpr std::uint32_t kDetectedSetType = 2;
// A cell this weak (Ec/Io, dB) the searcher has only detected.
constexpr int kDetectedBelowEcIo = -16;

// What the UMTS cells broadcast for idle-mode ranking: the offsets of the
// neighbours' R criterion (dB).
constexpr int kUmtsRankingOffset = 3;
constexpr int kGsmRankingOffset = 6;

// UMTS band 1: the uplink UARFCN lies 950 below the downlink one.
constexpr int kBand1UplinkOffset = 950;

// Open-loop transmit power: CPICH transmit power (33 dBm) less the RSCP, plus
// the uplink interference (-103 dBm) and the constant (-10 dB); the power
// control's steps scatter the samples by up to 2 dB. The UE's range: -50 to
// 24 dBm.
constexpr int kOpenLoopOffset = 33 - 103 - 10;
constexpr int kLowestTransmitPower = -50;
constexpr int kHighestTransmitPower = 24;
constexpr std::size_t kFachPowerSamples = 2;  // the RACH's preambles and message
constexpr std::size_t kDchPowerSamples = 8;

// The DCH's transport channels: one of user data (10 ms TTI) and one of
// signalling (40 ms TTI), counted over a window of 100 TTIs of 10 ms.
struct TransportChannel {
  std::uint32_t id;
  std::uint32_t blocksPerWindow;
};
constexpr std::array<TransportChannel, 2> kTransportChannels = {{{1, 100}, {2, 25}}};
constexpr std::uint32_t kBlerWindow = 100;

// GSM idle mode: RXLEV_ACCESS_MIN -104 dBm, so C1 is the level above it (a
// phone whose power class reaches MS_TXPWR_MAX_CCH loses nothing to it);
// C2 adds a CELL_RESELECT_OFFSET of 4 dB.
constexpr int kRxlevAccessMin = -104;
constexpr int kCellReselectOffset = 4;
constexpr std::size_t kMostGsmNeighbours = 6;

int c1Of(const Cell& cell) { return cell.level - kRxlevAccessMin; }

// A fixed scatter of measurements that the network does not model, the same
// for the same record of the same cell: 0 to span - 1.
int scatter(std::uint64_t record, std::uint64_t cellId, std::uint64_t sample, int span) {
  std::uint64_t x = record * 0x9E3779B97F4A7C15u ^ cellId * 0xBF58476D1CE4E5B9u ^ (sample + 1) * 0x94D049BB133111EBu;
  x ^= x >> 31;
  x *= 0xBF58476D1CE4E5B9u;
  x ^= x >> 29;
  return static_cast<int>(x % static_cast<std::uint64_t>(span));
}

// The cells of an access technology, measured and not serving, strongest first.
std::vector<const Cell*> measuredNeighbours(const SimulatedNetwork& network, Access access) {
  std::vector<const Cell*> cells;
  for (const Cell& cell : network.cells()) {
    if (cell.access == access && !cell.serving && cell.measured) cells.push_back(&cell);
  }
  std::stable_sort(cells.begin(), cells.end(), [](const Cell* a, const Cell* b) { return a->level > b->level; });
  return cells;
}

// Where the phone must be for a record to be due.
enum class Where { Anywhere, Umts, UmtsConnected, UmtsRanking, UmtsDch, Gsm, GsmDedicated };

bool isAt(const SimulatedNetwork& network, Where where) {
  const Phase phase = network.phase();
  switch (where) {
    case Where::Anywhere: return true;
    case Where::Umts: return onUmts(network);
    case Where::UmtsConnected: return onUmts(network) && rrcConnected(phase);
    case Where::UmtsRanking: return onUmts(network) && phase != Phase::UmtsDch;
    case Where::UmtsDch: return onUmts(network) && phase == Phase::UmtsDch;
    case Where::Gsm: return !onUmts(network);
    case Where::GsmDedicated: return !onUmts(network) && phase == Phase::GsmDedicated;
  }
  return false;
}

}  // namespace

// --- Schedule ---

struct GsmUmtsRadioEncoder::Report {
  std::uint16_t code;
  std::chrono::milliseconds every;
  Where where;
  std::optional<Bytes> (GsmUmtsRadioEncoder::*build)(const SimulatedNetwork&, std::uint64_t timestamp);
};

std::span<const GsmUmtsRadioEncoder::Report> GsmUmtsRadioEncoder::reports() {
  // In the order the records of one period go out: the BSICs before the
  // measurement that shows them.
  static constexpr std::array<Report, 25> kReports = {{
      {plmn_selection::kCode, 1000ms, Where::Anywhere, &GsmUmtsRadioEncoder::plmnSelectionMode},
      {gsm_umts::registration::kCode, 5000ms, Where::Anywhere, &GsmUmtsRadioEncoder::registration},
      {equivalent_plmn::kCode, 10000ms, Where::Anywhere, &GsmUmtsRadioEncoder::equivalentPlmns},
      {mm_state::kCode, 1000ms, Where::Anywhere, &GsmUmtsRadioEncoder::mmState},
      {gmm_state::kCode, 1000ms, Where::Anywhere, &GsmUmtsRadioEncoder::gmmState},
      {rrc_state::kCode, 2000ms, Where::Umts, &GsmUmtsRadioEncoder::rrcState},
      {umts_cell::kCode, 2000ms, Where::Umts, &GsmUmtsRadioEncoder::umtsCell},
      {gsm_umts::ciphering::kCode, 2000ms, Where::Umts, &GsmUmtsRadioEncoder::ciphering},
      {cell_set::kCode, 400ms, Where::Umts, &GsmUmtsRadioEncoder::cellSets},
      {ranked_cells::kCode, 1280ms, Where::UmtsRanking, &GsmUmtsRadioEncoder::rankedCells},
      {transmit_power::kCode, 1000ms, Where::UmtsConnected, &GsmUmtsRadioEncoder::transmitPower},
      {bler::kCode, 1000ms, Where::UmtsDch, &GsmUmtsRadioEncoder::blockErrors},
      {hsdpa_statistics::kCode, 1000ms, Where::UmtsDch, &GsmUmtsRadioEncoder::hsdpaStatistics},
      {rr_state::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::rrState},
      {dtx::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::dtxState},
      {si13_position::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::si13Position},
      {gprs_access::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::gprsAccess},
      {gprs_cell_options::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::gprsCellOptions},
      {pbcch::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::pbcch},
      {packet_system_info::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::packetSystemInfo},
      {arfcn_bsic::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::neighbourBsics},
      {gsm_cell_identity::kCode, 2000ms, Where::Gsm, &GsmUmtsRadioEncoder::gsmCellIdentity},
      {gsm_cell_measurement::kCode, 480ms, Where::Gsm, &GsmUmtsRadioEncoder::gsmCellMeasurement},
      {mobile_allocation::kCode, 2000ms, Where::GsmDedicated, &GsmUmtsRadioEncoder::mobileAllocation},
      {dedicated_allocation::kCode, 480ms, Where::GsmDedicated, &GsmUmtsRadioEncoder::dedicatedChannel},
  }};
  static_assert(std::all_of(kReports.begin(), kReports.end(),
                            [](const Report& r) { return r.every % LogCodeSimulator::kPeriod == 0ms; }),
                "reports fall on period starts");
  return kReports;
}

void GsmUmtsRadioEncoder::encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
                                 std::vector<SourcePacket>& out) {
  followRegistration(network);
  const bool changed =
      network.cellChanges() != reportedCellChanges_ || network.phaseChanges() != reportedPhaseChanges_;
  reportedCellChanges_ = network.cellChanges();
  reportedPhaseChanges_ = network.phaseChanges();
  for (const Report& report : reports()) {
    if (!isAt(network, report.where)) continue;
    if (!changed && period % LogCodeSimulator::periodsIn(report.every) != 0) continue;
    if (auto packet = (this->*report.build)(network, timestamp)) {
      out.push_back({std::make_shared<const Bytes>(std::move(*packet)), report.code});
    }
  }
}

// --- Registration ---

std::optional<Bytes> GsmUmtsRadioEncoder::plmnSelectionMode(const SimulatedNetwork& network,
                                                            std::uint64_t timestamp) {
  using namespace plmn_selection;
  RecordWriter record(kMinimumLength);
  record.put(kServiceState,
             registrationState(network) == Registration::Registered ? kServiceIdle : kServiceRegistering);
  record.put(kMode, kAutomaticSelection);
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::registration(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace gsm_umts::registration;
  constexpr int mcc = SimulatedNetwork::kMobileCountryCode;
  constexpr int mnc = SimulatedNetwork::kMobileNetworkCode;
  // A two-digit MNC: its third digit is the filler 0xF.
  constexpr std::array<std::uint32_t, 3> mccDigits = {mcc / 100, mcc / 10 % 10, mcc % 10};
  constexpr std::array<std::uint32_t, 3> mncDigits = {mnc / 10, mnc % 10, 0xF};
  const Cell& serving = network.servingCell();
  RecordWriter record(kMinimumLength);
  record.put(kNetworkOperatingMode, kNetworkOperatingModeI);
  record.put(kServiceType, kCsPsService);
  for (std::size_t i = 0; i < mccDigits.size(); ++i) record.put(kMccDigits[i], mccDigits[i]);
  for (std::size_t i = 0; i < mncDigits.size(); ++i) record.put(kMncDigits[i], mncDigits[i]);
  const std::uint32_t lac = unsignedOf(serving.areaCode);
  record.put(kLocationAreaCodeHigh, lac >> 8);
  record.put(kLocationAreaCodeLow, lac & 0xFF);
  record.put(kRoutingAreaCode, unsignedOf(network.routingAreaCode()));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::equivalentPlmns(const SimulatedNetwork&, std::uint64_t timestamp) {
  using namespace equivalent_plmn;
  constexpr std::uint32_t mcc = SimulatedNetwork::kMobileCountryCode;
  constexpr std::uint32_t mnc = SimulatedNetwork::kMobileNetworkCode;
  // One network (see the header): the registered one.
  RecordWriter record(kNetworks.first + kNetworkExtent);
  record.put(kCount, 1);
  const std::size_t at = kNetworks.first;
  record.put(kMccHundreds.at(at), mcc / 100);
  record.put(kMccTens.at(at), mcc / 10 % 10);
  record.put(kMccUnits.at(at), mcc % 10);
  record.put(kMncHundreds.at(at), mnc / 100);
  record.put(kMncTens.at(at), mnc / 10 % 10);
  record.put(kMncUnits.at(at), mnc % 10);
  return record.packet(kCode, timestamp);
}

// --- UMTS ---

std::optional<Bytes> GsmUmtsRadioEncoder::rrcState(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace rrc_state;
  RecordWriter record(kMinimumLength);
  record.put(kState, rrcStateOf(network.phase()));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::umtsCell(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace umts_cell;
  const Cell& serving = network.servingCell();
  RecordWriter record(kMinimumLength);
  record.put(kUplinkUarfcn, unsignedOf(serving.channel - kBand1UplinkOffset));
  record.put(kDownlinkUarfcn, unsignedOf(serving.channel));
  record.put(kCellId, unsignedOf(serving.cellId));
  record.put(kUraId, unsignedOf(network.uraIdentity(serving)));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::ciphering(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace gsm_umts::ciphering;
  // Security mode is set up with the RRC connection; idle has none.
  RecordWriter record(kMinimumLength);
  record.put(kCiphering, rrcConnected(network.phase()) ? 1 : 0);
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::cellSets(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace cell_set;
  const Cell& serving = network.servingCell();
  // The active set first, then the other measured cells of the serving carrier, strongest first.
  const std::vector<const Cell*> active = network.activeSet();
  std::vector<const Cell*> cells = active;
  for (const Cell* cell : measuredNeighbours(network, Access::UMTS)) {
    if (cell->channel == serving.channel && std::find(active.begin(), active.end(), cell) == active.end()) {
      cells.push_back(cell);
    }
  }
  // One wideband power for the carrier: the serving cell's RSCP less its Ec/Io.
  const int rssi = serving.level - serving.quality;
  const std::int32_t widebandPower = 10 * (rssi + 106) - 512;
  if (receivedCodePower(widebandPower, serving.quality) != serving.level) {
    throw std::logic_error("no wideband power shows RSCP " + std::to_string(serving.level));
  }

  RecordWriter record(kCells.first + (kCells.entrySize + kEnergyBlockSize) * cells.size());
  record.put(kWidebandPower.field, kWidebandPower.rawFor(widebandPower));
  record.put(kCount, static_cast<std::uint32_t>(cells.size()));
  const records::EntryList blocks = energyBlocks(cells.size());
  for (std::size_t i = 0; i < cells.size(); ++i) {
    const Cell& cell = *cells[i];
    const std::size_t entry = kCells.first + kCells.entrySize * i;
    const bool isActive = i < active.size();
    record.put(kScramblingCode.at(entry), unsignedOf(cell.code));
    record.put(kSetType.at(entry), isActive                         ? kActiveSet
                                   : cell.quality <= kDetectedBelowEcIo ? kDetectedSetType
                                                                        : kMonitoredSetType);
    record.put(kEnergies[0].at(blocks.first + blocks.entrySize * i), records::ecIoLinearFor(cell.quality));
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::rankedCells(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace ranked_cells;
  const bool rankingUmts = rankingRecords_++ % 2 == 0;
  if (rankingUmts) {
    const auto cells = measuredNeighbours(network, Access::UMTS);
    RecordWriter record(kUmtsCells.first + kUmtsCells.entrySize * cells.size());
    record.put(kUmtsCount, static_cast<std::uint32_t>(cells.size()));
    record.put(kGsmCount, 0);
    std::size_t entry = kUmtsCells.first;
    for (const Cell* cell : cells) {
      record.put(kDownlinkUarfcn.field.at(entry), kDownlinkUarfcn.rawFor(cell->channel));
      record.put(kScramblingCode.at(entry), unsignedOf(cell->code));
      record.put(kRscp.field.at(entry), kRscp.rawFor(cell->level));
      record.put(kRankRscp.field.at(entry), kRankRscp.rawFor(cell->level));
      record.put(kEcNo.field.at(entry), kEcNo.rawFor(cell->quality));
      record.put(kUmtsRankingValue.field.at(entry), kUmtsRankingValue.rawFor(cell->level - kUmtsRankingOffset));
      entry += kUmtsCells.entrySize;
    }
    return record.packet(kCode, timestamp);
  }
  const auto cells = measuredNeighbours(network, Access::GSM);
  RecordWriter record(kGsmCells.first + kGsmCells.entrySize * cells.size());
  record.put(kUmtsCount, 0);
  record.put(kGsmCount, static_cast<std::uint32_t>(cells.size()));
  std::size_t entry = kGsmCells.first;
  for (const Cell* cell : cells) {
    record.put(kArfcn.at(entry), unsignedOf(cell->channel));
    record.put(kBsic.at(entry), unsignedOf(cell->code));
    record.put(kRssi.field.at(entry), kRssi.rawFor(cell->level));
    record.put(kGsmRankingValue.field.at(entry), kGsmRankingValue.rawFor(cell->level - kGsmRankingOffset));
    entry += kGsmCells.entrySize;
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::transmitPower(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace transmit_power;
  const Cell& serving = network.servingCell();
  const std::uint64_t number = transmitPowerRecords_++;
  const std::size_t samples = network.phase() == Phase::UmtsDch ? kDchPowerSamples : kFachPowerSamples;
  RecordWriter record(kSamples.first + kSamples.entrySize * samples);
  record.put(kCount, static_cast<std::uint32_t>(samples));
  for (std::size_t i = 0; i < samples; ++i) {
    const int power = std::clamp(kOpenLoopOffset - serving.level + scatter(number, unsignedOf(serving.cellId), i, 5) - 2,
                                 kLowestTransmitPower, kHighestTransmitPower);
    // The middle of the raw values that show as this power: never 0, which means no sample.
    const std::int32_t raw = 10 * (power + 70) - 507;
    if (powerDbm(raw) != power || raw == kNoMeasurement) {
      throw std::logic_error("no raw transmit power shows " + std::to_string(power) + " dBm");
    }
    record.put(kPower.field.at(kSamples.first + kSamples.entrySize * i), kPower.rawFor(raw));
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::blockErrors(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace bler;
  const Cell& serving = network.servingCell();
  const std::uint64_t number = blerRecords_++;
  // The error rate the outer loop holds (1 %) while the cell is good, more as its Ec/Io falls.
  const std::uint32_t percent = serving.quality >= -8 ? 1 : serving.quality >= -12 ? 3 : 8;
  RecordWriter record(kChannels.first + kChannels.entrySize * kTransportChannels.size());
  record.put(kCount, static_cast<std::uint32_t>(kTransportChannels.size()));
  record.put(kWindowSize, kBlerWindow);
  for (std::size_t i = 0; i < kTransportChannels.size(); ++i) {
    const TransportChannel& channel = kTransportChannels[i];
    const std::size_t entry = kChannels.first + kChannels.entrySize * i;
    const auto errors = static_cast<std::uint32_t>(
        (channel.blocksPerWindow * percent + static_cast<std::uint32_t>(scatter(number, channel.id, i, 100))) / 100);
    record.put(kChannelId.at(entry), channel.id);
    record.put(kCrcReceived.at(entry), channel.blocksPerWindow);
    record.put(kCrcErrors.at(entry), errors);
  }
  return record.packet(kCode, timestamp);
}

// --- GSM ---

std::optional<Bytes> GsmUmtsRadioEncoder::neighbourBsics(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace arfcn_bsic;
  auto cells = measuredNeighbours(network, Access::GSM);
  if (cells.size() > kMostGsmNeighbours) cells.resize(kMostGsmNeighbours);
  RecordWriter record(kPairs.first + kPairs.entrySize * cells.size());
  record.put(kCount, static_cast<std::uint32_t>(cells.size()));
  std::size_t entry = kPairs.first;
  for (const Cell* cell : cells) {
    record.put(kArfcn.at(entry), unsignedOf(cell->channel));
    record.put(kBsic.at(entry), unsignedOf(cell->code));
    entry += kPairs.entrySize;
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::gsmCellIdentity(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace gsm_cell_identity;
  const Cell& serving = network.servingCell();
  RecordWriter record(kMinimumLength);
  record.put(kArfcn, unsignedOf(serving.channel));
  record.put(kBsic, unsignedOf(serving.code));
  record.put(kCellId, unsignedOf(serving.cellId));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::gsmCellMeasurement(const SimulatedNetwork& network,
                                                             std::uint64_t timestamp) {
  using namespace gsm_cell_measurement;
  const Cell& serving = network.servingCell();
  auto cells = measuredNeighbours(network, Access::GSM);
  if (cells.size() > kMostGsmNeighbours) cells.resize(kMostGsmNeighbours);
  RecordWriter record(kNeighbors.first + kNeighbors.entrySize * cells.size());
  // The levels go in as their magnitude: the bytes hold no sign.
  record.putValue(kServingRssi, -serving.level);
  record.put(kServingC1.field, kServingC1.rawFor(c1Of(serving)));
  record.put(kServingC2.field, kServingC2.rawFor(c1Of(serving) + kCellReselectOffset));
  record.put(kCellReselectHysteresis, hysteresisOf(serving));
  record.put(kNeighborCount, static_cast<std::uint32_t>(cells.size()));
  std::size_t entry = kNeighbors.first;
  for (const Cell* cell : cells) {
    record.put(kNeighborArfcn.at(entry), unsignedOf(cell->channel));
    record.put(kNeighborRssi.at(entry), unsignedOf(-cell->level));
    record.put(kNeighborC1.field.at(entry), kNeighborC1.rawFor(c1Of(*cell)));
    entry += kNeighbors.entrySize;
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::mobileAllocation(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace mobile_allocation;
  const Cell& serving = network.servingCell();
  RecordWriter record(kArfcns.first + kArfcns.entrySize * serving.mobileAllocation.size());
  record.put(kHsn, unsignedOf(serving.hoppingSequence));
  record.put(kCount, static_cast<std::uint32_t>(serving.mobileAllocation.size()));
  std::size_t entry = kArfcns.first;
  for (int arfcn : serving.mobileAllocation) {
    record.put(kArfcn.at(entry), unsignedOf(arfcn));
    entry += kArfcns.entrySize;
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::dedicatedChannel(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace dedicated_allocation;
  const Cell& serving = network.servingCell();
  if (serving.mobileAllocation.empty()) return std::nullopt;
  // The channel hops every TDMA frame; each record catches it on the next frequency of the allocation.
  const std::uint64_t hop = dedicatedRecords_++ % serving.mobileAllocation.size();
  RecordWriter record(kMinimumLength);
  record.put(kArfcn, unsignedOf(serving.mobileAllocation[hop]));
  return record.packet(kCode, timestamp);
}

// --- Mobility management ---

void GsmUmtsRadioEncoder::followRegistration(const SimulatedNetwork& network) {
  // The first registration is the attach; each one after follows a reselection
  // to the other access technology.
  const Access access = network.servingCell().access;
  if (registeredAccess_ != access) {
    registeredAccess_ = access;
    ++registrations_;
    registrationStep_ = network.steps();
  }
  if (network.phaseChanges() != reportedPhaseChanges_ || network.steps() == 0) phaseStep_ = network.steps();
}

GsmUmtsRadioEncoder::Registration GsmUmtsRadioEncoder::registrationState(const SimulatedNetwork& network) const {
  if (network.steps() != registrationStep_) return Registration::Registered;
  return registrations_ == 1 ? Registration::Attaching : Registration::Updating;
}

std::optional<Bytes> GsmUmtsRadioEncoder::mmState(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace mm_state;
  const Registration registration = registrationState(network);
  RecordWriter record(kMinimumLength);
  if (registration == Registration::Registered) {
    // A call is an MM connection, asked for in the first second of it.
    const bool inCall = network.phase() == Phase::GsmDedicated;
    record.put(kState, !inCall                         ? kMmIdle
                       : phaseJustBegan(network) ? kMmWaitForOutgoingConnection
                                                 : kMmConnectionActive);
    record.put(kSubstate, kMmNormalService);
    record.put(kUpdateStatus, kMmUpdated);
  } else {
    // In network operating mode I the location area is updated with the
    // routing area, so MM waits for GMM. The location area has not changed at
    // a reselection: it stays updated.
    const bool attaching = registration == Registration::Attaching;
    record.put(kState, kMmLocationUpdatingPending);
    record.put(kSubstate, attaching ? kMmLocationUpdateNeeded : kMmNormalService);
    record.put(kUpdateStatus, attaching ? kMmNotUpdated : kMmUpdated);
  }
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::gmmState(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace gmm_state;
  RecordWriter record(kMinimumLength);
  switch (registrationState(network)) {
    case Registration::Attaching:
      record.put(kState, kGmmRegisteredInitiated);
      record.put(kSubstate, kGmmAttachNeeded);
      record.put(kUpdateStatus, kGmmNotUpdated);
      break;
    case Registration::Updating:
      record.put(kState, kGmmRoutingAreaUpdateInitiated);
      record.put(kSubstate, kGmmUpdateNeeded);
      record.put(kUpdateStatus, kGmmNotUpdated);
      break;
    case Registration::Registered:
      // Data asks for a connection first; a call on GSM suspends GPRS.
      record.put(kState, network.phase() == Phase::UmtsConnecting ? kGmmServiceRequestInitiated : kGmmRegistered);
      record.put(kSubstate, network.phase() == Phase::GsmDedicated ? kGmmSuspended : kGmmNormalService);
      record.put(kUpdateStatus, kGmmUpdated);
      break;
  }
  return record.packet(kCode, timestamp);
}

// --- GSM radio resource and GPRS ---

std::optional<Bytes> GsmUmtsRadioEncoder::rrState(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace rr_state;
  const bool inCall = network.phase() == Phase::GsmDedicated;
  RecordWriter record(kMinimumLength);
  record.put(kState, registrationState(network) == Registration::Updating ? kRrReselectionFromUmts
                     : !inCall                                            ? kRrIdle
                     : phaseJustBegan(network)                            ? kRrConnectionPending
                                                                          : kRrDataTransfer);
  record.put(kStatus, inCall ? 1 : 0);
  record.put(kMode, inCall ? kRrVoice : kRrData);
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::dtxState(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace dtx;
  RecordWriter record(kMinimumLength);
  record.put(kDtxUsed, network.phase() == Phase::GsmDedicated ? 1 : 0);
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::si13Position(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace si13_position;
  RecordWriter record(kMinimumLength);
  record.put(kPosition, si13PositionOf(network.servingCell()));
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::gprsAccess(const SimulatedNetwork&, std::uint64_t timestamp) {
  using namespace gprs_access;
  RecordWriter record(kMinimumLength);
  record.put(kPfcSupported, kPfcNotSupported);
  record.put(kPriorityAccessThreshold, kPriorityClasses1To4);
  record.put(kNetworkControlOrder, kNetworkControlOrder0);
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::gprsCellOptions(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace gprs_cell_options;
  RecordWriter record(kMinimumLength);
  record.put(kT3192Code, t3192Of(network.servingCell()));
  record.put(kDrxTimerMax, kDrxTimerMaxSeconds);
  record.put(kAccessBurstType, kEightBitAccessBursts);
  return record.packet(kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::pbcch(const SimulatedNetwork&, std::uint64_t timestamp) {
  RecordWriter record(pbcch::kMinimumLength);
  record.put(pbcch::kPresent, 0);
  return record.packet(pbcch::kCode, timestamp);
}

std::optional<Bytes> GsmUmtsRadioEncoder::packetSystemInfo(const SimulatedNetwork&, std::uint64_t timestamp) {
  using namespace packet_system_info;
  // Without a PBCCH there are no PSI messages to count.
  RecordWriter record(kMinimumLength);
  record.put(kPsiStatus, 0);
  record.put(kCountLowRate, 0);
  record.put(kCountHighRate, 0);
  record.put(kExtMeasurementOrder, 0);
  record.put(kSiStatus, kPacketSiStatusSupported);
  return record.packet(kCode, timestamp);
}

// --- HSDPA ---

std::optional<Bytes> GsmUmtsRadioEncoder::hsdpaStatistics(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace hsdpa_statistics;
  const Cell& serving = network.servingCell();
  const std::uint64_t number = hsdpaRecords_++;
  if (harqCounts_.empty() || harqStay_ != network.phaseChanges()) {
    harqCounts_.assign(2 * kHarqProcessesPerCarrier, HarqCounts());
    harqStay_ = network.phaseChanges();
  }
  const std::uint32_t errorPercent = serving.quality >= -8 ? 10 : serving.quality >= -12 ? 15 : 25;
  const records::EntryList secondary = secondaryEntries(kHarqProcessesPerCarrier);
  RecordWriter record(secondary.first + secondary.entrySize * kHarqProcessesPerCarrier);
  record.put(kVersion, kHsdpaVersion);
  record.put(kSubFrames, kSubFramesPerRecord);
  record.put(kCarrier, kDualCarrier);
  record.put(kPrimaryCount, kHarqProcessesPerCarrier);
  record.put(kSecondaryCount, kHarqProcessesPerCarrier);
  for (std::size_t i = 0; i < harqCounts_.size(); ++i) {
    const std::size_t process = i % kHarqProcessesPerCarrier;
    HarqCounts& counts = harqCounts_[i];
    // Each process has a sixth of the sub-frames; it is scheduled in 70 to 99 % of them.
    const auto fresh = static_cast<std::uint32_t>(
        kSubFramesPerRecord / kHarqProcessesPerCarrier * static_cast<std::uint32_t>(70 + scatter(number, i, 0, 30)) /
        100);
    const auto failed = static_cast<std::uint32_t>(
        (fresh * errorPercent + static_cast<std::uint32_t>(scatter(number, i, 1, 100))) / 100);
    counts.newTransmissions += fresh;
    counts.blockErrors += failed;
    counts.receivedBits += (fresh - failed) * bitsPerBlock(serving);
    const std::size_t entry = i < kHarqProcessesPerCarrier ? kPrimaryEntries.first + kEntrySize * process
                                                           : secondary.first + kEntrySize * process;
    record.put(kProcessId.at(entry), static_cast<std::uint32_t>(process));
    record.put(kReceivedBits.at(entry), counts.receivedBits);
    record.put(kNewTransmissions.at(entry), counts.newTransmissions);
    record.put(kBlockErrors.at(entry), counts.blockErrors);
  }
  return record.packet(kCode, timestamp);
}

}  // namespace corvane::telephonyd
