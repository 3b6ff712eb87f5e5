#pragma once

// The GSM/UMTS radio log codes of the Quendra_GSM scenario, all taken from the
// simulated network, so that they agree with each other and with the cell
// list of extra code 0xFF0001. What goes out depends on where the phone is in
// its journey (SimulatedNetwork.h):
//
//   registration, wherever the phone is camped
//     0x7132  PLMN selection mode (automatic) and the       every 1 s
//             registration service state
//     0x7135  registration: PLMN, LAC, RAC, service type,   every 5 s
//             network operating mode (I)
//     0x7150  equivalent PLMN list                          every 10 s
//     0x7131  MM state, substate and update status          every 1 s
//     0x7130  GMM state, substate and update status         every 1 s
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
//     0x4221  HSDPA statistics of the HARQ processes (DCH)  every 1 s
//   on GSM
//     0x51FF  BSICs of the measured neighbour frequencies   every 2 s
//     0x5134  serving cell identity                         every 2 s
//     0x5137  serving cell level, C1, C2 and neighbours     every 480 ms
//     0x51F8  mobile allocation (dedicated, hopping)        every 2 s
//     0x5076  the dedicated channel's current ARFCN         every 480 ms
//     0x512C  RR state                                      every 2 s
//     0x5072  DTX (on in a call)                            every 2 s
//     0x51F4  SI13 position, 0x51F5 packet access, 0x51F6   every 2 s
//             GPRS cell options, 0x51FB PBCCH, 0x51FD
//             packet system information: the GPRS
//             parameters of the serving cell
//
// All that applies goes out in period 0, and again in the period of a cell
// or phase change, so that no record goes on naming the old cell or state.
//
// The mobility management states follow the journey: a combined GPRS attach
// in the first second, a combined routing and location area update in the
// second of each reselection between UMTS and GSM (the network runs in
// operating mode I, so MM waits for GMM: "location updating pending"), a
// service request while the RRC connection is set up, and on GSM an MM
// connection for the call, during which GPRS is suspended. The HSDPA
// statistics count per HARQ process from the start of each stay in CELL_DCH,
// on two carriers, so their counts grow through the stay.
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
  // Mobility management, GSM radio resource, GPRS and HSDPA.
  std::optional<Bytes> mmState(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> gmmState(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> rrState(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> dtxState(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> si13Position(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> gprsAccess(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> gprsCellOptions(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> pbcch(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> packetSystemInfo(const SimulatedNetwork& network, std::uint64_t timestamp);
  std::optional<Bytes> hsdpaStatistics(const SimulatedNetwork& network, std::uint64_t timestamp);

  // Where the phone's registration stands, from the network's steps.
  enum class Registration { Attaching, Updating, Registered };
  Registration registrationState(const SimulatedNetwork& network) const;
  // True in the first step of the current phase.
  bool phaseJustBegan(const SimulatedNetwork& network) const { return network.steps() == phaseStep_; }
  void followRegistration(const SimulatedNetwork& network);

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

  // The access technology the phone last registered on (none before the
  // attach), the step in which that registration began, and the step in
  // which the current phase began.
  std::optional<SimulatedNetwork::Access> registeredAccess_;
  std::uint64_t registrations_ = 0;
  std::uint64_t registrationStep_ = 0;
  std::uint64_t phaseStep_ = 0;
  // The HARQ processes' counts since the current stay in CELL_DCH began.
  struct HarqCounts {
    std::uint32_t receivedBits = 0;
    std::uint32_t newTransmissions = 0;
    std::uint32_t blockErrors = 0;
  };
  std::vector<HarqCounts> harqCounts_;
  std::uint64_t harqStay_ = 0;  // the phase change that began the stay counted
  std::uint64_t hsdpaRecords_ = 0;
};

}  // namespace corvane::telephonyd
