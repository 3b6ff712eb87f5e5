#pragma once

// The telephony-service client over named message ports: it reaches
// corvane-telephonyd on its well-known port and asks it for log channels.
//
// Service protocol, on the well-known port: a request with message id
// kTelephonyCreateLogChannelMessage whose data is an XML property list
// {"LocalPortName": name}; the reply is a property list {"ErrorDomain": integer,
// "ErrorCode": integer, "RemotePortName": string}, the name present when the
// code is 0. Commands then go to that port (the log channel itself).

#include <cstdint>
#include <string_view>

#include "platform/MessagePort.h"
#include "platform/Telephony.h"

namespace corvane {

// The service's well-known port (socket file "corvane-telephonyd.sock").
inline constexpr std::string_view kTelephonyServicePortName = "corvane-telephonyd";
inline constexpr MessageId kTelephonyCreateLogChannelMessage = 1;

inline constexpr std::string_view kTelephonyKeyLocalPortName = "LocalPortName";
inline constexpr std::string_view kTelephonyKeyErrorDomain = "ErrorDomain";
inline constexpr std::string_view kTelephonyKeyErrorCode = "ErrorCode";
inline constexpr std::string_view kTelephonyKeyRemotePortName = "RemotePortName";

// Error domains of TelephonyError.
inline constexpr std::int32_t kTelephonyDomainTransport = 1;  // code: the port status (kPort*)
inline constexpr std::int32_t kTelephonyDomainService = 2;    // code: one of the service codes below
inline constexpr std::int32_t kTelephonyDomainProtocol = 3;   // code: one of the protocol codes below

// Service codes.
inline constexpr std::int32_t kTelephonyErrorBadRequest = 1;
inline constexpr std::int32_t kTelephonyErrorBadPortName = 2;
inline constexpr std::int32_t kTelephonyErrorChannelUnavailable = 3;

// Protocol codes: the reply was not what the service should send.
inline constexpr std::int32_t kTelephonyErrorNoReply = 1;
inline constexpr std::int32_t kTelephonyErrorMalformedReply = 2;

// Time-outs of the log-channel request, in seconds.
inline constexpr double kTelephonyRequestSendTimeout = 1.0;
inline constexpr double kTelephonyRequestReceiveTimeout = 2.0;

class SocketTelephonyClient final : public TelephonyClient {
 public:
  // The ports are made through `ports`, which must outlive this client and its connections.
  explicit SocketTelephonyClient(MessagePortSystem& ports) : ports_(ports) {}

  std::unique_ptr<TelephonyConnection> TelephonyServerConnectionCreate(NotificationCallback callback) override;

 private:
  MessagePortSystem& ports_;
};

}  // namespace corvane
