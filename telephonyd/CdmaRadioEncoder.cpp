#include "telephonyd/CdmaRadioEncoder.h"

#include <algorithm>
#include <cmath>
#include <memory>

#include "LogGenerator/cdma2000/records/DataRateRecords.h"
#include "LogGenerator/cdma2000/records/EvdoPilotsRecord.h"
#include "LogGenerator/cdma2000/records/EvdoStatusRecord.h"
#include "LogGenerator/cdma2000/records/FingerRecord.h"
#include "LogGenerator/cdma2000/records/OneXSystemRecord.h"
#include "LogGenerator/cdma2000/records/SubpacketRecord.h"
#include "telephonyd/RecordWriter.h"

namespace corvane::telephonyd {

namespace {

using Cell = SimulatedNetwork::Cell;
using Phase = CdmaSession::Phase;
namespace subpackets = records::subpackets;

// Cadences, in 40 ms periods.
constexpr std::uint64_t kOneXStatusEvery = 8;   // 320 ms
constexpr std::uint64_t kEvdoEvery = 16;        // 640 ms
constexpr std::uint64_t kFrameEvery = 2;        // 80 ms
constexpr std::uint64_t kCountersEvery = 25;    // 1 s, the network's step
constexpr std::uint64_t kSystemEvery = 50;      // 2 s

// Table values.
constexpr std::uint32_t kPcsBandClass = 1;
constexpr std::uint32_t kPaging = 6;
constexpr std::uint32_t kTraffic = 8;
constexpr std::uint32_t kEvdoIdle = 3;
constexpr std::uint32_t kEvdoAccess = 4;
constexpr std::uint32_t kEvdoConnected = 5;
constexpr std::uint32_t kSessionOpen = 4;
constexpr std::uint32_t kRoamingOff = 0;
constexpr std::uint32_t kRoamingOn = 1;
constexpr std::uint32_t kRevision = 6;
constexpr std::uint32_t kOneXSystemVersion = 2;

// The 1x active-set energies: with N = 8, G = 144 and X = 2 an energy E
// stands for Ec/Io = E × 2 / (9 × 144 × 64) − 1/8, so E = (Ec/Io + 1/8) × 41472
// holds every Ec/Io from the floor to 0 dB in 16 bits.
constexpr std::uint32_t kEnergyN = 8;
constexpr std::uint32_t kEnergyG = 144;
constexpr std::uint32_t kEnergyX = 2;
constexpr std::uint32_t kActiveSetM = 1;
constexpr double kEnergyScale = 9.0 * kEnergyG * kEnergyN * kEnergyN / 2.0;  // 2^(2X - 3) = 2
// Sub-packet sizes: system state, radio, fingers (not read), and the traffic frame.
constexpr std::size_t kSystemStateSize = 8;
constexpr std::size_t kRadioSize = 14;
constexpr std::size_t kFingerSubpacketSize = 8;
constexpr std::size_t kTrafficDemodSize = 28;
// Fingers: two per pilot, and one left unassigned while fewer than four are.
constexpr int kFingersPerPilot = 2;
constexpr std::size_t kFewFingers = 4;

double linear(double db) { return std::pow(10.0, db / 10.0); }
// 10 log10(raw / 512) dB, inverted.
std::uint32_t energyRaw(double db) {
  return static_cast<std::uint32_t>(std::clamp(std::lround(512.0 * linear(db)), 1L, 65535L));
}

// 1x receive AGC: raw × 0.334 − 63.248 dBm, inverted.
std::uint32_t oneXRxAgc(int dbm) {
  const long raw = std::clamp(std::lround((dbm + 63.248) / 0.334), -128L, 127L);
  return records::onex_status::kRxAgc0.rawFor(static_cast<double>(raw));
}
// The open-loop transmit power for a received level, within the handset's range.
int transmitPower(int level) { return std::clamp(-76 - level, -50, 23); }

bool inTraffic(Phase phase) { return phase == Phase::OneXTraffic; }
bool evdoTransmitting(Phase phase) { return phase == Phase::EvdoAccess || phase == Phase::EvdoConnected; }

std::uint32_t evdoState(Phase phase) {
  switch (phase) {
    case Phase::EvdoAccess: return kEvdoAccess;
    case Phase::EvdoConnected: return kEvdoConnected;
    case Phase::OneXIdle:
    case Phase::OneXTraffic: return kEvdoIdle;
  }
  return kEvdoIdle;
}

void putSubpacketHeader(RecordWriter& w, std::size_t at, std::uint8_t id, std::size_t size) {
  w.put(subpackets::kId.at(at), id);
  w.put(subpackets::kSize.at(at), static_cast<std::uint32_t>(size));
}

}  // namespace

void CdmaRadioEncoder::encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
                              std::vector<SourcePacket>& out) {
  if (network.steps() != seenSteps_) {
    seenSteps_ = network.steps();
    session_.step(network);
  }
  const bool changed = period == 0 || network.cellChanges() != reportedCellChanges_ ||
                       session_.phaseChanges() != reportedPhaseChanges_;
  reportedCellChanges_ = network.cellChanges();
  reportedPhaseChanges_ = session_.phaseChanges();
  const auto emit = [&out](Bytes packet, std::uint16_t code) {
    out.push_back({std::make_shared<const Bytes>(std::move(packet)), code});
  };
  if (changed || period % kOneXStatusEvery == 0) emit(oneXStatus(network, timestamp), records::onex_status::kCode);
  if (changed || period % kEvdoEvery == 0) {
    emit(evdoStatus(network, timestamp), records::evdo_status::kCode);
    emit(evdoPilots(network, timestamp), records::evdo_pilots::kCode);
    emit(fingers(network, timestamp), records::finger::kCode);
  }
  if (inTraffic(session_.phase()) && period % kFrameEvery == 0) {
    emit(trafficFrame(timestamp), records::onex_traffic::kCode);
  }
  if (period % kCountersEvery == 0) {
    emit(forwardRate(timestamp), records::forward_rate::kCode);
    emit(reverseRate(timestamp), records::reverse_rate::kCode);
  }
  if (changed || period % kSystemEvery == 0) emit(oneXSystem(network, timestamp), records::onex_system::kCode);
}

