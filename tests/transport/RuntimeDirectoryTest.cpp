#include "platform/RuntimeDirectory.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "support/Process.h"

namespace corvane {
namespace {

// Sets or removes environment variables for one test and puts them back after.
class ScopedEnvironment {
 public:
  void set(const char* name, const char* value) {
    remember(name);
    if (value) {
      ::setenv(name, value, 1);
    } else {
      ::unsetenv(name);
    }
  }
  ~ScopedEnvironment() {
    for (auto& [name, value] : saved_) {
      if (value) {
        ::setenv(name.c_str(), value->c_str(), 1);
      } else {
        ::unsetenv(name.c_str());
      }
    }
  }

 private:
  void remember(const char* name) {
    const char* current = std::getenv(name);
    saved_.emplace_back(name, current ? std::optional<std::string>(current) : std::nullopt);
  }
  std::vector<std::pair<std::string, std::optional<std::string>>> saved_;
};

mode_t modeOf(const std::string& path) {
  struct stat info {};
  EXPECT_EQ(::lstat(path.c_str(), &info), 0);
  return info.st_mode & 07777;
}

TEST(RuntimeDirectoryTest, LocationPrefersCorvaneVariableThenXdgThenTmp) {
  ScopedEnvironment environment;
  environment.set("CORVANE_RUNTIME_DIR", "/somewhere/own");
  environment.set("XDG_RUNTIME_DIR", "/run/user/1000");
  EXPECT_EQ(runtimeDirectoryLocation(), "/somewhere/own");
  environment.set("CORVANE_RUNTIME_DIR", nullptr);
  EXPECT_EQ(runtimeDirectoryLocation(), "/run/user/1000/corvane");
  environment.set("XDG_RUNTIME_DIR", "");
  EXPECT_EQ(runtimeDirectoryLocation(), "/tmp/corvane-" + std::to_string(geteuid()));
}

TEST(RuntimeDirectoryTest, MissingDirectoryIsCreatedWithMode0700EvenUnderAPermissiveUmask) {
  test::TemporaryDirectory temporary;
  const std::string path = temporary.path() + "/run";
  const mode_t previousMask = ::umask(0);
  const auto result = prepareRuntimeDirectory(path);
  ::umask(previousMask);
  ASSERT_TRUE(result.ok()) << result.error;
  EXPECT_EQ(result.path, path);
  EXPECT_EQ(modeOf(path), 0700u);
}

TEST(RuntimeDirectoryTest, EnvironmentDirectoryIsCreated) {
  test::TemporaryDirectory temporary;
  ScopedEnvironment environment;
  const std::string path = temporary.path() + "/from-env";
  environment.set("CORVANE_RUNTIME_DIR", path.c_str());
  const auto result = prepareRuntimeDirectory();
  ASSERT_TRUE(result) << result.error;
  EXPECT_EQ(modeOf(path), 0700u);
}

TEST(RuntimeDirectoryTest, ExistingPrivateDirectoryIsAccepted) {
  test::TemporaryDirectory temporary;
  const std::string path = temporary.path() + "/run";
  ASSERT_EQ(::mkdir(path.c_str(), 0700), 0);
  EXPECT_TRUE(prepareRuntimeDirectory(path).ok());
}

TEST(RuntimeDirectoryTest, DirectoryOwnedByAnotherUserIsRefusedWithAClearMessage) {
  if (geteuid() != 0) GTEST_SKIP() << "needs root to give a directory away";
  test::TemporaryDirectory temporary;
  const std::string path = temporary.path() + "/run";
  ASSERT_EQ(::mkdir(path.c_str(), 0700), 0);
  ASSERT_EQ(::chown(path.c_str(), 65534, 65534), 0);
  const auto result = prepareRuntimeDirectory(path);
  EXPECT_FALSE(result.ok());
  EXPECT_EQ(result.error, "runtime directory " + path + " is owned by uid 65534, not by this user (uid 0)");
  EXPECT_EQ(result.error.find('\n'), std::string::npos);
}

TEST(RuntimeDirectoryTest, DirectoryOpenToGroupOrOthersIsRefused) {
  test::TemporaryDirectory temporary;
  const std::string path = temporary.path() + "/run";
  ASSERT_EQ(::mkdir(path.c_str(), 0700), 0);
  ASSERT_EQ(::chmod(path.c_str(), 0750), 0);
  const auto result = prepareRuntimeDirectory(path);
  EXPECT_FALSE(result.ok());
  EXPECT_EQ(result.error, "runtime directory " + path + " has mode 0750; group and others must have no access (0700)");
  // Refused, not repaired: the mode is left for the user to look at.
  EXPECT_EQ(modeOf(path), 0750u);
}

TEST(RuntimeDirectoryTest, FileInThePlaceOfTheDirectoryIsRefused) {
  test::TemporaryDirectory temporary;
  const std::string path = temporary.write("run", "not a directory");
  const auto result = prepareRuntimeDirectory(path);
  EXPECT_FALSE(result.ok());
  EXPECT_EQ(result.error, "runtime directory " + path + " is not a directory");
}

TEST(RuntimeDirectoryTest, SymbolicLinkToADirectoryIsRefused) {
  test::TemporaryDirectory temporary;
  const std::string target = temporary.path() + "/target";
  const std::string link = temporary.path() + "/run";
  ASSERT_EQ(::mkdir(target.c_str(), 0700), 0);
  ASSERT_EQ(::symlink(target.c_str(), link.c_str()), 0);
  const auto result = prepareRuntimeDirectory(link);
  EXPECT_FALSE(result.ok());
  EXPECT_EQ(result.error, "runtime directory " + link +
                              " is a symbolic link, which is not followed; remove the link so that the directory "
                              "is made afresh, or set CORVANE_RUNTIME_DIR to a private directory");
  // Neither the link nor its target is touched.
  EXPECT_EQ(std::filesystem::read_symlink(link), target);
  EXPECT_EQ(modeOf(target), 0700u);
}

TEST(RuntimeDirectoryTest, DanglingSymbolicLinkIsRefusedAsALinkAndNothingIsMadeAtItsTarget) {
  test::TemporaryDirectory temporary;
  const std::string target = temporary.path() + "/elsewhere";
  const std::string link = temporary.path() + "/run";
  ASSERT_EQ(::symlink(target.c_str(), link.c_str()), 0);
  const auto result = prepareRuntimeDirectory(link);
  EXPECT_FALSE(result.ok());
  EXPECT_EQ(result.error.rfind("runtime directory " + link + " is a symbolic link, which is not followed; ", 0), 0u)
      << result.error;
  EXPECT_FALSE(std::filesystem::exists(target));
}

TEST(RuntimeDirectoryTest, MissingParentIsReportedNotCreated) {
  test::TemporaryDirectory temporary;
  const std::string path = temporary.path() + "/no/such/parent";
  const auto result = prepareRuntimeDirectory(path);
  EXPECT_FALSE(result.ok());
  EXPECT_EQ(result.error, "runtime directory " + path + " cannot be created: No such file or directory");
}

}  // namespace
}  // namespace corvane
