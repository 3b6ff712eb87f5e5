#pragma once

// A peer of a socket port that does not use the library: it writes the frames
// of the documented wire format byte by byte, and can stop anywhere (an
// unfinished message, a request whose reply it never reads).

#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstdint>
#include <cstring>
#include <filesystem>
#include <optional>
#include <thread>

#include "platform/SocketMessagePort.h"

namespace corvane::test {

// Frame kinds and flags of the wire format.
inline constexpr std::uint8_t kMessageFrame = 1;
inline constexpr std::uint8_t kRequestFrame = 2;
inline constexpr std::uint8_t kMoreFollows = 0x01;
inline constexpr std::size_t kFrameHeaderSize = 16;

// A 16-byte little-endian frame header (kind, flags, reserved, message id,
// serial, payload length) and the payload.
inline Bytes frame(std::uint8_t kind, std::uint8_t flags, std::int32_t id, std::uint32_t serial,
                   const Bytes& payload) {
  Bytes out = {kind, flags, 0, 0};
  for (std::uint32_t value : {static_cast<std::uint32_t>(id), serial, static_cast<std::uint32_t>(payload.size())}) {
    for (int shift = 0; shift < 32; shift += 8) out.push_back(static_cast<std::uint8_t>(value >> shift));
  }
  out.insert(out.end(), payload.begin(), payload.end());
  return out;
}

class RawPeer {
 public:
  explicit RawPeer(const std::filesystem::path& socket) : fd_(::socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0)) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, socket.c_str(), sizeof address.sun_path - 1);
    connected_ = ::connect(fd_, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
  }
  ~RawPeer() { ::close(fd_); }
  RawPeer(const RawPeer&) = delete;
  RawPeer& operator=(const RawPeer&) = delete;

  bool connected() const { return connected_; }
  // Sends one datagram, waiting for buffer space; false once the port has closed the connection.
  bool send(const Bytes& datagram) { return ::send(fd_, datagram.data(), datagram.size(), MSG_NOSIGNAL) >= 0; }
  // Sends one datagram only if there is room for it now.
  bool sendWithoutWaiting(const Bytes& datagram) {
    return ::send(fd_, datagram.data(), datagram.size(), MSG_NOSIGNAL | MSG_DONTWAIT) >= 0;
  }
  // Whether the port has closed this connection, waiting up to the limit;
  // whatever it sent before is read and dropped.
  bool closedByThePort(std::chrono::milliseconds limit) {
    const auto giveUp = std::chrono::steady_clock::now() + limit;
    Bytes buffer(kSocketPortMaximumDatagram);
    for (;;) {
      const ssize_t n = ::recv(fd_, buffer.data(), buffer.size(), MSG_DONTWAIT);
      if (n == 0 || (n < 0 && errno != EAGAIN && errno != EWOULDBLOCK)) return true;
      if (std::chrono::steady_clock::now() > giveUp) return false;
      if (n < 0) std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
  }
  // The payload of the next datagram (a reply of one frame), waiting up to a second.
  std::optional<Bytes> reply() {
    pollfd p{fd_, POLLIN, 0};
    if (::poll(&p, 1, 1000) != 1) return std::nullopt;
    Bytes buffer(kSocketPortMaximumDatagram);
    const ssize_t n = ::recv(fd_, buffer.data(), buffer.size(), MSG_DONTWAIT);
    if (n < static_cast<ssize_t>(kFrameHeaderSize)) return std::nullopt;
    return Bytes(buffer.begin() + kFrameHeaderSize, buffer.begin() + n);
  }

 private:
  int fd_;
  bool connected_ = false;
};

}  // namespace corvane::test
