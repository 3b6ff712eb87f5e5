#pragma once

// What the service itself knows about the phone in a log-code scenario, and
// reports as extra codes: the SIM's elementary files (0xFF0000), the cell
// monitor's list of the serving cell and its neighbours (0xFF0001) and the
// active PDP contexts (0xFF0002).
//
// The phone is registered on the test network 001-01. The cells are those of
// the scenario's technology:
//   Quendra_GSM     camped on UMTS (band 1), with UMTS and GSM 900 neighbours,
//                   on a journey that takes it to GSM and back (below)
//   Quendra_UTRAN2  camped on a UTRAN2 cell (band 34 or 39), with UTRAN2 and
//                   GSM 900 neighbours
//   Quendra_LTE     camped on LTE (band 3), with intra- and inter-frequency LTE
//                   neighbours (band 3, 7, 20)
//   Quendra_CDMA    CDMA2000 cell sites on one PCS (band class 1) carrier: the
//                   cell list holds SID as CellMonitorLAC, the base id as
//                   CellMonitorCellId, the channel as CellMonitorARFCN, the
//                   PN offset as CellMonitorPID, the level as CellMonitorRSSI
//                   and the pilot's Ec/Io as CellMonitorECN0; the phone's own
//                   journey (1x idle, traffic, EV-DO) is telephonyd/CdmaSession.h
// Every measurement period the levels take a random-walk step, quality follows
// level, now and then a neighbour goes unmeasured, and a neighbour of the
// serving cell's access technology that stays clearly stronger takes over. The
// SIM's location files follow the registered area; a second PDP context (IMS)
// comes and goes now and then.
//
// LTE cells also carry what the LTE radio records report: the carrier (uplink
// E-ARFCN, bandwidth) and the reference-signal measurements. RSRP follows the
// cell's RSSI, lower by the spread of the carrier's power over its resource
// elements; RSRQ follows the level as Ec/N0 does on UMTS; both with some noise
// of their own, and with a filtered (averaged) value beside the latest one. The
// LTE network also names a UTRAN and a GERAN cell for reselection, which the
// phone does not measure while on LTE.
//
// Beside the planned cells, the LTE phone's cell search now and then finds a
// weak cell on the serving carrier. Such a cell is detected first (the phone
// knows its physical cell id, nothing measured yet) for some seconds; then it
// is either measured, an ordinary neighbour until it fades out again, or lost.
// These cells stay below the serving cell, so they never take over; the cell
// list holds them as it holds every neighbour, unmeasured while only detected.
//
// The GSM/UMTS phone moves through the same journey again and again, each
// stay lasting some seconds that the seed draws:
//   UMTS idle      camped, RRC disconnected; a UMTS coverage that had faded
//                  comes back up here
//   connecting     one step of RRC connection set-up
//   CELL_FACH      a little data on the common channels
//   CELL_DCH       a data session on a dedicated channel, with an active set
//                  of the serving cell and up to two cells of its carrier
//                  within reach of it (soft handover)
//   fading         released to idle while the UMTS coverage fades, until the
//                  serving level falls below -105 dBm and the phone reselects
//                  to the strongest GSM cell
//   GSM idle       camped on GSM
//   GSM dedicated  a call on a hopping traffic channel: the serving cell's
//                  mobile allocation and hopping sequence number
//   leaving GSM    idle again while the UMTS coverage comes back, until a
//                  UMTS cell is above -95 dBm and the phone reselects to it
// GSM cells carry a BSIC and a mobile allocation; the network also has a
// routing area and a UTRAN registration area (URA). The journey draws from a
// random stream of its own, so the SIM and PDP contexts of a seed stay as
// they were.
//
// Everything depends only on the technology, the seed and the number of steps.

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/Value.h"
#include "telephonyd/SeededRandom.h"
#include "telephonyd/UtranRrcJourney.h"

namespace corvane::telephonyd {

class SimulatedNetwork {
 public:
  static constexpr std::chrono::seconds kMeasurementPeriod{1};

  enum class Access { GSM, UMTS, UTRAN2, LTE, CDMA };

  struct Cell {
    Access access = Access::GSM;
    bool serving = false;
    int areaCode = 0;   // LAC; the TAC on LTE
    int cellId = 0;
    int channel = 0;    // ARFCN (GSM), UARFCN (UMTS, UTRAN2), E-ARFCN (LTE) or CDMA channel
    int band = 0;       // UMTS, UTRAN2 and LTE
    int code = 0;       // scrambling code (UMTS), cell parameter id (UTRAN2), physical cell id (LTE),
                        // BSIC (GSM, on the GSM/UMTS network), pilot PN offset (CDMA)
    int level = 0;      // dBm: RSSI (GSM, LTE, CDMA) or RSCP (UMTS, UTRAN2); GSM and LTE levels are even
    int quality = 0;    // Ec/N0 in dB (UMTS, UTRAN2); the pilot's Ec/Io in dB (CDMA)
    bool measured = true;
    int strongerSteps = 0;  // consecutive steps clearly above the serving cell

    // GSM on the GSM/UMTS network: the traffic channels' hopping sequence
    // number and mobile allocation (ARFCNs, ascending).
    int hoppingSequence = 0;
    std::vector<int> mobileAllocation;

    // LTE only. RSRP in dBm and RSRQ in dB move in half-dB steps, the finest
    // step that every LTE record carrying them can hold.
    int uplinkChannel = 0;   // uplink E-ARFCN
    int resourceBlocks = 0;  // the carrier's bandwidth: 100 (20 MHz) or 50 (10 MHz)
    double rsrp = 0;
    double rsrq = 0;
    double averageRsrp = 0;  // layer-3 filtered
    double averageRsrq = 0;
  };

