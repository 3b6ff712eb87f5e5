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
    : QWidget(parent), style_(style), reuseIdentifier_(std::move(reuseIdentifier)) {
  setAttribute(Qt::WA_OpaquePaintEvent, false);
  setFixedHeight(kHeight);
  setCursor(Qt::PointingHandCursor);
  contentView_ = new QWidget(this);
  contentView_->setObjectName(QStringLiteral("ContentView"));
  accessory_ = new QLabel(this);
  accessory_->hide();
}

QLabel* TableViewCell::textLabel() {
  if (!textLabel_) {
    textLabel_ = new QLabel(contentView_);
    textLabel_->setTextFormat(Qt::PlainText);
    textLabel_->setFont(theme::systemFont(17));
    QPalette palette = textLabel_->palette();
    palette.setColor(QPalette::WindowText, theme::kDarkText);
    textLabel_->setPalette(palette);
    layoutSubviews();
  }
  return textLabel_;
}

void TableViewCell::setAccessoryType(AccessoryType type) {
  if (type == accessoryType_) return;
  accessoryType_ = type;
  layoutSubviews();
  update();
}

void TableViewCell::setSelected(bool selected, bool /*animated*/) {
  if (selected == selected_) return;
  selected_ = selected;
  update();
}

void TableViewCell::layoutSubviews() {
  const int trailing = accessoryType_ == AccessoryType::None ? kTrailingMargin : kAccessoryWidth;
  contentView_->setGeometry(0, 0, std::max(0, width() - trailing), height());
  if (textLabel_) {
    textLabel_->setGeometry(10, 0, std::max(0, contentView_->width() - 10), contentView_->height());
  }
}

void TableViewCell::resizeEvent(QResizeEvent* event) {
  QWidget::resizeEvent(event);
  layoutSubviews();
}

void TableViewCell::paintEvent(QPaintEvent*) {
  QPainter painter(this);
  painter.fillRect(rect(), selected_ || pressed_ ? theme::kRowSelected : theme::kRowBackground);
  painter.fillRect(QRect(kSeparatorInset, height() - 1, width() - kSeparatorInset, 1), theme::kSeparator);

  if (accessoryType_ == AccessoryType::None) return;
  painter.setRenderHint(QPainter::Antialiasing);
  const QPointF centre(width() - kAccessoryWidth / 2.0, height() / 2.0);
  QPainterPath path;
  QPen pen;
  pen.setCapStyle(Qt::RoundCap);
  pen.setJoinStyle(Qt::RoundJoin);
  if (accessoryType_ == AccessoryType::DisclosureIndicator) {
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
  pressed_ = true;
  update();
}

void TableViewCell::mouseReleaseEvent(QMouseEvent* event) {
  if (event->button() != Qt::LeftButton || !pressed_) return QWidget::mouseReleaseEvent(event);
  pressed_ = false;
  update();
  if (!rect().contains(event->position().toPoint()) || !tapHandler_) return;
  // A copy: the handler may reload the table, which replaces this row's handler.
  const std::function<void()> handler = tapHandler_;
  handler();
}

// --- TableView ---------------------------------------------------------------

TableView::TableView(QWidget* parent) : QScrollArea(parent) {
  setObjectName(QStringLiteral("TableView"));
  setFrameShape(QFrame::NoFrame);
  setWidgetResizable(true);
  setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
  rowsWidget_ = new QWidget;
  rowsWidget_->setObjectName(QStringLiteral("TableRows"));
  rowsWidget_->setAutoFillBackground(true);
  QPalette palette = rowsWidget_->palette();
  palette.setColor(QPalette::Window, theme::kRowBackground);
  rowsWidget_->setPalette(palette);
  rowsLayout_ = new QVBoxLayout(rowsWidget_);
  rowsLayout_->setContentsMargins(0, 0, 0, 0);
  rowsLayout_->setSpacing(0);
  rowsLayout_->addStretch(1);
  setWidget(rowsWidget_);
}

void TableView::reloadData() {
  for (TableViewCell* cell : cells_) {
    rowsLayout_->removeWidget(cell);
    cell->setSelected(false, false);
    cell->setTapHandler({});
  }
  reusePool_ = std::move(cells_);
  cells_.clear();

  const int rows = dataSource_ ? std::max(0, dataSource_->tableViewNumberOfRowsInSection(*this, 0)) : 0;
  for (int row = 0; row < rows; ++row) {
    TableViewCell* cell = dataSource_->tableViewCellForRowAtIndexPath(*this, IndexPath{0, row});
    if (!cell) continue;
    // A source that hands back a row still in the pool gives it up.
    reusePool_.erase(std::remove(reusePool_.begin(), reusePool_.end(), cell), reusePool_.end());
    cell->setParent(rowsWidget_);
    cell->setTapHandler([this, cell] { tapped(cell); });
    rowsLayout_->insertWidget(static_cast<int>(cells_.size()), cell);
    cell->show();
    cells_.push_back(cell);
  }

  for (TableViewCell* unused : reusePool_) {
    unused->hide();
    unused->deleteLater();
  }
  reusePool_.clear();
}

TableViewCell* TableView::dequeueReusableCellWithIdentifier(const QString& identifier) {
  const auto found = std::find_if(reusePool_.begin(), reusePool_.end(),
                                  [&](const TableViewCell* cell) { return cell->reuseIdentifier() == identifier; });
  if (found == reusePool_.end()) return nullptr;
  TableViewCell* cell = *found;
  reusePool_.erase(found);
  return cell;
}

TableViewCell* TableView::cellForRowAtIndexPath(const IndexPath& indexPath) const {
  if (indexPath.section != 0 || indexPath.row < 0 || indexPath.row >= numberOfRows()) return nullptr;
  return cells_[static_cast<std::size_t>(indexPath.row)];
}

std::optional<IndexPath> TableView::indexPathForSelectedRow() const {
  for (std::size_t i = 0; i < cells_.size(); ++i) {
    if (cells_[i]->isSelected()) return IndexPath{0, static_cast<int>(i)};
  }
  return std::nullopt;
}

void TableView::selectRowAtIndexPath(const IndexPath& indexPath, bool animated) {
  for (TableViewCell* cell : cells_) cell->setSelected(false, animated);
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
  const auto found = std::find(cells_.begin(), cells_.end(), cell);
  std::optional<IndexPath> indexPath;
  if (found != cells_.end()) {
    indexPath = IndexPath{0, static_cast<int>(found - cells_.begin())};
    selectRowAtIndexPath(*indexPath, false);
  }
  if (dataSource_) dataSource_->tableViewDidSelectRowAtIndexPath(*this, indexPath);
}

}  // namespace corvane
