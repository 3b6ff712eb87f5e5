#pragma once

#include <optional>
#include <string>

namespace corvane {

// The text of a newly made UUID (36 characters, no braces), or nothing when none can be made.
std::optional<std::string> makeUUIDText();

}  // namespace corvane
