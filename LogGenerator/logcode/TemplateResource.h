#pragma once

// Loads a display template: the resource NAME.plist, a property list whose
// root is a dictionary.

#include <optional>
#include <string_view>

#include "platform/Value.h"

namespace corvane {

// Nothing when the resource is missing, unreadable or not a dictionary.
std::optional<Dictionary> loadTemplateResource(std::string_view name);

}  // namespace corvane
