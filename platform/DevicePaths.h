#pragma once

// The absolute paths of the phone, resolved under a device root:
// $CORVANE_DEVICE_ROOT, else "/". A desktop run (the demo) points the root at a
// directory of its own, so that it can hold the marker and the snapshots
// without touching the machine's real /var.

#include <cstdlib>
#include <filesystem>
#include <string_view>

namespace corvane {

// Its existence (a file or a directory) offers the save button.
inline constexpr std::string_view kSaveEnablingMarkerPath =
    "/OstrelInternal/Library/PreferenceBundles/Carrier Settings.bundle";
// Where snapshot files are written, next to the device's other diagnostic logs.
inline constexpr std::string_view kSnapshotDirectoryPath = "/var/log/corvane/snapshots";

// $CORVANE_DEVICE_ROOT when set and not empty, else "/".
inline std::filesystem::path deviceRoot() {
  const char* root = std::getenv("CORVANE_DEVICE_ROOT");
  return root && *root ? std::filesystem::path(root) : std::filesystem::path("/");
}

// An absolute device path below `root` ("/var/log" under "/tmp/dev" is "/tmp/dev/var/log").
inline std::filesystem::path devicePath(std::string_view absolutePath, const std::filesystem::path& root) {
  // Appending an absolute path would replace the root, so the leading separators go first.
  while (!absolutePath.empty() && absolutePath.front() == '/') absolutePath.remove_prefix(1);
  return root / std::filesystem::path(absolutePath);
}
inline std::filesystem::path devicePath(std::string_view absolutePath) { return devicePath(absolutePath, deviceRoot()); }

}  // namespace corvane
