// corvane-telephonyd as a process, talked to through the real client library
// in a runtime directory of the test's own.

#include <gtest/gtest.h>
#include <signal.h>
#include <spawn.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstring>
#include <filesystem>
#include <thread>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "platform/PropertyList.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"
#include "platform/VirtualRunLoop.h"
#include "support/Process.h"
#include "transport/RuntimeTestDirectory.h"

extern char** environ;

namespace corvane {
namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

const std::string kDaemon = CORVANE_TELEPHONYD_BINARY;

Bytes command(std::initializer_list<std::pair<const char*, const char*>> entries) {
  Dictionary fields;
  for (const auto& [key, value] : entries) fields.set(key, Value(value));
  return plist::serializeOrThrow(Value(fields), plist::Format::XML);
}

// The daemon's socket files in the runtime directory.
std::vector<std::string> serviceSockets(const std::string& directory) {
  std::vector<std::string> names;
  for (const auto& entry : std::filesystem::directory_iterator(directory)) {
    const std::string name = entry.path().filename().string();
    if (name.rfind("corvane-telephonyd", 0) == 0) names.push_back(name);
  }
  return names;
}

class Daemon {
 public:
  Daemon(const SocketPortSystem& ports, std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), kDaemon);
    std::vector<char*> argv;
    for (auto& a : arguments) argv.push_back(a.data());
    argv.push_back(nullptr);
    // The environment carries the test's CORVANE_RUNTIME_DIR.
    if (::posix_spawn(&pid_, kDaemon.c_str(), nullptr, nullptr, argv.data(), environ) != 0) pid_ = -1;
    const auto giveUp = Clock::now() + 5s;
    SocketPortSystem probe(ports.directory());
    while (pid_ > 0 && Clock::now() < giveUp && !probe.createRemotePort(std::string(kTelephonyServicePortName))) {
      std::this_thread::sleep_for(2ms);
    }
  }
  ~Daemon() {
    if (running()) {
      ::kill(pid_, SIGKILL);
      ::waitpid(pid_, nullptr, 0);
    }
  }
  Daemon(const Daemon&) = delete;
  Daemon& operator=(const Daemon&) = delete;

  bool running() {
    if (pid_ <= 0 || exited_) return false;
    int status = 0;
    if (::waitpid(pid_, &status, WNOHANG) == pid_) {
      exited_ = true;
      status_ = status;
      return false;
    }
    return true;
  }

  // Sends the signal and returns the exit status, or -1 when it does not end within 3 s.
  int stop(int signal) {
    ::kill(pid_, signal);
    const auto giveUp = Clock::now() + 3s;
    while (running() && Clock::now() < giveUp) std::this_thread::sleep_for(2ms);
    if (!exited_) return -1;
    return WIFEXITED(status_) ? WEXITSTATUS(status_) : 128 + WTERMSIG(status_);
  }

 private:
  pid_t pid_ = -1;
  bool exited_ = false;
  int status_ = 0;
};

// What the application does: a local port for the packets, a log channel, a
// remote port for the commands. Its run loop is pumped by the test.
class Client {
 public:
  Client(SocketPortSystem& ports, VirtualRunLoop& loop) : ports_(ports), loop_(loop) {
    static int counter = 0;
    localName_ = "CorvaneApp.test-" + std::to_string(::getpid()) + "-" + std::to_string(++counter);
    local_ = ports.createLocalPort(localName_, [this](LocalMessagePort&, MessageId id, const Bytes& data) {
      ids.push_back(id);
      last = data;
      return std::optional<Bytes>();
    });
    if (!local_) return;
    local_->scheduleOn(loop);
    SocketTelephonyClient telephony(ports);
    auto connection = telephony.TelephonyServerConnectionCreate(nullptr);
    if (!connection) return;
    std::string remoteName;
    if (connection->NetworkMonitorCreateLogChannel(localName_, remoteName).code != 0) return;
    remoteName_ = remoteName;
    remote_ = ports.createRemotePort(remoteName);
  }

  bool connected() const { return local_ && remote_; }
  RemoteMessagePort& remote() { return *remote_; }
  LocalMessagePort& local() { return *local_; }
  const std::string& commandPortName() const { return remoteName_; }

  std::optional<std::string> technology() {
    std::optional<Bytes> reply;
    if (remote_->sendRequest(0, command({{"GetTechnology", "GetTechnology"}}), 1.0, 1.0, &reply) != kPortSuccess ||
        !reply) {
      return std::nullopt;
    }
    const auto parsed = plist::parse(*reply);
    if (!parsed || !parsed->asDictionary()) return std::nullopt;
    const Value* answer = parsed->asDictionary()->find("GetTechnology");
    return answer && answer->asString() ? std::optional<std::string>(*answer->asString()) : std::nullopt;
  }

