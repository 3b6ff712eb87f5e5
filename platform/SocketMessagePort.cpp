#include "platform/SocketMessagePort.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <optional>
#include <thread>
#include <utility>

#include "platform/Log.h"

namespace corvane {

bool SocketPortShared::admitConnection() {
  std::size_t open = connections_.load();
  do {
    if (open >= limits_.connections) return false;
  } while (!connections_.compare_exchange_weak(open, open + 1));
  refusingConnections_.store(false);
  return true;
}

void SocketPortShared::releaseConnection() { connections_.fetch_sub(1); }

bool SocketPortShared::holdUnfinished(std::size_t bytes) {
  std::size_t held = unfinishedBytes_.load();
  do {
    if (bytes > limits_.unfinishedMessageBytes - std::min(held, limits_.unfinishedMessageBytes)) return false;
  } while (!unfinishedBytes_.compare_exchange_weak(held, held + bytes));
  return true;
}

void SocketPortShared::releaseUnfinished(std::size_t bytes) {
  if (unfinishedBytes_.fetch_sub(bytes) == bytes) refusingUnfinished_.store(false);
}

namespace {

using Clock = std::chrono::steady_clock;

enum class FrameKind : std::uint8_t { Message = 1, Request = 2, Reply = 3, EmptyReply = 4 };
constexpr std::uint8_t kMoreFollows = 0x01;
constexpr std::size_t kFrameHeaderSize = 16;
constexpr std::size_t kMaximumFramePayload = kSocketPortMaximumDatagram - kFrameHeaderSize;
// A burst of datagrams is read in one wake-up, but not without end, so that
// one busy connection cannot starve the rest of the run loop.
constexpr int kDatagramsPerWakeup = 64;
// Time a local port gives a slow requester to take its reply.
constexpr double kReplySendTimeout = 1.0;
// Time a remote port keeps retrying a connection to a listener whose backlog is full.
constexpr auto kConnectPatience = std::chrono::seconds(1);
// Socket files are private to their owner whatever the umask; the directory is too.
constexpr mode_t kSocketFileMode = 0600;
// Pause between the two probes that find a socket file stale.
constexpr auto kStaleSocketRecheck = std::chrono::milliseconds(50);

struct FrameHeader {
  FrameKind kind = FrameKind::Message;
  std::uint8_t flags = 0;
  MessageId id = 0;
  std::uint32_t serial = 0;
  std::uint32_t length = 0;
};

void putU32(std::vector<std::uint8_t>& out, std::uint32_t v) {
  for (int shift = 0; shift < 32; shift += 8) out.push_back(static_cast<std::uint8_t>(v >> shift));
}

std::uint32_t getU32(const std::uint8_t* p) {
  return static_cast<std::uint32_t>(p[0]) | static_cast<std::uint32_t>(p[1]) << 8 |
         static_cast<std::uint32_t>(p[2]) << 16 | static_cast<std::uint32_t>(p[3]) << 24;
}

void appendFrame(std::vector<std::uint8_t>& out, const FrameHeader& header, std::span<const std::uint8_t> payload) {
  out.push_back(static_cast<std::uint8_t>(header.kind));
  out.push_back(header.flags);
  out.push_back(0);
  out.push_back(0);
  putU32(out, static_cast<std::uint32_t>(header.id));
  putU32(out, header.serial);
  putU32(out, static_cast<std::uint32_t>(payload.size()));
  out.insert(out.end(), payload.begin(), payload.end());
}

struct Frame {
  FrameHeader header;
  std::span<const std::uint8_t> payload;
};

// The frame at `offset`, which then moves past it; nothing when the datagram
// is malformed there.
std::optional<Frame> takeFrame(std::span<const std::uint8_t> datagram, std::size_t& offset) {
  if (datagram.size() - offset < kFrameHeaderSize) return std::nullopt;
  const std::uint8_t* p = datagram.data() + offset;
  FrameHeader header;
  if (p[0] < 1 || p[0] > 4) return std::nullopt;
  header.kind = static_cast<FrameKind>(p[0]);
  header.flags = p[1];
  header.id = static_cast<MessageId>(getU32(p + 4));
  header.serial = getU32(p + 8);
  header.length = getU32(p + 12);
  if (header.length > datagram.size() - offset - kFrameHeaderSize) return std::nullopt;
  const auto payload = datagram.subspan(offset + kFrameHeaderSize, header.length);
  offset += kFrameHeaderSize + header.length;
  return Frame{header, payload};
}

// One message as the datagrams that carry it: one, unless it is too big.
std::vector<std::vector<std::uint8_t>> messageDatagrams(FrameKind kind, MessageId id, std::uint32_t serial,
                                                        std::span<const std::uint8_t> data) {
  std::vector<std::vector<std::uint8_t>> datagrams;
  std::size_t offset = 0;
  do {
    const std::size_t chunk = std::min(kMaximumFramePayload, data.size() - offset);
    const bool last = offset + chunk == data.size();
    std::vector<std::uint8_t> datagram;
    datagram.reserve(kFrameHeaderSize + chunk);
    appendFrame(datagram, {kind, last ? std::uint8_t{0} : kMoreFollows, id, serial, 0}, data.subspan(offset, chunk));
    datagrams.push_back(std::move(datagram));
    offset += chunk;
  } while (offset < data.size());
  return datagrams;
}

int pollMilliseconds(Clock::time_point deadline) {
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now()).count();
  return static_cast<int>(std::clamp<long long>(left, 0, 60'000));
}

Clock::time_point deadlineAfter(double seconds) {
  if (!(seconds > 0)) return Clock::now();
  seconds = std::min(seconds, 86400.0);
  return Clock::now() + std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(seconds));
}

bool isPeerGoneError(int error) { return error == EPIPE || error == ECONNRESET || error == ENOTCONN; }

enum class WaitOutcome { Ready, TimedOut, Interrupted };

// Waits until `fd` has the events or the deadline passes, unless the port
// system's waits are interrupted first. With `fd` -1 it waits for the
// deadline or the interruption alone.
WaitOutcome waitUntil(int fd, short events, Clock::time_point deadline, const SocketPortShared& shared) {
  for (;;) {
    if (shared.waitsStopped()) return WaitOutcome::Interrupted;
    if (Clock::now() >= deadline) return WaitOutcome::TimedOut;
    pollfd p[2] = {{fd, events, 0}, {shared.interruptDescriptor(), POLLIN, 0}};
    const int n = ::poll(p, 2, pollMilliseconds(deadline));
    if (n < 0 && errno != EINTR) return WaitOutcome::TimedOut;
    if (p[1].revents != 0) return WaitOutcome::Interrupted;  // a signal waits for the run loop
    if (n > 0 && p[0].revents != 0) return WaitOutcome::Ready;
  }
}

enum class SendOutcome { Sent, TimedOut, PeerGone, Failed };

// Sends one datagram whole (SOCK_SEQPACKET sends are all or nothing), waiting
// for buffer space until the deadline or an interruption. Never raises SIGPIPE.
SendOutcome sendDatagramUntil(int fd, std::span<const std::uint8_t> datagram, Clock::time_point deadline,
                              const SocketPortShared& shared) {
  bool waitOver = false;
  for (;;) {
    const ssize_t n = ::send(fd, datagram.data(), datagram.size(), MSG_DONTWAIT | MSG_NOSIGNAL);
    if (n >= 0) return SendOutcome::Sent;
    if (errno == EINTR) continue;
    if (errno == EAGAIN || errno == EWOULDBLOCK) {
      if (waitOver) return SendOutcome::TimedOut;
      // Once the wait is over, one last try: the space may have come with the end of the wait.
      waitOver = waitUntil(fd, POLLOUT, deadline, shared) != WaitOutcome::Ready;
      continue;
    }
    if (isPeerGoneError(errno)) return SendOutcome::PeerGone;
    return SendOutcome::Failed;
  }
}

// Receives one datagram without waiting. Returns its size, 0 at end of stream
// (or when the peer went leaving data of ours unread), -1 when nothing is
// there, -2 on an error or a datagram bigger than the buffer.
ssize_t receiveDatagram(int fd, std::vector<std::uint8_t>& buffer) {
  for (;;) {
    iovec io{buffer.data(), buffer.size()};
    msghdr message{};
    message.msg_iov = &io;
    message.msg_iovlen = 1;
    const ssize_t n = ::recvmsg(fd, &message, MSG_DONTWAIT | MSG_CMSG_CLOEXEC);
    if (n >= 0) return (message.msg_flags & MSG_TRUNC) ? -2 : n;
    if (errno == EINTR) continue;
    if (errno == EAGAIN || errno == EWOULDBLOCK) return -1;
    if (errno == ECONNRESET) return 0;
    return -2;
  }
}

bool fillAddress(const std::filesystem::path& path, sockaddr_un& address) {
  const std::string text = path.string();
  if (text.size() >= sizeof address.sun_path) return false;
  std::memset(&address, 0, sizeof address);
  address.sun_family = AF_UNIX;
  std::memcpy(address.sun_path, text.c_str(), text.size() + 1);
  return true;
}

int newSocket() { return ::socket(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK | SOCK_CLOEXEC, 0); }

// Binds the socket to its file with mode 0600. Linux makes the file with the
// socket's own mode less the umask, so the mode is set on the socket before
// (the file never appears wider) and on the file after (a umask that takes
// the owner's bits cannot leave it unusable).
int bindPrivately(int fd, const sockaddr_un& address) {
  if (::fchmod(fd, kSocketFileMode) != 0) return -1;
  if (::bind(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) return -1;
  if (::chmod(address.sun_path, kSocketFileMode) == 0) return 0;
  const int saved = errno;
  ::unlink(address.sun_path);
  errno = saved;
  return -1;
}

// Whether a listener is behind the socket file: a connection is taken, or
// waits in a full backlog.
bool somebodyListens(const sockaddr_un& address) {
  const int probe = newSocket();
  if (probe < 0) return false;
  const bool live = ::connect(probe, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0 ||
                    errno == EAGAIN;
  ::close(probe);
  return live;
}

void setError(std::string* error, std::string text) {
  if (error) *error = std::move(text);
}

}  // namespace

// ---------------------------------------------------------------------------
// Local port

struct SocketLocalPort::Connection {
  int fd = -1;
  RunLoop::Handle watch = 0;
  // A message arriving in several frames, collected until its last frame.
  bool assembling = false;
  FrameHeader pendingHeader;
  Bytes pending;
  // What `pending` holds against the port system's limit: its capacity.
  std::size_t held = 0;
};

SocketLocalPort::SocketLocalPort(std::string name, std::filesystem::path socketPath, int listener, Callback callback,
                                 std::shared_ptr<SocketPortShared> shared)
    : name_(std::move(name)),
      shared_(std::move(shared)),
      socketPath_(std::move(socketPath)),
      listener_(listener),
      callback_(std::move(callback)),
      receiveBuffer_(kSocketPortMaximumDatagram) {
  struct stat info {};
  if (::stat(socketPath_.c_str(), &info) == 0) {
    socketDevice_ = info.st_dev;
    socketInode_ = info.st_ino;
  }
}

SocketLocalPort::~SocketLocalPort() {
  connectionCallback_ = nullptr;
  closeAll();
}

void SocketLocalPort::scheduleOn(RunLoop& runLoop) {
  if (!isValid()) return;
  if (runLoop_) {
    runLoop_->cancel(listenerWatch_);
    for (auto& [fd, connection] : connections_) runLoop_->cancel(connection->watch);
  }
  runLoop_ = &runLoop;
  std::weak_ptr<SocketLocalPort> weak = weak_from_this();
  listenerWatch_ = runLoop.watchReadable(listener_, [weak] {
    if (auto self = weak.lock()) self->acceptPending();
  });
  for (auto& [fd, connection] : connections_) watch(connection);
}

void SocketLocalPort::watch(const std::shared_ptr<Connection>& connection) {
  std::weak_ptr<SocketLocalPort> weakPort = weak_from_this();
  std::weak_ptr<Connection> weakConnection = connection;
  connection->watch = runLoop_->watchReadable(connection->fd, [weakPort, weakConnection] {
    auto self = weakPort.lock();
    auto strong = weakConnection.lock();
    if (self && strong && strong->fd >= 0) self->readConnection(strong);
  });
}

void SocketLocalPort::acceptPending() {
  while (listener_ >= 0) {
    const int fd = ::accept4(listener_, nullptr, nullptr, SOCK_NONBLOCK | SOCK_CLOEXEC);
    if (fd < 0) {
      if (errno == EINTR || errno == ECONNABORTED) continue;
      if (errno != EAGAIN && errno != EWOULDBLOCK) {
        log::printf(log::kError, "Port %s could not accept a connection: %s", name_.c_str(), std::strerror(errno));
      }
      return;
    }
    if (!shared_->admitConnection()) {
      ::close(fd);
      if (shared_->firstConnectionRefusal()) {
        log::printf(log::kError,
                    "Port %s refuses new connections: %zu are open, the most its process takes; "
                    "refusing quietly until one closes",
                    name_.c_str(), shared_->limits().connections);
      }
      continue;
    }
    auto connection = std::make_shared<Connection>();
    connection->fd = fd;
    connections_.emplace(fd, connection);
    if (runLoop_) watch(connection);
    if (connectionCallback_) {
      auto self = shared_from_this();
      connectionCallback_(*this, connections_.size());
    }
  }
}

void SocketLocalPort::readConnection(const std::shared_ptr<Connection>& connection) {
  // The callbacks may invalidate this port or drop the last reference to it.
  auto self = shared_from_this();
  for (int i = 0; i < kDatagramsPerWakeup && connection->fd >= 0 && isValid(); ++i) {
    const ssize_t n = receiveDatagram(connection->fd, receiveBuffer_);
    if (n == -1) return;
    if (n == -2) {
      log::printf(log::kError, "Port %s dropped a connection after a receive error", name_.c_str());
    }
    if (n <= 0) {
      closeConnection(connection);
      return;
    }
    // The callbacks may read more on this same port (nested run-loop work), so
    // deliver from a copy of the datagram rather than the shared buffer.
    std::vector<std::uint8_t> datagram(receiveBuffer_.begin(), receiveBuffer_.begin() + n);
    if (!deliverDatagram(connection, datagram)) {
      if (connection->fd >= 0) {
        log::printf(log::kError, "Port %s dropped a connection that sent a malformed message", name_.c_str());
        closeConnection(connection);
      }
      return;
    }
  }
}

bool SocketLocalPort::deliverDatagram(const std::shared_ptr<Connection>& connection,
                                      std::span<const std::uint8_t> datagram) {
  std::size_t offset = 0;
  while (offset < datagram.size()) {
    const auto frame = takeFrame(datagram, offset);
    if (!frame) return false;
    const FrameHeader* header = &frame->header;
    const auto payload = frame->payload;

    Bytes data;
    if (connection->assembling || (header->flags & kMoreFollows)) {
      if (!connection->assembling) {
        connection->assembling = true;
        connection->pendingHeader = *header;
      }
      const FrameHeader& first = connection->pendingHeader;
      if (header->kind != first.kind || header->id != first.id || header->serial != first.serial) return false;
      if (connection->pending.size() + payload.size() > kSocketPortMaximumMessage) return false;
      if (!reserveUnfinished(*connection, payload.size())) {
        if (shared_->firstUnfinishedRefusal()) {
          log::printf(log::kError,
                      "Port %s dropped a connection: its unfinished message would take the memory held for "
                      "unfinished messages past %zu bytes; dropping such connections quietly until none is held",
                      name_.c_str(), shared_->limits().unfinishedMessageBytes);
        }
        closeConnection(connection);
        return true;
      }
      connection->pending.insert(connection->pending.end(), payload.begin(), payload.end());
      if (header->flags & kMoreFollows) continue;
      connection->assembling = false;
      data = std::move(connection->pending);
      connection->pending = {};
      releaseUnfinished(*connection);
    } else {
      data.assign(payload.begin(), payload.end());
    }

    // Replies only ever travel towards a remote port; one arriving here is stale.
    if (header->kind != FrameKind::Message && header->kind != FrameKind::Request) continue;
    std::optional<Bytes> reply;
    if (callback_) reply = callback_(*this, header->id, data);
    if (connection->fd < 0 || !isValid()) return true;
    if (header->kind == FrameKind::Request) {
      const FrameKind kind = reply ? FrameKind::Reply : FrameKind::EmptyReply;
      const auto deadline = deadlineAfter(kReplySendTimeout);
      for (const auto& out : messageDatagrams(kind, header->id, header->serial, reply ? *reply : Bytes{})) {
        if (sendDatagramUntil(connection->fd, out, deadline, *shared_) != SendOutcome::Sent) {
          closeConnection(connection);
          return true;
        }
      }
    }
  }
  return true;
}

bool SocketLocalPort::reserveUnfinished(Connection& connection, std::size_t more) {
  Bytes& pending = connection.pending;
  const std::size_t needed = pending.size() + more;
  if (needed <= connection.held) return true;
  // Grow as a vector would, so that a long message is not copied once per
  // datagram, but only as far as the limit allows.
  const std::size_t doubled = std::min(2 * connection.held, kSocketPortMaximumMessage);
  std::size_t capacity = std::max(needed, doubled);
  if (!shared_->holdUnfinished(capacity - connection.held)) {
    capacity = needed;
    if (!shared_->holdUnfinished(capacity - connection.held)) return false;
  }
  pending.reserve(capacity);
  connection.held = capacity;
  return true;
}

void SocketLocalPort::releaseUnfinished(Connection& connection) {
  if (connection.held == 0) return;
  shared_->releaseUnfinished(connection.held);
  connection.held = 0;
}

void SocketLocalPort::closeConnection(const std::shared_ptr<Connection>& connection) {
  if (connection->fd < 0) return;
  // The watch goes before the descriptor: a run loop must never poll a closed
  // (or reused) descriptor number.
  if (runLoop_ && connection->watch) runLoop_->cancel(connection->watch);
  connections_.erase(connection->fd);
  ::close(connection->fd);
  connection->fd = -1;
  connection->pending = {};
  releaseUnfinished(*connection);
  shared_->releaseConnection();
  if (connectionCallback_) {
    auto self = shared_from_this();
    connectionCallback_(*this, connections_.size());
  }
}

void SocketLocalPort::closeAll() {
  auto connections = std::move(connections_);
  connections_.clear();
  for (auto& [fd, connection] : connections) {
    if (runLoop_ && connection->watch) runLoop_->cancel(connection->watch);
    ::close(connection->fd);
    connection->fd = -1;
    connection->pending = {};
    releaseUnfinished(*connection);
    shared_->releaseConnection();
  }
  if (listener_ >= 0) {
    if (runLoop_ && listenerWatch_) runLoop_->cancel(listenerWatch_);
    listenerWatch_ = 0;
    // Remove the socket file only while it is still ours: after a restart the
    // same name may already belong to a new listener.
    struct stat info {};
    if (::lstat(socketPath_.c_str(), &info) == 0 && info.st_dev == socketDevice_ && info.st_ino == socketInode_) {
      ::unlink(socketPath_.c_str());
    }
    ::close(listener_);
    listener_ = -1;
  }
}

void SocketLocalPort::invalidate() {
  if (!isValid()) return;
  auto self = weak_from_this().lock();
  closeAll();
  InvalidationCallback callback = std::move(invalidation_);
  invalidation_ = nullptr;
  if (callback) callback(*this);
}

// ---------------------------------------------------------------------------
// Remote port

SocketRemotePort::SocketRemotePort(std::string name, int fd, std::shared_ptr<SocketPortShared> shared)
    : name_(std::move(name)), shared_(std::move(shared)), fd_(fd), receiveBuffer_(kSocketPortMaximumDatagram) {}

SocketRemotePort::~SocketRemotePort() {
  if (fd_ >= 0) ::close(fd_);
}

bool SocketRemotePort::isValid() const {
  if (fd_ < 0) return false;
  pollfd p{fd_, POLLIN, 0};
  if (::poll(&p, 1, 0) <= 0) return true;
  if (p.revents & (POLLHUP | POLLERR | POLLNVAL)) {
    peerGone();
    return false;
  }
  if (p.revents & POLLIN) {
    // Readable may mean a late reply; only an end of stream means the peer has gone.
    std::uint8_t byte = 0;
    const ssize_t n = ::recv(fd_, &byte, 1, MSG_PEEK | MSG_DONTWAIT);
    if (n == 0 || (n < 0 && isPeerGoneError(errno))) {
      peerGone();
      return false;
    }
  }
  return true;
}

void SocketRemotePort::peerGone() const {
  if (fd_ < 0) return;
  auto self = weak_from_this().lock();
  ::close(fd_);
  fd_ = -1;
  InvalidationCallback callback = std::move(invalidation_);
  invalidation_ = nullptr;
  if (callback) callback(*const_cast<SocketRemotePort*>(this));
}

void SocketRemotePort::invalidate() { peerGone(); }

std::int32_t SocketRemotePort::sendRequest(MessageId id, std::span<const std::uint8_t> data, double sendTimeout,
                                           double receiveTimeout, std::optional<Bytes>* reply) {
  if (reply) reply->reset();
  if (!isValid()) return kPortIsInvalid;
  if (data.size() > kSocketPortMaximumMessage) return kPortTransportError;
  // Serial 0 marks messages that want no reply; requests count from 1.
  if (++serial_ == 0) serial_ = 1;
  const std::uint32_t serial = reply ? serial_ : 0;
  const auto deadline = deadlineAfter(sendTimeout);
  for (const auto& datagram : messageDatagrams(reply ? FrameKind::Request : FrameKind::Message, id, serial, data)) {
    switch (sendDatagramUntil(fd_, datagram, deadline, *shared_)) {
      case SendOutcome::Sent:
        break;
      case SendOutcome::TimedOut:
        return kPortSendTimeout;
      case SendOutcome::PeerGone:
        peerGone();
        return kPortIsInvalid;
      case SendOutcome::Failed:
        return kPortTransportError;
    }
  }
  if (!reply) return kPortSuccess;
  return awaitReply(serial, receiveTimeout, reply);
}

std::int32_t SocketRemotePort::awaitReply(std::uint32_t serial, double timeoutSeconds, std::optional<Bytes>* reply) {
  const auto deadline = deadlineAfter(timeoutSeconds);
  Bytes assembled;
  bool waitOver = false;
  for (;;) {
    const ssize_t n = receiveDatagram(fd_, receiveBuffer_);
    if (n == 0) {
      peerGone();
      return kPortIsInvalid;
    }
    if (n == -2) return kPortTransportError;
    if (n == -1) {
      if (waitOver) return kPortReceiveTimeout;
      // Once the wait is over, one last look: the reply may have come with its end.
      waitOver = waitUntil(fd_, POLLIN, deadline, *shared_) != WaitOutcome::Ready;
      continue;
    }
    const std::span<const std::uint8_t> datagram(receiveBuffer_.data(), static_cast<std::size_t>(n));
    std::size_t offset = 0;
    while (offset < datagram.size()) {
      const auto frame = takeFrame(datagram, offset);
      if (!frame) return kPortTransportError;
      const FrameHeader* header = &frame->header;
      const auto payload = frame->payload;
      // Frames of other serials are replies to requests that timed out earlier.
      if (header->serial != serial) continue;
      if (header->kind == FrameKind::EmptyReply) return kPortSuccess;
      if (header->kind != FrameKind::Reply) continue;
      if (assembled.size() + payload.size() > kSocketPortMaximumMessage) return kPortTransportError;
      assembled.insert(assembled.end(), payload.begin(), payload.end());
      if (!(header->flags & kMoreFollows)) {
        *reply = std::move(assembled);
        return kPortSuccess;
      }
    }
  }
}

std::size_t SocketRemotePort::sendWithoutWaiting(std::span<const OutgoingMessage> messages, std::int32_t& status) {
  status = kPortSuccess;
  if (fd_ < 0) {
    status = kPortIsInvalid;
    return 0;
  }
  std::size_t sent = 0;
  while (sent < messages.size()) {
    const OutgoingMessage& first = messages[sent];
    if (kFrameHeaderSize + first.data.size() > kSocketPortMaximumDatagram) {
      // Too big to share a datagram: send it alone, in pieces.
      status = sendRequest(first.id, first.data, 1.0, 0.0, nullptr);
      if (status != kPortSuccess) return sent;
      ++sent;
      continue;
    }
    sendBuffer_.clear();
    std::size_t next = sent;
    while (next < messages.size() &&
           sendBuffer_.size() + kFrameHeaderSize + messages[next].data.size() <= kSocketPortMaximumDatagram) {
      appendFrame(sendBuffer_, {FrameKind::Message, 0, messages[next].id, 0, 0}, messages[next].data);
      ++next;
    }
    const ssize_t n = ::send(fd_, sendBuffer_.data(), sendBuffer_.size(), MSG_DONTWAIT | MSG_NOSIGNAL);
    if (n >= 0) {
      sent = next;
      continue;
    }
    if (errno == EINTR) continue;
    if (errno == EAGAIN || errno == EWOULDBLOCK) return sent;
    if (isPeerGoneError(errno)) {
      peerGone();
      status = kPortIsInvalid;
    } else {
      status = kPortTransportError;
    }
    return sent;
  }
  return sent;
}

// ---------------------------------------------------------------------------
// Port system

SocketPortSystem::SocketPortSystem(std::filesystem::path runtimeDirectory, SocketPortLimits limits)
    : directory_(std::move(runtimeDirectory)), shared_(std::make_shared<SocketPortShared>(limits)) {}

std::filesystem::path SocketPortSystem::socketPath(const std::string& name) const {
  return directory_ / (name + ".sock");
}

bool SocketPortSystem::isValidPortName(std::string_view name) {
  if (name.empty() || name.size() > 80 || name.front() == '.') return false;
  // One file-name component of visible ASCII: no separators, blanks or control characters.
  return std::all_of(name.begin(), name.end(), [](char c) { return c > ' ' && c < 0x7f && c != '/'; });
}

std::vector<std::string> SocketPortSystem::removeStaleSocketFiles() {
  struct Candidate {
    std::filesystem::path path;
    sockaddr_un address;
    dev_t device;
    ino_t inode;
  };
  // A socket file is judged by the file it is now: one replaced between the
  // probes is somebody else's, new, and left alone.
  const auto sameFile = [](const Candidate& candidate) {
    struct stat info {};
    return ::lstat(candidate.path.c_str(), &info) == 0 && S_ISSOCK(info.st_mode) &&
           info.st_dev == candidate.device && info.st_ino == candidate.inode;
  };
  std::vector<Candidate> candidates;
  std::error_code error;
  for (std::filesystem::directory_iterator it(directory_, error), end; !error && it != end; it.increment(error)) {
    Candidate candidate{it->path(), {}, 0, 0};
    struct stat info {};
    if (::lstat(candidate.path.c_str(), &info) != 0 || !S_ISSOCK(info.st_mode)) continue;
    if (!fillAddress(candidate.path, candidate.address) || somebodyListens(candidate.address)) continue;
    candidate.device = info.st_dev;
    candidate.inode = info.st_ino;
    candidates.push_back(std::move(candidate));
  }
  std::vector<std::string> removed;
  if (candidates.empty()) return removed;
  // A port being made binds its file a moment before it listens.
  std::this_thread::sleep_for(kStaleSocketRecheck);
  for (const Candidate& candidate : candidates) {
    if (!sameFile(candidate) || somebodyListens(candidate.address) || !sameFile(candidate)) continue;
    if (::unlink(candidate.path.c_str()) == 0) removed.push_back(candidate.path.filename().string());
  }
  std::sort(removed.begin(), removed.end());
  return removed;
}

std::shared_ptr<LocalMessagePort> SocketPortSystem::createLocalPort(const std::string& name,
                                                                    LocalMessagePort::Callback callback) {
  return createSocketLocalPort(name, std::move(callback));
}

std::shared_ptr<RemoteMessagePort> SocketPortSystem::createRemotePort(const std::string& name) {
  return createSocketRemotePort(name);
}

// Checks the name, fills the socket address of its path and makes an unbound
// socket; -1 with a one-line reason when any of that fails.
int SocketPortSystem::openSocketFor(const std::string& name, const std::filesystem::path& path, sockaddr_un& address,
                                    std::string* error) {
  if (!isValidPortName(name)) {
    setError(error, "invalid port name \"" + name + "\"");
    return -1;
  }
  if (!fillAddress(path, address)) {
    setError(error, "socket path " + path.string() + " is too long for a Unix-domain socket");
    return -1;
  }
  const int fd = newSocket();
  if (fd < 0) setError(error, std::string("cannot create a socket: ") + std::strerror(errno));
  return fd;
}

std::shared_ptr<SocketLocalPort> SocketPortSystem::createSocketLocalPort(const std::string& name,
                                                                         LocalMessagePort::Callback callback,
                                                                         std::string* error) {
  const std::filesystem::path path = socketPath(name);
  sockaddr_un address{};
  const int fd = openSocketFor(name, path, address, error);
  if (fd < 0) return nullptr;
  if (bindPrivately(fd, address) != 0) {
    if (errno != EADDRINUSE) {
      const int saved = errno;
      ::close(fd);
      setError(error, "cannot bind " + path.string() + ": " + std::strerror(saved));
      return nullptr;
    }
    // The file is there. A listener behind it means the name is taken; without
    // one it is left over from a process that died, and is replaced.
    if (somebodyListens(address)) {
      ::close(fd);
      setError(error, "port \"" + name + "\" is already served at " + path.string());
      return nullptr;
    }
    struct stat info {};
    if (::lstat(path.c_str(), &info) == 0 && !S_ISSOCK(info.st_mode)) {
      ::close(fd);
      setError(error, path.string() + " exists and is not a socket");
      return nullptr;
    }
    ::unlink(path.c_str());
    if (bindPrivately(fd, address) != 0) {
      const int saved = errno;
      ::close(fd);
      setError(error, "cannot bind " + path.string() + ": " + std::strerror(saved));
      return nullptr;
    }
  }
  if (::listen(fd, SOMAXCONN) != 0) {
    const int saved = errno;
    ::close(fd);
    setError(error, "cannot listen on " + path.string() + ": " + std::strerror(saved));
    return nullptr;
  }
  return std::shared_ptr<SocketLocalPort>(new SocketLocalPort(name, path, fd, std::move(callback), shared_));
}

std::shared_ptr<SocketRemotePort> SocketPortSystem::createSocketRemotePort(const std::string& name,
                                                                           std::string* error) {
  const std::filesystem::path path = socketPath(name);
  sockaddr_un address{};
  const int fd = openSocketFor(name, path, address, error);
  if (fd < 0) return nullptr;
  const auto giveUp = Clock::now() + kConnectPatience;
  for (;;) {
    if (::connect(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0) break;
    // A full backlog: the listener is alive but behind; give it a moment,
    // unless the program is stopping.
    if ((errno == EAGAIN || errno == EINTR) && Clock::now() < giveUp) {
      const int saved = errno;
      const auto pause = std::min(giveUp, Clock::now() + std::chrono::milliseconds(1));
      if (waitUntil(-1, 0, pause, *shared_) != WaitOutcome::Interrupted) continue;
      errno = saved;
    }
    const int saved = errno;
    ::close(fd);
    setError(error, "port \"" + name + "\" is not reachable: " + std::strerror(saved));
    return nullptr;
  }
  return std::shared_ptr<SocketRemotePort>(new SocketRemotePort(name, fd, shared_));
}

}  // namespace corvane
