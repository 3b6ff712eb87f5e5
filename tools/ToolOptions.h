#pragma once

// What corvane-decode and corvane-monitor share on their command lines: the
// --format values and the --log option.

#include <optional>
#include <string_view>

#include "TreePrinter.h"

namespace corvane::tools {

// "text" or "json"; nothing for anything else.
std::optional<TreeFormat> treeFormatNamed(std::string_view name);

// Copies every system-log line to standard error as "<priority> <text>", besides the system log.
void copyLogToStandardError();

// Where an offline tool sends the decoders' log lines.
enum class LogDestination {
  Nowhere,        // no line is made at all: the tool reports on its own
  SystemLog,      // every line to the system log
  StandardError,  // every line to standard error
};
std::optional<LogDestination> logDestinationNamed(std::string_view name);
void routeLog(LogDestination destination);

}  // namespace corvane::tools
