#pragma once

// The LTE radio log codes of the Quendra_LTE scenario, all taken from the
// simulated network, so that they agree with each other and with the cell
// list of extra code 0xFF0001:
//
//   0xB0C2  serving cell identity and carrier        every 2 s
//   0xB0C1  antennas of the serving cell             every 2 s
//   0xB17F  serving cell measurement                 every 320 ms
//   0xB179  intra-frequency measurement: measured    every 640 ms
//           and detected neighbours
//   0xB180  neighbour measurement of one E-ARFCN,    every 640 ms
//           each neighbour frequency in turn
//   0xB186  reselection candidate                    every 1280 ms
//
// All of them in period 0, and all of them again in the period of a cell
// change, so that no record goes on naming the old serving cell.
//
// Values: the serving cell's PCI, E-ARFCNs, bandwidth, cell identity, TAC and
// band; RSRP, RSRQ and RSSI of each cell, latest and filtered; Srxlev as the
// RSRP above the layer's Qrxlevmin (whole dB); the idle-mode settings that the
// cells of each band broadcast (kLayers in the .cpp). Neighbours that the
// network left unmeasured in a step are the "detected" cells of 0xB179 and
// are missing from 0xB180 and from the candidates.
//
// 0xB186 carries a single candidate. Its decoder reads candidates 4 bytes
// apart while an LTE, UTRAN or GERAN candidate's own fields take 8: a second
// candidate's priority and technology would lie where the first one's channel
// and cell id lie, and the list would show a channel number as a priority.
// With one candidate every field shows what was written. It is the strongest
// measured LTE neighbour; every fifth record reports one of the network's
// inter-RAT neighbours instead, UTRAN and GERAN in turn.

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "telephonyd/LogCodeSimulator.h"

namespace corvane::telephonyd {

class LteRadioEncoder final : public LogCodeSimulator::Encoder {
 public:
  void encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
              std::vector<SourcePacket>& out) override;

 private:
  // Each makes its record from the network as it is now; the neighbour
  // measurement has none when no neighbour is measured.
  std::optional<Bytes> servingCellIdentity(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> antennaInfo(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> servingCellMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> intraFrequencyMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> neighbourMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> reselectionCandidates(const SimulatedNetwork& network, std::uint64_t timestamp);

  struct Report;
  static std::span<const Report> reports();

  std::uint64_t reportedCellChanges_ = 0;
  // 0xB17F: reports in a row in which Srxlev was below zero, and the last measurement rules.
  int reportsBelowZero_ = 0;
  std::optional<std::uint32_t> lastRules_;
  // 0xB180: the neighbour frequency reported last.
  std::optional<int> lastNeighbourChannel_;
  // 0xB186: records sent so far.
  std::uint64_t reselectionRecords_ = 0;
};

}  // namespace corvane::telephonyd
