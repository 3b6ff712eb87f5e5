#include "app/CorvaneSaveViewController.h"

#include <QKeyEvent>
#include <QMessageBox>
#include <QPointer>

#include <cstdio>

#include "app/Theme.h"
#include "platform/DateText.h"
#include "platform/Log.h"
#include "platform/PropertyList.h"
#include "ui_CorvaneSaveViewController.h"

namespace corvane {

namespace {

QLabel* styleHeading(QLabel* label) {
  label->setFont(theme::boldSystemFont(12));
  QPalette palette = label->palette();
  palette.setColor(QPalette::WindowText, theme::kSecondaryText);
  label->setPalette(palette);
  return label;
}

// Writes straight into the final file (no temporary file and rename): a
// snapshot is written once and nothing else reads it while it is written.
bool writeFile(const std::string& path, const Bytes& bytes) {
  std::FILE* file = std::fopen(path.c_str(), "wb");
  if (!file) return false;
  const bool written = std::fwrite(bytes.data(), 1, bytes.size(), file) == bytes.size();
  return std::fclose(file) == 0 && written;
}

}  // namespace

CorvaneSaveViewController::CorvaneSaveViewController(const Value& saveHistory, ScreenHost& application,
                                                     RunLoop& mainQueue, std::filesystem::path snapshotDirectory)
    : _timeStamp(currentDate()), _saveHistory(saveHistory.deepCopy()),
      ui_(std::make_unique<Ui::CorvaneSaveViewController>()), application_(application), mainQueue_(mainQueue),
      snapshotDirectory_(std::move(snapshotDirectory)) {
  ui_->setupUi(this);
  setObjectName(QStringLiteral("CorvaneSaveViewController"));
  setTitle(ui_->titleLabel->text());
  viewDidLoad();
}

CorvaneSaveViewController::~CorvaneSaveViewController() = default;

void CorvaneSaveViewController::viewDidLoad() {
  connect(ui_->saveDescription, &QLineEdit::returnPressed, this,
          [this] { textFieldShouldReturn(ui_->saveDescription); });
  connect(ui_->saveButton, &QPushButton::clicked, this, &CorvaneSaveViewController::savePressed);
  connect(ui_->cancelButton, &QPushButton::clicked, this, &CorvaneSaveViewController::cancelPressed);

  ui_->header->setObjectName(QStringLiteral("NavigationBar"));
  ui_->header->setAttribute(Qt::WA_StyledBackground, true);
  ui_->titleLabel->setFont(theme::boldSystemFont(17));
  for (QPushButton* button : {ui_->cancelButton, ui_->saveButton}) {
    button->setFont(theme::systemFont(17));
    button->setCursor(Qt::PointingHandCursor);
  }
  ui_->saveButton->setObjectName(QStringLiteral("SaveSnapshotButton"));
  ui_->cancelButton->setObjectName(QStringLiteral("CancelSnapshotButton"));
  styleHeading(ui_->descriptionHeading);
  styleHeading(ui_->contentsHeading);
  ui_->saveDescription->setFont(theme::systemFont(15));
  ui_->saveDescription->setMinimumHeight(36);
  ui_->destinationLabel->setFont(theme::systemFont(12));
  QPalette secondary = ui_->destinationLabel->palette();
  secondary.setColor(QPalette::WindowText, theme::kSecondaryText);
  ui_->destinationLabel->setPalette(secondary);
  ui_->destinationLabel->setText(
      tr("Written to %1 as CorvaneSnapshot-<seconds since 1970>.corvane, an XML property list.")
          .arg(QString::fromStdString(snapshotDirectory_.string())));
  ui_->body->setAutoFillBackground(true);
  QPalette group = ui_->body->palette();
  group.setColor(QPalette::Window, theme::kGroupBackground);
  ui_->body->setPalette(group);

  ui_->saveContentTable->setDataSource(this);
  ui_->saveContentTable->reloadData();
  ui_->saveContentTable->sizeToFit();
}

void CorvaneSaveViewController::viewWillAppear(bool animated) {
  ViewController::viewWillAppear(animated);
  // Now inside the window, the list has the window's style and its final frame.
  ui_->saveContentTable->sizeToFit();
}

const Array* CorvaneSaveViewController::entries() const { return _saveHistory.asArray(); }

std::string CorvaneSaveViewController::snapshotFileAt(const Date& date) const {
  // Whole seconds, rounded down also before 1970.
  std::int64_t seconds = date.microsecondsSince1970 / 1'000'000;
  if (date.microsecondsSince1970 % 1'000'000 < 0) --seconds;
  char name[64];
  std::snprintf(name, sizeof name, "CorvaneSnapshot-%ld.corvane", static_cast<long>(seconds));
  return snapshotDirectory_.string() + "/" + name;
}

void CorvaneSaveViewController::savePressed() {
  // The keys go in this order, and the first value missing ends the dictionary.
  Dictionary snapshot;
  snapshot.set("Timestamp", Value(dateText(_timeStamp)));
  if (!_saveHistory.isNull()) {
    snapshot.set("Data", _saveHistory);
    snapshot.set("Description", Value(ui_->saveDescription->text().toStdString()));
  }

  const std::string file = snapshotFileAt(currentDate());
  std::string error;
  const std::optional<Bytes> bytes = plist::serialize(Value(snapshot), plist::Format::XML, &error);
  if (!bytes || !writeFile(file, *bytes)) {
    log::printf(log::kError, "Unable to write snapshot to %s", file.c_str());
    // The alert belongs to the window, so that it stays when this screen closes.
    QWidget* owner = window() != this ? window() : nullptr;
    auto* alert = new QMessageBox(QMessageBox::Warning, QStringLiteral("File Error"),
                                  QStringLiteral("Unable to write file to disk"), QMessageBox::NoButton, owner);
    alert->setObjectName(QStringLiteral("FileErrorAlert"));
    alert->addButton(QStringLiteral("Close"), QMessageBox::AcceptRole);
    alert->setAttribute(Qt::WA_DeleteOnClose);
    alert->open();
  }
  requestClose();
}

void CorvaneSaveViewController::cancelPressed() { requestClose(); }

void CorvaneSaveViewController::requestClose() {
  // Later, on the main queue: the button that asked is still on the call stack.
  mainQueue_.dispatchAsync([self = QPointer<CorvaneSaveViewController>(this)] {
    if (self) self->application_.closeSaveView();
  });
}

bool CorvaneSaveViewController::textFieldShouldReturn(QLineEdit* textField) {
  textField->clearFocus();
  return true;
}

void CorvaneSaveViewController::backgroundTouched() { ui_->saveDescription->clearFocus(); }

void CorvaneSaveViewController::mousePressEvent(QMouseEvent* event) {
  backgroundTouched();
  ViewController::mousePressEvent(event);
}

void CorvaneSaveViewController::keyPressEvent(QKeyEvent* event) {
  if (event->key() == Qt::Key_Escape) {
    cancelPressed();
    return;
  }
  ViewController::keyPressEvent(event);
}

int CorvaneSaveViewController::tableViewNumberOfRowsInSection(TableView&, int) {
  const Array* list = entries();
  return list ? static_cast<int>(list->size()) : 0;
}

TableViewCell* CorvaneSaveViewController::tableViewCellForRowAtIndexPath(TableView& tableView,
                                                                         const IndexPath& indexPath) {
  const Array* list = entries();
  if (!list || indexPath.row < 0 || static_cast<std::size_t>(indexPath.row) >= list->size()) return nullptr;
  const QString identifier = QString::fromLatin1(kCellIdentifier);
  TableViewCell* cell = tableView.dequeueReusableCellWithIdentifier(identifier);
  if (!cell) cell = new TableViewCell(TableViewCell::Style::Default, identifier);

  QString description;
  const Value& entry = list->at(static_cast<std::size_t>(indexPath.row));
  if (const Dictionary* dictionary = entry.asDictionary()) {
    if (const Value* text = dictionary->find("Description"); text && text->asString()) {
      description = QString::fromStdString(*text->asString());
    }
  }
  QFont font(QStringLiteral("Helvetica"));
  font.setPixelSize(13);
  cell->textLabel()->setFont(font);
  cell->textLabel()->setText(description);
  // Everything listed is saved; the mark cannot be taken off.
  cell->setAccessoryType(TableViewCell::AccessoryType::Checkmark);
  cell->setCursor(Qt::ArrowCursor);
  return cell;
}

void CorvaneSaveViewController::tableViewDidSelectRowAtIndexPath(TableView& tableView,
                                                                 const std::optional<IndexPath>& indexPath) {
  if (indexPath) tableView.deselectRowAtIndexPath(*indexPath, false);
  backgroundTouched();
}

TableView* CorvaneSaveViewController::saveContentTable() const { return ui_->saveContentTable; }
QLineEdit* CorvaneSaveViewController::saveDescription() const { return ui_->saveDescription; }
QPushButton* CorvaneSaveViewController::saveButton() const { return ui_->saveButton; }
QPushButton* CorvaneSaveViewController::cancelButton() const { return ui_->cancelButton; }

}  // namespace corvane