  std::int32_t start() { return remote_->sendRequest(0, command({{"SetState", "Streaming"}}), 1.0, 0.0, nullptr); }

  std::vector<MessageId> ids;
  Bytes last;

 private:
  SocketPortSystem& ports_;
  VirtualRunLoop& loop_;
  std::string localName_;
  std::string remoteName_;
  std::shared_ptr<LocalMessagePort> local_;
  std::shared_ptr<RemoteMessagePort> remote_;
};

class DaemonTest : public ::testing::Test {
 protected:
  void SetUp() override { ASSERT_TRUE(runtime.result().ok()) << runtime.result().error; }

  // Lets the clients' ports read what has arrived until the condition holds.
  template <typename Condition>
  bool pumpUntil(Condition condition, std::chrono::milliseconds limit = 3000ms) {
    const auto giveUp = Clock::now() + limit;
    for (;;) {
      loop.pollWatches();
      if (condition()) return true;
      if (Clock::now() > giveUp) return false;
      std::this_thread::sleep_for(1ms);
    }
  }
  void pumpFor(std::chrono::milliseconds duration) {
    pumpUntil([] { return false; }, duration);
  }

  test::RuntimeTestDirectory runtime;
  SocketPortSystem ports{runtime.result().path};
  VirtualRunLoop loop;
};

TEST_F(DaemonTest, GetTechnologyIsAnsweredWithTheSimulatedTechnology) {
  Daemon daemon(ports, {});
  Client client(ports, loop);
  ASSERT_TRUE(client.connected());
  EXPECT_EQ(client.technology(), "IFX");
  EXPECT_TRUE(client.ids.empty());
}

TEST_F(DaemonTest, NothingIsStreamedBeforeTheStartCommand) {
  Daemon daemon(ports, {"--rate", "1000"});
  Client client(ports, loop);
  ASSERT_TRUE(client.connected());
  pumpFor(100ms);
  EXPECT_TRUE(client.ids.empty());
}

TEST_F(DaemonTest, StartCommandStreamsDecodablePacketsWithMessageIdZero) {
  Daemon daemon(ports, {"--rate", "500"});
  Client client(ports, loop);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.technology(), "IFX");
  ASSERT_EQ(client.start(), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.ids.size() >= 20; }));
  for (MessageId id : client.ids) EXPECT_EQ(id, 0);
  GSMLogGenerator generator;
  Dictionary state;
  generator.updateState(state, client.last);
  const Value display = generator.generateLogUsingState(state);
  ASSERT_TRUE(display.asDictionary());
  EXPECT_TRUE(display.asDictionary()->contains("Serving Cell"));
}

TEST_F(DaemonTest, PacketLimitIsHonouredExactly) {
  Daemon daemon(ports, {"--rate", "max", "--packets", "5000"});
  Client client(ports, loop);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.start(), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.ids.size() >= 5000; }));
  pumpFor(50ms);
  EXPECT_EQ(client.ids.size(), 5000u);
}

TEST_F(DaemonTest, TwoClientsAreServedAtOnce) {
  Daemon daemon(ports, {"--rate", "200"});
  Client first(ports, loop);
  Client second(ports, loop);
  ASSERT_TRUE(first.connected() && second.connected());
  EXPECT_NE(first.commandPortName(), second.commandPortName());
  ASSERT_EQ(first.start(), kPortSuccess);
  ASSERT_EQ(second.start(), kPortSuccess);
  EXPECT_EQ(second.technology(), "IFX");
  ASSERT_TRUE(pumpUntil([&] { return first.ids.size() >= 10 && second.ids.size() >= 10; }));
}

TEST_F(DaemonTest, ClientThatVanishesMidStreamDoesNotStopTheService) {
  Daemon daemon(ports, {"--rate", "max"});
  {
    Client doomed(ports, loop);
    ASSERT_TRUE(doomed.connected());
    ASSERT_EQ(doomed.start(), kPortSuccess);
    ASSERT_TRUE(pumpUntil([&] { return doomed.ids.size() >= 1000; }));
    // Leaves without a word: its sockets simply close, as when a process dies.
  }
  // Its channel goes; only the well-known socket is left.
  ASSERT_TRUE(pumpUntil([&] { return serviceSockets(runtime.path()).size() == 1; }));
  EXPECT_TRUE(daemon.running());

  Client next(ports, loop);
  ASSERT_TRUE(next.connected());
  EXPECT_EQ(next.technology(), "IFX");
  ASSERT_EQ(next.start(), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return next.ids.size() >= 1000; }));
}

