#include "model/CorvaneModel.h"

#include "platform/Log.h"
#include "platform/PropertyList.h"

namespace corvane {

namespace {

constexpr MessageId kCommandMessageId = 0;
constexpr MessageId kPacketMessageId = 0;
constexpr std::string_view kGetTechnology = "GetTechnology";

std::optional<Bytes> serializeCommand(const Dictionary& command) {
  return plist::serialize(Value(command), plist::Format::XML);
}

}  // namespace

CorvaneModel::CorvaneModel(CorvaneModelEnvironment environment, CorvaneModelDelegate* delegate)
    : environment_(std::move(environment)), delegate_(delegate), self_(std::make_shared<CorvaneModel*>(this)) {}

CorvaneModel::~CorvaneModel() {
  self_.reset();
  destroyPorts();
}

// --- The log channel ---------------------------------------------------------

bool CorvaneModel::createPorts() {
  std::optional<std::string> uuid = environment_.makeUUID ? environment_.makeUUID() : std::nullopt;
  if (!uuid) return false;
  const std::string name = "CorvaneApp." + *uuid;

  // Kept without a check: a missing local port shows up as a failed channel below.
  _recvPort = environment_.ports.createLocalPort(
      name, [this](LocalMessagePort& port, MessageId id, const Bytes& data) {
        return ReceiveLogPacket(port, id, data, this);
      });
  if (_recvPort) {
    _recvPort->scheduleOn(environment_.runLoop);
    _recvPort->setInvalidationCallback([this](MessagePort& port) { LogPortInvalidated(port, this); });
  }

  std::unique_ptr<TelephonyConnection> connection = environment_.telephony.TelephonyServerConnectionCreate(
      [this](TelephonyConnection& c, const std::string& notification, const Value& data) {
        TelephonyConnectionNotified(c, notification, data, this);
      });
  if (!connection) {
    log::write(log::kError, "Could not create TSServerConnection");
    return false;
  }

  std::string remoteName;
  const TelephonyError error = connection->NetworkMonitorCreateLogChannel(name, remoteName);
  connection.reset();  // used only for this request
  if (error.code != 0) {
    log::printf(log::kError, "_TSServerConnectionNetworkMonitorCreateLogChannel returns error: %ld!",
                static_cast<long>(error.code));
    return false;
  }
  if (remoteName.empty()) {
    log::write(log::kError, "Could not create a log channel (TS returned null port)!");
    return false;
  }

  _sendPort = environment_.ports.createRemotePort(remoteName);
  if (!_sendPort) {
    log::write(log::kError, "Could not create the remote port!");
    return false;
  }
  log::printf(log::kError, " ***** Created ports (send=%s, recv=%s)", log::pointerText(_sendPort.get()).c_str(),
              log::pointerText(_recvPort.get()).c_str());
  return true;
}

void CorvaneModel::destroyPorts() {
  if (_displayUpdateTimer != 0) {
    environment_.runLoop.cancel(_displayUpdateTimer);
    _displayUpdateTimer = 0;
  }
  // The invalidation callback goes first, so that a deliberate teardown never restarts the monitor.
  if (_recvPort) {
    std::shared_ptr<LocalMessagePort> port = std::move(_recvPort);
    _recvPort.reset();
    port->setInvalidationCallback({});
    port->invalidate();
  }
  if (_sendPort) {
    std::shared_ptr<RemoteMessagePort> port = std::move(_sendPort);
    _sendPort.reset();
    port->setInvalidationCallback({});
    port->invalidate();
  }
}

void CorvaneModel::configureGenerator() {
  Dictionary query;
  query.set(kGetTechnology, Value(kGetTechnology));
  const std::optional<Bytes> command = serializeCommand(query);
  if (!command) {
    log::write(log::kError, " Could not generate GetTechnology command; cannot configure");
    return;
  }

  std::optional<Bytes> reply;
  const std::int32_t status =
      _sendPort ? _sendPort->sendRequest(kCommandMessageId, *command, kSendTimeout, kReplyTimeout, &reply)
                : kPortIsInvalid;
  if (status != kPortSuccess) {
    log::printf(log::kError, " ***** Could not send the GetTechnology command (got error=%d)", status);
    return;  // any reply data that came all the same is dropped with `reply`
  }
  if (!reply) {
    log::write(log::kError, " ***** No response to GetTechnology; cannot configure");
    return;
  }
  const std::optional<Value> parsed = plist::parse(*reply);
  if (!parsed || !parsed->isDictionary()) {
    log::write(log::kError, " ***** Could not parse reply to GetTechnology; cannot configure");
    return;
  }
  const Value* technology = parsed->asDictionary()->find(kGetTechnology);
  if (!technology || technology->isNull()) {
    log::write(log::kError, " ***** Reply to GetTechnology had no answer; cannot configure");
    return;
  }
  // A technology that is not a string equals none of the known ones.
  const std::string* name = technology->asString();
  if (!name) {
    _logGenerator = nullptr;
  } else if (environment_.generatorFromTechnology) {
    _logGenerator = environment_.generatorFromTechnology(*name);
  } else {
    _logGenerator = LogGenerator::generatorFromTechnology(*name);
  }
  log::printf(log::kError, "Got log generated: %s", log::pointerText(_logGenerator.get()).c_str());
}

std::optional<Bytes> CorvaneModel::ReceiveLogPacket(LocalMessagePort&, MessageId id, const Bytes& data,
                                                    CorvaneModel* model) {
  if (id == kPacketMessageId) model->updateWithData(data);
  return std::nullopt;
}

void CorvaneModel::LogPortInvalidated(MessagePort& port, CorvaneModel* model) {
  log::printf(log::kError, " ***** INVALIDATED %s *****", log::pointerText(&port).c_str());
  if (model) model->restartMonitor();
}

void CorvaneModel::TelephonyConnectionNotified(TelephonyConnection&, const std::string&, const Value&,
                                               CorvaneModel* model) {
  model->refresh();
}

// --- The monitor -------------------------------------------------------------

void CorvaneModel::restartMonitor() {
  destroyPorts();
  startMonitor();
}

void CorvaneModel::startMonitor() {
  if (_displayUpdateTimer != 0) return;  // already running

  if (!createPorts()) {
    log::write(log::kError, "Could not create the ports necessary");
    destroyPorts();
    scheduleRetry();
    return;
  }

  configureGenerator();
  if (!_logGenerator) {
    log::write(log::kError, "No log generator technology works");
    destroyPorts();
    scheduleRetry();
    return;
  }

  const std::optional<Bytes> start = serializeCommand(_logGenerator->getStartCommand());
  if (!start) {
    log::write(log::kError, " Could not generate PLIST");
    destroyPorts();
    scheduleRetry();
    return;
  }
  const std::int32_t status = _sendPort->sendRequest(kCommandMessageId, *start, kSendTimeout, 0.0, nullptr);
  if (status != kPortSuccess) {
    log::printf(log::kError, " ***** Could not send the START command (got error=%d)", status);
    destroyPorts();
    scheduleRetry();
    return;
  }

  log::write(log::kError, "Starting the display update timer");
  _displayUpdateTimer =
      environment_.runLoop.scheduleRepeatingTimer(kDisplayUpdateInterval, [weak = std::weak_ptr(self_)] {
        if (auto self = weak.lock()) (*self)->refresh();
      });
}

void CorvaneModel::scheduleRetry() {
  dispatchLater([](CorvaneModel& model) { model.startMonitor(); }, kRetryDelay);
}

void CorvaneModel::dispatchLater(std::function<void(CorvaneModel&)> task,
                                 std::optional<std::chrono::nanoseconds> delay) {
  auto run = [weak = std::weak_ptr(self_), task = std::move(task)] {
    if (auto self = weak.lock()) task(**self);
  };
  if (delay) {
    environment_.runLoop.dispatchAfter(*delay, std::move(run));
  } else {
    environment_.runLoop.dispatchAsync(std::move(run));
  }
}

// --- The display -------------------------------------------------------------

void CorvaneModel::refresh() {
  if (_sendPort && _recvPort && !_sendPort->isValid()) {
    // The service has gone. Invalidating the local port runs its invalidation
    // callback, which logs and restarts the monitor (and so stops this timer).
    std::shared_ptr<LocalMessagePort> port = _recvPort;
    port->invalidate();
  }
  if (!_updated) return;
  _updated = false;
  _nodes.reset();
  _nodesByPath.reset();
  dispatchLater(
      [](CorvaneModel& model) {
        if (model.delegate_) model.delegate_->updateViewControllerFromModel();
      },
      std::nullopt);
}

NodeRef CorvaneModel::topLevelNodes() {
  if (_nodes) return _nodes;
  if (!_logGenerator) return nullptr;
  const Value display = _logGenerator->generateLogUsingState(_state);
  auto paths = std::make_unique<PathDictionary>();
  _nodes = CorvaneModelNode::makeTreeFromObject(display, *paths);
  _nodesByPath = std::move(paths);
  return _nodes;
}

NodeRef CorvaneModel::nodeAtPath(const std::string& path) {
  if (!_nodesByPath) topLevelNodes();
  if (!_nodesByPath) return nullptr;
  auto it = _nodesByPath->find(path);
  return it == _nodesByPath->end() ? nullptr : it->second;
}

void CorvaneModel::updateWithData(const Bytes& data) {
  if (_logGenerator) _logGenerator->updateState(_state, data);
  _updated = true;
}

Value CorvaneModel::getSaveContents() {
  if (!_logGenerator) return Value();
  return _logGenerator->getSaveContentsFromState(_state);
}

}  // namespace corvane
