#include "platform/SignalEvents.h"

#include <fcntl.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstring>

namespace corvane {

namespace {

// Per signal number: 1 + the pipe its handler writes to, 0 when no
// SignalEvents catches it. The handler reads it, so it must be lock-free.
std::atomic<int> pipeOfSignal[NSIG];
static_assert(std::atomic<int>::is_always_lock_free);

extern "C" void writeSignalToPipe(int signal) {
  const int savedErrno = errno;
  const int fd = signal > 0 && signal < NSIG ? pipeOfSignal[signal].load() - 1 : -1;
  if (fd >= 0) {
    const auto number = static_cast<unsigned char>(signal);
    // A full pipe already holds signals enough to act on; this one may go.
    [[maybe_unused]] const ssize_t written = ::write(fd, &number, 1);
  }
  errno = savedErrno;
}

}  // namespace

struct SignalEvents::Caught {
  int signal;
  struct sigaction previous;
};

std::vector<int> SignalEvents::terminationSignals() { return {SIGINT, SIGTERM}; }

SignalEvents::SignalEvents(RunLoop& loop, Handler onSignal) : loop_(loop), onSignal_(std::move(onSignal)) {}

std::unique_ptr<SignalEvents> SignalEvents::watch(RunLoop& loop, const std::vector<int>& numbers, Handler onSignal,
                                                  std::string& error) {
  for (const int signal : numbers) {
    if (signal <= 0 || signal >= NSIG) {
      error = "cannot catch signal " + std::to_string(signal) + ": no such signal";
      return nullptr;
    }
    if (pipeOfSignal[signal].load() != 0) {
      error = "cannot catch signal " + std::to_string(signal) + ": it is caught already";
      return nullptr;
    }
  }
  int fds[2];
  if (::pipe2(fds, O_NONBLOCK | O_CLOEXEC) != 0) {
    error = std::string("cannot make the signal pipe: ") + std::strerror(errno);
    return nullptr;
  }
  std::unique_ptr<SignalEvents> events(new SignalEvents(loop, std::move(onSignal)));
  events->readFd_ = fds[0];
  events->writeFd_ = fds[1];

  for (const int signal : numbers) {
    auto caught = std::make_unique<Caught>();
    caught->signal = signal;
    struct sigaction action {};
    action.sa_handler = writeSignalToPipe;
    sigemptyset(&action.sa_mask);
    action.sa_flags = SA_RESTART;
    pipeOfSignal[signal].store(events->writeFd_ + 1);
    if (::sigaction(signal, &action, &caught->previous) != 0) {
      pipeOfSignal[signal].store(0);
      error = "cannot catch signal " + std::to_string(signal) + ": " + std::strerror(errno);
      return nullptr;  // the destructor gives back the signals caught so far
    }
    events->caught_.push_back(std::move(caught));
  }

  SignalEvents* self = events.get();
  events->watch_ = loop.watchReadable(events->readFd_, [self] { self->readPipe(); });
  return events;
}

SignalEvents::~SignalEvents() {
  for (auto it = caught_.rbegin(); it != caught_.rend(); ++it) {
    ::sigaction((*it)->signal, &(*it)->previous, nullptr);
    pipeOfSignal[(*it)->signal].store(0);
  }
  if (watch_ != 0) loop_.cancel(watch_);
  if (readFd_ >= 0) ::close(readFd_);
  if (writeFd_ >= 0) ::close(writeFd_);
}

void SignalEvents::readPipe() {
  // Everything that has arrived is read before any handler runs: a handler may
  // well end the loop.
  std::vector<int> arrived;
  unsigned char numbers[64];
  for (;;) {
    const ssize_t n = ::read(readFd_, numbers, sizeof numbers);
    if (n > 0) {
      arrived.insert(arrived.end(), numbers, numbers + n);
      continue;
    }
    if (n < 0 && errno == EINTR) continue;
    break;  // drained (EAGAIN), or nothing more to read
  }
  for (const int signal : arrived) onSignal_(signal);
}

}  // namespace corvane
