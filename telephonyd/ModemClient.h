#pragma once

// What the service knows of the phone's modem from its telephony stack
// (ModemManager on Linux, ModemManagerClient.h): the SIM, the cells and the
// packet data contexts. The service depends on this interface only, never on
// the library behind it.

#include <functional>
#include <optional>
#include <vector>

#include "telephonyd/ModemManagerMapping.h"

namespace corvane::telephonyd {

class ModemClient {
 public:
  enum class Part { Sim, Cells, Contexts };

  virtual ~ModemClient() = default;

  // Called on the service's run loop with the part that has changed; for the
  // cells, each time they have been read again, changed or not. Also when the
  // modem goes away (the parts are then unknown). Set before anything is asked.
  virtual void setChangeHandler(std::function<void(Part)> changed) = 0;
  // Asks the modem for the part again (the cells and the profiles are read on
  // request, not watched); the change handler tells when it is there. Never waits.
  virtual void refresh(Part part) = 0;

  // The latest state of each part; nothing while no modem is known (or the
  // part was not read yet).
  virtual std::optional<modem::SimState> sim() const = 0;
  virtual std::optional<std::vector<modem::Fields>> cells() const = 0;
  struct Contexts {
    std::vector<modem::Profile> profiles;
    std::vector<modem::Bearer> bearers;
  };
  virtual std::optional<Contexts> contexts() const = 0;
};

}  // namespace corvane::telephonyd
