#include "platform/SocketMessagePort.h"

#include <gtest/gtest.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <string>
#include <thread>

#include "PortServerThread.h"
#include "RawPeer.h"
#include "RuntimeTestDirectory.h"
#include "platform/Log.h"
#include "platform/SignalEvents.h"

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

std::size_t linesContaining(const log::CapturingSink& sink, std::string_view part) {
  const auto texts = sink.texts();
  return static_cast<std::size_t>(
      std::count_if(texts.begin(), texts.end(), [&](const std::string& t) { return t.find(part) != t.npos; }));
}

mode_t socketFileMode(const std::filesystem::path& path) {
  struct stat info {};
  EXPECT_EQ(::lstat(path.c_str(), &info), 0);
  EXPECT_TRUE(S_ISSOCK(info.st_mode));
  return info.st_mode & 07777;
}

TEST_F(SocketMessagePortTest, SocketFilesAreMadeWithMode0600WhateverTheUmask) {
  for (const mode_t mask : {mode_t{0}, mode_t{022}, mode_t{0277}}) {
    const mode_t previous = ::umask(mask);
    const std::string name = "private-" + std::to_string(mask);
    auto port = ports_.createLocalPort(name, nullptr);
    // A stale file of the same name is replaced by one of the same mode.
    ASSERT_TRUE(test::leaveStaleSocket(ports_.socketPath(name + "-replaced").string()));
    auto replacing = ports_.createLocalPort(name + "-replaced", nullptr);
    ::umask(previous);
    ASSERT_TRUE(port && replacing);
    EXPECT_EQ(socketFileMode(ports_.socketPath(name)), 0600u) << "umask " << mask;
    EXPECT_EQ(socketFileMode(ports_.socketPath(name + "-replaced")), 0600u) << "umask " << mask;
    // And the port can be reached.
    EXPECT_TRUE(ports_.createRemotePort(name));
  }
}

TEST_F(SocketMessagePortTest, StaleSocketFilesAreRemovedAndLiveOnesOtherFilesAndLinksAreLeftAlone) {
  const auto directory = std::filesystem::path(runtime_.path());
  ASSERT_TRUE(test::leaveStaleSocket((directory / "corvane-telephonyd.channel.dead.sock").string()));
  ASSERT_TRUE(test::leaveStaleSocket((directory / "CorvaneApp.dead.sock").string()));
  auto live = ports_.createLocalPort("corvane-telephonyd.channel.live", nullptr);
  ASSERT_TRUE(live);
  std::ofstream(directory / "notes.sock") << "not a socket";
  test::TemporaryDirectory elsewhere;
  const std::string outside = elsewhere.path() + "/outside.sock";
  ASSERT_TRUE(test::leaveStaleSocket(outside));
  std::filesystem::create_symlink(outside, directory / "link.sock");

  EXPECT_EQ(ports_.removeStaleSocketFiles(),
            (std::vector<std::string>{"CorvaneApp.dead.sock", "corvane-telephonyd.channel.dead.sock"}));
  std::vector<std::string> left;
  for (const auto& entry : std::filesystem::directory_iterator(directory)) {
    left.push_back(entry.path().filename().string());
  }
  std::sort(left.begin(), left.end());
  EXPECT_EQ(left, (std::vector<std::string>{"corvane-telephonyd.channel.live.sock", "link.sock", "notes.sock"}));
  EXPECT_TRUE(std::filesystem::exists(outside));
  EXPECT_TRUE(ports_.createRemotePort("corvane-telephonyd.channel.live"));
  EXPECT_TRUE(ports_.removeStaleSocketFiles().empty());
}

TEST_F(SocketMessagePortTest, ConnectionsBeyondTheLimitAreRefusedWithOneLineAndTheOthersAreServed) {
  log::ScopedCapture capture;
  SocketPortSystem limited(runtime_.result().path, {.connections = 2});
  std::shared_ptr<SocketLocalPort> local;
  server_.run([&](VirtualRunLoop& loop) {
    local = limited.createSocketLocalPort("limited", [](LocalMessagePort&, MessageId, const Bytes& data) {
      return std::optional<Bytes>(bytes("re:" + text(data)));
    });
    local->scheduleOn(loop);
  });
  auto first = ports_.createRemotePort("limited");
  auto second = ports_.createRemotePort("limited");
  ASSERT_TRUE(first && second);
  std::optional<Bytes> reply;
  ASSERT_EQ(first->sendRequest(0, bytes("1"), 1.0, 1.0, &reply), kPortSuccess);
  ASSERT_EQ(second->sendRequest(0, bytes("2"), 1.0, 1.0, &reply), kPortSuccess);
  for (int i = 0; i < 3; ++i) {
    // The kernel takes the connection; the port closes it unread.
    auto refused = ports_.createRemotePort("limited");
    ASSERT_TRUE(refused);
    EXPECT_EQ(refused->sendRequest(0, bytes("3"), 1.0, 1.0, &reply), kPortIsInvalid);
  }
  EXPECT_EQ(limited.shared().openConnections(), 2u);
  EXPECT_EQ(capture.sink().count("Port limited refuses new connections: 2 are open, the most its process takes; "
                                 "refusing quietly until one closes"),
            1u);
  ASSERT_EQ(first->sendRequest(0, bytes("still"), 1.0, 1.0, &reply), kPortSuccess);
  EXPECT_EQ(text(*reply), "re:still");

  // When one closes there is room again.
  first->invalidate();
  ASSERT_TRUE(eventually([&] { return limited.shared().openConnections() == 1; }));
  auto next = ports_.createRemotePort("limited");
  ASSERT_TRUE(next);
  ASSERT_EQ(next->sendRequest(0, bytes("next"), 1.0, 1.0, &reply), kPortSuccess);
  EXPECT_EQ(text(*reply), "re:next");
  invalidateOnServer(local);
  EXPECT_EQ(limited.shared().openConnections(), 0u);
}

