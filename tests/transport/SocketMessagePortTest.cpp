#include "platform/SocketMessagePort.h"

#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <cstring>
#include <filesystem>
#include <mutex>
#include <string>
#include <thread>

#include "PortServerThread.h"
#include "RuntimeTestDirectory.h"

namespace corvane {
namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

Bytes bytes(std::string_view text) { return Bytes(text.begin(), text.end()); }
std::string text(const Bytes& data) { return std::string(data.begin(), data.end()); }

struct Received {
  std::mutex mutex;
  std::vector<std::pair<MessageId, Bytes>> messages;

  void add(MessageId id, const Bytes& data) {
    std::lock_guard lock(mutex);
    messages.emplace_back(id, data);
  }
  std::size_t size() {
    std::lock_guard lock(mutex);
    return messages.size();
  }
  std::vector<std::pair<MessageId, Bytes>> copy() {
    std::lock_guard lock(mutex);
    return messages;
  }
};

// Waits, with short real sleeps, until the condition holds or a second has passed.
template <typename Condition>
bool eventually(Condition condition, std::chrono::milliseconds limit = 2000ms) {
  const auto giveUp = Clock::now() + limit;
  while (!condition()) {
    if (Clock::now() > giveUp) return false;
    std::this_thread::sleep_for(1ms);
  }
  return true;
}

class SocketMessagePortTest : public ::testing::Test {
 protected:
  void SetUp() override { ASSERT_TRUE(runtime_.result().ok()) << runtime_.result().error; }

  // A local port on the server thread that records what arrives and answers
  // every message with "re:" and its data.
  std::shared_ptr<SocketLocalPort> serveEcho(const std::string& name) {
    std::shared_ptr<SocketLocalPort> port;
    server_.run([&](VirtualRunLoop& loop) {
      port = ports_.createSocketLocalPort(name, [this](LocalMessagePort&, MessageId id, const Bytes& data) {
        received_.add(id, data);
        return std::optional<Bytes>(bytes("re:" + text(data)));
      });
      if (port) port->scheduleOn(loop);
    });
    return port;
  }

  void invalidateOnServer(const std::shared_ptr<SocketLocalPort>& port) {
    server_.run([&] { port->invalidate(); });
  }

