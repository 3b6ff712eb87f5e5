#include "telephonyd/UtranRrcJourney.h"

#include <array>

namespace corvane::telephonyd {

namespace {

using State = UtranRrcJourney::State;

// How long each state lasts (measurement periods, inclusive) and which follows.
struct Stay {
  State state;
  int least;
  int most;
  State next;
};
constexpr std::array<Stay, 6> kStays = {{
    {State::Disconnected, 4, 8, State::Connecting},
    {State::Connecting, 1, 1, State::Fach},
    {State::Fach, 2, 4, State::Dch},
    {State::Dch, 6, 12, State::Pch},
    {State::Pch, 3, 6, State::UraPch},
    {State::UraPch, 4, 8, State::Disconnected},
}};

const Stay& stayOf(State state) {
  for (const Stay& stay : kStays) {
    if (stay.state == state) return stay;
  }
  return kStays.front();
}

}  // namespace

UtranRrcJourney::UtranRrcJourney(std::uint64_t seed) : random_(seed ^ 0xD1B54A32D192ED03u) {
  const Stay& first = stayOf(state_);
  stepsLeft_ = random_.uniform(first.least, first.most);
}

void UtranRrcJourney::step() {
  if (--stepsLeft_ > 0) return;
  enter(stayOf(state_).next);
}

void UtranRrcJourney::enter(State state) {
  state_ = state;
  const Stay& stay = stayOf(state);
  stepsLeft_ = random_.uniform(stay.least, stay.most);
  ++changes_;
}

}  // namespace corvane::telephonyd