  // A cell of another access technology that the LTE cells name for
  // reselection. The phone does not measure it while camped on LTE, so the
  // cell list does not hold it.
  struct InterRatNeighbour {
    Access access = Access::UMTS;  // UMTS or GSM
    int channel = 0;               // UARFCN (UMTS) or ARFCN (GSM)
    int code = 0;                  // primary scrambling code (UMTS) or BSIC (GSM)
    int band = 0;                  // band 1 (UMTS); the band indicator 0, DCS 1800 (GSM)
  };

  // Where the GSM/UMTS phone is in its journey; the phase of the other technologies' phones stays UmtsIdle.
  enum class Phase { UmtsIdle, UmtsConnecting, UmtsFach, UmtsDch, UmtsFading, GsmIdle, GsmDedicated, GsmLeaving };

  // Throws std::invalid_argument for a technology that is not a log-code technology.
  SimulatedNetwork(std::string_view technology, std::uint64_t seed);

  // One measurement period later.
  void step();

  // Dictionary of the 14 SIM files, each a string.
  Value simFiles() const;
  // Array of cell dictionaries, serving cell first, then neighbours strongest first.
  Value cellList() const;
  // Array of context dictionaries, every value a string.
  Value pdpContexts() const;

  const std::vector<Cell>& cells() const { return cells_; }
  const Cell& servingCell() const { return cells_[serving_]; }
  // Empty but for LTE.
  const std::vector<InterRatNeighbour>& interRatNeighbours() const { return interRatNeighbours_; }
  std::uint64_t steps() const { return steps_; }
  std::uint64_t cellChanges() const { return cellChanges_; }
  // Counts the changes of the PDP contexts, so that a reporter sees when to report them again.
  std::uint64_t pdpGeneration() const { return pdpGeneration_; }
  const std::string& imsi() const { return imsi_; }

  Phase phase() const { return phase_; }
  // Counts the phase changes, so that a reporter sees when to report the state again.
  std::uint64_t phaseChanges() const { return phaseChanges_; }
  // The UMTS active set, serving cell first, the others strongest first; empty on GSM.
  std::vector<const Cell*> activeSet() const;
  int routingAreaCode() const { return routingAreaCode_; }
  // The URA of a UMTS cell: one per location area.
  int uraIdentity(const Cell& cell) const;

  // The UTRAN2 phone: its RRC states (UtranRrcJourney.h), and the URA of a
  // cell, one per location area, as one byte. Nothing on the other networks.
  const UtranRrcJourney* utranRrc() const { return utranRrc_ ? &*utranRrc_ : nullptr; }
  int utranRegistrationArea(const Cell& cell) const;

  static constexpr int kMobileCountryCode = 1;  // 001
  static constexpr int kMobileNetworkCode = 1;  // 01

 private:
  void addCells(Access access, int count, int areaCode);
  void drift(Cell& cell);
  void measureLteCell(Cell& cell, SeededRandom& noise);
  void stepDetectedCells();
  void detectCell();
  void changeServingCell(std::size_t to);
  std::size_t strongest(Access access) const;
  Dictionary cellFields(const Cell& cell) const;
  void planGsmUmtsCells();
  void enterPhase(Phase phase);
  void moveAlongJourney();
  void updateActiveSet();

  SeededRandom random_;
  // LTE's measurement noise and inter-RAT neighbours draw from a stream of
  // their own: the levels, cell changes, SIM and PDP contexts that a seed gives
  // do not depend on them.
  SeededRandom radio_;
  // So do the LTE cells that the phone finds beside the planned ones: their
  // coming and going, their values and their measurement noise.
  SeededRandom detection_;
  std::vector<Cell> cells_;
  // The planned cells come first in cells_; behind them the found ones, each
  // with its place in its life in foundCells_ (the same order).
  struct FoundCell {
    int detectedSteps = 0;  // left before it is measured or lost
    bool toBeMeasured = false;
    int measuredSteps = 0;  // left, once measured, before it fades out
  };
  std::size_t plannedCells_ = 0;
  std::vector<FoundCell> foundCells_;
  std::uint64_t nextDetection_ = 0;  // the step at which the cell search finds the next cell
  std::vector<InterRatNeighbour> interRatNeighbours_;
  std::size_t serving_ = 0;
  std::uint64_t steps_ = 0;

  // The GSM/UMTS phone's journey.
  bool journeys_ = false;
  SeededRandom journey_;
  Phase phase_ = Phase::UmtsIdle;
  int phaseStepsLeft_ = 0;  // of a timed phase
  std::uint64_t phaseChanges_ = 0;
  std::vector<std::size_t> activeSet_;  // indices into cells_
  int uraIdentity_ = 0;
  std::uint64_t cellChanges_ = 0;

  // The UTRAN2 phone.
  void planUtran2Cells(std::uint64_t seed);
  std::optional<UtranRrcJourney> utranRrc_;

  // SIM
  std::string imsi_;
  std::string iccid_;
  std::string msisdn_;
  std::string mailbox_;
  std::uint32_t tmsi_ = 0;
  std::uint32_t ptmsi_ = 0;
  std::uint32_t ptmsiSignature_ = 0;
  int routingAreaCode_ = 0;

  // PDP
  std::uint64_t pdpGeneration_ = 0;
  std::string internetAddress_;
  bool imsActive_ = false;
  std::string imsAddress_;
};

}  // namespace corvane::telephonyd
