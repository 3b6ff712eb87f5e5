#include "app/TableView.h"

#include <QMouseEvent>
#include <QPainter>
#include <QPainterPath>
#include <QVBoxLayout>

#include <algorithm>

#include "app/Theme.h"

namespace corvane {

namespace {
constexpr int kAccessoryWidth = 30;
// Rows without an accessory keep this much room at their right edge.
constexpr int kTrailingMargin = 10;
constexpr int kSeparatorInset = 10;
}  // namespace

// --- TableViewCell -----------------------------------------------------------

TableViewCell::TableViewCell(Style style, QString reuseIdentifier, QWidget* parent)
    : QWidget(parent), _style(style), _reuseIdentifier(std::move(reuseIdentifier)) {
  setAttribute(Qt::WA_OpaquePaintEvent, false);
  setFixedHeight(kHeight);
  setCursor(Qt::PointingHandCursor);
  _contentView = new QWidget(this);
  _contentView->setObjectName(QStringLiteral("ContentView"));
  _accessory = new QLabel(this);
  _accessory->hide();
}

QLabel* TableViewCell::textLabel() {
  if (!_textLabel) {
    _textLabel = new QLabel(_contentView);
    _textLabel->setTextFormat(Qt::PlainText);
    _textLabel->setFont(theme::systemFont(17));
    QPalette palette = _textLabel->palette();
    palette.setColor(QPalette::WindowText, theme::kDarkText);
    _textLabel->setPalette(palette);
    layoutSubviews();
  }
  return _textLabel;
}

void TableViewCell::setAccessoryType(AccessoryType type) {
  if (type == _accessoryType) return;
  _accessoryType = type;
  layoutSubviews();
  update();
}

void TableViewCell::setSelected(bool selected, bool /*animated*/) {
  if (selected == _selected) return;
  _selected = selected;
  update();
}

void TableViewCell::layoutSubviews() {
  const int trailing = _accessoryType == AccessoryType::None ? kTrailingMargin : kAccessoryWidth;
  _contentView->setGeometry(0, 0, std::max(0, width() - trailing), height());
  if (_textLabel) {
    _textLabel->setGeometry(10, 0, std::max(0, _contentView->width() - 10), _contentView->height());
  }
}

void TableViewCell::resizeEvent(QResizeEvent* event) {
  QWidget::resizeEvent(event);
  layoutSubviews();
}

void TableViewCell::paintEvent(QPaintEvent*) {
  QPainter painter(this);
  painter.fillRect(rect(), _selected || _pressed ? theme::kRowSelected : theme::kRowBackground);
  painter.fillRect(QRect(kSeparatorInset, height() - 1, width() - kSeparatorInset, 1), theme::kSeparator);

  if (_accessoryType == AccessoryType::None) return;
  painter.setRenderHint(QPainter::Antialiasing);
  const QPointF centre(width() - kAccessoryWidth / 2.0, height() / 2.0);
  QPainterPath path;
  QPen pen;
  pen.setCapStyle(Qt::RoundCap);
  pen.setJoinStyle(Qt::RoundJoin);
  if (_accessoryType == AccessoryType::DisclosureIndicator) {
    path.moveTo(centre + QPointF(-2.5, -6));
    path.lineTo(centre + QPointF(3.5, 0));
    path.lineTo(centre + QPointF(-2.5, 6));
    pen.setColor(QColor(0xa3, 0xab, 0xb5));
    pen.setWidthF(2.0);
  } else {
    path.moveTo(centre + QPointF(-6, 0));
    path.lineTo(centre + QPointF(-2, 5));
    path.lineTo(centre + QPointF(6, -6));
    pen.setColor(theme::kTint);
    pen.setWidthF(2.2);
  }
  painter.setPen(pen);
  painter.drawPath(path);
}

void TableViewCell::mousePressEvent(QMouseEvent* event) {
  if (event->button() != Qt::LeftButton) return QWidget::mousePressEvent(event);
  _pressed = true;
  update();
}

void TableViewCell::mouseReleaseEvent(QMouseEvent* event) {
  if (event->button() != Qt::LeftButton || !_pressed) return QWidget::mouseReleaseEvent(event);
  _pressed = false;
  update();
  if (!rect().contains(event->position().toPoint()) || !_tapHandler) return;
  // A copy: the handler may reload the table, which replaces this row's handler.
  const std::function<void()> handler = _tapHandler;
  handler();
}

// --- TableView ---------------------------------------------------------------

TableView::TableView(QWidget* parent) : QScrollArea(parent) {
  setObjectName(QStringLiteral("TableView"));
  setFrameShape(QFrame::NoFrame);
  setWidgetResizable(true);
  setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
  _rowsWidget = new QWidget;
  _rowsWidget->setObjectName(QStringLiteral("TableRows"));
  _rowsWidget->setAutoFillBackground(true);
  QPalette palette = _rowsWidget->palette();
  palette.setColor(QPalette::Window, theme::kRowBackground);
  _rowsWidget->setPalette(palette);
  _rowsLayout = new QVBoxLayout(_rowsWidget);
  _rowsLayout->setContentsMargins(0, 0, 0, 0);
  _rowsLayout->setSpacing(0);
  _rowsLayout->addStretch(1);
  setWidget(_rowsWidget);
}

void TableView::reloadData() {
  for (TableViewCell* cell : _cells) {
    _rowsLayout->removeWidget(cell);
    cell->setSelected(false, false);
    cell->setTapHandler({});
  }
  _reusePool = std::move(_cells);
  _cells.clear();

  const int rows = _dataSource ? std::max(0, _dataSource->tableViewNumberOfRowsInSection(*this, 0)) : 0;
  for (int row = 0; row < rows; ++row) {
    TableViewCell* cell = _dataSource->tableViewCellForRowAtIndexPath(*this, IndexPath{0, row});
    if (!cell) continue;
    // A source that hands back a row still in the pool gives it up.
    _reusePool.erase(std::remove(_reusePool.begin(), _reusePool.end(), cell), _reusePool.end());
    cell->setParent(_rowsWidget);
    cell->setTapHandler([this, cell] { tapped(cell); });
    _rowsLayout->insertWidget(static_cast<int>(_cells.size()), cell);
    cell->show();
    _cells.push_back(cell);
  }

  for (TableViewCell* unused : _reusePool) {
    unused->hide();
    unused->deleteLater();
  }
  _reusePool.clear();
}

TableViewCell* TableView::dequeueReusableCellWithIdentifier(const QString& identifier) {
  const auto found = std::find_if(_reusePool.begin(), _reusePool.end(),
                                  [&](const TableViewCell* cell) { return cell->reuseIdentifier() == identifier; });
  if (found == _reusePool.end()) return nullptr;
  TableViewCell* cell = *found;
  _reusePool.erase(found);
  return cell;
}

TableViewCell* TableView::cellForRowAtIndexPath(const IndexPath& indexPath) const {
  if (indexPath.section != 0 || indexPath.row < 0 || indexPath.row >= numberOfRows()) return nullptr;
  return _cells[static_cast<std::size_t>(indexPath.row)];
}

std::optional<IndexPath> TableView::indexPathForSelectedRow() const {
  for (std::size_t i = 0; i < _cells.size(); ++i) {
    if (_cells[i]->isSelected()) return IndexPath{0, static_cast<int>(i)};
  }
  return std::nullopt;
}

void TableView::selectRowAtIndexPath(const IndexPath& indexPath, bool animated) {
  for (TableViewCell* cell : _cells) cell->setSelected(false, animated);
  if (TableViewCell* cell = cellForRowAtIndexPath(indexPath)) cell->setSelected(true, animated);
}

void TableView::deselectRowAtIndexPath(const IndexPath& indexPath, bool animated) {
  if (TableViewCell* cell = cellForRowAtIndexPath(indexPath)) cell->setSelected(false, animated);
}

void TableView::sizeToFit() {
  ensurePolished();  // the frame's width comes from the style
  setFixedHeight(numberOfRows() * TableViewCell::kHeight + 2 * frameWidth());
}

void TableView::tapped(TableViewCell* cell) {
  const auto found = std::find(_cells.begin(), _cells.end(), cell);
  std::optional<IndexPath> indexPath;
  if (found != _cells.end()) {
    indexPath = IndexPath{0, static_cast<int>(found - _cells.begin())};
    selectRowAtIndexPath(*indexPath, false);
  }
  if (_dataSource) _dataSource->tableViewDidSelectRowAtIndexPath(*this, indexPath);
}

}  // namespace corvane
