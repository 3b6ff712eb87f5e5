#include "platform/Log.h"

#include <gtest/gtest.h>
#include <syslog.h>

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

// Takes only failures (levels 0-3), as a sink that ignores traces would.
class ErrorsOnlySink final : public log::Sink {
 public:
  void write(int priority, std::string_view text) override { lines_.push_back({priority, std::string(text)}); }
  bool wants(int priority) const override { return priority <= log::kError; }
  std::vector<log::Line> lines_;
};

TEST(Log, LinesTheSinkDoesNotWantAreNeverHandedToIt) {
  auto errors = std::make_shared<ErrorsOnlySink>();
  auto previous = log::sink();
  log::setSink(errors);
  log::printf(log::kWarning, "trace %d", 1);
  log::write(log::kWarning, "trace");
  log::printf(log::kError, "failure %d", 2);
  log::write(log::kError, "failure");
  EXPECT_FALSE(log::wants(log::kWarning));
  EXPECT_TRUE(log::wants(log::kError));
  log::setSink(previous);
  EXPECT_EQ(errors->lines_, (std::vector<log::Line>{{3, "failure 2"}, {3, "failure"}}));
}

TEST(Log, ATeeWantsWhatAnyOfItsSinksWantsAndHandsEachOnlyThat) {
  auto all = std::make_shared<log::CapturingSink>();
  auto errors = std::make_shared<ErrorsOnlySink>();
  log::TeeSink tee({all, errors});
  EXPECT_TRUE(tee.wants(log::kWarning));
  tee.write(log::kWarning, "trace");
  tee.write(log::kError, "failure");
  EXPECT_EQ(all->texts(), (std::vector<std::string>{"trace", "failure"}));
  EXPECT_EQ(errors->lines_, (std::vector<log::Line>{{3, "failure"}}));
  EXPECT_FALSE(log::TeeSink({errors}).wants(log::kWarning));
}

TEST(Log, TheSyslogSinkWantsWhatTheSyslogMaskLetsThrough) {
  log::SyslogSink syslogSink;
  EXPECT_TRUE(syslogSink.wants(log::kWarning));
  EXPECT_TRUE(syslogSink.wants(16));
  const int previous = setlogmask(LOG_UPTO(LOG_ERR));
  EXPECT_FALSE(syslogSink.wants(log::kWarning));
  EXPECT_FALSE(syslogSink.wants(log::kNotice));
  EXPECT_TRUE(syslogSink.wants(log::kError));
  // 16 carries no level bits of its own: it is level 0 to the mask.
  EXPECT_TRUE(syslogSink.wants(16));
  setlogmask(previous);
}

TEST(Log, LinesLongerThanTheUsualAreFormattedWhole) {
  log::ScopedCapture capture;
  const std::string longText(1000, 'x');
  log::printf(log::kError, "%s|%d", longText.c_str(), 42);
  log::printf(log::kError, "%s", std::string(255, 'y').c_str());
  log::printf(log::kError, "%s", std::string(256, 'z').c_str());
  EXPECT_EQ(capture.texts(),
            (std::vector<std::string>{longText + "|42", std::string(255, 'y'), std::string(256, 'z')}));
}

TEST(Log, PointersShowAsHexWithNullAsZero) {
  EXPECT_EQ(log::pointerText(nullptr), "0x0");
  EXPECT_EQ(log::pointerText(reinterpret_cast<const void*>(0x55d0c0ffee10)), "0x55d0c0ffee10");
}

}  // namespace
}  // namespace corvane
