#include "platform/DateText.h"

#include <QDateTime>
#include <QTimeZone>

#include <mutex>

namespace corvane {

namespace {
std::mutex& sourceMutex() {
  static std::mutex m;
  return m;
}
std::function<Date()>& source() {
  static std::function<Date()> s;
  return s;
}
}  // namespace

Date currentDate() {
  {
    std::lock_guard lock(sourceMutex());
    if (source()) return source()();
  }
  return Date{QDateTime::currentMSecsSinceEpoch() * 1000};
}

std::string dateText(const Date& date) {
  const QDateTime t = QDateTime::fromMSecsSinceEpoch(date.microsecondsSince1970 / 1000, QTimeZone::utc());
  return t.toString(QStringLiteral("yyyy-MM-dd HH:mm:ss '+0000'")).toStdString();
}

LocalTimeZone localTimeZoneAt(const Date& date) {
  const QDateTime local = QDateTime::fromMSecsSinceEpoch(date.microsecondsSince1970 / 1000, Qt::LocalTime);
  return LocalTimeZone{local.offsetFromUtc(), local.isDaylightTime()};
}

std::string currentDateText() { return dateText(currentDate()); }

void setDateSourceForTesting(std::function<Date()> s) {
  std::lock_guard lock(sourceMutex());
  source() = std::move(s);
}

}  // namespace corvane
