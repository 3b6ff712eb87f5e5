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
    "Usage: corvane-telephonyd [OPTION]...\n"
    "       corvane-telephonyd --replay FILE [--technology NAME] [--speed X | --as-fast-as-possible] [--loop]\n"
    "       corvane-telephonyd --diag DEVICE --technology NAME [--modem INDEX|PATH|IMEI]\n",
    "Serve network-monitor log channels to Corvane from the built-in simulator,\n"
    "from a capture file played back, or from a baseband's diagnostic port.\n"
    "\n"
    "  -t, --technology NAME  technology to simulate (default IFX); with --replay,\n"
    "                         the capture's (default: told by its log codes)\n"
    "  -s, --seed N           seed of the simulated scenario (default 1)\n"
    "  -r, --rate N           packets per second; 0 or \"max\": as fast as clients read (default 2)\n"
    "  -n, --packets N        stop sending to a channel after N packets (default: no limit)\n"
    "      --clock-start S    start the simulated clock of the log-code technologies'\n"
    "                         packet timestamps at S seconds since 1970-01-01 UTC\n"
    "                         (default: the time the service starts)\n"
    "      --replay FILE      play a capture instead of simulating: a DLF, a framed\n"
    "                         diagnostic stream, hex lines or a snapshot, as\n"
    "                         corvane-decode reads them, at the pace of its\n"
    "                         timestamps (a gap of more than 10 s, or a step back,\n"
    "                         is not waited for; packets without one, IFX reports,\n"
    "                         follow at --rate)\n"
    "      --speed X          play at X times the capture's pace (default 1)\n"
    "      --as-fast-as-possible\n"
    "                         play as fast as the clients take the packets\n"
    "      --loop             start the capture again after its end (default: play\n"
    "                         it once, then keep the channels open, sending nothing)\n"
    "      --diag DEVICE      bridge a baseband's diagnostic port (a USB serial tty,\n"
    "                         or a WWAN diagnostic device such as /dev/wwan0qcdm0):\n"
    "                         the log codes the channels ask for become its log\n"
    "                         mask, and its log records their packets; needs\n"
    "                         --technology, the decoder the baseband's codes are for;\n"
    "                         the extra codes come from ModemManager (system D-Bus)\n"
    "      --modem MODEM      with --diag: the ModemManager modem to report, by index,\n"
    "                         object path or IMEI (default: the one whose ports include\n"
    "                         DEVICE, else the only one)\n"
    "      --log-stderr       copy log lines to standard error\n"
    "  -h, --help             show this help and exit\n"
    "  -V, --version          show the version and exit\n"
    "\n"
    "IFX streams property-list reports. Quendra_GSM, Quendra_LTE, Quendra_UTRAN2 and\n"
    "Quendra_CDMA stream log records, only the codes that a channel's start command\n"
    "asks for: the extra codes 0 (SIM files), 1 (cell list) and 2 (PDP contexts), and\n"
    "the radio records of each technology (Quendra_CDMA: its eight 1x and EV-DO codes).\n"
    "A replay is played once for all channels, from the first start command on; a\n"
    "channel that starts later joins it where it is.\n"
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
      {"replay", 0, true},        {"speed", 0, true},         {"as-fast-as-possible", 0, false},
      {"loop", 0, false},         {"diag", 0, true},          {"modem", 0, true},
  };
  bool rateGiven = false;
  bool seedGiven = false;
  bool speedGiven = false;
  ParsedOptions parsed;
  const ParsedCommandLine commandLine =
      parseCommandLine(argc, argv, kOptions, [&](std::string_view name, const char* value) -> std::string {
        ServiceOptions& options = parsed.options;
        if (name == "technology") {
          options.technology = value;
          options.technologyGiven = true;
        }
        if (name == "seed" && !parseUnsigned(value, options.seed)) return "invalid seed '" + std::string(value) + "'";
        if (name == "seed") seedGiven = true;
        if (name == "replay") {
          if (!*value) return std::string("--replay needs a file");
          options.replay = value;
        }
        if (name == "speed") {
          if (!parseRate(value, options.speed) || options.speed == 0) {
            return "invalid speed '" + std::string(value) + "': give a factor above 0, such as 0.5 or 10";
          }
          speedGiven = true;
        }
        if (name == "as-fast-as-possible") options.asFastAsPossible = true;
        if (name == "loop") options.loop = true;
        if (name == "rate") rateGiven = true;
        if (name == "diag") {
          if (!*value) return std::string("--diag needs a device");
          options.diag = value;
        }
        if (name == "modem") {
          if (!*value) return std::string("--modem needs an index, an object path or an IMEI");
          options.modem = value;
        }
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

  const ServiceOptions& options = parsed.options;
  if (!options.modem.empty() && !options.diag) return failure("--modem is for --diag");
  if (options.diag) {
    if (options.replay) return failure("give --diag or --replay, not both");
    if (!options.technologyGiven) {
      return failure("--diag needs --technology NAME: the baseband does not say which decoder its log codes are for");
    }
    if (options.technology == kLogChannelTechnologyIFX) {
      return failure("--diag bridges log-code basebands; IFX is not one");
    }
    if (seedGiven || options.clockStart || rateGiven) {
      return failure(std::string(seedGiven ? "--seed" : options.clockStart ? "--clock-start" : "--rate") +
                     " is for the simulator, not for --diag");
    }
  }
  if (!options.replay) {
    if (speedGiven) return failure("--speed is for --replay");
    if (options.asFastAsPossible) return failure("--as-fast-as-possible is for --replay");
    if (options.loop) return failure("--loop is for --replay");
  } else {
    if (speedGiven && options.asFastAsPossible) return failure("give --speed or --as-fast-as-possible, not both");
    if (seedGiven) return failure("--seed is for the simulator, not for --replay");
    if (options.clockStart) return failure("--clock-start is for the simulator, not for --replay");
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
