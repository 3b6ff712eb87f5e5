#include "platform/Uuid.h"

#include <QUuid>

namespace corvane {

std::optional<std::string> makeUUIDText() {
  const QUuid uuid = QUuid::createUuid();
  if (uuid.isNull()) return std::nullopt;
  return uuid.toString(QUuid::WithoutBraces).toUpper().toStdString();
}

}  // namespace corvane
