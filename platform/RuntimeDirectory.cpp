#include "platform/RuntimeDirectory.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace corvane {

namespace {

std::string nonEmptyEnvironment(const char* name) {
  const char* value = std::getenv(name);
  return value && *value ? std::string(value) : std::string();
}

RuntimeDirectoryResult failure(const std::filesystem::path& directory, const std::string& reason) {
  return {{}, "runtime directory " + directory.string() + " " + reason};
}

std::string octalMode(mode_t mode) {
  char text[8];
  std::snprintf(text, sizeof text, "%04o", static_cast<unsigned>(mode & 07777));
  return text;
}

}  // namespace

std::filesystem::path runtimeDirectoryLocation() {
  if (std::string own = nonEmptyEnvironment("CORVANE_RUNTIME_DIR"); !own.empty()) return own;
  if (std::string xdg = nonEmptyEnvironment("XDG_RUNTIME_DIR"); !xdg.empty()) {
    return std::filesystem::path(xdg) / "corvane";
  }
  return "/tmp/corvane-" + std::to_string(geteuid());
}

RuntimeDirectoryResult prepareRuntimeDirectory(const std::filesystem::path& directory) {
  if (directory.empty()) return {{}, "runtime directory path is empty"};
  const std::string path = directory.string();

  // mkdir never follows a symbolic link in the last component and fails when
  // anything exists there; the checks below then judge what was found.
  if (::mkdir(path.c_str(), 0700) == 0) {
    // The umask may have narrowed the mode; it can never have widened it, but
    // set it exactly so the check below does not depend on the umask.
    if (::chmod(path.c_str(), 0700) != 0)
      return failure(directory, std::string("cannot be set to mode 0700: ") + std::strerror(errno));
  } else if (errno != EEXIST) {
    return failure(directory, std::string("cannot be created: ") + std::strerror(errno));
  }

  // lstat, so that a symbolic link planted in a shared /tmp is refused instead
  // of being followed to somebody else's directory.
  struct stat info {};
  if (::lstat(path.c_str(), &info) != 0)
    return failure(directory, std::string("cannot be examined: ") + std::strerror(errno));
  if (S_ISLNK(info.st_mode)) {
    return failure(directory,
                   "is a symbolic link, which is not followed; remove the link so that the directory is made "
                   "afresh, or set CORVANE_RUNTIME_DIR to a private directory");
  }
  if (!S_ISDIR(info.st_mode)) return failure(directory, "is not a directory");
  if (info.st_uid != geteuid()) {
    return failure(directory, "is owned by uid " + std::to_string(info.st_uid) + ", not by this user (uid " +
                                  std::to_string(geteuid()) + ")");
  }
  if ((info.st_mode & 077) != 0) {
    return failure(directory, "has mode " + octalMode(info.st_mode) + "; group and others must have no access (0700)");
  }
  return {directory, {}};
}

RuntimeDirectoryResult prepareRuntimeDirectory() { return prepareRuntimeDirectory(runtimeDirectoryLocation()); }

}  // namespace corvane
