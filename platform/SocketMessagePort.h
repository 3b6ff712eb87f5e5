#pragma once

// Named message ports over Unix-domain SOCK_SEQPACKET sockets. Every port name
// is one socket file "<name>.sock" in the private runtime directory. A local
// port listens there; a remote port is a connection to it, and a reply travels
// back on the connection that carried the request.
//
// Wire format. Each datagram holds one or more frames, back to back; a frame is
// a 16-byte little-endian header (kind u8, flags u8, reserved u16, message id
// i32, serial u32, payload length u32) and the payload. Kinds: a message, a
// request that wants a reply, a reply, an empty reply. A message too big for one
// datagram goes as consecutive frames of the same connection, all but the last
// flagged "more follows". Replies echo the serial of their request, so a late
// reply to a request that already timed out is recognised and dropped.
//
// Several small messages share one datagram when the sender batches them
// (SocketRemotePort::sendWithoutWaiting); that is what lets the service stream
// hundreds of thousands of packets per second.
//
// A peer may be slow, silent or hostile. The local ports of one port system
// together accept at most SocketPortLimits::connections connections and hold
// at most SocketPortLimits::unfinishedMessageBytes of multi-part messages that
// have not yet arrived whole; a connection beyond either is dropped, with one
// log line per wave of refusals, and the others are served on. The blocking
// waits (a reply a peer does not take, a reply a peer does not send, a
// listener whose backlog is full) end early once the program is stopping
// (interruptWaitsWhenReadable, stopWaiting), as if their time had run out.
//
// Socket files are made with mode 0600 whatever the umask.

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <map>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include <sys/un.h>

#include "platform/MessagePort.h"

namespace corvane {

// Largest datagram a port sends; the receive buffers are this big. It stays
// well below the kernel's default socket buffer, so one datagram always fits.
inline constexpr std::size_t kSocketPortMaximumDatagram = 64 * 1024;
// A message bigger than this is refused by the receiver, which then drops the connection.
inline constexpr std::size_t kSocketPortMaximumMessage = 16 * 1024 * 1024;

// What the local ports of one port system take from their peers, in all.
struct SocketPortLimits {
  // Open connections across all local ports.
  std::size_t connections = 128;
  // Memory held for multi-part messages whose last frame has not arrived yet,
  // across all connections; the largest message still fits.
  std::size_t unfinishedMessageBytes = kSocketPortMaximumMessage;
};

// State that the ports of one port system share: the limits and what is
// counted against them, and what ends their blocking waits early.
class SocketPortShared {
 public:
  explicit SocketPortShared(SocketPortLimits limits) : limits_(limits) {}

  const SocketPortLimits& limits() const { return limits_; }
  std::size_t openConnections() const { return connections_.load(); }
  std::size_t unfinishedMessageBytes() const { return unfinishedBytes_.load(); }

  // Counts one more connection; false (and nothing counted) at the limit.
  bool admitConnection();
  void releaseConnection();
  // Counts `bytes` more held for unfinished messages; false (and nothing
  // counted) when that would pass the limit.
  bool holdUnfinished(std::size_t bytes);
  void releaseUnfinished(std::size_t bytes);

  // Each returns true once per wave of refusals: the first refusal after the
  // limit had room again (a connection was admitted; nothing was held).
  bool firstConnectionRefusal() { return !refusingConnections_.exchange(true); }
  bool firstUnfinishedRefusal() { return !refusingUnfinished_.exchange(true); }

  void setInterruptDescriptor(int descriptor) { interruptDescriptor_.store(descriptor); }
  int interruptDescriptor() const { return interruptDescriptor_.load(); }
  void stopWaiting() { stopWaiting_.store(true); }
  bool waitsStopped() const { return stopWaiting_.load(); }

 private:
  SocketPortLimits limits_;
  std::atomic<std::size_t> connections_{0};
  std::atomic<std::size_t> unfinishedBytes_{0};
  std::atomic<bool> refusingConnections_{false};
  std::atomic<bool> refusingUnfinished_{false};
  std::atomic<int> interruptDescriptor_{-1};
  std::atomic<bool> stopWaiting_{false};
};

class SocketLocalPort final : public LocalMessagePort, public std::enable_shared_from_this<SocketLocalPort> {
 public:
  // Called on the run loop whenever a peer connects or a connection closes,
  // with the number of open connections. The service uses it to notice a
  // client that has gone.
  using ConnectionCallback = std::function<void(SocketLocalPort& port, std::size_t openConnections)>;

  ~SocketLocalPort() override;

  const std::string& name() const override { return name_; }
  bool isValid() const override { return listener_ >= 0; }
  // Closes the connections and the listening socket and removes the socket file.
  void invalidate() override;
  void setInvalidationCallback(InvalidationCallback callback) override { invalidation_ = std::move(callback); }
  void scheduleOn(RunLoop& runLoop) override;

  void setConnectionCallback(ConnectionCallback callback) { connectionCallback_ = std::move(callback); }
  std::size_t openConnections() const { return connections_.size(); }

  // Reads what has arrived without waiting; the run-loop watches call these.
  void acceptPending();

 private:
  friend class SocketPortSystem;
  struct Connection;

