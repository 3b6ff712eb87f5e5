#include "platform/Log.h"

#include <gtest/gtest.h>

namespace corvane {
namespace {

TEST(Log, CapturedLinesKeepPriorityAndExactText) {
  log::ScopedCapture capture;
  log::printf(log::kError, "_TSServerConnectionNetworkMonitorCreateLogChannel returns error: %ld!", 7L);
  log::write(16, " ***** raw");
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{
                                 {3, "_TSServerConnectionNetworkMonitorCreateLogChannel returns error: 7!"},
                                 {16, " ***** raw"},
                             }));
}

TEST(Log, ScopedCaptureRestoresThePreviousSink) {
  auto outer = std::make_shared<log::CapturingSink>();
  log::setSink(outer);
  {
    log::ScopedCapture inner;
    log::write(4, "inside");
    EXPECT_EQ(inner.sink().count("inside"), 1u);
  }
  log::write(4, "outside");
  EXPECT_EQ(outer->texts(), std::vector<std::string>{"outside"});
  log::setSink(std::make_shared<log::SyslogSink>());
}

TEST(Log, TeeSinkWritesToEverySink) {
  auto a = std::make_shared<log::CapturingSink>();
  auto b = std::make_shared<log::CapturingSink>();
  log::TeeSink tee({a, b});
  tee.write(5, "both");
  EXPECT_EQ(a->lines(), b->lines());
  EXPECT_EQ(a->count("both"), 1u);
}

TEST(Log, PointersShowAsHexWithNullAsZero) {
  EXPECT_EQ(log::pointerText(nullptr), "0x0");
  EXPECT_EQ(log::pointerText(reinterpret_cast<const void*>(0x55d0c0ffee10)), "0x55d0c0ffee10");
}

}  // namespace
}  // namespace corvane
