#include "telephonyd/CdmaSession.h"

#include <algorithm>
#include <stdexcept>

#include "LogGenerator/cdma2000/records/DataRateRecords.h"

namespace corvane::telephonyd {

namespace {

using Cell = SimulatedNetwork::Cell;
using Phase = CdmaSession::Phase;

// The journey, in order and round again; each stay least..most steps.
struct Stay {
  Phase phase;
  int least;
  int most;
};
constexpr std::array<Stay, 5> kJourney = {{
    {Phase::OneXIdle, 5, 8},
    {Phase::OneXTraffic, 10, 14},
    {Phase::OneXIdle, 3, 5},
    {Phase::EvdoAccess, 1, 1},
    {Phase::EvdoConnected, 10, 14},
}};

// Frame errors: a few in a thousand on a good pilot, more as it weakens
// (from -8 dB Ec/Io down), and a fade now and then.
constexpr int kBaseFrameErrors = 5;
constexpr int kFrameErrorsPerDbBelow = 15;
constexpr int kWeakPilotEcIo = -8;
constexpr int kFadeFrameErrors = 180;
constexpr int kFadeOneIn = 5;
constexpr int kMostFrameErrors = 400;

// EV-DO rates (kbps) over the serving pilot's Ec/Io: the forward link from
// 2457 at 0 dB, the reverse link from 153.
constexpr int kForwardPeak = 2457;
constexpr int kForwardPerDb = 110;
constexpr int kForwardLeast = 38;
constexpr int kReversePeak = 153;
constexpr int kReversePerDb = 5;
constexpr int kReverseLeast = 9;

// The counter index of the first rate that carries `bits` per count.
template <std::size_t N>
std::size_t counterOf(const std::array<std::uint32_t, N>& bitsPerCount, std::uint32_t bits) {
  const auto it = std::find(bitsPerCount.begin(), bitsPerCount.end(), bits);
  if (it == bitsPerCount.end()) throw std::logic_error("no rate of " + std::to_string(bits) + " bits");
  return static_cast<std::size_t>(it - bitsPerCount.begin());
}

}  // namespace

CdmaSession::CdmaSession(std::uint64_t seed)
    : random_(seed * 0x9E3779B97F4A7C15u + 0xC2u), noise_(seed ^ 0xD1B54A32D192ED03u) {
  networkId_ = random_.uniform(1, 65534);
  packetZone_ = random_.uniform(1, 255);
  uati_ = static_cast<std::uint32_t>(random_.uniform(0, 0xFFFFFF));
  colorCode_ = random_.uniform(1, 255);
  phaseStepsLeft_ = random_.uniform(kJourney[0].least, kJourney[0].most);
}

void CdmaSession::enterNextPhase() {
  journeyIndex_ = (journeyIndex_ + 1) % kJourney.size();
  const Stay& stay = kJourney[journeyIndex_];
  phase_ = stay.phase;
  phaseStepsLeft_ = random_.uniform(stay.least, stay.most);
  fadeStepsLeft_ = 0;
  ++phaseChanges_;
}

void CdmaSession::step(const SimulatedNetwork& network) {
  if (--phaseStepsLeft_ <= 0) enterNextPhase();
  const int ecIo = network.servingCell().quality;

  frameErrorPerMille_ = 0;
  if (phase_ == Phase::OneXTraffic) {
    if (fadeStepsLeft_ > 0) {
      --fadeStepsLeft_;
    } else if (random_.oneIn(kFadeOneIn)) {
      fadeStepsLeft_ = random_.uniform(2, 3);
    }
    const int weak = std::max(0, kWeakPilotEcIo - ecIo);
    frameErrorPerMille_ = std::min(kMostFrameErrors, kBaseFrameErrors + kFrameErrorsPerDbBelow * weak +
                                                         (fadeStepsLeft_ > 0 ? kFadeFrameErrors : 0));
  }

  forwardRate_ = 0;
  reverseRate_ = 0;
  if (phase_ == Phase::EvdoConnected) {
    forwardRate_ = std::clamp(kForwardPeak + kForwardPerDb * ecIo + 10 * random_.uniform(-12, 12), kForwardLeast,
                              kForwardPeak);
    reverseRate_ =
        std::clamp(kReversePeak + kReversePerDb * ecIo + random_.uniform(-8, 8), kReverseLeast, kReversePeak);
  }
  countData();
}

void CdmaSession::countData() {
  // A rate of R kbps is R × 1024 bits in the step: R / 2 packets of 2048 bits
  // and, for an odd R, one of 1024.
  namespace fl = records::forward_rate;
  namespace rl = records::reverse_rate;
  static const std::size_t forwardFull = counterOf(fl::kBitsPerCount, 2048);
  static const std::size_t forwardHalf = counterOf(fl::kBitsPerCount, 1024);
  static const std::size_t reverseFull = counterOf(rl::kBitsPerCount, 2048);
  static const std::size_t reverseHalf = counterOf(rl::kBitsPerCount, 1024);
  forwardCounts_[forwardFull] += static_cast<std::uint32_t>(forwardRate_ / 2);
  forwardCounts_[forwardHalf] += static_cast<std::uint32_t>(forwardRate_ % 2);
  // The reverse link's packets go to one block after the other.
  const std::size_t block = reverseSequence_ % kReverseBlocks;
  reverseCounts_[block][reverseFull] += static_cast<std::uint32_t>(reverseRate_ / 2);
  reverseCounts_[block][reverseHalf] += static_cast<std::uint32_t>(reverseRate_ % 2);
  ++forwardSequence_;
  ++reverseSequence_;
}

bool CdmaSession::nextFrameInError() { return noise_.uniform(0, 999) < frameErrorPerMille_; }

std::vector<const Cell*> CdmaSession::activeSet(const SimulatedNetwork& network, Link link) const {
  const Cell& serving = network.servingCell();
  std::vector<const Cell*> set{&serving};
  const Phase busy = link == Link::OneX ? Phase::OneXTraffic : Phase::EvdoConnected;
  if (phase_ != busy) return set;
  std::vector<const Cell*> others;
  for (const Cell& cell : network.cells()) {
    if (&cell == &serving || !cell.measured || cell.channel != serving.channel) continue;
    if (cell.quality >= serving.quality - kActiveSetWindow) others.push_back(&cell);
  }
  std::stable_sort(others.begin(), others.end(), [](const Cell* a, const Cell* b) { return a->quality > b->quality; });
  for (const Cell* cell : others) {
    if (set.size() == kActiveSetSize) break;
    set.push_back(cell);
  }
  return set;
}

int CdmaSession::evdoChannel(const SimulatedNetwork& network) const {
  // The EV-DO carrier lies two PCS carriers above the 1x one, or below it at the top of the band.
  const int oneX = network.servingCell().channel;
  return oneX + 50 <= 1175 ? oneX + 50 : oneX - 50;
}

}  // namespace corvane::telephonyd