  test::RuntimeTestDirectory runtime_;
  SocketPortSystem ports_{runtime_.result().path};
  Received received_;
  test::PortServerThread server_;
};

TEST_F(SocketMessagePortTest, RequestIsAnsweredOnTheSameConnection) {
  auto local = serveEcho("echo");
  ASSERT_TRUE(local);
  auto remote = ports_.createRemotePort("echo");
  ASSERT_TRUE(remote);
  std::optional<Bytes> reply;
  EXPECT_EQ(remote->sendRequest(7, bytes("hello"), 1.0, 1.0, &reply), kPortSuccess);
  ASSERT_TRUE(reply);
  EXPECT_EQ(text(*reply), "re:hello");
  ASSERT_EQ(received_.size(), 1u);
  EXPECT_EQ(received_.copy()[0].first, 7);
  EXPECT_EQ(text(received_.copy()[0].second), "hello");
  invalidateOnServer(local);
}

TEST_F(SocketMessagePortTest, MessageIdsAndDataArriveUnchangedAndInOrder) {
  auto local = serveEcho("ids");
  auto remote = ports_.createRemotePort("ids");
  ASSERT_TRUE(local && remote);
  const std::vector<MessageId> ids = {0, 1, -5, 123456, 0x7fffffff};
  for (MessageId id : ids) {
    EXPECT_EQ(remote->sendRequest(id, bytes("m" + std::to_string(id)), 1.0, 0.0, nullptr), kPortSuccess);
  }
  ASSERT_TRUE(eventually([&] { return received_.size() == ids.size(); }));
  const auto messages = received_.copy();
  for (std::size_t i = 0; i < ids.size(); ++i) {
    EXPECT_EQ(messages[i].first, ids[i]);
    EXPECT_EQ(text(messages[i].second), "m" + std::to_string(ids[i]));
  }
  invalidateOnServer(local);
}

TEST_F(SocketMessagePortTest, EmptyMessageAndMessagesLargerThanADatagramRoundTrip) {
  auto local = serveEcho("large");
  auto remote = ports_.createRemotePort("large");
  ASSERT_TRUE(local && remote);
  std::optional<Bytes> reply;
  EXPECT_EQ(remote->sendRequest(0, {}, 1.0, 1.0, &reply), kPortSuccess);
  ASSERT_TRUE(reply);
  EXPECT_EQ(text(*reply), "re:");

  std::string big(300 * 1024, '\0');
  for (std::size_t i = 0; i < big.size(); ++i) big[i] = static_cast<char>('a' + i % 26);
  EXPECT_EQ(remote->sendRequest(3, bytes(big), 1.0, 1.0, &reply), kPortSuccess);
  ASSERT_TRUE(reply);
  EXPECT_EQ(text(*reply), "re:" + big);
  invalidateOnServer(local);
}

TEST_F(SocketMessagePortTest, CallbackWithoutAnswerGivesSuccessAndNoReplyData) {
  std::shared_ptr<SocketLocalPort> local;
  server_.run([&](VirtualRunLoop& loop) {
    local = ports_.createSocketLocalPort("silent", [](LocalMessagePort&, MessageId, const Bytes&) {
      return std::optional<Bytes>();
    });
    local->scheduleOn(loop);
  });
  auto remote = ports_.createRemotePort("silent");
  ASSERT_TRUE(remote);
  std::optional<Bytes> reply = bytes("stale");
  EXPECT_EQ(remote->sendRequest(0, bytes("x"), 1.0, 1.0, &reply), kPortSuccess);
  EXPECT_FALSE(reply);
  invalidateOnServer(local);
}

TEST_F(SocketMessagePortTest, RemotePortToAMissingNameCannotBeMade) {
  EXPECT_EQ(ports_.createRemotePort("nobody-here"), nullptr);
  std::string error;
  EXPECT_EQ(ports_.createSocketRemotePort("nobody-here", &error), nullptr);
  EXPECT_NE(error.find("not reachable"), std::string::npos) << error;
}

TEST_F(SocketMessagePortTest, SendToAPortWhoseListenerHasGoneFails) {
  auto local = serveEcho("gone");
  auto remote = ports_.createRemotePort("gone");
  ASSERT_TRUE(local && remote);
  invalidateOnServer(local);
  std::optional<Bytes> reply;
  EXPECT_EQ(remote->sendRequest(0, bytes("anyone?"), 1.0, 1.0, &reply), kPortIsInvalid);
  EXPECT_FALSE(reply);
  EXPECT_EQ(remote->sendRequest(0, bytes("still?"), 1.0, 0.0, nullptr), kPortIsInvalid);
  EXPECT_EQ(ports_.createRemotePort("gone"), nullptr);
}

TEST_F(SocketMessagePortTest, ReceiveTimeoutIsReportedAfterAboutTheTimeout) {
  // Never scheduled: the kernel takes the connection and the request, but
  // nobody reads them, so no reply can come.
  auto local = ports_.createSocketLocalPort("deaf", nullptr);
  auto remote = ports_.createRemotePort("deaf");
  ASSERT_TRUE(local && remote);
  std::optional<Bytes> reply;
  const auto start = Clock::now();
  EXPECT_EQ(remote->sendRequest(0, bytes("hello"), 1.0, 0.2, &reply), kPortReceiveTimeout);
  const auto waited = Clock::now() - start;
  EXPECT_GE(waited, 190ms);
  EXPECT_LT(waited, 600ms);
  EXPECT_FALSE(reply);
  EXPECT_TRUE(remote->isValid());
}

TEST_F(SocketMessagePortTest, SendTimeoutIsReportedWhenTheReceiverStopsReading) {
  auto local = ports_.createSocketLocalPort("full", nullptr);
  auto remote = ports_.createRemotePort("full");
  ASSERT_TRUE(local && remote);
  const Bytes chunk(32 * 1024, 0x55);
  std::int32_t status = kPortSuccess;
  for (int i = 0; i < 1000 && status == kPortSuccess; ++i) status = remote->sendRequest(0, chunk, 0.05, 0.0, nullptr);
  EXPECT_EQ(status, kPortSendTimeout);
}

TEST_F(SocketMessagePortTest, LateReplyToATimedOutRequestIsNotTakenForTheNextReply) {
  std::shared_ptr<SocketLocalPort> local;
  server_.run([&](VirtualRunLoop& loop) {
    local = ports_.createSocketLocalPort("slow", [](LocalMessagePort&, MessageId, const Bytes& data) {
      if (text(data) == "slow") std::this_thread::sleep_for(300ms);
      return std::optional<Bytes>(bytes("answer to " + text(data)));
    });
    local->scheduleOn(loop);
  });
  auto remote = ports_.createRemotePort("slow");
  ASSERT_TRUE(remote);
  std::optional<Bytes> reply;
  EXPECT_EQ(remote->sendRequest(0, bytes("slow"), 1.0, 0.1, &reply), kPortReceiveTimeout);
  EXPECT_EQ(remote->sendRequest(0, bytes("quick"), 1.0, 1.0, &reply), kPortSuccess);
  ASSERT_TRUE(reply);
  EXPECT_EQ(text(*reply), "answer to quick");
  invalidateOnServer(local);
}

TEST_F(SocketMessagePortTest, RemotePortNoticesItsPeerHasGoneWithoutSendingAndRunsItsCallbackOnce) {
  auto local = serveEcho("peer");
  auto remote = ports_.createRemotePort("peer");
  ASSERT_TRUE(local && remote);
  int invalidations = 0;
  MessagePort* seen = nullptr;
  remote->setInvalidationCallback([&](MessagePort& port) {
    ++invalidations;
    seen = &port;
  });
  EXPECT_TRUE(remote->isValid());
  EXPECT_EQ(invalidations, 0);

  invalidateOnServer(local);
  EXPECT_FALSE(remote->isValid());
  EXPECT_EQ(invalidations, 1);
  EXPECT_EQ(seen, remote.get());
  EXPECT_FALSE(remote->isValid());
  remote->invalidate();
  EXPECT_EQ(invalidations, 1);
}

TEST_F(SocketMessagePortTest, RemotePortNoticesAPeerProcessThatDied) {
  const pid_t child = ::fork();
  ASSERT_GE(child, 0);
  if (child == 0) {
    // The child serves the port and dies without any clean-up.
    SocketPortSystem childPorts(runtime_.result().path);
    auto port = childPorts.createSocketLocalPort("process", nullptr);
    for (int i = 0; i < 200 && port; ++i) {
      port->acceptPending();
      std::this_thread::sleep_for(5ms);
    }
    ::_exit(0);
  }
  std::shared_ptr<RemoteMessagePort> remote;
  ASSERT_TRUE(eventually([&] { return (remote = ports_.createRemotePort("process")) != nullptr; }));
  int invalidations = 0;
  remote->setInvalidationCallback([&](MessagePort&) { ++invalidations; });
  EXPECT_TRUE(remote->isValid());
  ::kill(child, SIGKILL);
  int status = 0;
  ::waitpid(child, &status, 0);
  EXPECT_FALSE(remote->isValid());
  EXPECT_EQ(invalidations, 1);
}

TEST_F(SocketMessagePortTest, ClearedInvalidationCallbackIsNotRun) {
  auto local = serveEcho("cleared");
  auto remote = ports_.createRemotePort("cleared");
  ASSERT_TRUE(local && remote);
  int invalidations = 0;
  remote->setInvalidationCallback([&](MessagePort&) { ++invalidations; });
  remote->setInvalidationCallback(nullptr);
  invalidateOnServer(local);
  EXPECT_FALSE(remote->isValid());
  remote->invalidate();
  EXPECT_EQ(invalidations, 0);
}

TEST_F(SocketMessagePortTest, InvalidatingALocalPortRunsItsCallbackOnceAndRemovesItsSocketFile) {
  auto local = ports_.createLocalPort("local", nullptr);
  ASSERT_TRUE(local);
  const auto file = ports_.socketPath("local");
  EXPECT_TRUE(std::filesystem::exists(file));
  int invalidations = 0;
  local->setInvalidationCallback([&](MessagePort&) { ++invalidations; });
  EXPECT_TRUE(local->isValid());
  local->invalidate();
  local->invalidate();
  EXPECT_FALSE(local->isValid());
  EXPECT_EQ(invalidations, 1);
  EXPECT_FALSE(std::filesystem::exists(file));

  auto quiet = ports_.createLocalPort("quiet", nullptr);
  quiet->setInvalidationCallback([&](MessagePort&) { ++invalidations; });
  quiet->setInvalidationCallback(nullptr);
  quiet->invalidate();
  EXPECT_EQ(invalidations, 1);
}

TEST_F(SocketMessagePortTest, LocalPortNameServedByALiveSocketIsRefused) {
  auto first = ports_.createSocketLocalPort("unique", nullptr);
  ASSERT_TRUE(first);
  std::string error;
  EXPECT_EQ(ports_.createSocketLocalPort("unique", nullptr, &error), nullptr);
  EXPECT_EQ(error, "port \"unique\" is already served at " + ports_.socketPath("unique").string());
  EXPECT_TRUE(first->isValid());
  EXPECT_TRUE(std::filesystem::exists(ports_.socketPath("unique")));
}

TEST_F(SocketMessagePortTest, StaleSocketFileIsReplaced) {
  // A socket file left behind by a process that died: bound, never unlinked.
  const std::string path = ports_.socketPath("stale").string();
  ASSERT_TRUE(test::leaveStaleSocket(path));
  ASSERT_TRUE(std::filesystem::exists(path));
  EXPECT_EQ(ports_.createRemotePort("stale"), nullptr);

  auto local = serveEcho("stale");
  ASSERT_TRUE(local);
  auto remote = ports_.createRemotePort("stale");
  ASSERT_TRUE(remote);
  std::optional<Bytes> reply;
  EXPECT_EQ(remote->sendRequest(0, bytes("hi"), 1.0, 1.0, &reply), kPortSuccess);
  invalidateOnServer(local);
}

TEST_F(SocketMessagePortTest, BadPortNamesAreRefused) {
  EXPECT_FALSE(SocketPortSystem::isValidPortName(""));
  EXPECT_FALSE(SocketPortSystem::isValidPortName("a/b"));
  EXPECT_FALSE(SocketPortSystem::isValidPortName(".hidden"));
  EXPECT_FALSE(SocketPortSystem::isValidPortName("with space"));
  EXPECT_FALSE(SocketPortSystem::isValidPortName(std::string(81, 'x')));
  EXPECT_TRUE(SocketPortSystem::isValidPortName("CorvaneApp.{6f1c2a3b-0000-4000-8000-0123456789ab}"));
  EXPECT_TRUE(SocketPortSystem::isValidPortName("CorvaneApp.6f1c2a3b-0000-4000-8000-0123456789ab"));
  EXPECT_EQ(ports_.createLocalPort("../escape", nullptr), nullptr);
  EXPECT_EQ(ports_.createRemotePort("../escape"), nullptr);
}

TEST_F(SocketMessagePortTest, BatchedMessagesAllArriveInOrder) {
  auto local = serveEcho("batch");
  auto remote = ports_.createSocketRemotePort("batch");
  ASSERT_TRUE(local && remote);
  std::vector<Bytes> payloads;
  for (int i = 0; i < 5000; ++i) payloads.push_back(bytes("packet " + std::to_string(i)));
  std::vector<SocketRemotePort::OutgoingMessage> messages;
  for (const auto& p : payloads) messages.push_back({0, p});
  std::size_t sent = 0;
  const auto giveUp = Clock::now() + 5s;
  while (sent < messages.size() && Clock::now() < giveUp) {
    std::int32_t status = kPortSuccess;
    sent += remote->sendWithoutWaiting(std::span(messages).subspan(sent), status);
    ASSERT_EQ(status, kPortSuccess);
    if (sent < messages.size()) std::this_thread::sleep_for(1ms);
  }
  ASSERT_EQ(sent, messages.size());
  ASSERT_TRUE(eventually([&] { return received_.size() == messages.size(); }));
  const auto all = received_.copy();
  for (std::size_t i = 0; i < all.size(); ++i) ASSERT_EQ(text(all[i].second), "packet " + std::to_string(i));
  invalidateOnServer(local);
}

TEST_F(SocketMessagePortTest, LocalPortReportsConnectionsOpeningAndClosing) {
  std::shared_ptr<SocketLocalPort> local;
  std::vector<std::size_t> counts;  // written on the server thread, read after run()
  server_.run([&](VirtualRunLoop& loop) {
    local = ports_.createSocketLocalPort("counted", nullptr);
    local->setConnectionCallback([&](SocketLocalPort&, std::size_t open) { counts.push_back(open); });
    local->scheduleOn(loop);
  });
  auto remote = ports_.createRemotePort("counted");
  ASSERT_TRUE(remote);
  ASSERT_TRUE(eventually([&] {
    std::size_t open = 0;
    server_.run([&] { open = local->openConnections(); });
    return open == 1;
  }));
  remote->invalidate();
  ASSERT_TRUE(eventually([&] {
    std::size_t open = 1;
    server_.run([&] { open = local->openConnections(); });
    return open == 0;
  }));
  server_.run([&] { EXPECT_EQ(counts, (std::vector<std::size_t>{1, 0})); });
  invalidateOnServer(local);
}

}  // namespace
}  // namespace corvane