Bytes CdmaRadioEncoder::oneXStatus(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace records::onex_status;
  const std::vector<const Cell*> set = session_.activeSet(network, CdmaSession::Link::OneX);
  const std::size_t stride = pilotStride(kActiveSetM);
  const std::size_t setSize = kFirstPilot + stride * set.size();
  const std::size_t first = subpackets::kFirst;
  const std::size_t radio = first + kSystemStateSize;
  const std::size_t active = radio + kRadioSize;
  const std::size_t fingerPart = active + setSize;
  RecordWriter w(fingerPart + kFingerSubpacketSize);
  w.put(subpackets::kCount, 4);

  const bool traffic = inTraffic(session_.phase());
  putSubpacketHeader(w, first, kSystemStateId, kSystemStateSize);
  w.put(kDeviceState.at(first), traffic ? kTraffic : kPaging);

  const Cell& serving = network.servingCell();
  putSubpacketHeader(w, radio, kRadioId, kRadioSize);
  w.put(kRx0BandClass.at(radio), kPcsBandClass);
  w.put(kRx0Channel.at(radio), static_cast<std::uint32_t>(serving.channel));
  w.put(kRxAgc0.field.at(radio), oneXRxAgc(serving.level));
  if (traffic) {
    // The second chain listens on the same carrier, a few dB apart.
    w.put(kRx1BandClass.at(radio), kPcsBandClass);
    w.put(kRx1Channel.at(radio), static_cast<std::uint32_t>(serving.channel));
    w.put(kRxAgc1.field.at(radio), oneXRxAgc(serving.level + session_.diversityOffset()));
    w.put(kTxAgc.field.at(radio), kTxAgc.rawFor(10.0 * transmitPower(serving.level)));
  }

  putSubpacketHeader(w, active, kActiveSetId, setSize);
  w.put(kTotalEnergyN.at(active), kEnergyN);
  w.put(kGainG.at(active), kEnergyG);
  w.put(kExponentX.at(active), kEnergyX);
  w.put(kPilotCount.at(active), static_cast<std::uint32_t>(set.size()));
  w.put(kPilotM.at(active), kActiveSetM);
  w.put(kReferencePn.at(active), static_cast<std::uint32_t>(serving.code));
  for (std::size_t i = 0; i < set.size(); ++i) {
    const std::size_t record = active + kFirstPilot + stride * i;
    w.put(kPilotPn.at(record), static_cast<std::uint32_t>(set[i]->code));
    const double energy = (linear(set[i]->quality) + 1.0 / kEnergyN) * kEnergyScale;
    w.put(pilotEnergy(kActiveSetM).at(record), static_cast<std::uint32_t>(std::lround(energy)));
  }

  putSubpacketHeader(w, fingerPart, kFingerId, kFingerSubpacketSize);
  return w.packet(kCode, timestamp);
}

Bytes CdmaRadioEncoder::evdoStatus(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace records::evdo_status;
  const Cell& serving = network.servingCell();
  const Phase phase = session_.phase();
  const auto channel = static_cast<std::uint32_t>(session_.evdoChannel(network));
  RecordWriter w(kSize);
  w.put(kChannelLow, channel & 0xFF);
  w.put(kChannelHigh, channel >> 8);
  w.put(kBandClass, kPcsBandClass);
  w.put(kRxAgc0.field, kRxAgc0.rawFor(serving.level));
  if (evdoTransmitting(phase)) {
    w.put(kRxAgc1.field, kRxAgc1.rawFor(serving.level + session_.diversityOffset()));
    w.put(kTxAgc.field, kTxAgc.rawFor(transmitPower(serving.level)));
  }
  w.put(kPnOffset, static_cast<std::uint32_t>(serving.code));
  w.put(kDeviceState, evdoState(phase));
  w.put(kSessionState, kSessionOpen);
  w.put(kUatiLow, session_.uati() & 0xFFFF);
  w.put(kUatiHigh, session_.uati() >> 16);
  w.put(kColorCode, static_cast<std::uint32_t>(session_.colorCode()));
  return w.packet(kCode, timestamp);
}

