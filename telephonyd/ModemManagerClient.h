#pragma once

// The phone's own telephony state from ModemManager over the system D-Bus
// (libmm-glib): the SIM and own numbers, the cell information and the bearers
// and 3GPP profiles of one modem (ModemClient.h).
//
// The client runs its GLib main context on a thread of its own, so the packet
// stream never waits for D-Bus; what it learns is handed to the service's run
// loop through a descriptor the loop watches. It follows ModemManager
// appearing and vanishing, modems being added and removed and the chosen
// modem's state, SIM and bearers changing. Without a system bus, without
// ModemManager or without a modem that fits, it says so once in the log,
// reports nothing, and picks the modem up when it comes.

#include <memory>
#include <string>

#include "platform/RunLoop.h"
#include "telephonyd/ModemClient.h"

namespace corvane::telephonyd {

class ModemManagerClient final : public ModemClient {
 public:
  struct Settings {
    // --modem: an index, an object path or an IMEI; empty for the default
    // (modem::chooseModem).
    std::string modem;
    // --diag: the default modem is the one with this device among its ports.
    std::string diagDevice;
  };

  // Starts the client's thread. The run loop must outlive the client.
  ModemManagerClient(RunLoop& loop, Settings settings);
  ~ModemManagerClient() override;
  ModemManagerClient(const ModemManagerClient&) = delete;
  ModemManagerClient& operator=(const ModemManagerClient&) = delete;

  void setChangeHandler(std::function<void(Part)> changed) override;
  void refresh(Part part) override;
  std::optional<modem::SimState> sim() const override;
  std::optional<std::vector<modem::Fields>> cells() const override;
  std::optional<Contexts> contexts() const override;

 private:
  struct Impl;
  std::unique_ptr<Impl> impl_;
};

}  // namespace corvane::telephonyd
