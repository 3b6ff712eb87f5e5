#include "platform/DateText.h"

#include <gtest/gtest.h>

namespace corvane {
namespace {

TEST(DateText, StandardFormIsUtcWithZoneOffset) {
  // 2026-11-16 08:00:00 UTC
  EXPECT_EQ(dateText(Date{INT64_C(1794816000) * 1000000}), "2026-11-16 08:00:00 +0000");
  EXPECT_EQ(dateText(Date{0}), "1970-01-01 00:00:00 +0000");
}

TEST(DateText, CurrentDateComesFromTheReplaceableSource) {
  setDateSourceForTesting([] { return Date{INT64_C(1794816005) * 1000000}; });
  EXPECT_EQ(currentDateText(), "2026-11-16 08:00:05 +0000");
  setDateSourceForTesting({});
  EXPECT_GT(currentDate().microsecondsSince1970, INT64_C(1794816005) * 1000000 - INT64_C(86400) * 365 * 1000000);
}

}  // namespace
}  // namespace corvane
