#pragma once

// The private runtime directory that holds the socket file of every named
// message port. Only its owner may use it: anyone who can reach the sockets can
// talk to the telephony service and to the application, so a directory that
// another user owns, or that group or others can enter, is refused rather than
// repaired.

#include <filesystem>
#include <string>

namespace corvane {

struct RuntimeDirectoryResult {
  std::filesystem::path path;  // the usable directory, on success
  std::string error;           // one line saying what is wrong, on failure

  bool ok() const { return error.empty(); }
  explicit operator bool() const { return ok(); }
};

// Where the directory is, from the environment alone: $CORVANE_RUNTIME_DIR,
// else $XDG_RUNTIME_DIR/corvane, else /tmp/corvane-$UID.
std::filesystem::path runtimeDirectoryLocation();

// Creates the directory with mode 0700 when it is missing (its parent must
// exist) and checks that it is a directory of ours that nobody else can enter.
RuntimeDirectoryResult prepareRuntimeDirectory(const std::filesystem::path& directory);

// prepareRuntimeDirectory(runtimeDirectoryLocation()).
RuntimeDirectoryResult prepareRuntimeDirectory();

}  // namespace corvane
