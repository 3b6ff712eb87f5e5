// The monitor model on a virtual clock, against an in-memory telephony service.

#include "model/CorvaneModel.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>

#include "model/FakeTelephony.h"
#include "platform/Log.h"
#include "platform/VirtualRunLoop.h"
#include "support/Packets.h"
#include "support/Values.h"

namespace corvane {
namespace {

using namespace std::chrono_literals;
using test::D;
using test::FakeTelephony;
using test::S;

class CountingDelegate final : public CorvaneModelDelegate {
 public:
  void updateViewControllerFromModel() override { ++updates_; }
  int updates_ = 0;
};

class Model : public ::testing::Test {
 protected:
  Model()
      : model_(std::make_unique<CorvaneModel>(
            CorvaneModelEnvironment{loop_, service_, service_,
                                    [this]() -> std::optional<std::string> {
                                      if (!uuidWorks_) return std::nullopt;
                                      return "00000000-0000-0000-0000-" + std::to_string(100000000000 + ++uuids_);
                                    }},
            &delegate_)) {}

  std::size_t count(std::string_view line) { return log_.sink().count(line); }
  std::vector<std::string> lines() const { return log_.texts(); }
  std::size_t historySize() const {
    const Value* h = model_->state().find("History");
    return h && h->isArray() ? h->asArray()->size() : 0;
  }
  static Bytes packet(const std::string& arfcn) { return test::xmlBytes(D({{"Serving", D({{"ARFCN", S(arfcn)}})}})); }
  void startRunning() {
    model_->startMonitor();
    ASSERT_TRUE(model_->isRunning());
    log_.sink().clear();
  }

