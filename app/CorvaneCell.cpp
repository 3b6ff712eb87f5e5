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
  cell->_key = makeLabel(cell->contentView(), theme::boldSystemFont(kFontSize), theme::kDarkText);
  return cell;
}

CorvaneCell* CorvaneCell::initWithStyle(Style style, const QString& reuseIdentifier) {
  auto* cell = new CorvaneCell(style, reuseIdentifier);
  cell->_view = new QScrollArea(cell->contentView());
  cell->_view->setObjectName(QStringLiteral("ValueScroller"));
  cell->_view->setFrameShape(QFrame::NoFrame);
  cell->_view->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
  cell->_view->setVerticalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
  cell->_view->setWidgetResizable(false);
  cell->_view->setFocusPolicy(Qt::NoFocus);
  cell->_view->viewport()->setAutoFillBackground(false);
  cell->_scrolledContent = new QWidget;
  cell->_view->setWidget(cell->_scrolledContent);
  // After setWidget, which turns the filling on: the row's own background (and
  // its selection) shows through.
  cell->_scrolledContent->setAutoFillBackground(false);
  cell->_key = makeLabel(cell->_scrolledContent, theme::boldSystemFont(kFontSize), theme::kDarkText);
  cell->_value = makeLabel(cell->_scrolledContent, theme::systemFont(kFontSize), theme::kValueText);
  return cell;
}

void CorvaneCell::setLayoutKey() {
  _arrangement = Arrangement::Key;
  TableViewCell::layoutSubviews();
  if (!_key) return;
  const QRect bounds = contentView()->rect();
  const QSize key = textSize(QFontMetrics(measuringFont()), _key->text());
  _key->setGeometry(bounds.x() + kLeftMargin, (bounds.height() - key.height()) / 2, key.width(), key.height());
}

void CorvaneCell::setLayout() {
  _arrangement = Arrangement::KeyAndValue;
  TableViewCell::layoutSubviews();
  const QRect bounds = contentView()->rect();
  const int x0 = bounds.x();
  const int width = bounds.width();
  const int height = bounds.height();
  const QFontMetrics metrics(measuringFont());

  const QSize key = _key ? textSize(metrics, _key->text()) : QSize();
  if (_key) _key->setGeometry(x0 + kLeftMargin, (height - key.height()) / 2, key.width(), key.height());

  // The value is measured in the bold font too, although it is drawn regular.
  const QSize value = _value ? textSize(metrics, _value->text()) : QSize();
  const int need = key.width() + kLeftMargin + kGap + value.width();
  const int valueX = need < width ? width - value.width() : x0 + kLeftMargin + key.width() + kGap;
  if (_value) {
    _value->setGeometry(valueX, (height - value.height()) / 2, value.width(), value.height());
    // The whole value at a glance, for a mouse that cannot scroll sideways.
    setToolTip(need > width ? _value->text() : QString());
  }

  if (_view) {
    const int contentWidth = need > width ? width + key.width() + value.width() : width;
    _scrolledContent->resize(contentWidth, kScrollViewHeight);
    _view->setGeometry(bounds.x(), bounds.y(), width, kScrollViewHeight);
  }
}

void CorvaneCell::layoutSubviews() {
  switch (_arrangement) {
    case Arrangement::Key: setLayoutKey(); break;
    case Arrangement::KeyAndValue: setLayout(); break;
    case Arrangement::None: TableViewCell::layoutSubviews(); break;
  }
}

}  // namespace corvane
