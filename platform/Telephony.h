#pragma once

// The client side of the telephony service: a connection, and the request for a
// network-monitor log channel that delivers packets to a named local port.

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

#include "platform/Value.h"

namespace corvane {

struct TelephonyError {
  std::int32_t domain = 0;
  std::int32_t code = 0;  // 0 on success
};

class TelephonyConnection {
 public:
  virtual ~TelephonyConnection() = default;
  // Asks for a log channel delivering to the local port named `localPortName`.
  // On success the error code is 0 and `remotePortName` names the service's
  // command port for this channel.
  virtual TelephonyError NetworkMonitorCreateLogChannel(const std::string& localPortName,
                                                        std::string& remotePortName) = 0;
};

class TelephonyClient {
 public:
  using NotificationCallback =
      std::function<void(TelephonyConnection& connection, const std::string& notification, const Value& data)>;

  virtual ~TelephonyClient() = default;
  // nullptr when the service cannot be reached.
  virtual std::unique_ptr<TelephonyConnection> TelephonyServerConnectionCreate(NotificationCallback callback) = 0;
};

}  // namespace corvane