  log::ScopedCapture log_;
  VirtualRunLoop loop_;
  FakeTelephony service_;
  CountingDelegate delegate_;
  bool uuidWorks_ = true;
  int uuids_ = 0;
  std::unique_ptr<CorvaneModel> model_;
};

TEST_F(Model, StartingConnectsQueriesTheTechnologyAndSendsTheStartCommand) {
  model_->startMonitor();
  ASSERT_TRUE(model_->isConnected());
  ASSERT_TRUE(model_->isRunning());
  ASSERT_NE(model_->logGenerator(), nullptr);

  ASSERT_EQ(service_.localPorts_.size(), 1u);
  const auto& local = *service_.localPorts_[0];
  EXPECT_EQ(local.name(), "CorvaneApp.00000000-0000-0000-0000-100000000001");
  EXPECT_TRUE(local.scheduled());
  EXPECT_TRUE(local.hasInvalidationCallback());
  EXPECT_EQ(service_.channelRequests_, std::vector<std::string>{local.name()});

  ASSERT_EQ(service_.commands_.size(), 2u);
  const auto& query = service_.commands_[0];
  EXPECT_EQ(query.port, "CorvaneTS.1");
  EXPECT_EQ(query.id, 0);
  EXPECT_EQ(query.command, D({{"GetTechnology", S("GetTechnology")}}));
  EXPECT_EQ(query.sendTimeout, 1.0);
  EXPECT_EQ(query.receiveTimeout, 1.0);
  EXPECT_TRUE(query.wantsReply);
  const auto& start = service_.commands_[1];
  EXPECT_EQ(start.id, 0);
  EXPECT_EQ(start.command, D({{"SetState", S("Streaming")}}));
  EXPECT_EQ(start.sendTimeout, 1.0);
  EXPECT_EQ(start.receiveTimeout, 0.0);
  EXPECT_FALSE(start.wantsReply);

  const std::string created = " ***** Created ports (send=" + log::pointerText(service_.remotePorts_[0].get()) +
                              ", recv=" + log::pointerText(service_.localPorts_[0].get()) + ")";
  const std::string got = "Got log generated: " + log::pointerText(model_->logGenerator());
  const std::string creating = "Creating Log object: " + log::pointerText(model_->logGenerator());
  EXPECT_EQ(lines(), (std::vector<std::string>{created, creating, got, "Starting the display update timer"}));
  for (const auto& line : log_.lines()) {
    if (line.text.rfind("Creating Log object", 0) == 0) {
      EXPECT_EQ(line.priority, 4);
    } else {
      EXPECT_EQ(line.priority, 3) << line.text;
    }
  }
  EXPECT_EQ(loop_.timerCount(), 1u);
}

TEST_F(Model, ASecondStartWhileRunningDoesNothing) {
  startRunning();
  model_->startMonitor();
  EXPECT_EQ(service_.connectionsOpened_, 1);
  EXPECT_EQ(service_.localPorts_.size(), 1u);
  EXPECT_EQ(loop_.timerCount(), 1u);
  EXPECT_TRUE(lines().empty());
}

TEST_F(Model, AnUnreachableServiceIsRetriedEveryFiveSecondsWithoutLimit) {
  service_.reachable_ = false;
  model_->startMonitor();
  EXPECT_EQ(count("Could not create TSServerConnection"), 1u);
  EXPECT_EQ(count("Could not create the ports necessary"), 1u);
  EXPECT_FALSE(model_->isConnected());
  EXPECT_EQ(service_.localPorts_.back()->isValid(), false) << "the ports made so far are torn down";

  loop_.advanceBy(4999ms);
  EXPECT_EQ(count("Could not create the ports necessary"), 1u);
  loop_.advanceBy(1ms);
  EXPECT_EQ(count("Could not create the ports necessary"), 2u);
  loop_.advanceBy(60s);
  EXPECT_EQ(count("Could not create the ports necessary"), 14u);
  EXPECT_EQ(loop_.delayedCount(), 1u) << "one retry waiting, no pile-up";

  service_.reachable_ = true;
  loop_.advanceBy(5s);
  EXPECT_TRUE(model_->isRunning());
  EXPECT_EQ(count("Could not create the ports necessary"), 14u);
}

TEST_F(Model, EachAttemptUsesAFreshLocalPortName) {
  service_.reachable_ = false;
  model_->startMonitor();
  loop_.advanceBy(5s);
  ASSERT_EQ(service_.localPorts_.size(), 2u);
  EXPECT_NE(service_.localPorts_[0]->name(), service_.localPorts_[1]->name());
}

TEST_F(Model, AFailedUuidFailsTheAttemptQuietly) {
  uuidWorks_ = false;
  EXPECT_FALSE(model_->createPorts());
  EXPECT_TRUE(lines().empty());
  model_->startMonitor();
  EXPECT_EQ(lines(), std::vector<std::string>{"Could not create the ports necessary"});
  EXPECT_EQ(service_.connectionsOpened_, 0);
}

TEST_F(Model, ChannelFailuresAreLoggedAndRetried) {
  service_.channelErrorCode_ = 5;
  model_->startMonitor();
  EXPECT_EQ(count("_TSServerConnectionNetworkMonitorCreateLogChannel returns error: 5!"), 1u);
  EXPECT_EQ(count("Could not create the ports necessary"), 1u);

  service_.channelErrorCode_ = 0;
  service_.commandPortName_ = "";
  loop_.advanceBy(5s);
  EXPECT_EQ(count("Could not create a log channel (TS returned null port)!"), 1u);

  service_.commandPortName_ = "CorvaneTS.1";
  service_.remotePortCreatable_ = false;
  loop_.advanceBy(5s);
  EXPECT_EQ(count("Could not create the remote port!"), 1u);
  EXPECT_EQ(count("Could not create the ports necessary"), 3u);
  EXPECT_FALSE(model_->isConnected());
}

TEST_F(Model, AReplyThatIsNotAPropertyListGivesNoGeneratorAndARetry) {
  service_.technologyReply_ = test::bytesOf("IFX, honestly");
  model_->startMonitor();
  EXPECT_EQ(lines().back(), "No log generator technology works");
  EXPECT_EQ(count(" ***** Could not parse reply to GetTechnology; cannot configure"), 1u);
  EXPECT_EQ(model_->logGenerator(), nullptr);
  EXPECT_FALSE(model_->isConnected());
  EXPECT_EQ(service_.connectionsOpened_, 1);
  loop_.advanceBy(5s);
  EXPECT_EQ(service_.connectionsOpened_, 2);
  EXPECT_EQ(count(" ***** Could not parse reply to GetTechnology; cannot configure"), 2u);
}

TEST_F(Model, AnUnknownTechnologyLogsTheNullGeneratorThenNoGeneratorWorks) {
  service_.technologyReply_ = FakeTelephony::replyFor("WiMAX");
  model_->startMonitor();
  const auto all = lines();
  ASSERT_GE(all.size(), 2u);
  EXPECT_EQ(all[all.size() - 2], "Got log generated: 0x0");
  EXPECT_EQ(all[all.size() - 1], "No log generator technology works");
  EXPECT_EQ(loop_.delayedCount(), 1u);
}

TEST_F(Model, TechnologyQueryFailuresHaveTheirOwnLines) {
  service_.technologyStatus_ = kPortReceiveTimeout;
  model_->startMonitor();
  EXPECT_EQ(count(" ***** Could not send the GetTechnology command (got error=-2)"), 1u);

  service_.technologyStatus_ = kPortSuccess;
  service_.technologyReply_ = std::nullopt;
  loop_.advanceBy(5s);
  EXPECT_EQ(count(" ***** No response to GetTechnology; cannot configure"), 1u);

  service_.technologyReply_ = plist::serializeOrThrow(D({{"Technology", S("IFX")}}), plist::Format::XML);
  loop_.advanceBy(5s);
  EXPECT_EQ(count(" ***** Reply to GetTechnology had no answer; cannot configure"), 1u);
  EXPECT_EQ(count("No log generator technology works"), 3u);
}

TEST_F(Model, AFailedStartCommandTearsDownAndRetries) {
  service_.startStatus_ = kPortSendTimeout;
  model_->startMonitor();
  EXPECT_EQ(count(" ***** Could not send the START command (got error=-1)"), 1u);
  EXPECT_FALSE(model_->isRunning());
  EXPECT_FALSE(model_->isConnected());
  service_.startStatus_ = kPortSuccess;
  loop_.advanceBy(5s);
  EXPECT_TRUE(model_->isRunning());
}

TEST_F(Model, APacketWithMessageIdOneIsIgnoredWithoutAReply) {
  startRunning();
  EXPECT_EQ(service_.sendPacket(packet("62"), 1), std::nullopt);
  EXPECT_FALSE(model_->state().contains("Display"));
  loop_.advanceBy(2s);
  EXPECT_EQ(delegate_.updates_, 0);
  EXPECT_EQ(service_.sendPacket(packet("62"), 0), std::nullopt);
  EXPECT_TRUE(model_->state().contains("Display"));
}

TEST_F(Model, DestroyingPortsOfAModelWithoutPortsDoesNothing) {
  model_->destroyPorts();
  EXPECT_TRUE(lines().empty());
  EXPECT_FALSE(model_->isConnected());
}

TEST_F(Model, ADeliberateTeardownNeverRestarts) {
  startRunning();
  model_->destroyPorts();
  EXPECT_TRUE(lines().empty());
  EXPECT_FALSE(model_->isRunning());
  EXPECT_EQ(loop_.timerCount(), 0u);
  EXPECT_FALSE(service_.localPorts_[0]->isValid());
  EXPECT_FALSE(service_.remotePorts_[0]->isValid());
  loop_.advanceBy(30s);
  EXPECT_EQ(service_.connectionsOpened_, 1);
}

TEST_F(Model, TheRemotePortDyingIsNoticedWithinOneTickAndRestartsTheMonitor) {
  startRunning();
  const std::string invalidated = " ***** INVALIDATED " + log::pointerText(service_.localPorts_[0].get()) + " *****";
  service_.alive_ = false;
  loop_.advanceBy(1999ms);
  EXPECT_EQ(count(invalidated), 0u);
  loop_.advanceBy(1ms);
  EXPECT_EQ(count(invalidated), 1u);
  EXPECT_EQ(count("Could not create TSServerConnection"), 1u) << "restarted at once";
  EXPECT_FALSE(model_->isRunning());
  EXPECT_EQ(loop_.timerCount(), 0u);

  service_.alive_ = true;
  loop_.advanceBy(5s);
  EXPECT_TRUE(model_->isRunning());
  EXPECT_EQ(service_.localPorts_.size(), 3u);
  EXPECT_EQ(count(invalidated), 1u);
}

TEST_F(Model, ThePreviousGeneratorIsReusedWhenTheTechnologyQueryFailsOnAReconnect) {
  startRunning();
  LogGenerator* first = model_->logGenerator();
  service_.technologyStatus_ = kPortReceiveTimeout;
  service_.alive_ = false;
  loop_.advanceBy(2s);
  service_.alive_ = true;
  loop_.advanceBy(5s);
  EXPECT_EQ(count(" ***** Could not send the GetTechnology command (got error=-2)"), 1u);
  EXPECT_EQ(count("No log generator technology works"), 0u);
  EXPECT_TRUE(model_->isRunning());
  EXPECT_EQ(model_->logGenerator(), first);
  EXPECT_EQ(service_.commands_.back().command, D({{"SetState", S("Streaming")}})) << "start command sent again";
}

TEST_F(Model, PacketsWithinOnePeriodGiveOneUpdateOneDisplayAndOneSnapshot) {
  startRunning();
  for (int i = 0; i < 10; ++i) service_.sendPacket(packet(std::to_string(60 + i)));
  loop_.advanceBy(2s);
  EXPECT_EQ(delegate_.updates_, 1);
  EXPECT_EQ(historySize(), 0u) << "generated only when the screens ask";
  NodeRef root = model_->topLevelNodes();
  ASSERT_NE(root, nullptr);
  EXPECT_EQ(*model_->nodeAtPath("/Serving")->value(), "69");
  EXPECT_EQ(model_->topLevelNodes(), root) << "kept until the next tick with new packets";
  EXPECT_EQ(historySize(), 1u);
}

TEST_F(Model, NoPacketsForALongTimeGenerateNothing) {
  startRunning();
  service_.sendPacket(packet("62"));
  loop_.advanceBy(2s);
  model_->topLevelNodes();
  const NodeRef root = model_->topLevelNodes();
  loop_.advanceBy(std::chrono::hours(1));
  EXPECT_EQ(delegate_.updates_, 1);
  EXPECT_EQ(historySize(), 1u);
  EXPECT_EQ(model_->topLevelNodes(), root);
}

TEST_F(Model, ANewTickAfterNewPacketsDropsTheTreeAndTheNextRequestRebuildsIt) {
  startRunning();
  service_.sendPacket(packet("62"));
  loop_.advanceBy(2s);
  const NodeRef first = model_->topLevelNodes();
  service_.sendPacket(packet("63"));
  loop_.advanceBy(2s);
  EXPECT_EQ(delegate_.updates_, 2);
  EXPECT_NE(model_->topLevelNodes(), first);
  EXPECT_EQ(*model_->nodeAtPath("/Serving")->value(), "63");
  EXPECT_EQ(historySize(), 2u);
}

TEST_F(Model, NodeAtPathBeforeAnyPacketBuildsTheTreeOfTheEmptyState) {
  startRunning();
  const NodeRef root = model_->nodeAtPath("/");
  ASSERT_NE(root, nullptr);
  EXPECT_EQ(root->displayName(), "Corvane");
  EXPECT_EQ(*root->value(), "(unknown)");
  EXPECT_EQ(model_->nodeAtPath("/Serving"), nullptr);
  EXPECT_EQ(historySize(), 1u);
}

TEST_F(Model, WithoutAGeneratorThereAreNoNodesAndNoSaveContents) {
  EXPECT_EQ(model_->topLevelNodes(), nullptr);
  EXPECT_EQ(model_->nodeAtPath("/"), nullptr);
  EXPECT_TRUE(model_->getSaveContents().isNull());
  model_->updateWithData(packet("62"));  // no generator: nothing decoded, but it counts as new data
  loop_.advanceBy(2s);
  EXPECT_EQ(delegate_.updates_, 0) << "no timer runs before the monitor starts";
}

TEST_F(Model, SaveContentsComeFromTheGenerator) {
  startRunning();
  service_.sendPacket(packet("62"));
  loop_.advanceBy(2s);
  model_->topLevelNodes();
  const Value contents = model_->getSaveContents();
  ASSERT_TRUE(contents.isArray());
  EXPECT_EQ(contents.asArray()->size(), 1u);
}

TEST_F(Model, ALogCodeTechnologyStreamsItsCodesAndSavesItsPacketsAsADlf) {
  service_.technologyReply_ = FakeTelephony::replyFor("Quendra_LTE");
  startRunning();
  const Dictionary& start = *service_.commands_.back().command.asDictionary();
  EXPECT_EQ(*start.find("SetState")->asString(), "Streaming");
  const auto& extra = start.find("SetTsExtraCodes")->asArray()->elements();
  EXPECT_NE(std::find(extra.begin(), extra.end(), Value::integer(0)), extra.end());
  EXPECT_NE(std::find(extra.begin(), extra.end(), Value::integer(2)), extra.end());

  const Bytes sim = test::extraCodePacket(0, test::binaryBytes(D({{"kSimFile_ICCID", S("8901260123456789012")}})));
  service_.sendPacket(sim);
  loop_.advanceBy(2s);
  ASSERT_NE(model_->topLevelNodes(), nullptr);
  const auto node = model_->nodeAtPath("/SIM Info/EF-ICCID");
  ASSERT_NE(node, nullptr);
  ASSERT_NE(node->value(), nullptr);
  EXPECT_EQ(*node->value(), "8901260123456789012");

  const Value contents = model_->getSaveContents();
  ASSERT_TRUE(contents.isArray());
  const Array& entries = *contents.asArray();
  ASSERT_EQ(entries.size(), 2u);  // one snapshot, then the DLF
  const Dictionary& dlf = *entries.at(1).asDictionary();
  const std::size_t expected = 161 + sim.size() - 1;
  EXPECT_EQ(*dlf.find("Description")->asString(), "DLF binary (" + std::to_string(expected) + " bytes)");
  const Bytes& bytes = *dlf.find("DLF")->asData();
  ASSERT_EQ(bytes.size(), expected);
  EXPECT_EQ(Bytes(bytes.begin() + 161, bytes.end()), Bytes(sim.begin() + 1, sim.end()));
}

TEST_F(Model, TheHistoryIsKeptAcrossAReconnect) {
  startRunning();
  service_.sendPacket(packet("62"));
  loop_.advanceBy(2s);
  model_->topLevelNodes();
  service_.alive_ = false;
  loop_.advanceBy(2s);
  service_.alive_ = true;
  loop_.advanceBy(5s);
  ASSERT_TRUE(model_->isRunning());
  service_.sendPacket(packet("63"));
  loop_.advanceBy(2s);
  model_->topLevelNodes();
  EXPECT_EQ(historySize(), 2u);
}

TEST_F(Model, ANotificationOfTheConnectionRefreshes) {
  startRunning();
  service_.sendPacket(packet("62"));
  ASSERT_TRUE(service_.lastNotificationCallback_);
  test::FakeConnection connection(service_);
  service_.lastNotificationCallback_(connection, "AnyNotification", Value());
  loop_.runPending();
  EXPECT_EQ(delegate_.updates_, 1);
}

TEST_F(Model, RestartTearsDownAndStartsAgain) {
  startRunning();
  model_->restartMonitor();
  EXPECT_TRUE(model_->isRunning());
  EXPECT_EQ(service_.connectionsOpened_, 2);
  EXPECT_FALSE(service_.localPorts_[0]->isValid());
  EXPECT_EQ(loop_.timerCount(), 1u);
  EXPECT_EQ(count(" ***** INVALIDATED " + log::pointerText(service_.localPorts_[0].get()) + " *****"), 0u);
}

TEST_F(Model, AModelDestroyedWithARetryPendingLeavesNothingBehind) {
  service_.reachable_ = false;
  model_->startMonitor();
  service_.sendPacket(packet("62"));
  model_.reset();
  loop_.advanceBy(10s);
  EXPECT_EQ(count("Could not create the ports necessary"), 1u);
}

TEST_F(Model, TheDisplayTimerTicksEveryTwoSeconds) {
  startRunning();
  for (int tick = 1; tick <= 3; ++tick) {
    service_.sendPacket(packet("62"));
    loop_.advanceBy(2s);
    EXPECT_EQ(delegate_.updates_, tick);
  }
}

}  // namespace
}  // namespace corvane
