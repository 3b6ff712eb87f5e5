#include "app/CorvaneSaveViewController.h"

#include <QKeyEvent>
#include <QMessageBox>
#include <QPointer>

#include "app/Theme.h"
#include "platform/DateText.h"
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

}  // namespace

CorvaneSaveViewController::CorvaneSaveViewController(const Value& saveHistory, ScreenHost& application,
                                                     RunLoop& mainQueue, std::filesystem::path snapshotDirectory)
    : saver_(saveHistory, std::move(snapshotDirectory), currentDate()), descriptions_(saver_.entryDescriptions()),
      ui_(std::make_unique<Ui::CorvaneSaveViewController>()), application_(application), mainQueue_(mainQueue) {
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
  ui_->destinationLabel->setText(QString::fromStdString(saver_.destinationText()));
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

void CorvaneSaveViewController::savePressed() {
  if (!saver_.save(ui_->saveDescription->text().toStdString(), currentDate())) {
    // The alert belongs to the window, so that it stays when this screen closes.
    QWidget* owner = window() != this ? window() : nullptr;
    auto* alert = new QMessageBox(QMessageBox::Warning, QString::fromLatin1(kFileErrorTitle),
                                  QString::fromLatin1(kFileErrorMessage), QMessageBox::NoButton, owner);
    alert->setObjectName(QStringLiteral("FileErrorAlert"));
    alert->addButton(QString::fromLatin1(kFileErrorButton), QMessageBox::AcceptRole);
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
  return static_cast<int>(descriptions_.size());
}

TableViewCell* CorvaneSaveViewController::tableViewCellForRowAtIndexPath(TableView& tableView,
                                                                         const IndexPath& indexPath) {
  if (indexPath.row < 0 || static_cast<std::size_t>(indexPath.row) >= descriptions_.size()) return nullptr;
  const QString identifier = QString::fromLatin1(kCellIdentifier);
  TableViewCell* cell = tableView.dequeueReusableCellWithIdentifier(identifier);
  if (!cell) cell = new TableViewCell(TableViewCell::Style::Default, identifier);

  const QString description = QString::fromStdString(descriptions_[static_cast<std::size_t>(indexPath.row)]);
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
