#pragma once

// The modal screen that saves what the application has collected: it lists the
// entries of the save contents (every one is saved), takes a description, and
// writes one snapshot file, an XML property list {"Timestamp", "Data",
// "Description"} named after the second of saving.

#include <QLineEdit>
#include <QPushButton>

#include <filesystem>
#include <memory>
#include <string>

#include "app/NavigationController.h"
#include "app/ScreenHost.h"
#include "app/TableView.h"
#include "platform/RunLoop.h"
#include "platform/Value.h"
#include "presenter/SnapshotSaver.h"

namespace Ui {
class CorvaneSaveViewController;
}

namespace corvane {

class CorvaneSaveViewController final : public ViewController, private TableViewDataSource {
  Q_OBJECT

 public:
  static constexpr const char* kCellIdentifier = "SaveHistoryContentCell";

  // Records the moment of opening and keeps a copy of the save contents (the
  // model's, or null when it has none). Closing goes through `application` on
  // `mainQueue`; snapshots go into `snapshotDirectory`.
  CorvaneSaveViewController(const Value& saveHistory, ScreenHost& application, RunLoop& mainQueue,
                            std::filesystem::path snapshotDirectory);
  ~CorvaneSaveViewController() override;

  void viewDidLoad();
  void viewWillAppear(bool animated) override;
  void savePressed();
  void cancelPressed();
  bool textFieldShouldReturn(QLineEdit* textField);
  void backgroundTouched();

  int numberOfSectionsInTableView(TableView&) const { return 1; }
  int tableViewNumberOfRowsInSection(TableView& tableView, int section) override;
  TableViewCell* tableViewCellForRowAtIndexPath(TableView& tableView, const IndexPath& indexPath) override;
  void tableViewDidSelectRowAtIndexPath(TableView& tableView, const std::optional<IndexPath>& indexPath) override;

  TableView* saveContentTable() const;
  QLineEdit* saveDescription() const;
  QPushButton* saveButton() const;
  QPushButton* cancelButton() const;

  const Date& timeStamp() const { return saver_.timeStamp(); }
  const Value& saveHistory() const { return saver_.saveHistory(); }
  // The file that a save at `date` writes: "<directory>/CorvaneSnapshot-<seconds since 1970>.corvane".
  std::string snapshotFileAt(const Date& date) const { return saver_.snapshotFileAt(date); }

 protected:
  void mousePressEvent(QMouseEvent* event) override;
  void keyPressEvent(QKeyEvent* event) override;

 private:
  void requestClose();

  SnapshotSaver saver_;
  std::vector<std::string> descriptions_;
  std::unique_ptr<Ui::CorvaneSaveViewController> ui_;
  ScreenHost& application_;
  RunLoop& mainQueue_;
};

}  // namespace corvane
