#pragma once

// The command line of corvane-telephonyd.

#include <cstdint>
#include <optional>
#include <string>

namespace corvane::telephonyd {

struct ServiceOptions {
  std::string technology = "IFX";
  std::uint64_t seed = 1;
  // Packets per second; 0 streams as fast as the clients take them.
  double rate = 2.0;
  // Packets per channel before the service stops sending to it; 0 for no limit.
  std::uint64_t packetLimit = 0;
  // Log-code scenarios: seconds since 1970-01-01 UTC on the simulated clock
  // when the scenario starts; none for the time the service starts.
  std::optional<std::uint64_t> clockStart;
  bool logToStandardError = false;
  // Whether --technology was given (else the default, or a replayed capture's own).
  bool technologyGiven = false;

  // A capture to play instead of the simulator.
  std::optional<std::string> replay;
  // Of the capture's own pace; ignored at full speed.
  double speed = 1.0;
  bool asFastAsPossible = false;
  bool loop = false;

  // A baseband's diagnostic port to bridge instead of simulating.
  std::optional<std::string> diag;
  // With --diag: the modem whose SIM, cells and contexts ModemManager reports
  // (an index, an object path or an IMEI); empty for the default.
  std::string modem;
};

struct ParsedOptions {
  ServiceOptions options;
  bool exit = false;   // true: print and exit with exitCode instead of running
  int exitCode = 0;
  std::string output;  // for standard output (help, version)
  std::string error;   // one line for standard error, without the program name
};

ParsedOptions parseServiceOptions(int argc, char** argv);

std::string serviceUsage();

}  // namespace corvane::telephonyd