Bytes CdmaRadioEncoder::evdoPilots(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace records::evdo_pilots;
  const std::vector<const Cell*> set = session_.activeSet(network, CdmaSession::Link::Evdo);
  RecordWriter w(kPilots.first + kPilots.entrySize * set.size());
  w.put(kPilotCount, static_cast<std::uint32_t>(set.size()));
  for (std::size_t i = 0; i < set.size(); ++i) {
    const std::size_t entry = kPilots.first + kPilots.entrySize * i;
    w.put(kPilotPn.at(entry), static_cast<std::uint32_t>(set[i]->code));
    w.put(kPilotEnergy.at(entry), energyRaw(set[i]->quality));
  }
  return w.packet(kCode, timestamp);
}

Bytes CdmaRadioEncoder::fingers(const SimulatedNetwork& network, std::uint64_t timestamp) {
  using namespace records::finger;
  struct Finger {
    std::uint32_t pn;
    std::uint32_t ci;
  };
  std::vector<Finger> list;
  for (const Cell* cell : session_.activeSet(network, session_.busyLink())) {
    // The first path carries the pilot's C/I, a later one less.
    for (int path = 0; path < kFingersPerPilot; ++path) {
      const double ci = cell->quality + 3 - 4 * path + 0.5 * session_.diversityOffset();
      list.push_back({static_cast<std::uint32_t>(cell->code), energyRaw(ci)});
    }
  }
  if (list.size() < kFewFingers) list.push_back({kUnassignedPn, 0});
  RecordWriter w(kFingers.first + kFingers.entrySize * list.size());
  w.put(kFingerCount, static_cast<std::uint32_t>(list.size()));
  for (std::size_t i = 0; i < list.size(); ++i) {
    const std::size_t entry = kFingers.first + kFingers.entrySize * i;
    w.put(kPilotPn.at(entry), list[i].pn);
    if (list[i].pn != kUnassignedPn) w.put(kCarrierToInterference.at(entry), list[i].ci);
  }
  return w.packet(kCode, timestamp);
}

Bytes CdmaRadioEncoder::trafficFrame(std::uint64_t timestamp) {
  using namespace records::onex_traffic;
  const std::size_t at = subpackets::kFirst;
  RecordWriter w(at + kTrafficDemodSize);
  w.put(subpackets::kCount, 1);
  putSubpacketHeader(w, at, kTrafficDemodId, kTrafficDemodSize);
  w.put(kFrameError.at(at), session_.nextFrameInError() ? 1 : 0);
  return w.packet(kCode, timestamp);
}

Bytes CdmaRadioEncoder::forwardRate(std::uint64_t timestamp) const {
  using namespace records::forward_rate;
  RecordWriter w(kMinimumSize);
  w.put(kSequence, session_.forwardSequence());
  const auto& counts = session_.forwardCounts();
  for (std::size_t i = 0; i < counts.size(); ++i) {
    if (counts[i] != 0) w.put(counter(i), counts[i]);
  }
  return w.packet(kCode, timestamp);
}

Bytes CdmaRadioEncoder::reverseRate(std::uint64_t timestamp) const {
  using namespace records::reverse_rate;
  RecordWriter w(kMinimumSize);
  w.put(kSequence, session_.reverseSequence());
  for (std::size_t block = 0; block < kBlocks; ++block) {
    for (std::size_t rate = 0; rate < kBitsPerCount.size(); ++rate) {
      const std::uint32_t count = session_.reverseCount(block, rate);
      if (count != 0) w.put(counter(block, rate, 0), count);
    }
  }
  return w.packet(kCode, timestamp);
}

Bytes CdmaRadioEncoder::oneXSystem(const SimulatedNetwork& network, std::uint64_t timestamp) const {
  using namespace records::onex_system;
  const Cell& serving = network.servingCell();
  // The first cell lies in the registered system.
  const bool home = serving.areaCode == network.cells().front().areaCode;
  RecordWriter w(kFullSize);
  w.put(kVersion, kOneXSystemVersion);
  w.put(kRoamingIndicator, home ? kRoamingOff : kRoamingOn);
  w.put(kSystemType, kSystemTypeIs95);
  w.put(kSid, static_cast<std::uint32_t>(serving.areaCode));
  w.put(kNid, static_cast<std::uint32_t>(session_.networkId()));
  w.put(kPacketZone, static_cast<std::uint32_t>(session_.packetZone()));
  w.put(kProtocolRevision, kRevision);
  w.put(kBaseId, static_cast<std::uint32_t>(serving.cellId));
  return w.packet(kCode, timestamp);
}

}  // namespace corvane::telephonyd
