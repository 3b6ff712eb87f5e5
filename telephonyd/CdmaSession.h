#pragma once

// What the CDMA2000 phone of the Quendra_CDMA scenario does, beside the cells
// of the simulated network: a journey through 1x idle, a 1x voice call, 1x
// idle again and an EV-DO data session, round and round, each stay some
// seconds long as the seed draws them:
//
//   1x idle        camped (paging channel), EV-DO idle; one pilot
//   1x traffic     a call: both receive chains and the transmitter report,
//                  an active set of up to three pilots, and frames received
//                  in error now and then, more of them in a fade or while
//                  the serving pilot is weak
//   EV-DO access   one step of connection set-up
//   EV-DO connected data flows: the forward- and reverse-link byte counters
//                  grow at a rate that follows the serving pilot's Ec/Io
//
// The active set of a busy link (1x traffic, EV-DO connected) is the serving
// cell and up to two measured cells within kActiveSetWindow dB of its Ec/Io;
// of an idle link the serving cell alone. The counters grow by the rate's bits once per
// step, and their sequence values by one, so that a record's rate reads in
// kbps (1024 bits per second). Everything follows from the seed and the
// network's steps.

#include <array>
#include <cstdint>
#include <vector>

#include "telephonyd/SeededRandom.h"
#include "telephonyd/SimulatedNetwork.h"

namespace corvane::telephonyd {

class CdmaSession {
 public:
  enum class Phase { OneXIdle, OneXTraffic, EvdoAccess, EvdoConnected };

  static constexpr int kActiveSetWindow = 6;  // dB
  static constexpr std::size_t kActiveSetSize = 3;
  static constexpr std::size_t kForwardCounters = 56;
  static constexpr std::size_t kReverseBlocks = 6;
  static constexpr std::size_t kReverseRates = 12;

  explicit CdmaSession(std::uint64_t seed);

  // One step of the network later; call once for each of its steps.
  void step(const SimulatedNetwork& network);

  Phase phase() const { return phase_; }
  std::uint64_t phaseChanges() const { return phaseChanges_; }
  // The active set of the 1x or the EV-DO link: the serving cell first, then
  // the others strongest first; the serving cell alone unless the link is
  // busy (1x traffic, EV-DO connected).
  enum class Link { OneX, Evdo };
  std::vector<const SimulatedNetwork::Cell*> activeSet(const SimulatedNetwork& network, Link link) const;
  // The link whose fingers the searcher reports: EV-DO while connected, else 1x.
  Link busyLink() const { return phase_ == Phase::EvdoConnected ? Link::Evdo : Link::OneX; }

  // Draws whether the next traffic frame is received in error.
  bool nextFrameInError();
  // The chance of a frame error now, in thousandths.
  int frameErrorPerMille() const { return frameErrorPerMille_; }
  // Draws the small differences of the second receive chain and the multipath fingers (dB).
  int diversityOffset() { return noise_.uniform(-3, 3); }

  // The current data rates in kbps (zero but while EV-DO is connected).
  int forwardRate() const { return forwardRate_; }
  int reverseRate() const { return reverseRate_; }
  std::uint32_t forwardSequence() const { return forwardSequence_; }
  std::uint32_t reverseSequence() const { return reverseSequence_; }
  // Packets received at each forward-link rate, and sent at each reverse-link
  // rate in each of its blocks, since the start: the counters of 0x1192 and
  // 0x127e (the first of each reverse-link entry's four), whose bits the
  // records' layouts give.
  const std::array<std::uint32_t, kForwardCounters>& forwardCounts() const { return forwardCounts_; }
  std::uint32_t reverseCount(std::size_t block, std::size_t rate) const { return reverseCounts_[block][rate]; }

  // Identities: the network's NID and packet zone, the EV-DO session's UATI
  // (24 bits) and colour code, the EV-DO carrier.
  int networkId() const { return networkId_; }
  int packetZone() const { return packetZone_; }
  std::uint32_t uati() const { return uati_; }
  int colorCode() const { return colorCode_; }
  int evdoChannel(const SimulatedNetwork& network) const;

 private:
  void enterNextPhase();
  void countData();

  // The journey, fades and rates draw from one stream, the records' frames
  // and small differences from another: a session's steps are the same
  // whatever the encoder draws between them.
  SeededRandom random_;
  SeededRandom noise_;
  std::size_t journeyIndex_ = 0;
  Phase phase_ = Phase::OneXIdle;
  int phaseStepsLeft_ = 0;
  std::uint64_t phaseChanges_ = 0;

  int fadeStepsLeft_ = 0;
  int frameErrorPerMille_ = 0;

  int forwardRate_ = 0;
  int reverseRate_ = 0;
  std::uint32_t forwardSequence_ = 0;
  std::uint32_t reverseSequence_ = 0;
  std::array<std::uint32_t, kForwardCounters> forwardCounts_{};
  std::array<std::array<std::uint32_t, kReverseRates>, kReverseBlocks> reverseCounts_{};

  int networkId_ = 0;
  int packetZone_ = 0;
  std::uint32_t uati_ = 0;
  int colorCode_ = 0;
};

}  // namespace corvane::telephonyd