TEST_F(DaemonTest, ChannelWhoseLocalPortHasGoneIsClosedAndItsCommandPortBecomesInvalid) {
  Daemon daemon(ports, {"--rate", "200"});
  Client client(ports, loop);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.start(), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return !client.ids.empty(); }));
  client.local().invalidate();
  ASSERT_TRUE(pumpUntil([&] { return !client.remote().isValid(); }));
  EXPECT_TRUE(daemon.running());
}

TEST_F(DaemonTest, SigtermShutsDownCleanlyAndRemovesTheSockets) {
  Daemon daemon(ports, {"--rate", "200"});
  Client client(ports, loop);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.start(), kPortSuccess);
  EXPECT_EQ(serviceSockets(runtime.path()).size(), 2u);
  EXPECT_EQ(daemon.stop(SIGTERM), 0);
  EXPECT_TRUE(serviceSockets(runtime.path()).empty());
  EXPECT_FALSE(client.remote().isValid());
}

TEST_F(DaemonTest, SigintShutsDownCleanlyToo) {
  Daemon daemon(ports, {});
  EXPECT_EQ(daemon.stop(SIGINT), 0);
  EXPECT_TRUE(serviceSockets(runtime.path()).empty());
}

TEST_F(DaemonTest, SecondServiceOnALiveSocketIsRefused) {
  Daemon daemon(ports, {});
  const auto result = test::runProcess({kDaemon});
  EXPECT_EQ(result.exitCode, 1);
  EXPECT_EQ(result.err, "corvane-telephonyd: another corvane-telephonyd is already serving " +
                            ports.socketPath(std::string(kTelephonyServicePortName)).string() + "\n");
  EXPECT_TRUE(daemon.running());
  Client client(ports, loop);
  EXPECT_TRUE(client.connected());
}

TEST_F(DaemonTest, StaleSocketFileIsReplaced) {
  const std::string path = ports.socketPath(std::string(kTelephonyServicePortName)).string();
  ASSERT_TRUE(test::leaveStaleSocket(path));
  Daemon daemon(ports, {});
  EXPECT_TRUE(daemon.running());
  Client client(ports, loop);
  ASSERT_TRUE(client.connected());
  EXPECT_EQ(client.technology(), "IFX");
}

TEST_F(DaemonTest, LogChannelForAnUnusablePortNameIsRefused) {
  Daemon daemon(ports, {});
  SocketTelephonyClient telephony(ports);
  auto connection = telephony.TelephonyServerConnectionCreate(nullptr);
  ASSERT_TRUE(connection);
  std::string remote;
  const TelephonyError error = connection->NetworkMonitorCreateLogChannel("../../etc/x", remote);
  EXPECT_EQ(error.domain, kTelephonyDomainService);
  EXPECT_EQ(error.code, kTelephonyErrorBadPortName);
  EXPECT_TRUE(remote.empty());
}

TEST_F(DaemonTest, BadOptionExitsWithStatus2AndOneLine) {
  const auto result = test::runProcess({kDaemon, "--bogus"});
  EXPECT_EQ(result.exitCode, 2);
  EXPECT_EQ(result.err, "corvane-telephonyd: unknown option '--bogus' (see --help)\n");
  EXPECT_TRUE(serviceSockets(runtime.path()).empty());
}

TEST_F(DaemonTest, TechnologyWithoutAScenarioIsAClearError) {
  const auto result = test::runProcess({kDaemon, "--technology", "Quendra_CDMA"});
  EXPECT_EQ(result.exitCode, 1);
  EXPECT_EQ(result.err, "corvane-telephonyd: no simulator scenario for technology Quendra_CDMA yet\n");
}

TEST_F(DaemonTest, UnusableRuntimeDirectoryExitsWithStatus1AndOneLine) {
  test::TemporaryDirectory temporary;
  const std::string file = temporary.write("not-a-directory", "x");
  const auto result = test::runProcess({kDaemon}, "", {"CORVANE_RUNTIME_DIR=" + file});
  EXPECT_EQ(result.exitCode, 1);
  EXPECT_EQ(result.err, "corvane-telephonyd: runtime directory " + file + " is not a directory\n");
}

}  // namespace
}  // namespace corvane
