#include "app/ActivityIndicator.h"

#include <QPainter>

#include <algorithm>

namespace corvane {

namespace {
constexpr int kSpokes = 12;
constexpr int kStepMilliseconds = 80;
}  // namespace

ActivityIndicator::ActivityIndicator(QWidget* parent) : QWidget(parent) {
  setObjectName(QStringLiteral("ActivityIndicator"));
  setFixedSize(sizeHint());
  timer_.setInterval(kStepMilliseconds);
  connect(&timer_, &QTimer::timeout, this, [this] {
    step_ = (step_ + 1) % kSpokes;
    update();
  });
  hide();
}

void ActivityIndicator::startAnimating() {
  animating_ = true;
  timer_.start();
  show();
}

void ActivityIndicator::stopAnimating() {
  animating_ = false;
  timer_.stop();
  hide();
}

void ActivityIndicator::paintEvent(QPaintEvent*) {
  QPainter painter(this);
  painter.setRenderHint(QPainter::Antialiasing);
  const qreal side = std::min(width(), height());
  painter.translate(width() / 2.0, height() / 2.0);
  QPen pen(QColor(0x6b, 0x74, 0x7e));
  pen.setWidthF(side / 10.0);
  pen.setCapStyle(Qt::RoundCap);
  for (int i = 0; i < kSpokes; ++i) {
    // The spoke of the current step is the darkest; the ones behind it fade.
    const int age = (step_ - i + kSpokes) % kSpokes;
    QColor colour = pen.color();
    colour.setAlphaF(1.0 - 0.75 * age / (kSpokes - 1));
    pen.setColor(colour);
    painter.setPen(pen);
    painter.save();
    painter.rotate(360.0 * i / kSpokes);
    painter.drawLine(QPointF(0, -side * 0.22), QPointF(0, -side * 0.42));
    painter.restore();
  }
}

}  // namespace corvane
