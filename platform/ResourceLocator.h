#pragma once

// Finds the application's resources (the display templates) by name and type.
// One directory is the resource bundle, the first of:
//   1. $CORVANE_RESOURCE_DIR, when set (and then only it);
//   2. for a program that runs from the build tree, the source tree's resources/;
//   3. share/corvane/resources beside the program's prefix (an installed copy);
//   4. the data directory the build was configured to install into.
// A resource "NAME" of type "TYPE" is the file NAME.TYPE at the top level of it.

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace corvane::resources {

// The resource directory in use, or nothing when none of the candidates exists.
std::optional<std::string> resourceDirectory();

// The path of NAME.TYPE, or nothing when there is no such regular file.
std::optional<std::string> pathForResource(std::string_view name, std::string_view type);

// The paths of all regular files *.TYPE at the top level, in name order
// (letter case ignored, ties in byte order).
std::vector<std::string> pathsForResourcesOfType(std::string_view type);

}  // namespace corvane::resources
