// What corvane-decode and corvane-monitor share on their command lines: the
// tree formats and where the decoders' log lines go.

#include "ToolOptions.h"

#include <gtest/gtest.h>

#include "platform/Log.h"

namespace corvane::tools {
namespace {

// Puts the sink back that the test found.
struct KeepSink {
  std::shared_ptr<log::Sink> kept = log::sink();
  ~KeepSink() { log::setSink(kept); }
};

TEST(ToolOptions, TreeFormatsAreTextAndJson) {
  EXPECT_EQ(treeFormatNamed("text"), TreeFormat::Text);
  EXPECT_EQ(treeFormatNamed("json"), TreeFormat::Json);
  EXPECT_EQ(treeFormatNamed("xml"), std::nullopt);
}

TEST(ToolOptions, LogDestinationsAreTheSystemLogAndStandardError) {
  EXPECT_EQ(logDestinationNamed("syslog"), LogDestination::SystemLog);
  EXPECT_EQ(logDestinationNamed("stderr"), LogDestination::StandardError);
  EXPECT_EQ(logDestinationNamed("printer"), std::nullopt);
}

TEST(ToolOptions, WithTheLogSentNowhereNoLineIsMade) {
  KeepSink keep;
  routeLog(LogDestination::Nowhere);
  for (int priority : {log::kError, log::kWarning, log::kNotice, 16}) EXPECT_FALSE(log::wants(priority)) << priority;
  routeLog(LogDestination::StandardError);
  for (int priority : {log::kError, log::kWarning, log::kNotice, 16}) EXPECT_TRUE(log::wants(priority)) << priority;
}

TEST(ToolOptions, StandardErrorGetsEveryLineAsPriorityAndText) {
  KeepSink keep;
  routeLog(LogDestination::StandardError);
  testing::internal::CaptureStderr();
  log::printf(log::kWarning, "Creating Log object: %s", "0x1");
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "<4> Creating Log object: 0x1\n");
}

}  // namespace
}  // namespace corvane::tools
