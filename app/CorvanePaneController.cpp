#include "app/CorvanePaneController.h"

#include <QLabel>
#include <QStyle>
#include <QToolButton>
#include <QVBoxLayout>

#include "app/ActivityIndicator.h"
#include "app/CorvaneCell.h"
#include "app/Theme.h"
#include "presenter/PaneRows.h"

namespace corvane {

namespace {
constexpr int kStatusFontSize = 14;
}  // namespace

CorvanePaneController::CorvanePaneController(NodeRef node, std::string path, ScreenHost& application)
    : _nodes(std::move(node)), _keyPath(std::move(path)), _status(QStringLiteral("")), _isLoading(true),
      application_(application) {
  setObjectName(QStringLiteral("CorvanePaneController"));
  auto* layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  tableView_ = new TableView(this);
  tableView_->setDataSource(this);
  layout->addWidget(tableView_);
  updateTitle();
  tableView_->reloadData();
}

void CorvanePaneController::createToolbarItems() {
  auto* indicator = new ActivityIndicator(toolbar());
  if (_isLoading) {
    indicator->startAnimating();
  } else {
    indicator->stopAnimating();
  }

  auto* status = new QLabel(_status, toolbar());
  status->setObjectName(QStringLiteral("StatusLabel"));
  status->setTextFormat(Qt::PlainText);
  status->setFont(theme::systemFont(kStatusFontSize));
  status->setAttribute(Qt::WA_TranslucentBackground);
  QPalette palette = status->palette();
  palette.setColor(QPalette::WindowText, theme::kDarkText);
  status->setPalette(palette);
  status->setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Fixed);
  status->adjustSize();

  std::vector<BarItem> items{BarItem::item(indicator), BarItem::item(status), BarItem::flexibleSpace()};
  if (application_.allowSaveButton()) {
    auto* save = new QToolButton(toolbar());
    save->setObjectName(QStringLiteral("SaveButton"));
    save->setText(tr("Save"));
    save->setIcon(style()->standardIcon(QStyle::SP_DialogSaveButton));
    save->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
    save->setToolTip(tr("Save a snapshot of the collected history"));
    save->setFont(theme::systemFont(15));
    save->setCursor(Qt::PointingHandCursor);
    save->setAutoRaise(true);
    connect(save, &QToolButton::clicked, this, [this] { application_.showSaveView(); });
    items.push_back(BarItem::item(save));
  }
  setToolbarItems(std::move(items), true);
}

void CorvanePaneController::viewWillAppear(bool animated) {
  ViewController::viewWillAppear(animated);
  updateTitle();
  if (NavigationController* navigation = navigationController()) navigation->setToolbarHidden(false);
  createToolbarItems();
  // Coming back to a screen shows it without the row that was opened.
  if (const auto selected = tableView_->indexPathForSelectedRow()) tableView_->deselectRowAtIndexPath(*selected, false);
}

void CorvanePaneController::setStatus(const std::optional<QString>& status, bool isLoading) {
  _status = status.value_or(QStringLiteral(""));
  _isLoading = isLoading;
  createToolbarItems();
}

void CorvanePaneController::reloadWithNode(NodeRef node) {
  _nodes = std::move(node);
  updateTitle();
  tableView_->reloadData();
  createToolbarItems();
}

void CorvanePaneController::viewWillDisappear(bool animated) {
  ViewController::viewWillDisappear(animated);
  if (QWidget* focused = focusWidget()) focused->clearFocus();
}

void CorvanePaneController::updateTitle() {
  setTitle(QString::fromStdString(paneTitle(_nodes.get())));
}

const NodeRef* CorvanePaneController::childAt(int row) const {
  return row < 0 ? nullptr : paneChildAt(_nodes.get(), static_cast<std::size_t>(row));
}

int CorvanePaneController::tableViewNumberOfRowsInSection(TableView&, int) {
  const NodeArray* children = _nodes ? _nodes->childNodes() : nullptr;
  return children ? static_cast<int>(children->size()) : 0;
}

TableViewCell* CorvanePaneController::tableViewCellForRowAtIndexPath(TableView& tableView,
                                                                     const IndexPath& indexPath) {
  const NodeRef* child = childAt(indexPath.row);
  if (!child || !*child) return nullptr;
  const PaneRow row = paneRow(**child);
  const QString identifier = QString::fromLatin1(kCellIdentifier);
  // One identifier for both kinds of row, so a row made for one kind may come back for the other.
  auto* cell = static_cast<CorvaneCell*>(tableView.dequeueReusableCellWithIdentifier(identifier));
  const QString name = QString::fromStdString(row.key);

  if (row.opens) {
    if (!cell) cell = CorvaneCell::initWithStyleKey(TableViewCell::Style::Value1, identifier);
    cell->key->setText(name);
    cell->setAccessoryType(TableViewCell::AccessoryType::DisclosureIndicator);
    if (cell->value) cell->value->setText(QString());
    cell->setLayoutKey();
  } else {
    if (!cell) cell = CorvaneCell::initWithStyle(TableViewCell::Style::Value1, identifier);
    cell->key->setText(name);
    cell->setAccessoryType(TableViewCell::AccessoryType::None);
    if (cell->value) cell->value->setText(QString::fromStdString(row.value));
    cell->setLayout();
  }
  return cell;
}

void CorvanePaneController::tableViewDidSelectRowAtIndexPath(TableView& tableView,
                                                             const std::optional<IndexPath>& indexPath) {
  if (!indexPath) return;
  const NodeRef* child = childAt(indexPath->row);
  if (!child || !*child) return;
  if (!(*child)->childNodes()) {
    tableView.deselectRowAtIndexPath(*indexPath, false);
    return;
  }
  auto* screen = new CorvanePaneController(*child, appendPathComponent(_keyPath, (*child)->displayName()),
                                           application_);
  screen->setStatus(_status, _isLoading);
  if (NavigationController* navigation = navigationController()) {
    navigation->pushViewController(screen, true);
  } else {
    delete screen;
  }
}

}  // namespace corvane
