#include "telephonyd/ServiceOptions.h"

#include <getopt.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdlib>

#include "platform/LogChannelTechnology.h"
#include "platform/Version.h"

namespace corvane::telephonyd {

namespace {

// Far enough for any capture, and far from overflowing a microsecond count.
constexpr std::uint64_t kLatestClockStart = 100'000'000'000;  // in the year 5138

ParsedOptions failure(std::string error) {
  ParsedOptions parsed;
  parsed.exit = true;
  parsed.exitCode = 2;
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

}  // namespace

std::string serviceUsage() {
  return "Usage: corvane-telephonyd [OPTION]...\n"
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
         "IFX streams property-list reports. Quendra_GSM, Quendra_LTE and Quendra_UTRAN2\n"
         "stream log records, only the codes that a channel's start command asks for:\n"
         "so far the extra codes 0 (SIM files), 1 (cell list) and 2 (PDP contexts).\n"
         "\n"
         "Sockets live in $CORVANE_RUNTIME_DIR, else $XDG_RUNTIME_DIR/corvane, else /tmp/corvane-$UID.\n"
         "SIGTERM or SIGINT stop the service and remove its sockets.\n";
}

ParsedOptions parseServiceOptions(int argc, char** argv) {
  enum { kLogStderr = 1000, kClockStart };
  static const option kLongOptions[] = {
      {"technology", required_argument, nullptr, 't'}, {"seed", required_argument, nullptr, 's'},
      {"rate", required_argument, nullptr, 'r'},       {"packets", required_argument, nullptr, 'n'},
      {"log-stderr", no_argument, nullptr, kLogStderr}, {"clock-start", required_argument, nullptr, kClockStart},
      {"help", no_argument, nullptr, 'h'},             {"version", no_argument, nullptr, 'V'},
      {nullptr, 0, nullptr, 0}};

  ParsedOptions parsed;
  // getopt keeps its state in globals: start afresh, and report errors ourselves.
  optind = 0;
  opterr = 0;
  for (;;) {
    const int previous = optind == 0 ? 1 : optind;
    const int option = getopt_long(argc, argv, ":t:s:r:n:hV", kLongOptions, nullptr);
    if (option == -1) break;
    const std::string given = previous < argc ? argv[previous] : "";
    switch (option) {
      case 't':
        parsed.options.technology = optarg;
        break;
      case 's':
        if (!parseUnsigned(optarg, parsed.options.seed)) return failure("invalid seed '" + std::string(optarg) + "'");
        break;
      case 'r':
        if (!parseRate(optarg, parsed.options.rate)) {
          return failure("invalid rate '" + std::string(optarg) + "': give packets per second, or 0 or max");
        }
        break;
      case 'n':
        if (!parseUnsigned(optarg, parsed.options.packetLimit)) {
          return failure("invalid packet count '" + std::string(optarg) + "'");
        }
        break;
      case kClockStart: {
        std::uint64_t seconds = 0;
        // Microseconds since 1970 must fit the 64-bit timestamp for a long while yet.
        if (!parseUnsigned(optarg, seconds) || seconds > kLatestClockStart) {
          return failure("invalid clock start '" + std::string(optarg) + "': give seconds since 1970-01-01 UTC");
        }
        parsed.options.clockStart = seconds;
        break;
      }
      case kLogStderr:
        parsed.options.logToStandardError = true;
        break;
      case 'h':
        parsed.exit = true;
        parsed.output = serviceUsage();
        return parsed;
      case 'V':
        parsed.exit = true;
        parsed.output = std::string("corvane-telephonyd ") + kVersion + "\n";
        return parsed;
      case ':':
        return failure("option '" + given + "' needs a value");
      default:
        return failure("unknown option '" + given + "'");
    }
  }
  if (optind < argc) return failure("unexpected argument '" + std::string(argv[optind]) + "'");

  const auto& known = kAllLogChannelTechnologies;
  if (std::find(known.begin(), known.end(), parsed.options.technology) == known.end()) {
    std::string names;
    for (auto name : known) names += (names.empty() ? "" : ", ") + std::string(name);
    return failure("unknown technology '" + parsed.options.technology + "' (known: " + names + ")");
  }
  return parsed;
}

}  // namespace corvane::telephonyd
