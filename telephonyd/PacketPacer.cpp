#include "telephonyd/PacketPacer.h"

#include <utility>

namespace corvane::telephonyd {

PacketPacer::PacketPacer(RunLoop& loop, PacketSource& source, Deliver deliver, TurnDone turnDone)
    : loop_(loop), source_(source), deliver_(std::move(deliver)), turnDone_(std::move(turnDone)) {}

PacketPacer::~PacketPacer() {
  pause();
  *alive_ = false;
}

void PacketPacer::resume() {
  if (running_ || ended_) return;
  running_ = true;
  rebase_ = true;
  schedule(RunLoop::Duration::zero());
}

void PacketPacer::pause() {
  running_ = false;
  if (timer_) loop_.cancel(timer_);
  timer_ = 0;
}

void PacketPacer::schedule(RunLoop::Duration delay) {
  std::weak_ptr<bool> alive = alive_;
  timer_ = loop_.dispatchAfter(delay, [this, alive] {
    if (alive.expired()) return;
    timer_ = 0;
    if (running_) turn();
  });
}

void PacketPacer::turn() {
  const RunLoop::Duration now = loop_.now();
  std::uint64_t handed = 0;
  std::optional<RunLoop::Duration> wait;
  while (!wait) {
    if (!ahead_) {
      const PacketSource::Availability availability = source_.availability();
      if (availability == PacketSource::Availability::Ended) {
        ended_ = true;
        running_ = false;
        break;
      }
      if (availability == PacketSource::Availability::Later) {
        wait = kRetry;
        break;
      }
      ahead_ = source_.nextPacket();
    }
    if (rebase_ || now - (base_ + ahead_->due) > kLongestLag) {
      base_ = now - ahead_->due;
      rebase_ = false;
    }
    const RunLoop::Duration due = base_ + ahead_->due;
    if (due > now) {
      wait = due - now;
      break;
    }
    deliver_(*ahead_);
    ahead_.reset();
    ++delivered_;
    if (++handed == kMostPerTurn) wait = RunLoop::Duration::zero();
  }
  if (handed > 0 && turnDone_) turnDone_();
  if (running_ && wait) schedule(*wait);
}

}  // namespace corvane::telephonyd
