#pragma once

// Reading packets from files. A file is either one property list (one packet)
// or text with one packet per line in hex: blanks and colons may stand between
// bytes, blank lines and lines starting with "#" are skipped.

#include <optional>
#include <span>
#include <string>
#include <vector>

#include "platform/Value.h"

namespace corvane::tools {

struct InputError {
  std::string message;  // one line, naming the source and, for hex text, the line number
};

// Splits the contents of one input into packets. `source` names the input in messages.
std::optional<std::vector<Bytes>> packetsFromContents(std::span<const std::uint8_t> contents, const std::string& source,
                                                      InputError& error);

// Parses one line of hex text; nullopt with a reason for a bad line.
std::optional<Bytes> parseHexLine(std::string_view line, std::string& reason);

// Reads a whole file ("-" is standard input).
std::optional<Bytes> readInput(const std::string& path, InputError& error);

}  // namespace corvane::tools
