#pragma once

// The telephony service: hands out network-monitor log channels on its
// well-known port, answers each channel's commands on the channel's own
// command port, and streams the packet source's packets to the client's local
// port once the client has sent its start command.
//
// A channel ends when its client closes the command port, when delivery finds
// the client's port gone, or when nobody connects to a new channel in time; the
// other channels are not affected.

#include <cstdint>
#include <deque>
#include <map>
#include <set>
#include <memory>
#include <string>

#include "platform/RunLoop.h"
#include "platform/SocketMessagePort.h"
#include "telephonyd/ModemExtraCodes.h"
#include "telephonyd/PacketPacer.h"
#include "telephonyd/PacketSource.h"

namespace corvane::telephonyd {

class TelephonyService {
 public:
  struct Settings {
    // Packets per second; 0 as fast as the clients read. A source that keeps
    // its own time (a replayed capture) is paced by it instead.
    double rate = 2.0;
    std::uint64_t packetLimit = 0;   // per channel; 0 for no limit
  };

  // The ports and the run loop must outlive the service.
  TelephonyService(SocketPortSystem& ports, RunLoop& runLoop, std::unique_ptr<PacketSource> source, Settings settings);
  ~TelephonyService();
  TelephonyService(const TelephonyService&) = delete;
  TelephonyService& operator=(const TelephonyService&) = delete;

  // Removes the socket files in the runtime directory that nobody listens on,
  // then opens the well-known port; false with a one-line reason when that
  // fails (for instance because another service is serving it).
  bool start(std::string& error);
  // Ends every channel and closes the well-known port, removing the socket files.
  void stop();

  std::size_t channelCount() const { return channels_.size(); }

  // The extra codes of a real modem, sent beside a live source's packets to
  // the channels that ask for them. Before start().
  void setModemExtraCodes(std::unique_ptr<ModemExtraCodes> extraCodes);

 private:
  struct Channel {
    std::string name;  // of its command port
    std::string clientPortName;
    std::shared_ptr<SocketLocalPort> commandPort;
    std::shared_ptr<SocketRemotePort> delivery;
    PacketFilter filter;
    bool streaming = false;
    bool connected = false;
    bool ending = false;
    std::deque<std::shared_ptr<const Bytes>> queue;
    std::uint64_t accepted = 0;  // packets taken for this channel, counted against the limit
    std::uint64_t dropped = 0;
    RunLoop::Handle connectDeadline = 0;
  };

  std::optional<Bytes> handleServiceRequest(MessageId id, const Bytes& data);
  std::optional<Bytes> handleCommand(const std::string& channelName, const Bytes& data);
  void startStreaming(Channel& channel, const Dictionary& command);
  void endChannelSoon(Channel& channel, std::string reason);
  void endChannel(const std::string& name, const std::string& reason);

  bool wantsMore(const Channel& channel) const;
  void offer(Channel& channel, const SourcePacket& packet);
  // Sends what the channel's socket takes now; true when something went.
  bool flush(Channel& channel);
  void ensureProduction();
  // Takes up to `most` packets from the source, offering each to every
  // channel; fewer when the source has no more for now.
  std::uint64_t produce(std::uint64_t most);
  void retryProductionSoon();
  // Takes what a live source has, and sends it.
  void produceLive();
  // Tells the source which log codes the streaming channels want, and the
  // modem's extra codes which of theirs.
  void updateWantedCodes();
  void producePaced();
  void pumpAtFullSpeed();
  bool anyoneStreaming() const;

  SocketPortSystem& ports_;
  RunLoop& runLoop_;
  std::unique_ptr<PacketSource> source_;
  Settings settings_;
  std::unique_ptr<ModemExtraCodes> modemExtraCodes_;
  std::shared_ptr<SocketLocalPort> servicePort_;
  std::map<std::string, std::unique_ptr<Channel>> channels_;
  // Work queued on the run loop checks this, so that none of it runs after the service is gone.
  std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);

  // A source that keeps its own time is played by its timestamps, whatever the rate.
  std::unique_ptr<PacketPacer> pacer_;
  bool sourceEnded_ = false;
  bool liveFlushScheduled_ = false;
  RunLoop::Handle pacedTimer_ = 0;
  RunLoop::Duration pacedStart_{};
  std::uint64_t pacedProduced_ = 0;
  bool pumpScheduled_ = false;
  std::vector<SocketRemotePort::OutgoingMessage> outgoing_;
};

}  // namespace corvane::telephonyd
