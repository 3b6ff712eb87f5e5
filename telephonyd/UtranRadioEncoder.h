#pragma once

// The UTRAN radio log codes of the Quendra_UTRAN2 scenario, all taken from
// the simulated network, so that they agree with each other and with the cell
// list of extra code 0xFF0001:
//
//   0xD0E0  RRC state (UtranRrcJourney.h)                         every 2 s
//   0xD0E2  serving cell: identity, URA, UARFCNs (the same both    every 2 s
//           ways on a TDD carrier), access
//   0xD00A  UTRAN cells: the serving cell (active set), measured   every 640 ms
//           neighbours (monitored set) and unmeasured ones
//           (detected set), strongest first; the cells of the
//           serving carrier within 9 dB of it are joint-detected
//   0xD00E  measured GSM neighbours, strongest first              every 1280 ms
//   0xD00C  transport-channel BLER and CCTrCH SIR, while the       every 1 s
//           phone has channels of its own (FACH, DCH)
//
// All that applies goes out in period 0, and again in the period of a cell
// or RRC state change.
//
// Two fields carry what the decoders make of them, not a unit of measure: the
// neighbours' filtered RSCP is an 8-bit field shown as a fraction of 256, so
// it carries the RSCP's magnitude in dB (85 for -85 dBm); the cell identity
// of 0xD00A holds 7 bits, so it carries the cell parameter id.

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "telephonyd/LogCodeSimulator.h"

namespace corvane::telephonyd {

class UtranRadioEncoder final : public LogCodeSimulator::Encoder {
 public:
  void encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
              std::vector<SourcePacket>& out) override;

 private:
  std::optional<Bytes> rrcState(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> servingCell(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> utranNeighbours(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> gsmNeighbours(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> channelMeasurements(const SimulatedNetwork& network, std::uint64_t timestamp);

  struct Report;
  static std::span<const Report> reports();

  std::uint64_t reportedCellChanges_ = 0;
  std::uint64_t reportedStateChanges_ = 0;
  // 0xD00C records sent so far: the scatter of their measurements.
  std::uint64_t channelRecords_ = 0;
};

}  // namespace corvane::telephonyd
