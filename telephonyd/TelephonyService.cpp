#include "telephonyd/TelephonyService.h"

#include <poll.h>

#include <QUuid>
#include <algorithm>
#include <chrono>
#include <cmath>
#include <limits>
#include <utility>

#include "platform/Log.h"
#include "platform/PropertyList.h"
#include "platform/SocketTelephonyClient.h"

namespace corvane::telephonyd {

namespace {

using namespace std::chrono_literals;

// A client that asked for a channel but never connects to it is given up.
constexpr auto kConnectDeadline = 10s;
// Packets waiting for a slow client, per channel. At a paced rate the oldest
// are dropped beyond this; at full speed production waits instead.
constexpr std::size_t kQueueLimit = 8192;
// At full speed new packets are made when every streaming channel's queue has
// fallen below this, in batches of this size.
constexpr std::size_t kFullSpeedBatch = 1024;
// Longest stretch of full-speed streaming before the run loop gets its turn
// (new channels, commands and signals).
constexpr auto kFullSpeedSlice = 5ms;
// Most packets made in one paced tick after the loop was held up.
constexpr std::uint64_t kMaximumCatchUp = 10000;
// A live source's packets that a client could not take yet are offered again after this.
constexpr auto kLiveFlushRetry = 5ms;
// Messages handed to one batched send.
constexpr std::size_t kMessagesPerFlush = 2048;

Bytes serviceReply(std::int32_t domain, std::int32_t code, const std::string& remotePortName) {
  Dictionary fields;
  fields.set(kTelephonyKeyErrorDomain, Value::integer(domain));
  fields.set(kTelephonyKeyErrorCode, Value::integer(code));
  if (!remotePortName.empty()) fields.set(kTelephonyKeyRemotePortName, Value(remotePortName));
  return plist::serializeOrThrow(Value(fields), plist::Format::XML);
}

}  // namespace

TelephonyService::TelephonyService(SocketPortSystem& ports, RunLoop& runLoop, std::unique_ptr<PacketSource> source,
                                   Settings settings)
    : ports_(ports), runLoop_(runLoop), source_(std::move(source)), settings_(settings) {
  if (source_->isLive()) {
    std::weak_ptr<bool> alive = alive_;
    source_->setArrivalHandler([this, alive] {
      if (!alive.expired()) produceLive();
    });
  }
  if (source_->keepsTime()) {
    pacer_ = std::make_unique<PacketPacer>(
        runLoop_, *source_,
        [this](const SourcePacket& packet) {
          for (auto& [name, channel] : channels_) offer(*channel, packet);
        },
        [this] {
          for (auto& [name, channel] : channels_) flush(*channel);
          if (!anyoneStreaming()) pacer_->pause();
        });
  }
}

TelephonyService::~TelephonyService() {
  stop();
  *alive_ = false;
  modemExtraCodes_.reset();
}

bool TelephonyService::start(std::string& error) {
  // A process that was killed leaves its socket files behind (a service its
  // channels', a client its own port); nothing else would ever remove them.
  if (const auto stale = ports_.removeStaleSocketFiles(); !stale.empty()) {
    log::printf(log::kNotice, "Removed %zu socket files that nobody listened on, left by processes that were killed",
                stale.size());
  }
  servicePort_ = ports_.createSocketLocalPort(
      std::string(kTelephonyServicePortName),
      [this](LocalMessagePort&, MessageId id, const Bytes& data) { return handleServiceRequest(id, data); }, &error);
  if (!servicePort_) return false;
  servicePort_->scheduleOn(runLoop_);
  return true;
}

void TelephonyService::stop() {
  std::vector<std::string> names;
  for (const auto& [name, channel] : channels_) names.push_back(name);
  for (const auto& name : names) endChannel(name, "the service is stopping");
  if (pacedTimer_) runLoop_.cancel(pacedTimer_);
  pacedTimer_ = 0;
  if (pacer_) pacer_->pause();
  if (servicePort_) {
    servicePort_->invalidate();
    servicePort_.reset();
  }
}

std::optional<Bytes> TelephonyService::handleServiceRequest(MessageId id, const Bytes& data) {
  if (id != kTelephonyCreateLogChannelMessage) {
    log::printf(log::kError, "Service request with unknown message id %d refused", id);
    return serviceReply(kTelephonyDomainService, kTelephonyErrorBadRequest, {});
  }
  const auto request = plist::parse(data);
  const Dictionary* fields = request ? request->asDictionary() : nullptr;
  const Value* clientPort = fields ? fields->find(kTelephonyKeyLocalPortName) : nullptr;
  if (!clientPort || !clientPort->asString()) {
    log::printf(log::kError, "Log-channel request without a local port name refused");
    return serviceReply(kTelephonyDomainService, kTelephonyErrorBadRequest, {});
  }
  const std::string& clientPortName = *clientPort->asString();
  if (!SocketPortSystem::isValidPortName(clientPortName)) {
    log::printf(log::kError, "Log-channel request for the unusable port name \"%s\" refused", clientPortName.c_str());
    return serviceReply(kTelephonyDomainService, kTelephonyErrorBadPortName, {});
  }

  auto channel = std::make_unique<Channel>();
  channel->name = std::string(kTelephonyServicePortName) + ".channel." +
                  QUuid::createUuid().toString(QUuid::WithoutBraces).toStdString();
  channel->clientPortName = clientPortName;
  std::string error;
  const std::string name = channel->name;
  channel->commandPort = ports_.createSocketLocalPort(
      name, [this, name](LocalMessagePort&, MessageId, const Bytes& command) { return handleCommand(name, command); },
      &error);
  if (!channel->commandPort) {
    log::printf(log::kError, "Could not open a log channel for %s: %s", clientPortName.c_str(), error.c_str());
    return serviceReply(kTelephonyDomainService, kTelephonyErrorChannelUnavailable, {});
  }
  channel->commandPort->setConnectionCallback([this, name](SocketLocalPort&, std::size_t open) {
    auto it = channels_.find(name);
    if (it == channels_.end()) return;
    Channel& c = *it->second;
    if (open > 0) {
      c.connected = true;
      if (c.connectDeadline) runLoop_.cancel(c.connectDeadline);
      c.connectDeadline = 0;
    } else if (c.connected) {
      endChannelSoon(c, "its client closed the channel");
    }
  });
  channel->commandPort->scheduleOn(runLoop_);
  std::weak_ptr<bool> alive = alive_;
  channel->connectDeadline = runLoop_.dispatchAfter(kConnectDeadline, [this, alive, name] {
    if (alive.expired()) return;
    auto it = channels_.find(name);
    if (it != channels_.end() && !it->second->connected) endChannel(name, "its client never connected");
  });
  log::printf(log::kNotice, "Log channel %s opened for %s", name.c_str(), clientPortName.c_str());
  channels_.emplace(name, std::move(channel));
  return serviceReply(0, 0, name);
}

std::optional<Bytes> TelephonyService::handleCommand(const std::string& channelName, const Bytes& data) {
  auto it = channels_.find(channelName);
  if (it == channels_.end() || it->second->ending) return std::nullopt;
  Channel& channel = *it->second;
  const auto command = plist::parse(data);
  const Dictionary* fields = command ? command->asDictionary() : nullptr;
  if (!fields) {
    log::printf(log::kError, "Channel %s: a command that is not a property-list dictionary was ignored",
                channelName.c_str());
    return std::nullopt;
  }
  if (fields->contains("GetTechnology")) {
    Dictionary answer;
    answer.set("GetTechnology", Value(source_->technology()));
    return plist::serializeOrThrow(Value(answer), plist::Format::XML);
  }
  if (const Value* state = fields->find("SetState")) {
    if (state->asString() && *state->asString() == "Streaming") {
      startStreaming(channel, *fields);
    } else {
      channel.streaming = false;
      channel.queue.clear();
      log::printf(log::kNotice, "Channel %s: streaming stopped", channelName.c_str());
      updateWantedCodes();
    }
    return std::nullopt;
  }
  log::printf(log::kError, "Channel %s: unknown command ignored", channelName.c_str());
  return std::nullopt;
}

void TelephonyService::startStreaming(Channel& channel, const Dictionary& command) {
  channel.filter = PacketFilter::fromStartCommand(command);
  if (!channel.delivery) {
    std::string error;
    channel.delivery = ports_.createSocketRemotePort(channel.clientPortName, &error);
    if (!channel.delivery) {
      log::printf(log::kError, "Channel %s: cannot reach the client's port: %s", channel.name.c_str(), error.c_str());
      endChannelSoon(channel, "its client's port is not reachable");
      return;
    }
  }
  channel.streaming = true;
  log::printf(log::kNotice, "Channel %s: streaming to %s", channel.name.c_str(), channel.clientPortName.c_str());
  updateWantedCodes();
  ensureProduction();
}

void TelephonyService::endChannelSoon(Channel& channel, std::string reason) {
  // Not at once: this may be running inside one of the channel's own port callbacks.
  if (channel.ending) return;
  channel.ending = true;
  channel.streaming = false;
  updateWantedCodes();
  std::weak_ptr<bool> alive = alive_;
  runLoop_.dispatchAsync([this, alive, name = channel.name, reason = std::move(reason)] {
    if (!alive.expired()) endChannel(name, reason);
  });
}

void TelephonyService::endChannel(const std::string& name, const std::string& reason) {
  auto it = channels_.find(name);
  if (it == channels_.end()) return;
  std::unique_ptr<Channel> channel = std::move(it->second);
  channels_.erase(it);
  if (channel->connectDeadline) runLoop_.cancel(channel->connectDeadline);
  channel->commandPort->setConnectionCallback(nullptr);
  channel->commandPort->invalidate();
  if (channel->delivery) channel->delivery->invalidate();
  if (channel->dropped > 0) {
    log::printf(log::kWarning, "Channel %s: %llu packets were dropped for a slow client", name.c_str(),
                static_cast<unsigned long long>(channel->dropped));
  }
  log::printf(log::kNotice, "Log channel %s closed: %s", name.c_str(), reason.c_str());
  updateWantedCodes();
}

void TelephonyService::setModemExtraCodes(std::unique_ptr<ModemExtraCodes> extraCodes) {
  modemExtraCodes_ = std::move(extraCodes);
  modemExtraCodes_->setEmitter([this](const SourcePacket& packet) {
    for (auto& [name, channel] : channels_) {
      offer(*channel, packet);
      flush(*channel);
    }
  });
}

void TelephonyService::updateWantedCodes() {
  std::set<std::uint32_t> codes;
  std::set<std::uint32_t> extraCodes;
  for (const auto& [name, channel] : channels_) {
    if (!channel->streaming) continue;
    codes.insert(channel->filter.logCodes().begin(), channel->filter.logCodes().end());
    extraCodes.insert(channel->filter.extraCodes().begin(), channel->filter.extraCodes().end());
  }
  source_->setWantedCodes(codes);
  if (modemExtraCodes_) modemExtraCodes_->setWantedCodes(extraCodes);
}

void TelephonyService::produceLive() {
  produce(std::numeric_limits<std::uint64_t>::max());
  bool waiting = false;
  for (auto& [name, channel] : channels_) {
    flush(*channel);
    waiting = waiting || (!channel->queue.empty() && !channel->ending);
  }
  // A client that is full now gets the rest soon, whether or not more comes.
  if (waiting && !liveFlushScheduled_) {
    liveFlushScheduled_ = true;
    std::weak_ptr<bool> alive = alive_;
    runLoop_.dispatchAfter(kLiveFlushRetry, [this, alive] {
      if (alive.expired()) return;
      liveFlushScheduled_ = false;
      produceLive();
    });
  }
}

bool TelephonyService::anyoneStreaming() const {
  return std::any_of(channels_.begin(), channels_.end(), [](const auto& entry) { return entry.second->streaming; });
}

bool TelephonyService::wantsMore(const Channel& channel) const {
  return channel.streaming && (settings_.packetLimit == 0 || channel.accepted < settings_.packetLimit);
}

void TelephonyService::offer(Channel& channel, const SourcePacket& packet) {
  if (!wantsMore(channel) || !channel.filter.accepts(packet)) return;
  if (channel.queue.size() >= kQueueLimit) {
    channel.queue.pop_front();
    if (channel.dropped++ == 0) {
      log::printf(log::kWarning, "Channel %s: client is not keeping up; dropping its oldest packets",
                  channel.name.c_str());
    }
  }
  channel.queue.push_back(packet.data);
  ++channel.accepted;
}

bool TelephonyService::flush(Channel& channel) {
  bool progress = false;
  while (!channel.queue.empty() && !channel.ending) {
    outgoing_.clear();
    const std::size_t count = std::min(channel.queue.size(), kMessagesPerFlush);
    for (std::size_t i = 0; i < count; ++i) outgoing_.push_back({0, *channel.queue[i]});
    std::int32_t status = kPortSuccess;
    const std::size_t sent = channel.delivery->sendWithoutWaiting(outgoing_, status);
    channel.queue.erase(channel.queue.begin(), channel.queue.begin() + static_cast<std::ptrdiff_t>(sent));
    progress = progress || sent > 0;
    if (status != kPortSuccess) {
      channel.queue.clear();
      endChannelSoon(channel, "its client's port has gone");
      break;
    }
    if (sent < count) break;  // the socket is full for now
  }
  return progress;
}

void TelephonyService::retryProductionSoon() {
  if (pumpScheduled_) return;
  pumpScheduled_ = true;
  std::weak_ptr<bool> alive = alive_;
  runLoop_.dispatchAfter(PacketPacer::kRetry, [this, alive] {
    if (!alive.expired()) pumpAtFullSpeed();
  });
}

void TelephonyService::ensureProduction() {
  if (sourceEnded_ || source_->isLive()) return;  // a live source's packets are taken as they come
  if (pacer_) {
    pacer_->resume();
    return;
  }
  if (settings_.rate > 0) {
    if (pacedTimer_) return;
    pacedStart_ = runLoop_.now();
    pacedProduced_ = 0;
    const auto interval = std::max<RunLoop::Duration>(
        1ms, std::chrono::duration_cast<RunLoop::Duration>(std::chrono::duration<double>(1.0 / settings_.rate)));
    std::weak_ptr<bool> alive = alive_;
    pacedTimer_ = runLoop_.scheduleRepeatingTimer(interval, [this, alive] {
      if (!alive.expired()) producePaced();
    });
    producePaced();  // the first packet at once, not one interval later
    return;
  }
  if (pumpScheduled_) return;
  pumpScheduled_ = true;
  std::weak_ptr<bool> alive = alive_;
  runLoop_.dispatchAsync([this, alive] {
    if (!alive.expired()) pumpAtFullSpeed();
  });
}

void TelephonyService::producePaced() {
  if (!anyoneStreaming()) {
    runLoop_.cancel(pacedTimer_);
    pacedTimer_ = 0;
    return;
  }
  const double elapsed = std::chrono::duration<double>(runLoop_.now() - pacedStart_).count();
  const auto due = static_cast<std::uint64_t>(std::floor(elapsed * settings_.rate)) + 1;
  std::uint64_t count = due > pacedProduced_ ? due - pacedProduced_ : 0;
  if (count > kMaximumCatchUp) {
    // Held up for long (a suspended process): resume the pace instead of flooding.
    pacedProduced_ = due - kMaximumCatchUp;
    count = kMaximumCatchUp;
  }
  // A source that has nothing yet makes up for it at the next tick.
  pacedProduced_ += produce(count);
  for (auto& [name, channel] : channels_) flush(*channel);
  if (sourceEnded_) {
    runLoop_.cancel(pacedTimer_);
    pacedTimer_ = 0;
  }
}

std::uint64_t TelephonyService::produce(std::uint64_t most) {
  std::uint64_t made = 0;
  for (; made < most; ++made) {
    const PacketSource::Availability availability = source_->availability();
    if (availability != PacketSource::Availability::Ready) {
      sourceEnded_ = availability == PacketSource::Availability::Ended;
      break;
    }
    const SourcePacket packet = source_->nextPacket();
    for (auto& [name, channel] : channels_) offer(*channel, packet);
  }
  return made;
}

void TelephonyService::pumpAtFullSpeed() {
  pumpScheduled_ = false;
  const auto sliceEnd = std::chrono::steady_clock::now() + kFullSpeedSlice;
  for (;;) {
    bool progress = false;
    for (auto& [name, channel] : channels_) progress = flush(*channel) || progress;
    if (std::chrono::steady_clock::now() >= sliceEnd) break;

    // Production waits for the slowest streaming channel, so that nobody loses a packet.
    bool anyWanting = false;
    std::size_t shortestQueue = kQueueLimit;
    std::vector<pollfd> blocked;
    for (auto& [name, channel] : channels_) {
      if (channel->ending || !channel->streaming) continue;
      if (wantsMore(*channel)) {
        anyWanting = true;
        shortestQueue = std::min(shortestQueue, channel->queue.size());
      }
      if (!channel->queue.empty()) blocked.push_back({channel->delivery->descriptor(), POLLOUT, 0});
    }
    if (!anyWanting && blocked.empty()) return;  // nothing left to send: stop until a new start
    if (anyWanting && shortestQueue < kFullSpeedBatch && !sourceEnded_) {
      if (produce(kFullSpeedBatch) > 0) continue;
      if (blocked.empty()) {
        // The source has nothing yet (or has ended, and stays so).
        if (!sourceEnded_) retryProductionSoon();
        return;
      }
    } else if (blocked.empty()) {
      return;  // the source has ended and everything has gone
    }
    const auto now = std::chrono::steady_clock::now();
    if (!progress && !blocked.empty()) {
      // Every client is full: sleep until one can take more (or the slice ends).
      const auto wait = std::chrono::ceil<std::chrono::milliseconds>(sliceEnd - now).count();
      ::poll(blocked.data(), blocked.size(), static_cast<int>(wait));
    }
  }
  ensureProduction();
}

}  // namespace corvane::telephonyd
