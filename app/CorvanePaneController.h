#pragma once

// A list screen over one node of the display tree: a row per child, sections
// open a deeper screen, values show beside their keys. Its toolbar shows the
// loading indicator, the status text and, where saving is offered, the save
// button. The application feeds it fresh nodes; the screen never asks the
// model itself.

#include <optional>
#include <string>

#include "app/NavigationController.h"
#include "app/ScreenHost.h"
#include "app/TableView.h"
#include "model/CorvaneModelNode.h"

namespace corvane {

class ActivityIndicator;

class CorvanePaneController final : public ViewController, private TableViewDataSource {
  Q_OBJECT

 public:
  static constexpr const char* kCellIdentifier = "CorvanePaneControllerCell";

  // `node` may be null (the root before the first update); `application` must outlive the screen.
  CorvanePaneController(NodeRef node, std::string path, ScreenHost& application);

  void createToolbarItems();
  void viewWillAppear(bool animated) override;
  // Keeps the status ("" for none) and the loading flag, then rebuilds the toolbar.
  void setStatus(const std::optional<QString>& status, bool isLoading);
  void reloadWithNode(NodeRef node);
  const std::string& path() const { return _keyPath; }
  void viewWillDisappear(bool animated) override;

  int tableViewNumberOfRowsInSection(TableView& tableView, int section) override;
  TableViewCell* tableViewCellForRowAtIndexPath(TableView& tableView, const IndexPath& indexPath) override;
  void tableViewDidSelectRowAtIndexPath(TableView& tableView, const std::optional<IndexPath>& indexPath) override;

  const NodeRef& node() const { return _nodes; }
  const QString& status() const { return _status; }
  bool isLoading() const { return _isLoading; }
  TableView* tableView() const { return tableView_; }

 private:
  void updateTitle();
  const NodeRef* childAt(int row) const;

  NodeRef _nodes;
  std::string _keyPath;
  QString _status;
  bool _isLoading = true;

  ScreenHost& application_;
  TableView* tableView_;
};

}  // namespace corvane
