#pragma once

// Named message ports. A local port receives (message id, data) messages sent
// to its name and may answer with reply data; a remote port sends requests to a
// named local port of another process, with send and receive time-outs and an
// optional reply. A port whose peer has gone is invalid; invalidating a port
// runs its invalidation callback once.

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <span>
#include <string>

#include "platform/RunLoop.h"
#include "platform/Value.h"

namespace corvane {

using MessageId = std::int32_t;

// Status codes of sendRequest.
inline constexpr std::int32_t kPortSuccess = 0;
inline constexpr std::int32_t kPortSendTimeout = -1;
inline constexpr std::int32_t kPortReceiveTimeout = -2;
inline constexpr std::int32_t kPortIsInvalid = -3;
inline constexpr std::int32_t kPortTransportError = -4;

class MessagePort {
 public:
  using InvalidationCallback = std::function<void(MessagePort& port)>;

  virtual ~MessagePort() = default;
  virtual const std::string& name() const = 0;
  virtual bool isValid() const = 0;
  // Makes the port invalid; the invalidation callback, if any, runs once.
  virtual void invalidate() = 0;
  // Registers the invalidation callback; an empty function clears it.
  virtual void setInvalidationCallback(InvalidationCallback callback) = 0;
};

class LocalMessagePort : public MessagePort {
 public:
  // Called on the run loop for every message; the result, if any, is the reply.
  using Callback = std::function<std::optional<Bytes>(LocalMessagePort& port, MessageId id, const Bytes& data)>;

  // Delivers the callbacks (and invalidation) on this run loop.
  virtual void scheduleOn(RunLoop& runLoop) = 0;
};

class RemoteMessagePort : public MessagePort {
 public:
  // Sends one request. With `reply` given, waits up to `receiveTimeout` seconds
  // for reply data and stores it there. Returns kPortSuccess or an error status.
  virtual std::int32_t sendRequest(MessageId id, std::span<const std::uint8_t> data, double sendTimeout,
                                   double receiveTimeout, std::optional<Bytes>* reply) = 0;
};

// Makes ports; the socket implementation lives in the private runtime directory.
class MessagePortSystem {
 public:
  virtual ~MessagePortSystem() = default;
  // nullptr when the name is taken or the port cannot be made.
  virtual std::shared_ptr<LocalMessagePort> createLocalPort(const std::string& name,
                                                            LocalMessagePort::Callback callback) = 0;
  // nullptr when no local port of that name is reachable.
  virtual std::shared_ptr<RemoteMessagePort> createRemotePort(const std::string& name) = 0;
};

}  // namespace corvane
