#include "telephonyd/SimulatedNetwork.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdio>
#include <stdexcept>

#include "platform/CellMonitor.h"
#include "platform/LogChannelTechnology.h"
#include "telephonyd/SimFileCoding.h"

namespace corvane::telephonyd {

namespace {

constexpr int kHandoverMargin = 6;     // dB a neighbour must lead by ...
constexpr int kHandoverSteps = 3;      // ... for this many steps in a row
constexpr int kUnmeasuredOneIn = 20;   // chance of a neighbour going unmeasured in a step
constexpr int kImsToggleOneIn = 60;    // chance per step that the IMS context comes or goes
// Below this UMTS level the fading GSM/UMTS phone falls back to GSM; above
// the other the phone leaving GSM returns.
constexpr int kUmtsFallbackLevel = -105;
constexpr int kUmtsReturnLevel = -95;
// dB per step by which the UMTS coverage fades and comes back; back in UMTS
// idle it keeps coming back until the serving cell is at this level.
constexpr int kUmtsFadeStep = 4;
constexpr int kUmtsRecoveredLevel = -85;
constexpr int kUmtsRecoverStep = 2;
// The active set: a cell of the serving carrier within this many dB of the
// serving cell joins it, one beyond the other leaves it; at most three cells.
constexpr int kActiveSetAddWindow = 10;
constexpr int kActiveSetDropWindow = 13;
constexpr std::size_t kActiveSetSize = 3;

// How long the timed phases of the journey last, in steps.
struct PhaseLength {
  SimulatedNetwork::Phase phase;
  int least;
  int most;
};
constexpr std::array<PhaseLength, 6> kPhaseLengths = {{
    {SimulatedNetwork::Phase::UmtsIdle, 6, 10},
    {SimulatedNetwork::Phase::UmtsConnecting, 1, 1},
    {SimulatedNetwork::Phase::UmtsFach, 3, 5},
    {SimulatedNetwork::Phase::UmtsDch, 8, 12},
    {SimulatedNetwork::Phase::GsmIdle, 4, 6},
    {SimulatedNetwork::Phase::GsmDedicated, 6, 10},
}};

// The phase that follows a timed one when its time is up; the fading and
// leaving phases end with a reselection instead.
struct PhaseSuccessor {
  SimulatedNetwork::Phase phase;
  SimulatedNetwork::Phase next;
};
constexpr std::array<PhaseSuccessor, 6> kPhaseSuccessors = {{
    {SimulatedNetwork::Phase::UmtsIdle, SimulatedNetwork::Phase::UmtsConnecting},
    {SimulatedNetwork::Phase::UmtsConnecting, SimulatedNetwork::Phase::UmtsFach},
    {SimulatedNetwork::Phase::UmtsFach, SimulatedNetwork::Phase::UmtsDch},
    {SimulatedNetwork::Phase::UmtsDch, SimulatedNetwork::Phase::UmtsFading},
    {SimulatedNetwork::Phase::GsmIdle, SimulatedNetwork::Phase::GsmDedicated},
    {SimulatedNetwork::Phase::GsmDedicated, SimulatedNetwork::Phase::GsmLeaving},
}};

// GSM 900 traffic channels: a mobile allocation of 3 to 5 of them.
constexpr int kLowestGsmArfcn = 1;
constexpr int kHighestGsmArfcn = 124;
constexpr int kMobileAllocationLeast = 3;
constexpr int kMobileAllocationMost = 5;

// The LTE cell search finds a cell on the serving carrier every 4 to 25 steps,
// unless two found cells are still only detected or five are about at once.
constexpr int kDetectionEveryLeast = 4;
constexpr int kDetectionEveryMost = 25;
constexpr std::size_t kMostDetected = 2;
constexpr std::size_t kMostFound = 5;
// A found cell is only detected for 3 to 40 steps; then one in two is measured,
// for 15 to 90 steps, and the others are lost.
constexpr int kDetectedLeast = 3;
constexpr int kDetectedMost = 40;
constexpr int kMeasuredOneIn = 2;
constexpr int kMeasuredLeast = 15;
constexpr int kMeasuredMost = 90;
// Found 8 to 20 dB below the serving cell (in 2 dB steps), and kept at least
// 4 dB below it; never below the floor of the LTE range, so a serving cell at
// that floor may be matched, but never passed.
constexpr int kFoundBelowServingLeast = 8;
constexpr int kFoundBelowServingMost = 20;
constexpr int kFoundBelowServing = 4;

// The LTE bands of the scenario. On each, the uplink E-ARFCN lies 18000 above the downlink one.
struct LteBand {
  int band;
  int uplinkOffset;
  int resourceBlocks;
};
constexpr std::array<LteBand, 3> kLteBands = {{
    {3, 18000, 100},
    {7, 18000, 100},
    {20, 18000, 50},
}};

const LteBand& lteBand(int band) {
  for (const LteBand& entry : kLteBands) {
    if (entry.band == band) return entry;
  }
  throw std::logic_error("no LTE carrier plan for band " + std::to_string(band));
}

constexpr double kLowestRsrp = -125;
constexpr double kHighestRsrp = -70;
constexpr double kLowestRsrq = -20;
constexpr double kHighestRsrq = -3;

// RSSI sums the power of all resource elements of the carrier (12 per
// resource block), about half of them loaded; RSRP is the power of one
// reference-signal element, so it lies below RSSI by about this much:
// 28 dB on 100 resource blocks, 25 dB on 50.
double rsrpBelowRssi(int resourceBlocks) { return std::round(10 * std::log10(12.0 * resourceBlocks) - 3); }

// A layer-3 filter of equal weights, kept on the half-dB steps.
double filtered(double average, double latest) { return std::round(average + latest) / 2; }

struct LevelRange {
  int low;
  int high;
};

LevelRange levelRange(SimulatedNetwork::Access access) {
  switch (access) {
    case SimulatedNetwork::Access::GSM: return {-110, -48};
    case SimulatedNetwork::Access::LTE: return {-100, -40};
    case SimulatedNetwork::Access::UMTS:
    case SimulatedNetwork::Access::UTRAN2: return {-120, -50};
    case SimulatedNetwork::Access::CDMA: return {-105, -55};
  }
  return {-120, -40};
}

// GSM RSSI and LTE RSSI are reported in units of 2 dB, so their levels move in whole units.
bool hasEvenLevel(SimulatedNetwork::Access access) {
  return access == SimulatedNetwork::Access::GSM || access == SimulatedNetwork::Access::LTE;
}

std::string_view accessValue(SimulatedNetwork::Access access) {
  switch (access) {
    case SimulatedNetwork::Access::GSM: return CellMonitorRadioAccessTechnologyGSM;
    case SimulatedNetwork::Access::UMTS: return CellMonitorRadioAccessTechnologyUMTS;
    case SimulatedNetwork::Access::UTRAN2: return CellMonitorRadioAccessTechnologyUTRAN2;
    case SimulatedNetwork::Access::LTE: return CellMonitorRadioAccessTechnologyLTE;
    case SimulatedNetwork::Access::CDMA: return CellMonitorRadioAccessTechnologyCDMA;
  }
  return {};
}

std::string digitString(SeededRandom& random, int count) {
  std::string out;
  for (int i = 0; i < count; ++i) out += static_cast<char>('0' + random.uniform(0, 9));
  return out;
}

char luhnCheckDigit(std::string_view digits) {
  int sum = 0;
  bool doubled = true;  // the check digit will stand to the right
  for (auto it = digits.rbegin(); it != digits.rend(); ++it) {
    int d = *it - '0';
    if (doubled) d = d * 2 > 9 ? d * 2 - 9 : d * 2;
    sum += d;
    doubled = !doubled;
  }
  return static_cast<char>('0' + (10 - sum % 10) % 10);
}

// The PLMN identity as the SIM stores it, of a 3-digit MCC and a 2-digit MNC.
std::string plmnIdentity(int mcc, int mnc) {
  char digits[16];
  std::snprintf(digits, sizeof digits, "%03d%02d", mcc, mnc);
  return telephonyd::plmnIdentity(digits).value_or("FFFFFF");
}

// A network name element of EF-PNN: tag, length, coding (GSM default alphabet,
// number of spare bits in the last octet) and the name packed in 7-bit characters.
std::string networkNameElement(int tag, std::string_view name) {
  std::string packed;
  std::uint32_t pending = 0;
  int bits = 0;
  for (char c : name) {
    pending |= static_cast<std::uint32_t>(c & 0x7F) << bits;
    bits += 7;
    while (bits >= 8) {
      packed += hexBytes(pending & 0xFF, 1);
      pending >>= 8;
      bits -= 8;
    }
  }
  if (bits > 0) packed += hexBytes(pending & 0xFF, 1);
  const int spareBits = bits > 0 ? 8 - bits : 0;
  const auto octets = static_cast<std::uint64_t>(packed.size() / 2);
  const auto coding = 0x80u | static_cast<unsigned>(spareBits);
  return hexBytes(static_cast<std::uint64_t>(tag), 1) + hexBytes(octets + 1, 1) + hexBytes(coding, 1) + packed;
}

std::string number(long long value) { return std::to_string(value); }

}  // namespace

SimulatedNetwork::SimulatedNetwork(std::string_view technology, std::uint64_t seed)
    : random_(seed),
      radio_(~seed),
      detection_(seed ^ 0x9E3779B97F4A7C15u),
      journey_(seed * 0x2545F4914F6CDD1Du + 0x632BE59BD9B4E019u) {
  const int areaCode = random_.uniform(0x1000, 0x7FFF);
  if (technology == kLogChannelTechnologyQuendraGSM) {
    addCells(Access::UMTS, 5, areaCode);
    addCells(Access::GSM, 4, areaCode);
    journeys_ = true;
  } else if (technology == kLogChannelTechnologyQuendraUTRAN2) {
    addCells(Access::UTRAN2, 5, areaCode);
    addCells(Access::GSM, 3, areaCode);
    planUtran2Cells(seed);
  } else if (technology == kLogChannelTechnologyQuendraLTE) {
    addCells(Access::LTE, 6, areaCode);
    for (Cell& cell : cells_) {
      const LteBand& band = lteBand(cell.band);
      cell.uplinkChannel = cell.channel + band.uplinkOffset;
      cell.resourceBlocks = band.resourceBlocks;
      measureLteCell(cell, radio_);
      cell.averageRsrp = cell.rsrp;
      cell.averageRsrq = cell.rsrq;
    }
    // A UMTS band 1 cell and a GSM 1800 cell.
    interRatNeighbours_.push_back({Access::UMTS, radio_.uniform(10562, 10838), radio_.uniform(0, 511), 1});
    interRatNeighbours_.push_back({Access::GSM, radio_.uniform(512, 885), radio_.uniform(0, 63), 0});
    nextDetection_ = static_cast<std::uint64_t>(detection_.uniform(kDetectionEveryLeast, kDetectionEveryMost));
  } else if (technology == kLogChannelTechnologyQuendraCDMA) {
    addCells(Access::CDMA, 6, areaCode);
  } else {
    throw std::invalid_argument("no simulated network for technology " + std::string(technology));
  }
  cells_[serving_].serving = true;
  plannedCells_ = cells_.size();

  imsi_ = "00101" + digitString(random_, 10);
  iccid_ = "8900101" + digitString(random_, 11);
  iccid_ += luhnCheckDigit(iccid_);
  const std::string area = number(random_.uniform(201, 989));
  msisdn_ = "+1" + area + "55501" + digitString(random_, 2);
  mailbox_ = "+1" + area + "5550100";
  tmsi_ = static_cast<std::uint32_t>(random_.uniform(0, 0x3FFFFFFF));
  ptmsi_ = 0xC0000000u | static_cast<std::uint32_t>(random_.uniform(0, 0x3FFFFFFF));
  ptmsiSignature_ = static_cast<std::uint32_t>(random_.uniform(0, 0xFFFFFF));
  routingAreaCode_ = random_.uniform(1, 254);
  internetAddress_ = "10." + number(random_.uniform(0, 255)) + "." + number(random_.uniform(0, 255)) + "." +
                     number(random_.uniform(1, 254));
  if (journeys_) planGsmUmtsCells();
}

void SimulatedNetwork::planGsmUmtsCells() {
  std::vector<int> broadcastChannels;
  for (const Cell& cell : cells_) {
    if (cell.access == Access::GSM) broadcastChannels.push_back(cell.channel);
  }
  for (Cell& cell : cells_) {
    if (cell.access != Access::GSM) continue;
    cell.code = journey_.uniform(0, 63);  // NCC and BCC
    cell.hoppingSequence = journey_.uniform(1, 63);
    // Traffic channels apart from every cell's broadcast channel.
    const int count = journey_.uniform(kMobileAllocationLeast, kMobileAllocationMost);
    while (static_cast<int>(cell.mobileAllocation.size()) < count) {
      const int arfcn = journey_.uniform(kLowestGsmArfcn, kHighestGsmArfcn);
      const auto taken = [arfcn](const std::vector<int>& channels) {
        return std::find(channels.begin(), channels.end(), arfcn) != channels.end();
      };
      if (!taken(broadcastChannels) && !taken(cell.mobileAllocation)) cell.mobileAllocation.push_back(arfcn);
    }
    std::sort(cell.mobileAllocation.begin(), cell.mobileAllocation.end());
  }
  uraIdentity_ = journey_.uniform(1, 0xFFFF);
  phase_ = Phase::UmtsIdle;
  for (const PhaseLength& length : kPhaseLengths) {
    if (length.phase == phase_) phaseStepsLeft_ = journey_.uniform(length.least, length.most);
  }
  updateActiveSet();
}

void SimulatedNetwork::enterPhase(Phase phase) {
  phase_ = phase;
  phaseStepsLeft_ = 0;
  for (const PhaseLength& length : kPhaseLengths) {
    if (length.phase == phase) phaseStepsLeft_ = journey_.uniform(length.least, length.most);
  }
  ++phaseChanges_;
}

void SimulatedNetwork::moveAlongJourney() {
  // The UMTS coverage fades, comes back, and once back settles.
  const int trend = phase_ == Phase::UmtsFading ? -kUmtsFadeStep
                    : phase_ == Phase::GsmLeaving ? kUmtsFadeStep
                    : phase_ == Phase::UmtsIdle && cells_[serving_].level < kUmtsRecoveredLevel ? kUmtsRecoverStep
                                                                                                : 0;
  if (trend != 0) {
    const LevelRange range = levelRange(Access::UMTS);
    for (Cell& cell : cells_) {
      if (cell.access != Access::UMTS) continue;
      cell.level = std::clamp(cell.level + trend, range.low, range.high);
      cell.quality = std::clamp((cell.level + 60) / 4 - 2 + journey_.uniform(-1, 1), -24, 0);
    }
  }
  if (phaseStepsLeft_ > 0 && --phaseStepsLeft_ == 0) {
    for (const PhaseSuccessor& successor : kPhaseSuccessors) {
      if (successor.phase == phase_) {
        enterPhase(successor.next);
        break;
      }
    }
  }
}

void SimulatedNetwork::updateActiveSet() {
  const Cell& serving = cells_[serving_];
  std::vector<std::size_t> previous = std::move(activeSet_);
  activeSet_.clear();
  if (serving.access != Access::UMTS) return;
  activeSet_.push_back(serving_);
  if (phase_ != Phase::UmtsDch) return;
  std::vector<std::size_t> others;
  for (std::size_t i = 0; i < cells_.size(); ++i) {
    const Cell& cell = cells_[i];
    if (i == serving_ || cell.access != Access::UMTS || !cell.measured || cell.channel != serving.channel) continue;
    const bool member = std::find(previous.begin(), previous.end(), i) != previous.end();
    const int window = member ? kActiveSetDropWindow : kActiveSetAddWindow;
    if (cell.level >= serving.level - window) others.push_back(i);
  }
  std::stable_sort(others.begin(), others.end(),
                   [this](std::size_t a, std::size_t b) { return cells_[a].level > cells_[b].level; });
  for (std::size_t i : others) {
    if (activeSet_.size() == kActiveSetSize) break;
    activeSet_.push_back(i);
  }
}

std::vector<const SimulatedNetwork::Cell*> SimulatedNetwork::activeSet() const {
  std::vector<const Cell*> cells;
  for (std::size_t i : activeSet_) cells.push_back(&cells_[i]);
  return cells;
}

int SimulatedNetwork::uraIdentity(const Cell& cell) const {
  return (uraIdentity_ + cell.areaCode - cells_.front().areaCode) & 0xFFFF;
}

void SimulatedNetwork::addCells(Access access, int count, int areaCode) {
  std::vector<int> channels;  // the carriers of this access technology, the first one the serving cell's
  std::vector<int> bands;
  switch (access) {
    case Access::GSM: {
      // GSM 900, a few channels apart as a planner would set them.
      int arfcn = random_.uniform(1, 40);
      for (int i = 0; i < count; ++i) {
        channels.push_back(arfcn);
        bands.push_back(0);
        arfcn += random_.uniform(3, 11);
      }
      break;
    }
    case Access::UMTS: {
      // Two 5 MHz carriers of band 1.
      const int carrier = random_.uniform(10562, 10813);
      for (int i = 0; i < count; ++i) {
        channels.push_back(i > 0 && random_.oneIn(3) ? carrier + 25 : carrier);
        bands.push_back(1);
      }
      break;
    }
    case Access::UTRAN2: {
      // Two 1.6 MHz carriers of band 34 or band 39.
      const bool band34 = random_.oneIn(2);
      const int carrier = band34 ? random_.uniform(10054, 10113) : random_.uniform(9404, 9588);
      for (int i = 0; i < count; ++i) {
        channels.push_back(i > 0 && random_.oneIn(3) ? carrier + 8 : carrier);
        bands.push_back(band34 ? 34 : 39);
      }
      break;
    }
    case Access::LTE: {
      // Band 3 for the serving carrier and its intra-frequency neighbours; one
      // neighbour each on band 7 and band 20.
      const int carrier = random_.uniform(1200, 1949);
      for (int i = 0; i < count; ++i) {
        if (i == count - 2) {
          channels.push_back(random_.uniform(2750, 3449));
          bands.push_back(7);
        } else if (i == count - 1) {
          channels.push_back(random_.uniform(6150, 6449));
          bands.push_back(20);
        } else {
          channels.push_back(carrier);
          bands.push_back(3);
        }
      }
      break;
    }
    case Access::CDMA: {
      // One PCS (band class 1) carrier, on the 25-channel raster.
      const int carrier = 25 * random_.uniform(1, 45);
      for (int i = 0; i < count; ++i) {
        channels.push_back(carrier);
        bands.push_back(1);
      }
      break;
    }
  }

  const int codeLimit = access == Access::UMTS || access == Access::CDMA ? 511 : access == Access::UTRAN2 ? 127 : 503;
  const int controller = random_.uniform(1, 4095);  // RNC of the UMTS/UTRAN2 cells, most of them
  const LevelRange range = levelRange(access);
  const bool first = cells_.empty();
  for (int i = 0; i < count; ++i) {
    Cell cell;
    cell.access = access;
    // Most cells share the registered area; some lie across its border.
    cell.areaCode = random_.oneIn(4) ? areaCode + random_.uniform(1, 9) : areaCode;
    if (first && i == 0) cell.areaCode = areaCode;
    cell.channel = channels[static_cast<std::size_t>(i)];
    cell.band = bands[static_cast<std::size_t>(i)];
    switch (access) {
      case Access::GSM: cell.cellId = random_.uniform(1, 65535); break;
      case Access::UMTS:
      case Access::UTRAN2:
        cell.cellId = (random_.oneIn(5) ? random_.uniform(1, 4095) : controller) << 16 | random_.uniform(1, 65535);
        break;
      case Access::LTE: cell.cellId = random_.uniform(1, 0xFFFFF) << 8 | random_.uniform(1, 3); break;
      case Access::CDMA: cell.cellId = random_.uniform(1, 65535); break;  // the base id
    }
    if (access != Access::GSM) {
      // Distinct codes among the cells of one access technology, as planning requires.
      for (;;) {
        cell.code = random_.uniform(0, codeLimit);
        const bool taken = std::any_of(cells_.begin(), cells_.end(),
                                       [&](const Cell& c) { return c.access == access && c.code == cell.code; });
        if (!taken) break;
      }
    }
    if (first && i == 0) {
      cell.level = random_.uniform(range.high - 35, range.high - 20);
    } else {
      const int reference = first ? cells_.front().level : random_.uniform(range.low + 25, range.high - 20);
      cell.level = std::clamp(reference - random_.uniform(3, 20), range.low, range.high);
    }
    if (hasEvenLevel(access)) cell.level -= cell.level % 2;
    cell.quality = std::clamp((cell.level + 60) / 4 - 2, -24, 0);
    cells_.push_back(cell);
  }
}

void SimulatedNetwork::drift(Cell& cell) {
  const LevelRange range = levelRange(cell.access);
  const int stepSize = hasEvenLevel(cell.access) ? 2 * random_.uniform(-1, 1) : random_.uniform(-2, 2);
  cell.level = std::clamp(cell.level + stepSize, range.low, range.high);
  if (cell.access == Access::UMTS || cell.access == Access::UTRAN2 || cell.access == Access::CDMA) {
    // Ec/N0 (a CDMA pilot's Ec/Io) follows the level, with some noise.
    cell.quality = std::clamp((cell.level + 60) / 4 - 2 + random_.uniform(-1, 1), -24, 0);
  }
  if (cell.access == Access::LTE) {
    measureLteCell(cell, radio_);
    cell.averageRsrp = filtered(cell.averageRsrp, cell.rsrp);
    cell.averageRsrq = filtered(cell.averageRsrq, cell.rsrq);
  }
  cell.measured = cell.serving || !random_.oneIn(kUnmeasuredOneIn);
}

void SimulatedNetwork::measureLteCell(Cell& cell, SeededRandom& noise) {
  // Levels are even, so both land on half-dB steps.
  const double rsrp = cell.level - rsrpBelowRssi(cell.resourceBlocks) + 0.5 * noise.uniform(-2, 2);
  // From -3 dB at -40 dBm down to -18 dB at -100 dBm, as Ec/N0 follows RSCP.
  const double rsrq = -3 + 0.25 * (cell.level + 40) + 0.5 * noise.uniform(-1, 1);
  cell.rsrp = std::clamp(rsrp, kLowestRsrp, kHighestRsrp);
  cell.rsrq = std::clamp(rsrq, kLowestRsrq, kHighestRsrq);
}

void SimulatedNetwork::stepDetectedCells() {
  const Cell& serving = cells_[serving_];
  const int lowest = levelRange(Access::LTE).low;
  // Weak cells: they stay clearly below the serving cell, so they are never the
  // strongest and never take over.
  auto belowServing = [&](int level) { return std::max(lowest, std::min(level, serving.level - kFoundBelowServing)); };

  for (std::size_t i = 0; i < foundCells_.size();) {
    FoundCell& found = foundCells_[i];
    Cell& cell = cells_[plannedCells_ + i];
    const bool wasDetected = found.detectedSteps > 0;
    const bool gone = wasDetected ? --found.detectedSteps == 0 && !found.toBeMeasured  // lost
                                  : --found.measuredSteps == 0;                      // faded out
    if (gone) {
      cells_.erase(cells_.begin() + static_cast<std::ptrdiff_t>(plannedCells_ + i));
      foundCells_.erase(foundCells_.begin() + static_cast<std::ptrdiff_t>(i));
      continue;
    }
    cell.level = belowServing(cell.level + 2 * detection_.uniform(-1, 1));
    measureLteCell(cell, detection_);
    if (found.detectedSteps > 0 || wasDetected) {
      // Nothing filtered yet: the filter starts with the first measurement.
      cell.averageRsrp = cell.rsrp;
      cell.averageRsrq = cell.rsrq;
      cell.measured = found.detectedSteps == 0;
    } else {
      cell.averageRsrp = filtered(cell.averageRsrp, cell.rsrp);
      cell.averageRsrq = filtered(cell.averageRsrq, cell.rsrq);
      // Now and then unmeasured, like every neighbour.
      cell.measured = !detection_.oneIn(kUnmeasuredOneIn);
    }
    ++i;
  }

  std::size_t detected = 0;
  for (const FoundCell& found : foundCells_) detected += found.detectedSteps > 0 ? 1 : 0;
  if (steps_ >= nextDetection_ && detected < kMostDetected && foundCells_.size() < kMostFound) {
    detectCell();
    nextDetection_ = steps_ + static_cast<std::uint64_t>(detection_.uniform(kDetectionEveryLeast, kDetectionEveryMost));
  }
}

void SimulatedNetwork::detectCell() {
  const Cell& serving = cells_[serving_];
  Cell cell;
  cell.access = Access::LTE;
  // In the registered area (that of the first serving cell) or across its border.
  cell.areaCode = cells_.front().areaCode + (detection_.oneIn(4) ? detection_.uniform(1, 9) : 0);
  cell.cellId = detection_.uniform(1, 0xFFFFF) << 8 | detection_.uniform(1, 3);
  cell.channel = serving.channel;
  cell.band = serving.band;
  const LteBand& band = lteBand(cell.band);
  cell.uplinkChannel = cell.channel + band.uplinkOffset;
  cell.resourceBlocks = band.resourceBlocks;
  // A physical cell id that no cell about uses.
  for (;;) {
    cell.code = detection_.uniform(0, 503);
    const bool taken = std::any_of(cells_.begin(), cells_.end(), [&](const Cell& c) { return c.code == cell.code; });
    if (!taken) break;
  }
  const int lowest = levelRange(Access::LTE).low;
  cell.level = std::max(lowest, serving.level - 2 * detection_.uniform(kFoundBelowServingLeast / 2,
                                                                         kFoundBelowServingMost / 2));
  cell.measured = false;
  measureLteCell(cell, detection_);
  cell.averageRsrp = cell.rsrp;
  cell.averageRsrq = cell.rsrq;

  FoundCell found;
  found.detectedSteps = detection_.uniform(kDetectedLeast, kDetectedMost);
  found.toBeMeasured = detection_.oneIn(kMeasuredOneIn);
  found.measuredSteps = detection_.uniform(kMeasuredLeast, kMeasuredMost);
  cells_.push_back(cell);
  foundCells_.push_back(found);
}

std::size_t SimulatedNetwork::strongest(Access access) const {
  std::size_t best = cells_.size();
  for (std::size_t i = 0; i < cells_.size(); ++i) {
    const Cell& cell = cells_[i];
    if (cell.access != access || !cell.measured) continue;
    if (best == cells_.size() || cell.level > cells_[best].level) best = i;
  }
  return best;
}

void SimulatedNetwork::changeServingCell(std::size_t to) {
  Cell& from = cells_[serving_];
  from.serving = false;
  if (cells_[to].areaCode != from.areaCode) {
    // A location update in the new area: the network hands out new temporary identities.
    tmsi_ = static_cast<std::uint32_t>(random_.uniform(0, 0x3FFFFFFF));
    ptmsi_ = 0xC0000000u | static_cast<std::uint32_t>(random_.uniform(0, 0x3FFFFFFF));
    ptmsiSignature_ = static_cast<std::uint32_t>(random_.uniform(0, 0xFFFFFF));
  }
  serving_ = to;
  cells_[to].serving = true;
  cells_[to].measured = true;
  for (Cell& cell : cells_) cell.strongerSteps = 0;
  ++cellChanges_;
}

void SimulatedNetwork::step() {
  ++steps_;
  for (std::size_t i = 0; i < plannedCells_; ++i) drift(cells_[i]);
  if (cells_[serving_].access == Access::LTE) stepDetectedCells();
  if (journeys_) moveAlongJourney();
  if (utranRrc_) utranRrc_->step();
  const Cell& serving = cells_[serving_];
  for (Cell& cell : cells_) {
    const bool clearlyStronger = !cell.serving && cell.measured && cell.access == serving.access &&
                                 cell.level >= serving.level + kHandoverMargin;
    cell.strongerSteps = clearlyStronger ? cell.strongerSteps + 1 : 0;
  }
  const std::size_t best = strongest(serving.access);
  if (best != serving_ && best < cells_.size() && cells_[best].strongerSteps >= kHandoverSteps) {
    changeServingCell(best);
  } else if (phase_ == Phase::UmtsFading && serving.level < kUmtsFallbackLevel) {
    const std::size_t gsm = strongest(Access::GSM);
    if (gsm < cells_.size()) {
      changeServingCell(gsm);
      enterPhase(Phase::GsmIdle);
    }
  } else if (phase_ == Phase::GsmLeaving) {
    const std::size_t umts = strongest(Access::UMTS);
    if (umts < cells_.size() && cells_[umts].level > kUmtsReturnLevel) {
      changeServingCell(umts);
      enterPhase(Phase::UmtsIdle);
    }
  }
  if (journeys_) updateActiveSet();

  if (random_.oneIn(kImsToggleOneIn)) {
    imsActive_ = !imsActive_;
    if (imsActive_) {
      imsAddress_ = "2001:db8:" + hexBytes(static_cast<std::uint64_t>(random_.uniform(0, 0xFFFF)), 2) + ":" +
                    hexBytes(static_cast<std::uint64_t>(random_.uniform(0, 0xFFFF)), 2) + "::" +
                    hexBytes(static_cast<std::uint64_t>(random_.uniform(1, 0xFFFF)), 2);
    }
    ++pdpGeneration_;
  }
}

// --- The UTRAN2 phone ---

void SimulatedNetwork::planUtran2Cells(std::uint64_t seed) {
  // A stream of its own: the cells, SIM and PDP contexts of a seed stay as they were.
  SeededRandom planning(seed ^ 0x8CB92BA72F3D8DD7u);
  for (Cell& cell : cells_) {
    if (cell.access != Access::GSM) continue;
    // The UTRAN2 baseband reports a GSM cell's identity in 14 bits.
    cell.cellId = cell.cellId % 0x3FFF + 1;
    cell.code = planning.uniform(0, 63);  // NCC and BCC
  }
  utranRrc_.emplace(seed);
}

int SimulatedNetwork::utranRegistrationArea(const Cell& cell) const { return cell.areaCode % 255 + 1; }

Dictionary SimulatedNetwork::cellFields(const Cell& cell) const {
  Dictionary fields;
  auto measuredValue = [&](int value) { return Value::integer(cell.measured ? value : kCellMonitorNotMeasured); };
  fields.set(CellMonitorCellRadioAccessTechnology, Value(accessValue(cell.access)));
  fields.set(CellMonitorCellType, Value(cell.serving ? CellMonitorCellTypeServing : CellMonitorCellTypeNeighbor));
  fields.set(CellMonitorMCC, Value::integer(kMobileCountryCode));
  fields.set(CellMonitorMNC, Value::integer(kMobileNetworkCode));
  switch (cell.access) {
    case Access::GSM:
      fields.set(CellMonitorLAC, Value::integer(cell.areaCode));
      fields.set(CellMonitorCellId, Value::integer(cell.cellId));
      fields.set(CellMonitorARFCN, Value::integer(cell.channel));
      fields.set(CellMonitorRSSI, measuredValue(cell.level / 2));
      break;
    case Access::UMTS:
    case Access::UTRAN2:
      fields.set(CellMonitorLAC, Value::integer(cell.areaCode));
      fields.set(CellMonitorCellId, Value::integer(cell.cellId));
      fields.set(CellMonitorUARFCN, Value::integer(cell.channel));
      fields.set(CellMonitorBandInfo, Value::integer(cell.band));
      fields.set(CellMonitorSCN, Value::integer(cell.code));
      fields.set(CellMonitorRSCP, measuredValue(cell.level));
      fields.set(CellMonitorECN0, measuredValue(cell.quality));
      break;
    case Access::LTE:
      fields.set(CellMonitorTAC, Value::integer(cell.areaCode));
      fields.set(CellMonitorCellId, Value::integer(cell.cellId));
      fields.set(CellMonitorPID, Value::integer(cell.code));
      fields.set(CellMonitorUARFCN, Value::integer(cell.channel));
      fields.set(CellMonitorBandInfo, Value::integer(cell.band));
      fields.set(CellMonitorRSSI, measuredValue(cell.level / 2));
      break;
    case Access::CDMA:
      fields.set(CellMonitorLAC, Value::integer(cell.areaCode));  // SID
      fields.set(CellMonitorCellId, Value::integer(cell.cellId));  // base id
      fields.set(CellMonitorARFCN, Value::integer(cell.channel));
      fields.set(CellMonitorBandInfo, Value::integer(cell.band));
      fields.set(CellMonitorPID, Value::integer(cell.code));  // PN offset
      fields.set(CellMonitorRSSI, measuredValue(cell.level));
      fields.set(CellMonitorECN0, measuredValue(cell.quality));
      break;
  }
  return fields;
}

Value SimulatedNetwork::cellList() const {
  std::vector<const Cell*> neighbours;
  for (const Cell& cell : cells_) {
    if (!cell.serving) neighbours.push_back(&cell);
  }
  // Strongest first, as the cell monitor sorts them; unmeasured cells last.
  std::stable_sort(neighbours.begin(), neighbours.end(), [](const Cell* a, const Cell* b) {
    if (a->measured != b->measured) return a->measured;
    return a->level > b->level;
  });
  Array list;
  list.append(Value(cellFields(cells_[serving_])));
  for (const Cell* cell : neighbours) list.append(Value(cellFields(*cell)));
  return Value(list);
}

Value SimulatedNetwork::simFiles() const {
  // The identities and location files are hex dumps of the elementary files'
  // contents; numbers are shown as dialled.
  const Cell& serving = cells_[serving_];
  const std::string home = plmnIdentity(kMobileCountryCode, kMobileNetworkCode);
  const std::string locationArea = home + hexBytes(static_cast<std::uint64_t>(serving.areaCode), 2);
  const int accessClass = imsi_.back() - '0';
  const std::string unusedPlmn = "FFFFFF";

  Dictionary files;
  files.set("kSimFile_ICCID", Value(iccid_));
  files.set("kSimFile_MSISDN", Value(msisdn_));
  files.set("kSimFile_MBDN", Value(mailbox_));
  files.set("kSimFile_HPPLMN", Value("05"));  // search every 5 x 6 minutes
  // TMSI, LAI, TMSI time (none), update status (updated).
  files.set("kSimFile_LOCI", Value(hexBytes(tmsi_, 4) + locationArea + "FF" + "00"));
  // P-TMSI, its signature, RAI, routing area update status (updated).
  files.set("kSimFile_PSLOCI", Value(hexBytes(ptmsi_, 4) + hexBytes(ptmsiSignature_, 3) + locationArea +
                                     hexBytes(static_cast<std::uint64_t>(routingAreaCode_), 1) + "00"));
  files.set("kSimFile_ACC", Value(hexBytes(1u << accessClass, 2)));  // the class is the IMSI's last digit
  files.set("kSimFile_AD", Value("00000002"));                 // normal operation, 2-digit MNC
  files.set("kSimFile_FPLMN", Value(plmnIdentity(kMobileCountryCode, 2) + unusedPlmn + unusedPlmn + unusedPlmn));
  files.set("kSimFile_AHPLMN", Value(home));
  files.set("kSimFile_RATMODE", Value("00"));  // no restriction of access technologies
  files.set("kSimFile_PNN", Value(networkNameElement(0x43, "Test Network") + networkNameElement(0x45, "Test")));
  // The whole home network (LAC 0000-FFFE) is named by PNN record 1.
  files.set("kSimFile_OPL", Value(home + "0000" + "FFFE" + "01"));
  // Home network on UTRAN, E-UTRAN and GSM; two unused entries.
  files.set("kSimFile_OPLMNAcT", Value(home + "C080" + unusedPlmn + "0000" + unusedPlmn + "0000"));
  return Value(files);
}

Value SimulatedNetwork::pdpContexts() const {
  Array contexts;
  Dictionary internet;
  internet.set("Context ID", Value("1"));
  internet.set("APN", Value("internet"));
  internet.set("PDP Type", Value("IPv4"));
  internet.set("PDP Address", Value(internetAddress_));
  internet.set("QoS", Value("Interactive, priority 3, 384/2048 kbit/s up/down"));
  contexts.append(Value(internet));
  if (imsActive_) {
    Dictionary ims;
    ims.set("Context ID", Value("2"));
    ims.set("APN", Value("ims"));
    ims.set("PDP Type", Value("IPv6"));
    ims.set("PDP Address", Value(imsAddress_));
    ims.set("QoS", Value("Conversational, 64/64 kbit/s up/down"));
    contexts.append(Value(ims));
  }
  return Value(contexts);
}

}  // namespace corvane::telephonyd
