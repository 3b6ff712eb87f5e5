#include <gtest/gtest.h>

#include "PortServerThread.h"
#include "RuntimeTestDirectory.h"
#include "platform/PropertyList.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"

namespace corvane {
namespace {

// A stand-in for the service's well-known port whose answer the test chooses.
class SocketTelephonyClientTest : public ::testing::Test {
 protected:
  void SetUp() override { ASSERT_TRUE(runtime_.result().ok()) << runtime_.result().error; }
  void TearDown() override {
    if (service_) server_.run([&] { service_->invalidate(); });
  }

  void serve(std::function<std::optional<Bytes>(MessageId, const Value&)> answer) {
    server_.run([&](VirtualRunLoop& loop) {
      service_ = ports_.createSocketLocalPort(std::string(kTelephonyServicePortName),
                                            [answer](LocalMessagePort&, MessageId id, const Bytes& data) {
                                              return answer(id, plist::parse(data).value_or(Value()));
                                            });
      service_->scheduleOn(loop);
    });
  }

  static Bytes reply(std::int64_t domain, std::int64_t code, const char* name) {
    Dictionary fields;
    fields.set(kTelephonyKeyErrorDomain, Value::integer(domain));
    fields.set(kTelephonyKeyErrorCode, Value::integer(code));
    if (name) fields.set(kTelephonyKeyRemotePortName, Value(name));
    return plist::serializeOrThrow(Value(fields), plist::Format::XML);
  }

  test::RuntimeTestDirectory runtime_;
  SocketPortSystem ports_{runtime_.result().path};
  SocketTelephonyClient client_{ports_};
  std::shared_ptr<SocketLocalPort> service_;
  test::PortServerThread server_;
};

TEST_F(SocketTelephonyClientTest, UnreachableServiceGivesNoConnection) {
  EXPECT_EQ(client_.TelephonyServerConnectionCreate(nullptr), nullptr);
}

TEST_F(SocketTelephonyClientTest, LogChannelRequestNamesTheLocalPortAndReturnsTheCommandPort) {
  std::string askedFor;
  MessageId askedWith = -1;
  serve([&](MessageId id, const Value& request) {
    askedWith = id;
    if (const Dictionary* d = request.asDictionary()) {
      if (const Value* name = d->find(kTelephonyKeyLocalPortName); name && name->asString())
        askedFor = *name->asString();
    }
    return std::optional<Bytes>(reply(0, 0, "corvane-telephonyd.channel.1"));
  });
  auto connection = client_.TelephonyServerConnectionCreate(nullptr);
  ASSERT_TRUE(connection);
  std::string remote = "left over";
  const TelephonyError error = connection->NetworkMonitorCreateLogChannel("CorvaneApp.abc", remote);
  EXPECT_EQ(error.code, 0);
  EXPECT_EQ(remote, "corvane-telephonyd.channel.1");
  EXPECT_EQ(askedFor, "CorvaneApp.abc");
  EXPECT_EQ(askedWith, kTelephonyCreateLogChannelMessage);
}

TEST_F(SocketTelephonyClientTest, ServiceErrorIsPassedOnWithoutAName) {
  serve([&](MessageId, const Value&) {
    return std::optional<Bytes>(reply(kTelephonyDomainService, kTelephonyErrorBadPortName, "ignored"));
  });
  auto connection = client_.TelephonyServerConnectionCreate(nullptr);
  ASSERT_TRUE(connection);
  std::string remote;
  const TelephonyError error = connection->NetworkMonitorCreateLogChannel("bad/name", remote);
  EXPECT_EQ(error.domain, kTelephonyDomainService);
  EXPECT_EQ(error.code, kTelephonyErrorBadPortName);
  EXPECT_TRUE(remote.empty());
}

TEST_F(SocketTelephonyClientTest, ReplyThatIsNotAPropertyListIsAProtocolError) {
  serve([&](MessageId, const Value&) { return std::optional<Bytes>(Bytes{'n', 'o', 'p', 'e'}); });
  auto connection = client_.TelephonyServerConnectionCreate(nullptr);
  ASSERT_TRUE(connection);
  std::string remote;
  const TelephonyError error = connection->NetworkMonitorCreateLogChannel("CorvaneApp.x", remote);
  EXPECT_EQ(error.domain, kTelephonyDomainProtocol);
  EXPECT_EQ(error.code, kTelephonyErrorMalformedReply);
}

TEST_F(SocketTelephonyClientTest, MissingReplyIsAProtocolError) {
  serve([&](MessageId, const Value&) { return std::optional<Bytes>(); });
  auto connection = client_.TelephonyServerConnectionCreate(nullptr);
  ASSERT_TRUE(connection);
  std::string remote;
  const TelephonyError error = connection->NetworkMonitorCreateLogChannel("CorvaneApp.x", remote);
  EXPECT_EQ(error.domain, kTelephonyDomainProtocol);
  EXPECT_EQ(error.code, kTelephonyErrorNoReply);
}

TEST_F(SocketTelephonyClientTest, ServiceThatVanishedIsATransportError) {
  serve([&](MessageId, const Value&) { return std::optional<Bytes>(reply(0, 0, "x")); });
  auto connection = client_.TelephonyServerConnectionCreate(nullptr);
  ASSERT_TRUE(connection);
  server_.run([&] { service_->invalidate(); });
  std::string remote;
  const TelephonyError error = connection->NetworkMonitorCreateLogChannel("CorvaneApp.x", remote);
  EXPECT_EQ(error.domain, kTelephonyDomainTransport);
  EXPECT_EQ(error.code, kPortIsInvalid);
}

}  // namespace
}  // namespace corvane
