#pragma once

// The RRC states of the Quendra_UTRAN2 phone, moving as a phone's do: idle
// (disconnected), a connection set-up, a little data on the common channels
// (FACH), a session on dedicated channels (DCH), then inactivity sends it to
// CELL_PCH and on to URA_PCH, until the network releases it to idle. Each
// stay lasts some measurement periods that the seed draws, from a random
// stream of its own, so the cells, SIM files and PDP contexts of a seed do
// not depend on it.

#include <cstdint>

#include "telephonyd/SeededRandom.h"

namespace corvane::telephonyd {

class UtranRrcJourney {
 public:
  // The RRC state numbers the baseband reports.
  enum class State : std::uint8_t { Disconnected = 0, Connecting = 1, Fach = 2, Dch = 3, Pch = 4, UraPch = 5 };

  explicit UtranRrcJourney(std::uint64_t seed);

  // One measurement period later.
  void step();

  State state() const { return state_; }
  // Counts the state changes, so that a reporter sees when to report again.
  std::uint64_t changes() const { return changes_; }
  // With transport channels of its own: FACH and DCH.
  bool hasTransportChannels() const { return state_ == State::Fach || state_ == State::Dch; }

 private:
  void enter(State state);

  SeededRandom random_;
  State state_ = State::Disconnected;
  int stepsLeft_ = 0;
  std::uint64_t changes_ = 0;
};

}  // namespace corvane::telephonyd
