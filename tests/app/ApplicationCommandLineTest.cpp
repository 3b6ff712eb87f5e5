// corvane's command line, as a process: it takes no arguments of its own but
// --help and --version, and leaves Qt's own options to Qt.

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/Version.h"
#include "support/Process.h"

namespace corvane {
namespace {

const std::string kApp = CORVANE_APP_BINARY;
const std::vector<std::string> kHeadless{"DISPLAY=", "WAYLAND_DISPLAY=", "QT_QPA_PLATFORM="};
// Nothing reaches a service or a settings file: every case ends before that.
const std::vector<std::string> kOffscreen{"QT_QPA_PLATFORM=offscreen", "CORVANE_RUNTIME_DIR=/nonexistent/corvane"};

// Qt may say something about the environment first; the program's own lines end standard error.
bool endsWith(const std::string& text, const std::string& end) {
  return text.size() >= end.size() && text.compare(text.size() - end.size(), end.size(), end) == 0;
}

TEST(ApplicationCommandLine, HelpAndVersionNeedNoDisplay) {
  for (const char* option : {"--help", "-h"}) {
    const test::ProcessResult help = test::runProcess({kApp, option}, "", kHeadless);
    EXPECT_EQ(help.exitCode, 0) << help.err;
    EXPECT_EQ(help.out.rfind("Usage: corvane\n", 0), 0u) << help.out;
    EXPECT_NE(help.out.find("--version"), std::string::npos);
    EXPECT_EQ(help.err, "");
  }
  for (const char* option : {"--version", "-V"}) {
    const test::ProcessResult version = test::runProcess({kApp, option}, "", kHeadless);
    EXPECT_EQ(version.exitCode, 0) << version.err;
    EXPECT_EQ(version.out, std::string("corvane ") + kVersion + "\n");
  }
}

TEST(ApplicationCommandLine, AnUnknownOptionIsAUsageErrorWithStatusTwo) {
  const test::ProcessResult result = test::runProcess({kApp, "--bogus"}, "", kOffscreen);
  EXPECT_EQ(result.exitCode, 2);
  EXPECT_EQ(result.out, "");
  EXPECT_TRUE(endsWith(result.err, "corvane: unknown option '--bogus'\nUsage: corvane\n")) << result.err;
}

TEST(ApplicationCommandLine, AnArgumentIsAUsageErrorToo) {
  const test::ProcessResult result = test::runProcess({kApp, "extra"}, "", kOffscreen);
  EXPECT_EQ(result.exitCode, 2);
  EXPECT_TRUE(endsWith(result.err, "corvane: unexpected argument 'extra'\nUsage: corvane\n")) << result.err;
}

TEST(ApplicationCommandLine, QtsOwnOptionsAreLeftToQt) {
  const test::ProcessResult bogus =
      test::runProcess({kApp, "-platform", "offscreen", "-reverse", "--bogus"}, "", kOffscreen);
  EXPECT_EQ(bogus.exitCode, 2);
  EXPECT_TRUE(endsWith(bogus.err, "corvane: unknown option '--bogus'\nUsage: corvane\n")) << bogus.err;
  const test::ProcessResult help = test::runProcess({kApp, "-platform", "offscreen", "--help"}, "", kOffscreen);
  EXPECT_EQ(help.exitCode, 0);
  EXPECT_EQ(help.out.rfind("Usage: corvane\n", 0), 0u) << help.out;
}

}  // namespace
}  // namespace corvane
