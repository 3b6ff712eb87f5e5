#pragma once

// An in-memory telephony service with its message ports, for testing the model
// on a virtual clock. Each knob makes one step of the channel fail.

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/MessagePort.h"
#include "platform/PropertyList.h"
#include "platform/Telephony.h"

namespace corvane::test {

struct SentCommand {
  std::string port;
  MessageId id;
  Value command;  // the parsed property list
  double sendTimeout;
  double receiveTimeout;
  bool wantsReply;
};

class FakeTelephony;

// Validity and the invalidation callback, as both kinds of port have them.
template <typename Port>
class FakePort : public Port {
 public:
  void invalidate() override {
    if (!valid_) return;
    valid_ = false;
    typename Port::InvalidationCallback callback = std::move(invalidation_);
    invalidation_ = nullptr;
    if (callback) callback(*this);
  }
  void setInvalidationCallback(typename Port::InvalidationCallback callback) override {
    invalidation_ = std::move(callback);
  }
  bool hasInvalidationCallback() const { return static_cast<bool>(invalidation_); }

 protected:
  typename Port::InvalidationCallback invalidation_;
  bool valid_ = true;
};

class FakeLocalPort final : public FakePort<LocalMessagePort> {
 public:
  FakeLocalPort(std::string name, Callback callback) : name_(std::move(name)), callback_(std::move(callback)) {}
  const std::string& name() const override { return name_; }
  bool isValid() const override { return valid_; }
  void scheduleOn(RunLoop& runLoop) override { runLoop_ = &runLoop; }

  std::optional<Bytes> deliver(MessageId id, const Bytes& data) { return callback_(*this, id, data); }
  bool scheduled() const { return runLoop_ != nullptr; }

 private:
  std::string name_;
  Callback callback_;
  RunLoop* runLoop_ = nullptr;
};

class FakeRemotePort final : public FakePort<RemoteMessagePort> {
 public:
  FakeRemotePort(std::string name, FakeTelephony& service) : name_(std::move(name)), service_(service) {}
  const std::string& name() const override { return name_; }
  bool isValid() const override;
  std::int32_t sendRequest(MessageId id, std::span<const std::uint8_t> data, double sendTimeout, double receiveTimeout,
                           std::optional<Bytes>* reply) override;

 private:
  std::string name_;
  FakeTelephony& service_;
};

class FakeTelephony final : public MessagePortSystem, public TelephonyClient {
 public:
  // Knobs, each for one way the channel can fail.
  bool reachable_ = true;
  std::int32_t channelErrorCode_ = 0;
  std::string commandPortName_ = "CorvaneTS.1";
  bool remotePortCreatable_ = true;
  std::int32_t technologyStatus_ = kPortSuccess;
  std::optional<Bytes> technologyReply_ = replyFor("IFX");
  std::int32_t startStatus_ = kPortSuccess;
  bool alive_ = true;  // false: the service has died and its ports are invalid

  // What happened.
  std::vector<SentCommand> commands_;
  std::vector<std::string> channelRequests_;  // local port names
  int connectionsOpened_ = 0;
  std::vector<std::shared_ptr<FakeLocalPort>> localPorts_;
  std::vector<std::shared_ptr<FakeRemotePort>> remotePorts_;
  TelephonyClient::NotificationCallback lastNotificationCallback_;

  static Bytes replyFor(const std::string& technology) {
    Dictionary reply;
    reply.set("GetTechnology", Value(technology));
    return plist::serializeOrThrow(Value(reply), plist::Format::XML);
  }

  // Sends a packet to the newest local port, as the service streams it.
  std::optional<Bytes> sendPacket(const Bytes& packet, MessageId id = 0) {
    return localPorts_.back()->deliver(id, packet);
  }

  std::shared_ptr<LocalMessagePort> createLocalPort(const std::string& name, LocalMessagePort::Callback callback) override {
    auto port = std::make_shared<FakeLocalPort>(name, std::move(callback));
    localPorts_.push_back(port);
    return port;
  }

  std::shared_ptr<RemoteMessagePort> createRemotePort(const std::string& name) override {
    if (!remotePortCreatable_ || !alive_) return nullptr;
    auto port = std::make_shared<FakeRemotePort>(name, *this);
    remotePorts_.push_back(port);
    return port;
  }

  std::unique_ptr<TelephonyConnection> TelephonyServerConnectionCreate(NotificationCallback callback) override;
};

class FakeConnection final : public TelephonyConnection {
 public:
  explicit FakeConnection(FakeTelephony& service) : service_(service) {}
  TelephonyError NetworkMonitorCreateLogChannel(const std::string& localPortName, std::string& remotePortName) override {
    service_.channelRequests_.push_back(localPortName);
    if (service_.channelErrorCode_ != 0) return {1, service_.channelErrorCode_};
    remotePortName = service_.commandPortName_;
    return {};
  }

 private:
  FakeTelephony& service_;
};

inline std::unique_ptr<TelephonyConnection> FakeTelephony::TelephonyServerConnectionCreate(NotificationCallback callback) {
  if (!reachable_ || !alive_) return nullptr;
  ++connectionsOpened_;
  lastNotificationCallback_ = std::move(callback);
  return std::make_unique<FakeConnection>(*this);
}

inline bool FakeRemotePort::isValid() const { return valid_ && service_.alive_; }

inline std::int32_t FakeRemotePort::sendRequest(MessageId id, std::span<const std::uint8_t> data, double sendTimeout,
                                                double receiveTimeout, std::optional<Bytes>* reply) {
  if (!isValid()) return kPortIsInvalid;
  Value command = plist::parseOrThrow(data);
  service_.commands_.push_back({name_, id, command, sendTimeout, receiveTimeout, reply != nullptr});
  if (command.asDictionary() && command.asDictionary()->contains("GetTechnology")) {
    if (reply) *reply = service_.technologyReply_;
    return service_.technologyStatus_;
  }
  return service_.startStatus_;
}

}  // namespace corvane::test
