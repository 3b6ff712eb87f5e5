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
inline constexpr std::size_t kSocketPortMaximumMessage = 64 * 1024 * 1024;

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

  SocketLocalPort(std::string name, std::filesystem::path socketPath, int listener, Callback callback);
  void watch(const std::shared_ptr<Connection>& connection);
  void readConnection(const std::shared_ptr<Connection>& connection);
  // Returns false when the connection must be closed.
  bool deliverDatagram(const std::shared_ptr<Connection>& connection, std::span<const std::uint8_t> datagram);
  void closeConnection(const std::shared_ptr<Connection>& connection);
  void closeAll();

  std::string name_;
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
  SocketRemotePort(std::string name, int fd);
  // Marks the port invalid after its peer was found gone; runs the callback once.
  void peerGone() const;
  std::int32_t sendDatagram(std::span<const std::uint8_t> datagram, double timeoutSeconds) const;
  std::int32_t awaitReply(std::uint32_t serial, double timeoutSeconds, std::optional<Bytes>* reply);

  std::string name_;
  mutable int fd_ = -1;
  mutable InvalidationCallback invalidation_;
  std::uint32_t serial_ = 0;
  std::vector<std::uint8_t> sendBuffer_;
  std::vector<std::uint8_t> receiveBuffer_;
};

class SocketPortSystem final : public MessagePortSystem {
 public:
  // `runtimeDirectory` must already be prepared (prepareRuntimeDirectory).
  explicit SocketPortSystem(std::filesystem::path runtimeDirectory);

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

 private:
  static int openSocketFor(const std::string& name, const std::filesystem::path& path, sockaddr_un& address,
                           std::string* error);

  std::filesystem::path directory_;
};

}  // namespace corvane
