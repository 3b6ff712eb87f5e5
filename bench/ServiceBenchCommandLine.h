#pragma once

// The command line of the benches that start corvane-telephonyd themselves:
// [PACKETS] [PATH-TO-corvane-telephonyd], besides --help and --version.

#include <cerrno>
#include <cstdlib>
#include <optional>
#include <string>
#include <string_view>

#include "platform/CommandLine.h"

namespace corvane::bench {

struct ServiceBenchOptions {
  unsigned long long packets;
  std::string daemon;
};

// The options to run with; nothing, with the exit status in `status`, when
// the program ends here (help, version or bad usage).
inline std::optional<ServiceBenchOptions> parseServiceBenchOptions(int argc, char** argv, const ProgramUsage& program,
                                                                   unsigned long long defaultPackets, int& status) {
  const ParsedCommandLine parsed =
      parseCommandLine(argc, argv, {}, [](std::string_view, const char*) { return std::string(); }, true);
  if (const std::optional<int> answered = answerCommandLine(parsed, program)) {
    status = *answered;
    return std::nullopt;
  }
  ServiceBenchOptions options{defaultPackets, CORVANE_TELEPHONYD_BINARY};
  if (parsed.operands.size() > 2) {
    status = usageError(program, "unexpected argument '" + parsed.operands[2] + "'");
    return std::nullopt;
  }
  if (!parsed.operands.empty()) {
    const std::string& text = parsed.operands[0];
    char* end = nullptr;
    errno = 0;
    options.packets = std::strtoull(text.c_str(), &end, 10);
    if (errno != 0 || end == text.c_str() || *end != '\0' || text[0] == '-' || options.packets == 0) {
      status = usageError(program, "PACKETS must be a whole number of at least 1, not '" + text + "'");
      return std::nullopt;
    }
  }
  if (parsed.operands.size() > 1) options.daemon = parsed.operands[1];
  return options;
}

}  // namespace corvane::bench
