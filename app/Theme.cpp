#include "app/Theme.h"

#include <QGuiApplication>

namespace corvane::theme {

QFont systemFont(int pixelSize) {
  QFont font = QGuiApplication::font();
  font.setPixelSize(pixelSize);
  font.setBold(false);
  return font;
}

QFont boldSystemFont(int pixelSize) {
  QFont font = systemFont(pixelSize);
  font.setBold(true);
  return font;
}

}  // namespace corvane::theme