TEST_F(SocketMessagePortTest, UnfinishedMessagesBeyondTheLimitDropTheirConnectionsWithOneLineAndTheOthersAreServed) {
  log::ScopedCapture capture;
  constexpr std::size_t kLimit = 256 * 1024;
  SocketPortSystem limited(runtime_.result().path, {.connections = 16, .unfinishedMessageBytes = kLimit});
  std::shared_ptr<SocketLocalPort> local;
  server_.run([&](VirtualRunLoop& loop) {
    local = limited.createSocketLocalPort("assembling", [](LocalMessagePort&, MessageId, const Bytes& data) {
      return std::optional<Bytes>(bytes("got " + std::to_string(data.size())));
    });
    local->scheduleOn(loop);
  });
  const Bytes part(40 * 1024, 0x41);
  const std::string refusal = "Port assembling dropped a connection: its unfinished message would take the memory "
                              "held for unfinished messages past 262144 bytes; dropping such connections quietly "
                              "until none is held";
  // Eight peers start a message of three parts of 40 KB and stop there.
  std::vector<std::unique_ptr<test::RawPeer>> peers;
  for (std::uint32_t serial = 1; serial <= 8; ++serial) {
    auto peer = std::make_unique<test::RawPeer>(limited.socketPath("assembling"));
    ASSERT_TRUE(peer->connected());
    for (int i = 0; i < 3; ++i) peer->send(test::frame(test::kRequestFrame, test::kMoreFollows, 9, serial, part));
    peers.push_back(std::move(peer));
  }
  ASSERT_TRUE(eventually([&] { return linesContaining(capture.sink(), "unfinished message") == 1; }));
  std::vector<test::RawPeer*> dropped;
  std::vector<std::pair<test::RawPeer*, std::uint32_t>> kept;
  for (std::uint32_t serial = 1; serial <= 8; ++serial) {
    test::RawPeer* peer = peers[serial - 1].get();
    if (peer->closedByThePort(100ms)) {
      dropped.push_back(peer);
    } else {
      kept.emplace_back(peer, serial);
    }
  }
  EXPECT_LE(limited.shared().unfinishedMessageBytes(), kLimit);
  EXPECT_GE(kept.size(), 1u);
  EXPECT_GE(dropped.size(), 5u);
  EXPECT_EQ(capture.sink().count(refusal), 1u);
  // The peers kept are served: their messages finish and are answered.
  for (auto [peer, serial] : kept) {
    ASSERT_TRUE(peer->send(test::frame(test::kRequestFrame, 0, 9, serial, bytes("end"))));
    EXPECT_EQ(peer->reply(), bytes("got " + std::to_string(3 * part.size() + 3)));
  }
  ASSERT_TRUE(eventually([&] { return limited.shared().unfinishedMessageBytes() == 0; }));

  // With nothing held, the next wave of refusals is reported again, once.
  std::vector<std::unique_ptr<test::RawPeer>> wave;
  for (std::uint32_t serial = 1; serial <= 8; ++serial) {
    wave.push_back(std::make_unique<test::RawPeer>(limited.socketPath("assembling")));
    for (int i = 0; i < 3; ++i) {
      wave.back()->send(test::frame(test::kRequestFrame, test::kMoreFollows, 9, serial, part));
    }
  }
  ASSERT_TRUE(eventually([&] { return capture.sink().count(refusal) == 2; }));
  wave.clear();
  peers.clear();
  ASSERT_TRUE(eventually([&] { return limited.shared().openConnections() == 0; }));
  EXPECT_EQ(limited.shared().unfinishedMessageBytes(), 0u);
  EXPECT_EQ(capture.sink().count(refusal), 2u);
  invalidateOnServer(local);
}

