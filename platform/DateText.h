#pragma once

// The current date, and the standard text form of a date used in snapshots:
// "2026-11-16 08:00:00 +0000" (always UTC).

#include <functional>
#include <string>

#include "platform/Value.h"

namespace corvane {

Date currentDate();
std::string dateText(const Date& date);
std::string currentDateText();

// The local time zone at a date: the offset from UTC in seconds (east
// positive) and whether daylight-saving time is in effect.
struct LocalTimeZone {
  int offsetFromUtcSeconds = 0;
  bool daylightSaving = false;
};
LocalTimeZone localTimeZoneAt(const Date& date);

// Replaces the source of the current date (tests); an empty function restores the system clock.
void setDateSourceForTesting(std::function<Date()> source);

}  // namespace corvane
