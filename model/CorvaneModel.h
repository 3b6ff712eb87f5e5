#pragma once

// The monitor model: keeps the log channel to the telephony service alive,
// owns the generator of the reported technology and the state dictionary,
// feeds every packet to the generator, and every 2 s turns the generator's
// display into the node tree that the screens read. It never gives up: any
// failure tears the channel down and tries again 5 s later.

#include <chrono>
#include <functional>
#include <memory>
#include <optional>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "model/CorvaneModelNode.h"
#include "platform/MessagePort.h"
#include "platform/RunLoop.h"
#include "platform/Telephony.h"
#include "platform/Value.h"

namespace corvane {

// The application side of the model: told (on the main queue) when the tree
// was dropped and must be asked for again.
class CorvaneModelDelegate {
 public:
  virtual ~CorvaneModelDelegate() = default;
  virtual void updateViewControllerFromModel() = 0;
};

// What the model needs of the platform.
struct CorvaneModelEnvironment {
  RunLoop& runLoop;
  MessagePortSystem& ports;
  TelephonyClient& telephony;
  // Makes the text of a new UUID; nothing when that fails.
  std::function<std::optional<std::string>()> makeUUID;
  // Chooses the generator of a technology; LogGenerator::generatorFromTechnology when empty.
  // Benchmarks put a counting generator here.
  std::function<std::unique_ptr<LogGenerator>(std::string_view technology)> generatorFromTechnology = {};
};

class CorvaneModel {
 public:
  static constexpr std::chrono::nanoseconds kDisplayUpdateInterval = std::chrono::milliseconds(2000);
  static constexpr std::chrono::nanoseconds kRetryDelay = std::chrono::nanoseconds(5'000'000'000);
  static constexpr double kSendTimeout = 1.0;
  static constexpr double kReplyTimeout = 1.0;

  // Creates the empty state dictionary; the monitor is not started here.
  CorvaneModel(CorvaneModelEnvironment environment, CorvaneModelDelegate* delegate);
  ~CorvaneModel();
  CorvaneModel(const CorvaneModel&) = delete;
  CorvaneModel& operator=(const CorvaneModel&) = delete;

  bool isConnected() const { return _recvPort && _sendPort; }

  // The log channel.
  bool createPorts();
  void destroyPorts();
  void configureGenerator();

  // The monitor's life.
  void restartMonitor();
  void startMonitor();

  // The display.
  NodeRef topLevelNodes();
  void refresh();
  NodeRef nodeAtPath(const std::string& path);
  void updateWithData(const Bytes& data);
  // The generator's save contents; null without a generator.
  Value getSaveContents();

  // For the application's status texts and for tests.
  bool isRunning() const { return _displayUpdateTimer != 0; }
  LogGenerator* logGenerator() const { return _logGenerator.get(); }
  const Dictionary& state() const { return _state; }

 private:
  // The port and connection callbacks; the model is their (unretained) context.
  static std::optional<Bytes> ReceiveLogPacket(LocalMessagePort& port, MessageId id, const Bytes& data,
                                               CorvaneModel* model);
  static void LogPortInvalidated(MessagePort& port, CorvaneModel* model);
  static void TelephonyConnectionNotified(TelephonyConnection& connection, const std::string& notification,
                                          const Value& data, CorvaneModel* model);

  void scheduleRetry();
  // Runs `task` on the main queue later, unless this model has gone by then.
  void dispatchLater(std::function<void(CorvaneModel&)> task, std::optional<std::chrono::nanoseconds> delay);

  CorvaneModelEnvironment environment_;
  CorvaneModelDelegate* delegate_;

  std::shared_ptr<LocalMessagePort> _recvPort;
  std::shared_ptr<RemoteMessagePort> _sendPort;
  RunLoop::Handle _displayUpdateTimer = 0;
  bool _updated = false;
  std::unique_ptr<LogGenerator> _logGenerator;
  Dictionary _state;
  NodeRef _nodes;
  std::unique_ptr<PathDictionary> _nodesByPath;

  // Work dispatched for later holds a weak reference to this, so it does nothing once the model is gone.
  std::shared_ptr<CorvaneModel*> self_;
};

}  // namespace corvane
