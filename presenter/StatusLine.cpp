#include "presenter/StatusLine.h"

#include <ctime>

namespace corvane {

std::string StatusLine::updateMessageAt(const Date& date) {
  std::int64_t seconds = date.microsecondsSince1970 / 1'000'000;
  if (date.microsecondsSince1970 % 1'000'000 < 0) --seconds;
  const std::time_t time = static_cast<std::time_t>(seconds);
  std::tm local{};
  localtime_r(&time, &local);
  char text[64];
  const std::size_t length = std::strftime(text, sizeof text, "Updated %Y-%m-%d at %H:%M:%S", &local);
  return std::string(text, length);
}

StatusState StatusLine::current(bool connected) const {
  if (connected) return {updateMessage_, false};
  return {kConnectingStatus, true};
}

void StatusLine::displayUpdated(bool connected, const Date& now) {
  if (connected) updateMessage_ = updateMessageAt(now);
}

}  // namespace corvane