TEST_F(SocketMessagePortTest, AWaitForAReplyEndsWhenTheInterruptDescriptorBecomesReadable) {
  int signalled[2];
  ASSERT_EQ(::pipe(signalled), 0);
  ports_.interruptWaitsWhenReadable(signalled[0]);
  auto local = ports_.createSocketLocalPort("never-answers", nullptr);  // never scheduled: nobody reads
  auto remote = ports_.createRemotePort("never-answers");
  ASSERT_TRUE(local && remote);
  std::thread signaller([&] {
    std::this_thread::sleep_for(100ms);
    const char byte = 1;
    EXPECT_EQ(::write(signalled[1], &byte, 1), 1);
  });
  std::optional<Bytes> reply;
  const auto start = Clock::now();
  EXPECT_EQ(remote->sendRequest(0, bytes("hello"), 5.0, 5.0, &reply), kPortReceiveTimeout);
  const auto waited = Clock::now() - start;
  signaller.join();
  EXPECT_GE(waited, 90ms);
  EXPECT_LT(waited, 1s);
  // While it stays readable, no wait starts at all.
  const auto again = Clock::now();
  EXPECT_EQ(remote->sendRequest(0, bytes("hello"), 5.0, 5.0, &reply), kPortReceiveTimeout);
  EXPECT_LT(Clock::now() - again, 100ms);
  ports_.interruptWaitsWhenReadable(-1);
  ::close(signalled[0]);
  ::close(signalled[1]);
}

TEST_F(SocketMessagePortTest, ATerminationSignalEndsAWaitForBufferSpace) {
  VirtualRunLoop loop;
  std::vector<int> received;
  std::string error;
  const auto events = SignalEvents::watch(loop, {SIGUSR2}, [&](int signal) { received.push_back(signal); }, error);
  ASSERT_TRUE(events) << error;
  ports_.interruptWaitsWhenReadable(events->pendingDescriptor());
  auto local = ports_.createSocketLocalPort("stops-reading", nullptr);
  auto remote = ports_.createRemotePort("stops-reading");
  ASSERT_TRUE(local && remote);
  const Bytes chunk(32 * 1024, 0x55);
  while (remote->sendRequest(0, chunk, 0.0, 0.0, nullptr) == kPortSuccess) {
  }
  std::thread signaller([] {
    std::this_thread::sleep_for(100ms);
    ::kill(::getpid(), SIGUSR2);
  });
  const auto start = Clock::now();
  EXPECT_EQ(remote->sendRequest(0, chunk, 5.0, 0.0, nullptr), kPortSendTimeout);
  const auto waited = Clock::now() - start;
  signaller.join();
  EXPECT_GE(waited, 90ms);
  EXPECT_LT(waited, 1s);
  // The signal is still the loop's to handle.
  loop.pollWatches();
  EXPECT_EQ(received, std::vector<int>{SIGUSR2});
  ports_.interruptWaitsWhenReadable(-1);
}

TEST_F(SocketMessagePortTest, AfterStopWaitingNothingWaitsButWhatTheSocketTakesAtOnceStillGoes) {
  std::vector<std::string> arrived;
  auto local = ports_.createSocketLocalPort("stopping", [&](LocalMessagePort&, MessageId, const Bytes& data) {
    arrived.push_back(text(data));
    return std::optional<Bytes>(bytes("too late"));
  });
  auto remote = ports_.createRemotePort("stopping");
  ASSERT_TRUE(local && remote);
  ports_.stopWaiting();
  // The request goes at once; its reply, which nobody is there to make yet, is not waited for.
  std::optional<Bytes> reply;
  auto start = Clock::now();
  EXPECT_EQ(remote->sendRequest(1, bytes("last words"), 1.0, 1.0, &reply), kPortReceiveTimeout);
  EXPECT_LT(Clock::now() - start, 100ms);
  VirtualRunLoop loop;
  local->scheduleOn(loop);
  ASSERT_TRUE(eventually([&] {
    loop.pollWatches();
    return !arrived.empty();
  }));
  EXPECT_EQ(arrived, std::vector<std::string>{"last words"});

  // Nor does a new connection wait for a listener that is behind on its backlog.
  const int listener = ::socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0);
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::strncpy(address.sun_path, ports_.socketPath("behind").c_str(), sizeof address.sun_path - 1);
  ASSERT_EQ(::bind(listener, reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
  ASSERT_EQ(::listen(listener, 0), 0);
  test::RawPeer waiting(ports_.socketPath("behind"));  // fills the backlog of one
  ASSERT_TRUE(waiting.connected());
  start = Clock::now();
  std::string error;
  EXPECT_EQ(ports_.createSocketRemotePort("behind", &error), nullptr);
  EXPECT_LT(Clock::now() - start, 100ms);
  EXPECT_EQ(error, "port \"behind\" is not reachable: " + std::string(std::strerror(EAGAIN)));
  ::close(listener);
  local->invalidate();
}

}  // namespace
}  // namespace corvane
