#pragma once

// The service's extra codes from a real modem (ModemClient.h), sent while a
// streaming channel asks for them:
//   0xFF0000  the SIM files, every kSimFilesEvery and as soon as they change
//   0xFF0001  the cell list, read from the modem once every kCellsEvery
//   0xFF0002  the PDP contexts, every kContextsEvery and as soon as they change
// Each is sent at once when a channel starts asking for it, once the modem
// has told it. While no modem is known nothing is sent.

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <set>
#include <utility>

#include "platform/RunLoop.h"
#include "telephonyd/ModemClient.h"
#include "telephonyd/PacketSource.h"

namespace corvane::telephonyd {

class ModemExtraCodes {
 public:
  static constexpr std::chrono::seconds kCellsEvery{1};
  static constexpr std::chrono::seconds kContextsEvery{5};
  static constexpr std::chrono::seconds kSimFilesEvery{10};

  // The run loop must outlive this.
  ModemExtraCodes(RunLoop& loop, std::unique_ptr<ModemClient> client);
  ~ModemExtraCodes();
  ModemExtraCodes(const ModemExtraCodes&) = delete;
  ModemExtraCodes& operator=(const ModemExtraCodes&) = delete;

  // Where the packets go (the service offers them to its channels).
  void setEmitter(std::function<void(const SourcePacket&)> emitter) { emit_ = std::move(emitter); }
  // The extra codes the streaming channels ask for, each less 0xFF0000.
  void setWantedCodes(const std::set<std::uint32_t>& extraCodes);

 private:
  void tick();
  void onChange(ModemClient::Part part);
  void send(ModemClient::Part part);
  bool wants(ModemClient::Part part) const;

  RunLoop& loop_;
  std::unique_ptr<ModemClient> client_;
  std::function<void(const SourcePacket&)> emit_;
  std::set<std::uint32_t> wanted_;
  RunLoop::Handle timer_ = 0;
  std::uint64_t ticks_ = 0;
  // Work queued on the run loop holds a weak copy: it does nothing once this is gone.
  std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace corvane::telephonyd
