// corvane-telephonyd as a process, talked to through the real client library
// in a runtime directory of the test's own.

#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <spawn.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>
#include <thread>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "LogGenerator/LogGenerator.h"
#include "PacketInput.h"
#include "platform/PropertyList.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"
#include "platform/Version.h"
#include "platform/VirtualRunLoop.h"
#include "support/LogRecords.h"
#include "telephonyd/LogRecord.h"
#include "support/FakeBaseband.h"
#include "support/Process.h"
#include "transport/RawPeer.h"
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
  // With `errorFile`, the daemon's standard error goes there.
  Daemon(const SocketPortSystem& ports, std::vector<std::string> arguments, const std::string& errorFile = "") {
    arguments.insert(arguments.begin(), kDaemon);
    std::vector<char*> argv;
    for (auto& a : arguments) argv.push_back(a.data());
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    if (!errorFile.empty()) {
      posix_spawn_file_actions_addopen(&actions, STDERR_FILENO, errorFile.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
    }
    // The environment carries the test's CORVANE_RUNTIME_DIR.
    if (::posix_spawn(&pid_, kDaemon.c_str(), &actions, nullptr, argv.data(), environ) != 0) pid_ = -1;
    posix_spawn_file_actions_destroy(&actions);
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

  pid_t pid() const { return pid_; }

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
      ids_.push_back(id);
      last_ = data;
      if (keepAll_) all_.push_back(data);
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
  std::int32_t start(const Dictionary& fields) {
    return remote_->sendRequest(0, plist::serializeOrThrow(Value(fields), plist::Format::XML), 1.0, 0.0, nullptr);
  }

  std::vector<MessageId> ids_;
  Bytes last_;
  bool keepAll_ = false;
  std::vector<Bytes> all_;

 private:
  SocketPortSystem& ports_;
  VirtualRunLoop& loop_;
  std::string localName_;
  std::string remoteName_;
  std::shared_ptr<LocalMessagePort> local_;
  std::shared_ptr<RemoteMessagePort> remote_;
};

// The first value under the key, searched depth first.
const Value* findKey(const Value& tree, std::string_view key) {
  if (const Dictionary* d = tree.asDictionary()) {
    if (const Value* v = d->find(key)) return v;
    for (const auto& [name, child] : d->entries()) {
      if (const Value* v = findKey(child, key)) return v;
    }
  } else if (const Array* a = tree.asArray()) {
    for (const Value& child : a->elements()) {
      if (const Value* v = findKey(child, key)) return v;
    }
  }
  return nullptr;
}

class DaemonTest : public ::testing::Test {
 protected:
  void SetUp() override { ASSERT_TRUE(runtime_.result().ok()) << runtime_.result().error; }

  // Lets the clients' ports read what has arrived until the condition holds.
  template <typename Condition>
  bool pumpUntil(Condition condition, std::chrono::milliseconds limit = 3000ms) {
    const auto giveUp = Clock::now() + limit;
    for (;;) {
      loop_.pollWatches();
      if (condition()) return true;
      if (Clock::now() > giveUp) return false;
      std::this_thread::sleep_for(1ms);
    }
  }
  void pumpFor(std::chrono::milliseconds duration) {
    pumpUntil([] { return false; }, duration);
  }

  test::RuntimeTestDirectory runtime_;
  SocketPortSystem ports_{runtime_.result().path};
  VirtualRunLoop loop_;
};

TEST_F(DaemonTest, GetTechnologyIsAnsweredWithTheSimulatedTechnology) {
  Daemon daemon(ports_, {});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  EXPECT_EQ(client.technology(), "IFX");
  EXPECT_TRUE(client.ids_.empty());
}

TEST_F(DaemonTest, NothingIsStreamedBeforeTheStartCommand) {
  Daemon daemon(ports_, {"--rate", "1000"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  pumpFor(100ms);
  EXPECT_TRUE(client.ids_.empty());
}

TEST_F(DaemonTest, StartCommandStreamsDecodablePacketsWithMessageIdZero) {
  Daemon daemon(ports_, {"--rate", "500"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.technology(), "IFX");
  ASSERT_EQ(client.start(), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.ids_.size() >= 20; }));
  for (MessageId id : client.ids_) EXPECT_EQ(id, 0);
  GSMLogGenerator generator;
  Dictionary state;
  generator.updateState(state, client.last_);
  const Value display = generator.generateLogUsingState(state);
  ASSERT_TRUE(display.asDictionary());
  EXPECT_TRUE(display.asDictionary()->contains("Serving Cell"));
}

Dictionary logCodeStart(std::initializer_list<std::int64_t> logCodes, std::initializer_list<std::int64_t> extraCodes) {
  auto numbers = [](std::initializer_list<std::int64_t> list) {
    Array array;
    for (auto n : list) array.append(Value::integer(n));
    return Value(array);
  };
  Dictionary fields;
  fields.set("SetState", Value("Streaming"));
  fields.set("SetQuendraLogCodes", numbers(logCodes));
  fields.set("SetTsExtraCodes", numbers(extraCodes));
  return fields;
}

std::uint32_t effectiveCode(const Bytes& packet) {
  const std::uint32_t code = packet.at(3) | packet.at(4) << 8;
  return packet.at(0) == 0xFF ? 0xFF0000 | code : code;
}

TEST_F(DaemonTest, LogCodeTechnologyStreamsOnlyTheCellListsThatTheStartCommandAsksFor) {
  Daemon daemon(ports_, {"--technology", "Quendra_LTE", "--rate", "max", "--packets", "30"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  client.keepAll_ = true;
  ASSERT_EQ(client.technology(), "Quendra_LTE");
  ASSERT_EQ(client.start(logCodeStart({}, {1})), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.all_.size() >= 30; }));
  pumpFor(50ms);
  ASSERT_EQ(client.all_.size(), 30u);
  for (const Bytes& packet : client.all_) {
    ASSERT_GE(packet.size(), 13u);
    EXPECT_EQ(effectiveCode(packet), 0xFF0001u);
    EXPECT_EQ(packet[1] | packet[2] << 8, static_cast<int>(packet.size() - 1));
    const auto cells = plist::parse(std::span(packet).subspan(13));
    ASSERT_TRUE(cells && cells->asArray() && !cells->asArray()->empty());
    const Value& serving = cells->asArray()->at(0);
    EXPECT_EQ(serving.asDictionary()->get("CellMonitorCellRadioAccessTechnology"),
              Value("CellMonitorRadioAccessTechnologyLTE"));
    EXPECT_EQ(serving.asDictionary()->get("CellMonitorCellType"), Value("CellMonitorCellTypeServing"));
  }
}

TEST_F(DaemonTest, LteScenarioStreamsOnlyTheRadioRecordsThatTheStartCommandAsksFor) {
  Daemon daemon(ports_, {"--technology", "Quendra_LTE", "--rate", "max", "--packets", "40"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  client.keepAll_ = true;
  ASSERT_EQ(client.technology(), "Quendra_LTE");
  ASSERT_EQ(client.start(logCodeStart({0xB17F, 0xB186}, {})), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.all_.size() >= 40; }));
  pumpFor(50ms);
  ASSERT_EQ(client.all_.size(), 40u);
  std::set<std::uint32_t> codes;
  for (const Bytes& packet : client.all_) {
    ASSERT_GE(packet.size(), 13u);
    EXPECT_EQ(packet[0], 0x01);
    EXPECT_EQ(packet[1] | packet[2] << 8, static_cast<int>(packet.size() - 1));
    codes.insert(effectiveCode(packet));
  }
  // Serving measurements every 320 ms, reselection candidates every 1280 ms.
  EXPECT_EQ(codes, (std::set<std::uint32_t>{0xB17F, 0xB186}));
}

TEST_F(DaemonTest, StartCommandWithAnotherTechnologysCodesGetsNothingOfThem) {
  Daemon daemon(ports_, {"--technology", "Quendra_UTRAN2", "--rate", "max"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.technology(), "Quendra_UTRAN2");
  // The LTE generator's log codes, without extra codes.
  ASSERT_EQ(client.start(logCodeStart({0xB0C2, 0xB0C1, 0xB179, 0xB17F, 0xB180, 0xB186}, {})), kPortSuccess);
  pumpFor(300ms);
  EXPECT_TRUE(client.ids_.empty());
  EXPECT_TRUE(daemon.running());
}

TEST_F(DaemonTest, LogCodePacketsTravelToTheDecodeToolsReadersAndDecoderUnchanged) {
  Daemon daemon(ports_, {"--technology", "Quendra_GSM", "--rate", "max", "--packets", "40", "--seed", "3",
                        "--clock-start", "1800000000"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  client.keepAll_ = true;
  ASSERT_EQ(client.start(logCodeStart({0x5134, 0x4005}, {0, 1, 2})), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.all_.size() >= 40; }));
  const std::vector<Bytes>& packets = client.all_;
  ASSERT_EQ(packets.size(), 40u);
  // The first period: SIM files, cell list, PDP contexts, at the start of the clock.
  EXPECT_EQ(effectiveCode(packets[0]), 0xFF0000u);
  EXPECT_EQ(effectiveCode(packets[1]), 0xFF0001u);
  EXPECT_EQ(effectiveCode(packets[2]), 0xFF0002u);
  // 1800000000 s since 1970 is 1484035200 s, 1 187 228 160 000 ticks of 1.25 ms, since 1980-01-06.
  EXPECT_EQ(Bytes(packets[0].begin() + 5, packets[0].begin() + 13),
            (Bytes{0x00, 0x00, 0x00, 0x10, 0x50, 0x6C, 0x14, 0x01}));

  tools::InputError error;
  // As hex text, one packet per line.
  std::string hex;
  for (const Bytes& packet : packets) {
    for (std::uint8_t b : packet) {
      hex += "0123456789abcdef"[b >> 4];
      hex += "0123456789abcdef"[b & 15];
    }
    hex += '\n';
  }
  auto fromHex = tools::packetsFromContents(Bytes(hex.begin(), hex.end()), "capture.hex", error);
  ASSERT_TRUE(fromHex) << error.message;
  EXPECT_EQ(fromHex->packets, packets);

  // As a DLF that the application wrote over three display intervals.
  const std::vector<std::vector<Bytes>> intervals = {{packets.begin(), packets.begin() + 7},
                                                     {packets.begin() + 7, packets.begin() + 25},
                                                     {packets.begin() + 25, packets.end()}};
  const Bytes dlf = test::dlfOfIntervals(intervals);
  ASSERT_EQ(tools::detectInputFormat(dlf), tools::InputFormat::Dlf);
  auto fromDlf = tools::packetsFromContents(dlf, "capture.dlf", error);
  ASSERT_TRUE(fromDlf) << error.message;
  EXPECT_EQ(fromDlf->packets, packets);
  EXPECT_TRUE(fromDlf->warnings.empty());

  // As a snapshot of those intervals.
  Array data;
  for (const auto& interval : intervals) {
    Dictionary entry;
    entry.set("DisplayState", Value(test::concatenated(interval)));
    data.append(Value(entry));
  }
  Dictionary dlfEntry;
  dlfEntry.set("DLF", Value(dlf));
  data.append(Value(dlfEntry));
  Dictionary snapshot;
  snapshot.set("Timestamp", Value("2027-01-15 08:00:00 +0000"));
  snapshot.set("Data", Value(data));
  auto fromSnapshot = tools::packetsFromContents(plist::serializeOrThrow(Value(snapshot), plist::Format::XML),
                                                 "CorvaneSnapshot-1800000000.corvane", error);
  ASSERT_TRUE(fromSnapshot) << error.message;
  EXPECT_EQ(fromSnapshot->packets, packets);

  // And the GSM/UMTS generator shows the SIM files they carry.
  auto generator = LogGenerator::generatorFromTechnology("Quendra_GSM");
  ASSERT_TRUE(generator);
  Dictionary state;
  for (const Bytes& packet : fromDlf->packets) generator->updateState(state, packet);
  const Value display = generator->generateLogUsingState(state);
  const Value* simInfo = findKey(display, "SIM Info");
  ASSERT_TRUE(simInfo && simInfo->asDictionary());
  const Value* iccid = simInfo->asDictionary()->find("EF-ICCID");
  ASSERT_TRUE(iccid && iccid->asString());
  EXPECT_EQ(iccid->asString()->substr(0, 7), "8900101");
}

TEST_F(DaemonTest, PacketLimitIsHonouredExactly) {
  Daemon daemon(ports_, {"--rate", "max", "--packets", "5000"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.start(), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.ids_.size() >= 5000; }));
  pumpFor(50ms);
  EXPECT_EQ(client.ids_.size(), 5000u);
}

TEST_F(DaemonTest, TwoClientsAreServedAtOnce) {
  Daemon daemon(ports_, {"--rate", "200"});
  Client first(ports_, loop_);
  Client second(ports_, loop_);
  ASSERT_TRUE(first.connected() && second.connected());
  EXPECT_NE(first.commandPortName(), second.commandPortName());
  ASSERT_EQ(first.start(), kPortSuccess);
  ASSERT_EQ(second.start(), kPortSuccess);
  EXPECT_EQ(second.technology(), "IFX");
  ASSERT_TRUE(pumpUntil([&] { return first.ids_.size() >= 10 && second.ids_.size() >= 10; }));
}

TEST_F(DaemonTest, ClientThatVanishesMidStreamDoesNotStopTheService) {
  Daemon daemon(ports_, {"--rate", "max"});
  {
    Client doomed(ports_, loop_);
    ASSERT_TRUE(doomed.connected());
    ASSERT_EQ(doomed.start(), kPortSuccess);
    ASSERT_TRUE(pumpUntil([&] { return doomed.ids_.size() >= 1000; }));
    // Leaves without a word: its sockets simply close, as when a process dies.
  }
  // Its channel goes; only the well-known socket is left.
  ASSERT_TRUE(pumpUntil([&] { return serviceSockets(runtime_.path()).size() == 1; }));
  EXPECT_TRUE(daemon.running());

  Client next(ports_, loop_);
  ASSERT_TRUE(next.connected());
  EXPECT_EQ(next.technology(), "IFX");
  ASSERT_EQ(next.start(), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return next.ids_.size() >= 1000; }));
}

