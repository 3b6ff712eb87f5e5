#pragma once

// Signals as events of a run loop. The programs end on SIGINT and SIGTERM as
// they end any other way, by ordinary work on their run loop (the model tears
// its ports down, the service removes its sockets, the application restores
// the status-bar preference), never inside a signal handler.
//
// The handler only writes the signal's number to a pipe that the run loop
// watches. A pipe, rather than a signalfd, works whatever threads Qt and its
// plugins have started and leaves no blocked signals for child processes to
// inherit.

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "platform/RunLoop.h"

namespace corvane {

class SignalEvents {
 public:
  using Handler = std::function<void(int signal)>;

  // The signals a program ends on.
  static std::vector<int> terminationSignals();

  // Catches the signals `numbers` from now on and calls `onSignal` on `loop`
  // once per signal that arrives, in order. Signals that arrive before the loop
  // runs wait for it. `onSignal` must not destroy this object. Returns
  // nullptr, and a one-line reason in `error`, when a signal is already caught
  // by another SignalEvents or the pipe cannot be made.
  static std::unique_ptr<SignalEvents> watch(RunLoop& loop, const std::vector<int>& numbers, Handler onSignal,
                                             std::string& error);

  // Readable from the moment a caught signal arrives until the run loop has
  // handled it. Work that blocks the loop may poll it (never read it) to give
  // up early: SocketPortSystem::interruptWaitsWhenReadable.
  int pendingDescriptor() const { return readFd_; }

  // Gives the signals back to the actions they had before.
  ~SignalEvents();
  SignalEvents(const SignalEvents&) = delete;
  SignalEvents& operator=(const SignalEvents&) = delete;

 private:
  struct Caught;
  SignalEvents(RunLoop& loop, Handler onSignal);
  void readPipe();

  RunLoop& loop_;
  Handler onSignal_;
  int readFd_ = -1;
  int writeFd_ = -1;
  RunLoop::Handle watch_ = 0;
  std::vector<std::unique_ptr<Caught>> caught_;
};

}  // namespace corvane
