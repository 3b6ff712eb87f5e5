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

// Replaces the source of the current date (tests); an empty function restores the system clock.
void setDateSourceForTesting(std::function<Date()> source);

}  // namespace corvane
