#include "telephonyd/ServiceOptions.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdlib>

#include "platform/CommandLine.h"
#include "platform/LogChannelTechnology.h"

namespace corvane::telephonyd {

namespace {

// Far enough for any capture, and far from overflowing a microsecond count.
constexpr std::uint64_t kLatestClockStart = 100'000'000'000;  // in the year 5138

ParsedOptions failure(std::string error) {
  ParsedOptions parsed;
  parsed.exit = true;
  parsed.exitCode = kExitUsage;
  parsed.error = std::move(error) + " (see --help)";
  return parsed;
}

bool parseUnsigned(const char* text, std::uint64_t& value) {
  if (!text || !*text || *text == '-' || *text == '+') return false;
  char* end = nullptr;
  errno = 0;
  const unsigned long long parsed = std::strtoull(text, &end, 10);
  if (errno != 0 || *end != '\0') return false;
  value = parsed;
  return true;
}

bool parseRate(const char* text, double& rate) {
  if (std::string_view(text) == "max") {
    rate = 0;
    return true;
  }
  char* end = nullptr;
  errno = 0;
  const double parsed = std::strtod(text, &end);
  if (errno != 0 || end == text || *end != '\0' || !std::isfinite(parsed) || parsed < 0) return false;
  rate = parsed;
  return true;
}

const ProgramUsage kProgram{
    "corvane-telephonyd",
    "Usage: corvane-telephonyd [OPTION]...\n",
    "Serve network-monitor log channels to Corvane from the built-in simulator.\n"
    "\n"
    "  -t, --technology NAME  technology to simulate (default IFX)\n"
    "  -s, --seed N           seed of the simulated scenario (default 1)\n"
    "  -r, --rate N           packets per second; 0 or \"max\": as fast as clients read (default 2)\n"
    "  -n, --packets N        stop sending to a channel after N packets (default: no limit)\n"
    "      --clock-start S    start the simulated clock of the log-code technologies'\n"
    "                         packet timestamps at S seconds since 1970-01-01 UTC\n"
    "                         (default: the time the service starts)\n"
    "      --log-stderr       copy log lines to standard error\n"
    "  -h, --help             show this help and exit\n"
    "  -V, --version          show the version and exit\n"
    "\n"
    "IFX streams property-list reports. Quendra_GSM, Quendra_LTE, Quendra_UTRAN2 and\n"
    "Quendra_CDMA stream log records, only the codes that a channel's start command\n"
    "asks for: the extra codes 0 (SIM files), 1 (cell list) and 2 (PDP contexts), and\n"
    "the radio records of each technology (Quendra_CDMA: its eight 1x and EV-DO codes).\n"
    "\n"
    "Sockets live in $CORVANE_RUNTIME_DIR, else $XDG_RUNTIME_DIR/corvane, else /tmp/corvane-$UID.\n"
    "SIGTERM or SIGINT stop the service and remove its sockets.\n",
};

}  // namespace

std::string serviceUsage() { return helpText(kProgram); }

ParsedOptions parseServiceOptions(int argc, char** argv) {
  static constexpr CommandLineOption kOptions[] = {
      {"technology", 't', true},  {"seed", 's', true},        {"rate", 'r', true},
      {"packets", 'n', true},     {"clock-start", 0, true},   {"log-stderr", 0, false},
  };
  ParsedOptions parsed;
  const ParsedCommandLine commandLine =
      parseCommandLine(argc, argv, kOptions, [&](std::string_view name, const char* value) -> std::string {
        ServiceOptions& options = parsed.options;
        if (name == "technology") options.technology = value;
        if (name == "seed" && !parseUnsigned(value, options.seed)) return "invalid seed '" + std::string(value) + "'";
        if (name == "rate" && !parseRate(value, options.rate)) {
          return "invalid rate '" + std::string(value) + "': give packets per second, or 0 or max";
        }
        if (name == "packets" && !parseUnsigned(value, options.packetLimit)) {
          return "invalid packet count '" + std::string(value) + "'";
        }
        if (name == "clock-start") {
          std::uint64_t seconds = 0;
          // Microseconds since 1970 must fit the 64-bit timestamp for a long while yet.
          if (!parseUnsigned(value, seconds) || seconds > kLatestClockStart) {
            return "invalid clock start '" + std::string(value) + "': give seconds since 1970-01-01 UTC";
          }
          options.clockStart = seconds;
        }
        if (name == "log-stderr") options.logToStandardError = true;
        return {};
      });
  switch (commandLine.request) {
    case ParsedCommandLine::Request::Run:
      break;
    case ParsedCommandLine::Request::Help:
      parsed.exit = true;
      parsed.output = serviceUsage();
      return parsed;
    case ParsedCommandLine::Request::Version:
      parsed.exit = true;
      parsed.output = versionText(kProgram.name);
      return parsed;
    case ParsedCommandLine::Request::UsageError:
      return failure(commandLine.error);
  }

  const auto& known = kAllLogChannelTechnologies;
  if (std::find(known.begin(), known.end(), parsed.options.technology) == known.end()) {
    std::string names;
    for (auto name : known) names += (names.empty() ? "" : ", ") + std::string(name);
    return failure("unknown technology '" + parsed.options.technology + "' (known: " + names + ")");
  }
  return parsed;
}

}  // namespace corvane::telephonyd
