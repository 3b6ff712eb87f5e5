#pragma once

// The GSM/UMTS radio log codes of the Quendra_GSM scenario, all taken from the
// simulated network, so that they agree with each other and with the cell
// list of extra code 0xFF0001. What goes out depends on where the phone is in
// its journey (SimulatedNetwork.h):
//
//   registration, wherever the phone is camped
//     0x7132  PLMN selection mode (automatic)               every 10 s
//     0x7135  registration: PLMN, LAC, RAC, service type    every 5 s
//     0x7150  equivalent PLMN list                          every 10 s
//   on UMTS
//     0x4125  RRC state                                     every 2 s
//     0x4127  serving cell, UARFCNs and URA                 every 2 s
//     0x4157  ciphering (on while RRC connected)            every 2 s
//     0x417A  searcher's cell sets: active set, monitored   every 400 ms
//             and detected cells of the serving carrier
//     0x4005  ranked idle-mode neighbours (not in DCH),     every 1280 ms
//             the UMTS cells and the GSM cells in turn
//     0x4031  transmit power samples (connecting, FACH, DCH) every 1 s
//     0x4116  BLER of the transport channels (DCH)          every 1 s
//   on GSM
//     0x51FF  BSICs of the measured neighbour frequencies   every 2 s
//     0x5134  serving cell identity                         every 2 s
//     0x5137  serving cell level, C1, C2 and neighbours     every 480 ms
//     0x51F8  mobile allocation (dedicated, hopping)        every 2 s
//     0x5076  the dedicated channel's current ARFCN         every 480 ms
//
// All that applies goes out in period 0, and again in the period of a cell
// or phase change, so that no record goes on naming the old cell or state.
//
// Two records cannot say everything their decoders read. 0x7150's networks
// overlap by three bytes (a network's six digits begin three bytes after the
// one before), so the list holds one network: the registered one. 0x4005's
// UMTS and GSM lists both begin at offset 15, so each record carries one of
// them, with the other's count 0; the ranking alternates between them.

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "telephonyd/LogCodeSimulator.h"

namespace corvane::telephonyd {

class GsmUmtsRadioEncoder final : public LogCodeSimulator::Encoder {
 public:
  void encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
              std::vector<SourcePacket>& out) override;

 private:
  // Each makes its record from the network as it is now, or none.
  std::optional<Bytes> plmnSelectionMode(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> registration(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> equivalentPlmns(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> rrcState(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> umtsCell(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> ciphering(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> cellSets(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> rankedCells(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> transmitPower(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> blockErrors(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> neighbourBsics(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> gsmCellIdentity(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> gsmCellMeasurement(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> mobileAllocation(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> dedicatedChannel(const SimulatedNetwork& network, std::uint64_t timestamp);

  struct Report;
  static std::span<const Report> reports();

  std::uint64_t reportedCellChanges_ = 0;
  std::uint64_t reportedPhaseChanges_ = 0;
  // 0x4005 records sent so far: even ones rank the UMTS cells, odd ones the GSM cells.
  std::uint64_t rankingRecords_ = 0;
  // 0x4031, 0x4116 and 0x5076 records sent so far: their measurement noise and the hop they report.
  std::uint64_t transmitPowerRecords_ = 0;
  std::uint64_t blerRecords_ = 0;
  std::uint64_t dedicatedRecords_ = 0;
};

}  // namespace corvane::telephonyd