  SocketLocalPort(std::string name, std::filesystem::path socketPath, int listener, Callback callback,
                  std::shared_ptr<SocketPortShared> shared);
  void watch(const std::shared_ptr<Connection>& connection);
  void readConnection(const std::shared_ptr<Connection>& connection);
  // Returns false when the connection sent a malformed message and must be closed.
  bool deliverDatagram(const std::shared_ptr<Connection>& connection, std::span<const std::uint8_t> datagram);
  // Makes room for `more` bytes of the connection's unfinished message; false
  // when the port system's limit on such bytes does not allow it.
  bool reserveUnfinished(Connection& connection, std::size_t more);
  void releaseUnfinished(Connection& connection);
  void closeConnection(const std::shared_ptr<Connection>& connection);
  void closeAll();

  std::string name_;
  std::shared_ptr<SocketPortShared> shared_;
  std::filesystem::path socketPath_;
  std::uint64_t socketDevice_ = 0;
  std::uint64_t socketInode_ = 0;
  int listener_ = -1;
  Callback callback_;
  InvalidationCallback invalidation_;
  ConnectionCallback connectionCallback_;
  RunLoop* runLoop_ = nullptr;
  RunLoop::Handle listenerWatch_ = 0;
  std::map<int, std::shared_ptr<Connection>> connections_;
  std::vector<std::uint8_t> receiveBuffer_;
};

class SocketRemotePort final : public RemoteMessagePort, public std::enable_shared_from_this<SocketRemotePort> {
 public:
  struct OutgoingMessage {
    MessageId id;
    std::span<const std::uint8_t> data;
  };

  ~SocketRemotePort() override;

  const std::string& name() const override { return name_; }
  // A port whose peer has gone becomes invalid here, without anything being
  // sent; that first discovery runs the invalidation callback.
  bool isValid() const override;
  void invalidate() override;
  void setInvalidationCallback(InvalidationCallback callback) override { invalidation_ = std::move(callback); }

  std::int32_t sendRequest(MessageId id, std::span<const std::uint8_t> data, double sendTimeout, double receiveTimeout,
                           std::optional<Bytes>* reply) override;

  // Sends, without waiting for buffer space, as many of the messages (in order,
  // no replies) as the socket takes now, several per datagram. Returns how many
  // went; `status` is kPortSuccess, or kPortIsInvalid when the peer has gone. A
  // message bigger than one datagram is sent whole, waiting up to one second.
  std::size_t sendWithoutWaiting(std::span<const OutgoingMessage> messages, std::int32_t& status);

  // The connected socket, for callers that wait until it can take more (poll POLLOUT).
  int descriptor() const { return fd_; }

 private:
  friend class SocketPortSystem;
  SocketRemotePort(std::string name, int fd, std::shared_ptr<SocketPortShared> shared);
  // Marks the port invalid after its peer was found gone; runs the callback once.
  void peerGone() const;
  std::int32_t sendDatagram(std::span<const std::uint8_t> datagram, double timeoutSeconds) const;
  std::int32_t awaitReply(std::uint32_t serial, double timeoutSeconds, std::optional<Bytes>* reply);

  std::string name_;
  std::shared_ptr<SocketPortShared> shared_;
  mutable int fd_ = -1;
  mutable InvalidationCallback invalidation_;
  std::uint32_t serial_ = 0;
  std::vector<std::uint8_t> sendBuffer_;
  std::vector<std::uint8_t> receiveBuffer_;
};

class SocketPortSystem final : public MessagePortSystem {
 public:
  // `runtimeDirectory` must already be prepared (prepareRuntimeDirectory).
  explicit SocketPortSystem(std::filesystem::path runtimeDirectory, SocketPortLimits limits = {});

  std::shared_ptr<LocalMessagePort> createLocalPort(const std::string& name,
                                                    LocalMessagePort::Callback callback) override;
  std::shared_ptr<RemoteMessagePort> createRemotePort(const std::string& name) override;

  // As above, with the concrete types and a one-line reason on failure.
  std::shared_ptr<SocketLocalPort> createSocketLocalPort(const std::string& name, LocalMessagePort::Callback callback,
                                                         std::string* error = nullptr);
  std::shared_ptr<SocketRemotePort> createSocketRemotePort(const std::string& name, std::string* error = nullptr);

  const std::filesystem::path& directory() const { return directory_; }
  std::filesystem::path socketPath(const std::string& name) const;

  // Names are single file-name components: letters, digits, '.', '-' and '_',
  // not starting with '.', at most 80 characters.
  static bool isValidPortName(std::string_view name);

  // The blocking waits of this system's ports end early, as if their time had
  // run out, while `descriptor` is readable: SignalEvents::pendingDescriptor(),
  // so that a termination signal is not kept waiting by a silent peer. -1 for none.
  void interruptWaitsWhenReadable(int descriptor) { shared_->setInterruptDescriptor(descriptor); }
  // From now on the ports send what the sockets take at once and wait for
  // nothing more (a program that is stopping).
  void stopWaiting() { shared_->stopWaiting(); }

  // Removes the socket files of the directory that nobody listens on: left by
  // a process that was killed before it could remove them. A socket counts as
  // stale when connecting to it is refused, twice, a moment apart (a port
  // being made listens right after its file appears); live sockets, other
  // files and symbolic links are left alone. Returns the file names removed.
  std::vector<std::string> removeStaleSocketFiles();

  const SocketPortShared& shared() const { return *shared_; }

 private:
  static int openSocketFor(const std::string& name, const std::filesystem::path& path, sockaddr_un& address,
                           std::string* error);

  std::filesystem::path directory_;
  std::shared_ptr<SocketPortShared> shared_;
};

}  // namespace corvane
