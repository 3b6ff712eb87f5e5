#include "platform/SocketTelephonyClient.h"

#include <utility>

#include "platform/PropertyList.h"

namespace corvane {

namespace {

class SocketTelephonyConnection final : public TelephonyConnection {
 public:
  SocketTelephonyConnection(std::shared_ptr<RemoteMessagePort> service, TelephonyClient::NotificationCallback callback)
      : service_(std::move(service)), callback_(std::move(callback)) {}

  ~SocketTelephonyConnection() override {
    // A connection that goes away deliberately is no news to its owner.
    service_->setInvalidationCallback(nullptr);
    service_->invalidate();
  }

  TelephonyError NetworkMonitorCreateLogChannel(const std::string& localPortName,
                                                std::string& remotePortName) override {
    remotePortName.clear();
    Dictionary request;
    request.set(kTelephonyKeyLocalPortName, Value(localPortName));
    auto data = plist::serialize(Value(request), plist::Format::XML);
    if (!data) return {kTelephonyDomainProtocol, kTelephonyErrorMalformedReply};

    std::optional<Bytes> replyData;
    const std::int32_t status =
        service_->sendRequest(kTelephonyCreateLogChannelMessage, *data, kTelephonyRequestSendTimeout,
                              kTelephonyRequestReceiveTimeout, &replyData);
    if (status != kPortSuccess) return {kTelephonyDomainTransport, status};
    if (!replyData) return {kTelephonyDomainProtocol, kTelephonyErrorNoReply};

    const auto reply = plist::parse(*replyData);
    const Dictionary* fields = reply ? reply->asDictionary() : nullptr;
    if (!fields) return {kTelephonyDomainProtocol, kTelephonyErrorMalformedReply};
    const Value* domain = fields->find(kTelephonyKeyErrorDomain);
    const Value* code = fields->find(kTelephonyKeyErrorCode);
    if (!domain || !code || !domain->asInteger() || !code->asInteger()) {
      return {kTelephonyDomainProtocol, kTelephonyErrorMalformedReply};
    }
    TelephonyError error{static_cast<std::int32_t>(*domain->asInteger()),
                         static_cast<std::int32_t>(*code->asInteger())};
    if (error.code == 0) {
      // The caller checks for a missing or empty name itself and says so.
      if (const Value* name = fields->find(kTelephonyKeyRemotePortName); name && name->asString()) {
        remotePortName = *name->asString();
      }
    }
    return error;
  }

 private:
  std::shared_ptr<RemoteMessagePort> service_;
  // Kept for the connection's lifetime; the service sends no notifications yet.
  TelephonyClient::NotificationCallback callback_;
};

}  // namespace

std::unique_ptr<TelephonyConnection> SocketTelephonyClient::TelephonyServerConnectionCreate(
    NotificationCallback callback) {
  auto service = ports_.createRemotePort(std::string(kTelephonyServicePortName));
  if (!service) return nullptr;
  return std::make_unique<SocketTelephonyConnection>(std::move(service), std::move(callback));
}

}  // namespace corvane
