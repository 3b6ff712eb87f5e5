#pragma once

// What the command-line tools share: usage errors, the --format values and the
// --log option.

#include <optional>
#include <string>
#include <string_view>

#include "TreePrinter.h"

namespace corvane::tools {

inline constexpr int kExitUsage = 2;

// Prints "PROGRAM: MESSAGE" and the usage line to standard error; returns kExitUsage.
int usageError(const char* program, const char* usage, const std::string& message);

// "text" or "json"; nothing for anything else.
std::optional<TreeFormat> treeFormatNamed(std::string_view name);

// Copies every system-log line to standard error as "<priority> <text>", besides the system log.
void copyLogToStandardError();

}  // namespace corvane::tools