TEST_F(DaemonTest, ChannelWhoseLocalPortHasGoneIsClosedAndItsCommandPortBecomesInvalid) {
  Daemon daemon(ports_, {"--rate", "200"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.start(), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return !client.ids_.empty(); }));
  client.local().invalidate();
  ASSERT_TRUE(pumpUntil([&] { return !client.remote().isValid(); }));
  EXPECT_TRUE(daemon.running());
}

TEST_F(DaemonTest, SigtermShutsDownCleanlyAndRemovesTheSockets) {
  Daemon daemon(ports_, {"--rate", "200"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.start(), kPortSuccess);
  EXPECT_EQ(serviceSockets(runtime_.path()).size(), 2u);
  EXPECT_EQ(daemon.stop(SIGTERM), 0);
  EXPECT_TRUE(serviceSockets(runtime_.path()).empty());
  EXPECT_FALSE(client.remote().isValid());
}

TEST_F(DaemonTest, SigintShutsDownCleanlyToo) {
  Daemon daemon(ports_, {});
  EXPECT_EQ(daemon.stop(SIGINT), 0);
  EXPECT_TRUE(serviceSockets(runtime_.path()).empty());
}

TEST_F(DaemonTest, SecondServiceOnALiveSocketIsRefused) {
  Daemon daemon(ports_, {});
  const auto result = test::runProcess({kDaemon});
  EXPECT_EQ(result.exitCode, 1);
  EXPECT_EQ(result.err, "corvane-telephonyd: another corvane-telephonyd is already serving " +
                            ports_.socketPath(std::string(kTelephonyServicePortName)).string() + "\n");
  EXPECT_TRUE(daemon.running());
  Client client(ports_, loop_);
  EXPECT_TRUE(client.connected());
}

TEST_F(DaemonTest, StaleSocketFileIsReplaced) {
  const std::string path = ports_.socketPath(std::string(kTelephonyServicePortName)).string();
  ASSERT_TRUE(test::leaveStaleSocket(path));
  Daemon daemon(ports_, {});
  EXPECT_TRUE(daemon.running());
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  EXPECT_EQ(client.technology(), "IFX");
}

std::vector<std::string> filesIn(const std::string& directory) {
  std::vector<std::string> names;
  for (const auto& entry : std::filesystem::directory_iterator(directory)) {
    names.push_back(entry.path().filename().string());
  }
  std::sort(names.begin(), names.end());
  return names;
}

TEST_F(DaemonTest, SocketFilesLeftByAKilledServiceAreRemovedAtTheNextStartAndLiveOnesAreLeftAlone) {
  {
    Daemon killed(ports_, {});
    Client client(ports_, loop_);
    ASSERT_TRUE(client.connected());
    EXPECT_EQ(killed.stop(SIGKILL), 128 + SIGKILL);
  }
  // The well-known socket and the channel's stay behind.
  ASSERT_EQ(serviceSockets(runtime_.path()).size(), 2u);
  ASSERT_TRUE(test::leaveStaleSocket(runtime_.path() + "/CorvaneApp.killed.sock"));
  // A channel of another instance that still runs, and a file that is no socket.
  auto live = ports_.createLocalPort("corvane-telephonyd.channel.another-instance", nullptr);
  ASSERT_TRUE(live);
  std::ofstream(runtime_.path() + "/notes.sock") << "not a socket";

  Daemon restarted(ports_, {});
  ASSERT_TRUE(restarted.running());
  EXPECT_EQ(filesIn(runtime_.path()), (std::vector<std::string>{"corvane-telephonyd.channel.another-instance.sock",
                                                                 "corvane-telephonyd.sock", "notes.sock"}));
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  EXPECT_EQ(client.technology(), "IFX");
}

mode_t modeOf(const std::string& path) {
  struct stat info {};
  EXPECT_EQ(::lstat(path.c_str(), &info), 0) << path;
  return info.st_mode & 07777;
}

TEST_F(DaemonTest, SocketFilesAreOnlyTheOwnersWhateverTheUmask) {
  for (const mode_t mask : {mode_t{0}, mode_t{022}}) {
    const mode_t previous = ::umask(mask);
    Daemon daemon(ports_, {});
    ::umask(previous);
    Client client(ports_, loop_);
    ASSERT_TRUE(client.connected());
    const auto sockets = serviceSockets(runtime_.path());
    ASSERT_EQ(sockets.size(), 2u);
    for (const auto& name : sockets) EXPECT_EQ(modeOf(runtime_.path() + "/" + name), 0600u) << name << " " << mask;
    EXPECT_EQ(daemon.stop(SIGTERM), 0);
  }
}

// The resident memory of a process, in bytes.
std::size_t residentBytes(pid_t pid) {
  std::ifstream status("/proc/" + std::to_string(pid) + "/status");
  std::string line;
  while (std::getline(status, line)) {
    if (line.rfind("VmRSS:", 0) == 0) return std::stoull(line.substr(6)) * 1024;
  }
  return 0;
}

std::string contentsOf(const std::string& path) {
  std::ifstream in(path);
  std::stringstream text;
  text << in.rdbuf();
  return text.str();
}

std::size_t occurrences(const std::string& text, const std::string& part) {
  std::size_t count = 0;
  for (auto at = text.find(part); at != std::string::npos; at = text.find(part, at + part.size())) ++count;
  return count;
}

// Whether this build (and so the daemon beside it) runs under AddressSanitizer.
#if defined(__SANITIZE_ADDRESS__)
constexpr bool kSanitized = true;
#else
constexpr bool kSanitized = false;
#endif

TEST_F(DaemonTest, UnfinishedMessagesOfManyConnectionsAreCappedWithOneLineAndTheServiceServesOn) {
  test::TemporaryDirectory logs;
  const std::string errors = logs.path() + "/stderr";
  Daemon daemon(ports_, {"--log-stderr"}, errors);
  ASSERT_TRUE(daemon.running());
  const std::size_t before = residentBytes(daemon.pid());
  // Twenty peers each start a request of 4 MB and never finish it: 80 MB if all were held.
  const auto socket = ports_.socketPath(std::string(kTelephonyServicePortName));
  const Bytes part(kSocketPortMaximumDatagram - test::kFrameHeaderSize, 0x5a);
  std::vector<std::unique_ptr<test::RawPeer>> peers;
  for (std::uint32_t serial = 1; serial <= 20; ++serial) {
    auto peer = std::make_unique<test::RawPeer>(socket);
    ASSERT_TRUE(peer->connected());
    for (int i = 0; i < 64; ++i) {
      if (!peer->send(test::frame(test::kRequestFrame, test::kMoreFollows, kTelephonyCreateLogChannelMessage, serial,
                                  part))) {
        break;
      }
    }
    peers.push_back(std::move(peer));
  }
  std::vector<std::uint32_t> kept;
  for (std::uint32_t serial = 1; serial <= 20; ++serial) {
    if (!peers[serial - 1]->closedByThePort(200ms)) kept.push_back(serial);
  }
  // 16 MB hold at most four of them.
  EXPECT_GE(kept.size(), 1u);
  EXPECT_LE(kept.size(), 4u);
  if (!kSanitized) {
    // The sanitizer's allocator keeps freed memory in quarantine, so only a plain build shows what is held.
    EXPECT_LT(residentBytes(daemon.pid()), before + 40 * 1024 * 1024)
        << "before: " << before << ", after: " << residentBytes(daemon.pid());
  }

  // The peers kept are served: their requests finish and are answered (as malformed).
  for (const std::uint32_t serial : kept) {
    ASSERT_TRUE(peers[serial - 1]->send(
        test::frame(test::kRequestFrame, 0, kTelephonyCreateLogChannelMessage, serial, Bytes{'x'})));
    const auto reply = peers[serial - 1]->reply();
    ASSERT_TRUE(reply);
    const auto answer = plist::parse(*reply);
    ASSERT_TRUE(answer && answer->asDictionary());
    EXPECT_EQ(answer->asDictionary()->get(kTelephonyKeyErrorCode), Value::integer(kTelephonyErrorBadRequest));
  }
  // And so is everyone else.
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  EXPECT_EQ(client.technology(), "IFX");
  EXPECT_EQ(daemon.stop(SIGTERM), 0);
  const std::string log = contentsOf(errors);
  EXPECT_EQ(occurrences(log, "Port corvane-telephonyd dropped a connection: its unfinished message"), 1u) << log;
}

// How soon the service ends on SIGTERM; the sanitizers add their own work at exit.
constexpr auto kStopBound = kSanitized ? 600ms : 200ms;

TEST_F(DaemonTest, SigtermEndsTheServiceAtOnceWhileSilentPeersHoldItWaiting) {
  Daemon daemon(ports_, {});
  const auto socket = ports_.socketPath(std::string(kTelephonyServicePortName));
  // Three peers send requests and never read a reply: the service waits up to
  // a second for room for each peer's next reply.
  std::vector<std::unique_ptr<test::RawPeer>> silent;
  for (std::uint32_t peer = 0; peer < 3; ++peer) {
    silent.push_back(std::make_unique<test::RawPeer>(socket));
    ASSERT_TRUE(silent.back()->connected());
    // More requests than the replies that fit in the socket's buffer.
    int full = 0;
    for (std::uint32_t serial = 1; serial <= 600 && full < 50;) {
      if (silent.back()->sendWithoutWaiting(test::frame(test::kRequestFrame, 0, 99, serial, Bytes{'?'}))) {
        ++serial;
        full = 0;
      } else {
        ++full;
        std::this_thread::sleep_for(1ms);
      }
    }
  }
  // Until the service is held: a request of an ordinary client is not
  // answered soon. Found early, most of the second is still to wait.
  const auto giveUp = Clock::now() + 3s;
  bool held = false;
  while (!held && Clock::now() < giveUp) {
    auto probe = ports_.createRemotePort(std::string(kTelephonyServicePortName));
    ASSERT_TRUE(probe);
    std::optional<Bytes> reply;
    held = probe->sendRequest(99, Bytes{'?'}, 1.0, 0.05, &reply) == kPortReceiveTimeout;
  }
  ASSERT_TRUE(held);

  const auto start = Clock::now();
  EXPECT_EQ(daemon.stop(SIGTERM), 0);
  const auto took = Clock::now() - start;
  EXPECT_LT(took, kStopBound) << std::chrono::duration_cast<std::chrono::milliseconds>(took).count() << " ms";
  EXPECT_TRUE(serviceSockets(runtime_.path()).empty());
}

TEST_F(DaemonTest, LogChannelForAnUnusablePortNameIsRefused) {
  Daemon daemon(ports_, {});
  SocketTelephonyClient telephony(ports_);
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
  EXPECT_TRUE(serviceSockets(runtime_.path()).empty());
}

TEST_F(DaemonTest, HelpAndVersionNameTheProgramAndExitWithStatus0) {
  const auto help = test::runProcess({kDaemon, "--help"});
  EXPECT_EQ(help.exitCode, 0);
  EXPECT_EQ(help.out.rfind("Usage: corvane-telephonyd", 0), 0u) << help.out;
  EXPECT_EQ(help.err, "");
  const auto version = test::runProcess({kDaemon, "--version"});
  EXPECT_EQ(version.exitCode, 0);
  EXPECT_EQ(version.out, std::string("corvane-telephonyd ") + kVersion + "\n");
  EXPECT_TRUE(serviceSockets(runtime_.path()).empty());
}

TEST_F(DaemonTest, UnusableRuntimeDirectoryExitsWithStatus1AndOneLine) {
  test::TemporaryDirectory temporary;
  const std::string file = temporary.write("not-a-directory", "x");
  const auto result = test::runProcess({kDaemon}, "", {"CORVANE_RUNTIME_DIR=" + file});
  EXPECT_EQ(result.exitCode, 1);
  EXPECT_EQ(result.err, "corvane-telephonyd: runtime directory " + file + " is not a directory\n");
}

TEST_F(DaemonTest, RuntimeDirectoryThatIsASymbolicLinkIsRefusedAsSuch) {
  test::TemporaryDirectory temporary;
  const std::string link = temporary.path() + "/run";
  ASSERT_EQ(::symlink(runtime_.path().c_str(), link.c_str()), 0);
  const auto result = test::runProcess({kDaemon}, "", {"CORVANE_RUNTIME_DIR=" + link});
  EXPECT_EQ(result.exitCode, 1);
  EXPECT_EQ(result.err, "corvane-telephonyd: runtime directory " + link +
                            " is a symbolic link, which is not followed; remove the link so that the directory is "
                            "made afresh, or set CORVANE_RUNTIME_DIR to a private directory\n");
  EXPECT_TRUE(serviceSockets(runtime_.path()).empty());
}

// --- Replaying a capture ---

// A DLF of `count` records, `ticks` apart (1.25 ms each): LTE serving-cell
// measurements (0xB17F) and identities (0xB0C1) in turn, and every fifth a
// cell list (extra code 1). Each record's payload holds its number.
std::string replayCapture(int count, std::uint64_t ticks, std::vector<Bytes>& packets) {
  std::string dlf;
  for (int i = 0; i < count; ++i) {
    const std::uint64_t timestamp = (1'000'000 + static_cast<std::uint64_t>(i) * ticks) << 16;
    Bytes packet;
    if (i % 5 == 4) {
      Array cells;
      cells.append(Value::integer(i));
      packet = telephonyd::encodeExtraCodePacket(1, timestamp, Value(cells));
    } else {
      const Bytes payload{static_cast<std::uint8_t>(i), static_cast<std::uint8_t>(i >> 8)};
      packet = telephonyd::encodeLogPacket(i % 2 == 0 ? 0xB17F : 0xB0C1, timestamp, payload);
    }
    dlf.append(packet.begin() + 1, packet.end());
    packets.push_back(std::move(packet));
  }
  return dlf;
}

TEST_F(DaemonTest, ReplayStreamsOnlyTheCapturesPacketsThatTheStartCommandAsksForInTheirOrder) {
  test::TemporaryDirectory files;
  std::vector<Bytes> packets;
  const std::string capture = files.write("lte.dlf", replayCapture(3000, 1, packets));
  Daemon daemon(ports_, {"--replay", capture, "--as-fast-as-possible"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  // The technology is the capture's: its log codes are LTE's.
  EXPECT_EQ(client.technology(), "Quendra_LTE");
  client.keepAll_ = true;
  ASSERT_EQ(client.start(logCodeStart({0xB17F}, {1})), kPortSuccess);
  std::vector<Bytes> expected;
  for (std::size_t i = 0; i < packets.size(); ++i) {
    if (i % 5 == 4 || i % 2 == 0) expected.push_back(packets[i]);
  }
  ASSERT_TRUE(pumpUntil([&] { return client.all_.size() >= expected.size(); }, 10000ms)) << client.all_.size();
  pumpFor(100ms);
  EXPECT_EQ(client.all_, expected);
  EXPECT_TRUE(std::all_of(client.ids_.begin(), client.ids_.end(), [](MessageId id) { return id == 0; }));
  // Played once: the service stays, with its channel open and answering.
  EXPECT_TRUE(daemon.running());
  EXPECT_EQ(client.technology(), "Quendra_LTE");
}

TEST_F(DaemonTest, ReplayFollowsTheRecordsTimestampsAndItsSpeed) {
  test::TemporaryDirectory files;
  std::vector<Bytes> packets;
  // Six records 200 ms apart (160 ticks): the last is due 1 s after the first.
  const std::string capture = files.write("paced.dlf", replayCapture(6, 160, packets));
  for (const char* speed : {"1", "4"}) {
    Daemon daemon(ports_, {"--replay", capture, "--speed", speed});
    Client client(ports_, loop_);
    ASSERT_TRUE(client.connected());
    client.keepAll_ = true;
    ASSERT_EQ(client.start(logCodeStart({0xB17F, 0xB0C1}, {1})), kPortSuccess);
    ASSERT_TRUE(pumpUntil([&] { return !client.all_.empty(); }));
    const auto first = Clock::now();
    ASSERT_TRUE(pumpUntil([&] { return client.all_.size() == 6; }, 5000ms));
    const auto took = Clock::now() - first;
    EXPECT_EQ(client.all_, packets);
    if (std::string(speed) == "1") {
      EXPECT_GE(took, 950ms);
      EXPECT_LT(took, 2500ms);
    } else {
      EXPECT_GE(took, 230ms);
      EXPECT_LT(took, 900ms);
    }
  }
}

TEST_F(DaemonTest, ReplayInALoopStartsTheCaptureAgain) {
  test::TemporaryDirectory files;
  std::vector<Bytes> packets;
  const std::string capture = files.write("loop.dlf", replayCapture(10, 1, packets));
  Daemon daemon(ports_, {"--replay", capture, "--loop", "--as-fast-as-possible", "--packets", "35"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  client.keepAll_ = true;
  ASSERT_EQ(client.start(logCodeStart({0xB17F, 0xB0C1}, {1})), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.all_.size() >= 35; }));
  for (std::size_t i = 0; i < 35; ++i) EXPECT_EQ(client.all_[i], packets[i % 10]) << i;
}

TEST_F(DaemonTest, ReplayOfACaptureThatCannotBeReadOrToldExitsWithStatus1AndOneLine) {
  test::TemporaryDirectory files;
  const auto missing = test::runProcess({kDaemon, "--replay", files.path() + "/missing.dlf"});
  EXPECT_EQ(missing.exitCode, 1);
  EXPECT_EQ(missing.err,
            "corvane-telephonyd: " + files.path() + "/missing.dlf: cannot open: No such file or directory\n");
  // Only the service's own extra codes: no technology to tell.
  std::vector<Bytes> packets;
  std::string extraOnly;
  for (int i = 0; i < 3; ++i) {
    const Bytes packet = telephonyd::encodeExtraCodePacket(1, static_cast<std::uint64_t>(i) << 16, Value(Array{}));
    extraOnly.append(packet.begin() + 1, packet.end());
  }
  const std::string capture = files.write("extra.dlf", extraOnly);
  const auto untold = test::runProcess({kDaemon, "--replay", capture});
  EXPECT_EQ(untold.exitCode, 1);
  EXPECT_EQ(untold.err, "corvane-telephonyd: cannot tell the technology of " + capture +
                            ": it holds no log records, only the service's own extra codes; give it with "
                            "--technology NAME\n");
  EXPECT_TRUE(serviceSockets(runtime_.path()).empty());
}

// --- Bridging a diagnostic port: the fake baseband on a pseudo-terminal ---

using test::FakeBaseband;

TEST_F(DaemonTest, DiagBridgeSetsTheMaskOfTheStartCommandAndStreamsOnlyItsCodesDecodably) {
  test::TemporaryDirectory files;
  // A system bus that is not there, whatever the machine runs.
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", ("unix:path=" + files.path() + "/no-bus").c_str(), 1);
  FakeBaseband baseband(files.path(), {"--rate", "300", "--seed", "4"});
  Daemon daemon(ports_, {"--diag", baseband.link(), "--technology", "Quendra_LTE"});
  {
    Client client(ports_, loop_);
    ASSERT_TRUE(client.connected());
    EXPECT_EQ(client.technology(), "Quendra_LTE");
    client.keepAll_ = true;
    ASSERT_EQ(client.start(logCodeStart({0xB0C1, 0xB17F}, {0, 1})), kPortSuccess);
    ASSERT_TRUE(baseband.waitFor("mask set: id 11: 0xB0C1 0xB17F\n")) << baseband.lines();
    ASSERT_TRUE(pumpUntil([&] { return client.all_.size() >= 40; }, 5000ms));
    std::set<std::uint32_t> codes;
    for (const Bytes& packet : client.all_) codes.insert(effectiveCode(packet));
    // Only the log codes asked for: on a real baseband the extra codes come from ModemManager, and there is
    // none on this bus.
    EXPECT_EQ(codes, (std::set<std::uint32_t>{0xB0C1, 0xB17F}));
    auto generator = LogGenerator::generatorFromTechnology("Quendra_LTE");
    Dictionary state;
    for (const Bytes& packet : client.all_) generator->updateState(state, packet);
    const Value display = generator->generateLogUsingState(state);
    // The serving cell's measurements (0xB17F) are on the screen.
    const Value* measurements = findKey(display, "Serving Cell Measurements");
    ASSERT_TRUE(measurements && measurements->asDictionary());
    const Value* rsrp = measurements->asDictionary()->find("Measured RSRP");
    ASSERT_TRUE(rsrp && rsrp->asString());
    EXPECT_NE(rsrp->asString()->find(" dBm"), std::string::npos) << *rsrp->asString();
  }
  // The channel gone, the baseband's logging is switched off again.
  EXPECT_TRUE(baseband.waitFor("logging disabled")) << baseband.lines();
  EXPECT_TRUE(daemon.running());
}

TEST_F(DaemonTest, DiagBridgeRecoversWithinSixSecondsWhenThePortVanishes) {
  test::TemporaryDirectory files;
  FakeBaseband baseband(files.path(), {"--rate", "200", "--vanish-after", "0.5", "--away-for", "1.5"});
  Daemon daemon(ports_, {"--diag", baseband.link(), "--technology", "Quendra_LTE"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  client.keepAll_ = true;
  ASSERT_EQ(client.start(logCodeStart({0xB17F, 0xB179}, {})), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return !client.all_.empty(); }));
  ASSERT_TRUE(baseband.waitFor("vanished"));
  const auto vanished = Clock::now();
  pumpFor(20ms);
  const std::size_t before = client.all_.size();
  // Back after 1.5 s: the service finds it, asks the ranges, sets the mask, and packets flow again.
  ASSERT_TRUE(pumpUntil([&] { return client.all_.size() > before + 5; }, 6000ms)) << baseband.lines();
  EXPECT_LT(Clock::now() - vanished, 6s);
  const std::string lines = baseband.lines();
  EXPECT_NE(lines.find("back on"), std::string::npos);
  EXPECT_NE(lines.find("mask set: id 11: 0xB179 0xB17F", lines.find("back on")), std::string::npos) << lines;
  EXPECT_TRUE(daemon.running());
}

TEST_F(DaemonTest, DiagBridgeReadsThroughSplitFramesGarbageBadCrcsAndASecondSubscription) {
  test::TemporaryDirectory files;
  FakeBaseband baseband(files.path(),
                        {"--rate", "300", "--split", "--garbage", "--bad-crc", "7", "--subscription"});
  Daemon daemon(ports_, {"--diag", baseband.link(), "--technology", "Quendra_LTE"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  client.keepAll_ = true;
  ASSERT_EQ(client.start(logCodeStart({0xB17F, 0xB0C1, 0xB179, 0xB180, 0xB186, 0xB0C2}, {})), kPortSuccess);
  ASSERT_TRUE(pumpUntil([&] { return client.all_.size() >= 60; }, 5000ms)) << baseband.lines();
  for (const Bytes& packet : client.all_) {
    ASSERT_GE(packet.size(), 13u);
    EXPECT_EQ(packet[0], 0x01);
    EXPECT_EQ(static_cast<std::size_t>(packet[1] | packet[2] << 8), packet.size() - 1);
    EXPECT_TRUE(packet[4] == 0xB0 || packet[4] == 0xB1) << static_cast<int>(packet[4]);
  }
  EXPECT_TRUE(daemon.running());
}

TEST_F(DaemonTest, DiagBridgeOfASilentBasebandWaitsWithoutEnding) {
  test::TemporaryDirectory files;
  FakeBaseband baseband(files.path(), {"--silent"});
  Daemon daemon(ports_, {"--diag", baseband.link(), "--technology", "Quendra_LTE"});
  Client client(ports_, loop_);
  ASSERT_TRUE(client.connected());
  ASSERT_EQ(client.start(logCodeStart({0xB17F}, {})), kPortSuccess);
  // Asked once, then again after each second without an answer.
  ASSERT_TRUE(baseband.waitFor("ranges asked\nranges asked\n", 4000ms)) << baseband.lines();
  EXPECT_TRUE(client.all_.empty());
  EXPECT_TRUE(daemon.running());
}

TEST_F(DaemonTest, ASecondServiceOnTheSameDiagnosticPortIsRefused) {
  test::TemporaryDirectory files;
  FakeBaseband baseband(files.path(), {});
  Daemon daemon(ports_, {"--diag", baseband.link(), "--technology", "Quendra_LTE"});
  ASSERT_TRUE(daemon.running());
  test::TemporaryDirectory otherRuntime;
  const auto second = test::runProcess({kDaemon, "--diag", baseband.link(), "--technology", "Quendra_LTE"}, "",
                                       {"CORVANE_RUNTIME_DIR=" + otherRuntime.path() + "/run"});
  EXPECT_EQ(second.exitCode, 1);
  EXPECT_EQ(second.err, "corvane-telephonyd: " + baseband.link() +
                            ": in use: another program holds its lock (is another corvane-telephonyd bridging it?)\n");
}

TEST_F(DaemonTest, DiagWithoutATechnologyIsRefusedWithTheOptionToGive) {
  const auto result = test::runProcess({kDaemon, "--diag", "/dev/null"});
  EXPECT_EQ(result.exitCode, 2);
  EXPECT_EQ(result.err, "corvane-telephonyd: --diag needs --technology NAME: the baseband does not say which "
                        "decoder its log codes are for (see --help)\n");
}

}  // namespace
}  // namespace corvane
