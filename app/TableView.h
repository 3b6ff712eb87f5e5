#pragma once

// A list of rows in one section, in the manner of a phone's list screens: the
// rows are widgets of fixed height that a data source makes (and may take back
// from a reuse pool after a reload); a tap selects a row and tells the source.

#include <QLabel>
#include <QScrollArea>
#include <QWidget>

#include <functional>
#include <optional>
#include <vector>

class QVBoxLayout;

namespace corvane {

class TableView;

// Row and section of a row; screens use the row, the last index.
struct IndexPath {
  int section = 0;
  int row = 0;
  friend bool operator==(const IndexPath&, const IndexPath&) = default;
};

class TableViewCell : public QWidget {
  Q_OBJECT

 public:
  enum class Style { Default, Value1 };
  enum class AccessoryType { None, DisclosureIndicator, Checkmark };

  static constexpr int kHeight = 44;

  TableViewCell(Style style, QString reuseIdentifier, QWidget* parent = nullptr);

  Style style() const { return style_; }
  const QString& reuseIdentifier() const { return reuseIdentifier_; }
  // The area the row's own labels go in: the row less its accessory.
  QWidget* contentView() const { return contentView_; }
  // The row's text label (made on first use), laid out across the content area.
  QLabel* textLabel();

  void setAccessoryType(AccessoryType type);
  AccessoryType accessoryType() const { return accessoryType_; }

  bool isSelected() const { return selected_; }
  void setSelected(bool selected, bool animated);

  // Called with every tap on the row (the table sets it).
  void setTapHandler(std::function<void()> handler) { tapHandler_ = std::move(handler); }

  QSize sizeHint() const override { return {320, kHeight}; }

 protected:
  // The platform's own layout: the content area and the accessory. Rows that
  // place labels of their own override this and call it first.
  virtual void layoutSubviews();

  void resizeEvent(QResizeEvent* event) override;
  void paintEvent(QPaintEvent* event) override;
  void mousePressEvent(QMouseEvent* event) override;
  void mouseReleaseEvent(QMouseEvent* event) override;

 private:
  Style style_;
  QString reuseIdentifier_;
  QWidget* contentView_;
  QLabel* textLabel_ = nullptr;
  QLabel* accessory_;
  AccessoryType accessoryType_ = AccessoryType::None;
  bool selected_ = false;
  bool pressed_ = false;
  std::function<void()> tapHandler_;
};

class TableViewDataSource {
 public:
  virtual int tableViewNumberOfRowsInSection(TableView& tableView, int section) = 0;
  // The row widget for the index path, made or taken with dequeueReusableCellWithIdentifier.
  virtual TableViewCell* tableViewCellForRowAtIndexPath(TableView& tableView, const IndexPath& indexPath) = 0;
  // A tap on a row; `indexPath` may be missing.
  virtual void tableViewDidSelectRowAtIndexPath(TableView& tableView, const std::optional<IndexPath>& indexPath) = 0;

 protected:
  ~TableViewDataSource() = default;
};

class TableView final : public QScrollArea {
  Q_OBJECT

 public:
  explicit TableView(QWidget* parent = nullptr);

  void setDataSource(TableViewDataSource* dataSource) { dataSource_ = dataSource; }

  // Asks the data source for every row again. The rows shown so far go into the
  // reuse pool first, in order; rows left there afterwards are deleted.
  void reloadData();
  // A row from the reuse pool made with this identifier (the first one put
  // there), or nullptr. The table takes the row back when it is returned.
  TableViewCell* dequeueReusableCellWithIdentifier(const QString& identifier);

  int numberOfRows() const { return static_cast<int>(cells_.size()); }
  TableViewCell* cellForRowAtIndexPath(const IndexPath& indexPath) const;
  std::optional<IndexPath> indexPathForSelectedRow() const;
  void selectRowAtIndexPath(const IndexPath& indexPath, bool animated);
  void deselectRowAtIndexPath(const IndexPath& indexPath, bool animated);

  // Makes the height fit the rows (lists that sit inside a larger layout).
  void sizeToFit();

 private:
  void tapped(TableViewCell* cell);

  TableViewDataSource* dataSource_ = nullptr;
  QWidget* rowsWidget_;
  QVBoxLayout* rowsLayout_;
  std::vector<TableViewCell*> cells_;
  std::vector<TableViewCell*> reusePool_;
};

}  // namespace corvane
