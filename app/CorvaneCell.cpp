#include "app/CorvaneCell.h"

#include <QFontMetrics>

#include "app/Theme.h"

namespace corvane {

namespace {

constexpr int kFontSize = 15;
constexpr int kLeftMargin = 10;
constexpr int kGap = 50;
constexpr int kScrollViewHeight = 50;

QSize textSize(const QFontMetrics& metrics, const QString& text) {
  return {metrics.horizontalAdvance(text), metrics.height()};
}

}  // namespace

CorvaneCell::CorvaneCell(Style style, const QString& reuseIdentifier) : TableViewCell(style, reuseIdentifier) {}

QLabel* CorvaneCell::makeLabel(QWidget* parent, const QFont& font, const QColor& colour) {
  auto* label = new QLabel(parent);
  label->setTextFormat(Qt::PlainText);
  label->setAlignment(Qt::AlignLeft | Qt::AlignVCenter);
  label->setFont(font);
  QPalette palette = label->palette();
  palette.setColor(QPalette::WindowText, colour);
  label->setPalette(palette);
  // Taps go through to the row.
  label->setAttribute(Qt::WA_TransparentForMouseEvents);
  return label;
}

QFont CorvaneCell::measuringFont() { return theme::boldSystemFont(kFontSize); }

CorvaneCell* CorvaneCell::initWithStyleKey(Style style, const QString& reuseIdentifier) {
  auto* cell = new CorvaneCell(style, reuseIdentifier);
  cell->key = makeLabel(cell->contentView(), theme::boldSystemFont(kFontSize), theme::kDarkText);
  return cell;
}

CorvaneCell* CorvaneCell::initWithStyle(Style style, const QString& reuseIdentifier) {
  auto* cell = new CorvaneCell(style, reuseIdentifier);
  cell->view = new QScrollArea(cell->contentView());
  cell->view->setObjectName(QStringLiteral("ValueScroller"));
  cell->view->setFrameShape(QFrame::NoFrame);
  cell->view->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
  cell->view->setVerticalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
  cell->view->setWidgetResizable(false);
  cell->view->setFocusPolicy(Qt::NoFocus);
  cell->view->viewport()->setAutoFillBackground(false);
  cell->scrolledContent_ = new QWidget;
  cell->view->setWidget(cell->scrolledContent_);
  // After setWidget, which turns the filling on: the row's own background (and
  // its selection) shows through.
  cell->scrolledContent_->setAutoFillBackground(false);
  cell->key = makeLabel(cell->scrolledContent_, theme::boldSystemFont(kFontSize), theme::kDarkText);
  cell->value = makeLabel(cell->scrolledContent_, theme::systemFont(kFontSize), theme::kValueText);
  return cell;
}

void CorvaneCell::setLayoutKey() {
  arrangement_ = Arrangement::Key;
  TableViewCell::layoutSubviews();
  if (!key) return;
  const QRect bounds = contentView()->rect();
  const QSize keySize = textSize(QFontMetrics(measuringFont()), key->text());
  key->setGeometry(bounds.x() + kLeftMargin, (bounds.height() - keySize.height()) / 2, keySize.width(),
                   keySize.height());
}

void CorvaneCell::setLayout() {
  arrangement_ = Arrangement::KeyAndValue;
  TableViewCell::layoutSubviews();
  const QRect bounds = contentView()->rect();
  const int x0 = bounds.x();
  const int width = bounds.width();
  const int height = bounds.height();
  const QFontMetrics metrics(measuringFont());

  const QSize keySize = key ? textSize(metrics, key->text()) : QSize();
  if (key) key->setGeometry(x0 + kLeftMargin, (height - keySize.height()) / 2, keySize.width(), keySize.height());

  // The value is measured in the bold font too, although it is drawn regular.
  const QSize valueSize = value ? textSize(metrics, value->text()) : QSize();
  const int need = keySize.width() + kLeftMargin + kGap + valueSize.width();
  const int valueX = need < width ? width - valueSize.width() : x0 + kLeftMargin + keySize.width() + kGap;
  if (value) {
    value->setGeometry(valueX, (height - valueSize.height()) / 2, valueSize.width(), valueSize.height());
    // The whole value at a glance, for a mouse that cannot scroll sideways.
    setToolTip(need > width ? value->text() : QString());
  }

  if (view) {
    const int contentWidth = need > width ? width + keySize.width() + valueSize.width() : width;
    scrolledContent_->resize(contentWidth, kScrollViewHeight);
    view->setGeometry(bounds.x(), bounds.y(), width, kScrollViewHeight);
  }
}

void CorvaneCell::layoutSubviews() {
  switch (arrangement_) {
    case Arrangement::Key: setLayoutKey(); break;
    case Arrangement::KeyAndValue: setLayout(); break;
    case Arrangement::None: TableViewCell::layoutSubviews(); break;
  }
}

}  // namespace corvane
