#pragma once

// The CDMA2000 log codes of the Quendra_CDMA scenario, from the simulated
// network's CDMA cells and the phone's session (telephonyd/CdmaSession.h), so
// that they agree with each other and with the cell list of 0xFF0001:
//
//   0x119c  1x status: state, receive chains, transmitter,  every 320 ms
//           active set (sub-packets 1-4)
//   0x1183  EV-DO status: carrier, state, AGC, serving PN,   every 640 ms
//           session, UATI, colour code
//   0x12b6  EV-DO active-set pilots                          every 640 ms
//   0x108a  finger C/I                                       every 640 ms
//   0x119d  1x traffic frame (sub-packet 11), in error or    every 80 ms, in 1x traffic
//           not
//   0x1192  EV-DO forward-link counters                      every 1 s
//   0x127e  EV-DO reverse-link counters                      every 1 s
//   0x134f  1x system: ERI, SID, NID, packet zone, base id   every 2 s
//
// All of them in period 0; the status, pilot, finger and system records again
// in the period of a cell or phase change. The counters come right after the
// network's step, so each record's rate is that of the step.
//
// Values: SID and base id are the serving cell's area code and cell id, the
// pilots' PN offsets and Ec/Io their codes and qualities, the AGC their
// levels (1x: raw × 0.334 − 63.248 dBm; EV-DO in whole dBm), the transmit
// power the open-loop estimate −76 dBm − level. The roaming indicator is OFF
// on the registered SID, ON elsewhere.

#include <cstdint>
#include <vector>

#include "telephonyd/CdmaSession.h"
#include "telephonyd/LogCodeSimulator.h"

namespace corvane::telephonyd {

class CdmaRadioEncoder final : public LogCodeSimulator::Encoder {
 public:
  explicit CdmaRadioEncoder(std::uint64_t seed) : session_(seed) {}

  void encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
              std::vector<SourcePacket>& out) override;

  const CdmaSession& session() const { return session_; }

 private:
  Bytes oneXStatus(const SimulatedNetwork& network, std::uint64_t timestamp);
  Bytes evdoStatus(const SimulatedNetwork& network, std::uint64_t timestamp);
  Bytes evdoPilots(const SimulatedNetwork& network, std::uint64_t timestamp);
  Bytes fingers(const SimulatedNetwork& network, std::uint64_t timestamp);
  Bytes trafficFrame(std::uint64_t timestamp);
  Bytes forwardRate(std::uint64_t timestamp) const;
  Bytes reverseRate(std::uint64_t timestamp) const;
  Bytes oneXSystem(const SimulatedNetwork& network, std::uint64_t timestamp) const;

  CdmaSession session_;
  std::uint64_t seenSteps_ = 0;
  std::uint64_t reportedCellChanges_ = 0;
  std::uint64_t reportedPhaseChanges_ = 0;
};

}  // namespace corvane::telephonyd
