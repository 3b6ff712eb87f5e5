#include "app/NavigationController.h"

#include <QFontMetrics>
#include <QHBoxLayout>
#include <QLabel>
#include <QPainter>
#include <QShortcut>
#include <QStackedLayout>
#include <QStackedWidget>
#include <QToolButton>
#include <QVBoxLayout>

#include <algorithm>

#include "app/Theme.h"

namespace corvane {

namespace {

constexpr int kMaximumBackTextWidth = 130;

// A title that is cut short with an ellipsis where the bar is too narrow; its
// text stays whole.
class TitleLabel final : public QLabel {
 public:
  using QLabel::QLabel;

 protected:
  void paintEvent(QPaintEvent*) override {
    QPainter painter(this);
    painter.setFont(font());
    painter.setPen(palette().color(QPalette::WindowText));
    const QString shown = fontMetrics().elidedText(text(), Qt::ElideRight, contentsRect().width());
    painter.drawText(contentsRect(), static_cast<int>(alignment()), shown);
  }
};

}  // namespace

namespace {

constexpr int kNavigationBarHeight = 44;
constexpr int kToolbarHeight = 44;

// Bars are plain widgets, so their background must be asked for.
QWidget* makeBar(const char* objectName, QWidget* parent) {
  auto* bar = new QWidget(parent);
  bar->setObjectName(QString::fromLatin1(objectName));
  bar->setAttribute(Qt::WA_StyledBackground, true);
  return bar;
}

}  // namespace

// --- ViewController ----------------------------------------------------------

ViewController::ViewController(QWidget* parent) : QWidget(parent) {
  toolbar_ = makeBar("Toolbar", this);
  toolbar_->hide();
  toolbar_->setFixedHeight(kToolbarHeight);
  toolbarLayout_ = new QHBoxLayout(toolbar_);
  toolbarLayout_->setContentsMargins(12, 0, 8, 0);
  toolbarLayout_->setSpacing(8);
}

ViewController::~ViewController() {
  // While this screen is on a stack, its toolbar lives in the stack's toolbar area.
  delete toolbar_.data();
}

void ViewController::setTitle(const QString& title) {
  if (title == title_) return;
  title_ = title;
  emit titleChanged(title_);
}

void ViewController::setToolbarItems(std::vector<BarItem> items, bool /*animated*/) {
  while (QLayoutItem* old = toolbarLayout_->takeAt(0)) {
    if (QWidget* widget = old->widget()) {
      // Deleted later: the call may come from one of these very widgets.
      widget->hide();
      widget->deleteLater();
    }
    delete old;
  }
  toolbarItems_ = std::move(items);
  for (const BarItem& item : toolbarItems_) {
    if (item.kind == BarItem::Kind::FlexibleSpace) {
      toolbarLayout_->addStretch(1);
    } else if (item.widget) {
      toolbarLayout_->addWidget(item.widget, 0, Qt::AlignVCenter);
      // Shown now rather than when the layout gets to it, unless hidden on purpose.
      const bool hiddenOnPurpose =
          item.widget->isHidden() && item.widget->testAttribute(Qt::WA_WState_ExplicitShowHide);
      if (!hiddenOnPurpose) item.widget->show();
    }
  }
}

void ViewController::viewWillAppear(bool) {}
void ViewController::viewWillDisappear(bool) {}

// --- NavigationController ----------------------------------------------------

NavigationController::NavigationController(ViewController* rootViewController, QWidget* parent) : QWidget(parent) {
  setObjectName(QStringLiteral("NavigationController"));
  presentation_ = new QStackedLayout(this);
  presentation_->setContentsMargins(0, 0, 0, 0);

  stackPage_ = new QWidget(this);
  auto* page = new QVBoxLayout(stackPage_);
  page->setContentsMargins(0, 0, 0, 0);
  page->setSpacing(0);

  navigationBar_ = makeBar("NavigationBar", stackPage_);
  navigationBar_->setFixedHeight(kNavigationBarHeight);
  auto* bar = new QHBoxLayout(navigationBar_);
  bar->setContentsMargins(4, 0, 4, 0);
  bar->setSpacing(0);
  backButton_ = new QToolButton(navigationBar_);
  backButton_->setObjectName(QStringLiteral("BackButton"));
  backButton_->setFont(theme::systemFont(17));
  backButton_->setCursor(Qt::PointingHandCursor);
  backButton_->setAutoRaise(true);
  backButton_->setFocusPolicy(Qt::NoFocus);
  connect(backButton_, &QToolButton::clicked, this, [this] { popViewControllerAnimated(true); });
  titleLabel_ = new TitleLabel(navigationBar_);
  titleLabel_->setObjectName(QStringLiteral("NavigationTitle"));
  titleLabel_->setFont(theme::boldSystemFont(17));
  titleLabel_->setAlignment(Qt::AlignCenter);
  titleLabel_->setTextFormat(Qt::PlainText);
  // A long title is clipped, never widening the window (section names such as
  // "Connected mode LTE Intra-frequency Measurement" are wider than a phone).
  titleLabel_->setSizePolicy(QSizePolicy::Ignored, QSizePolicy::Preferred);
  titleBalance_ = new QWidget(navigationBar_);
  bar->addWidget(backButton_);
  bar->addWidget(titleLabel_, 1);
  bar->addWidget(titleBalance_);

  screens_ = new QStackedWidget(stackPage_);
  toolbars_ = new QStackedWidget(stackPage_);
  toolbars_->setFixedHeight(kToolbarHeight);
  toolbars_->hide();

  page->addWidget(navigationBar_);
  page->addWidget(screens_, 1);
  page->addWidget(toolbars_);
  presentation_->addWidget(stackPage_);

  // Desktop habits for going back: Alt+Left and Backspace.
  for (const QKeySequence& keys : {QKeySequence(QKeySequence::Back), QKeySequence(Qt::Key_Backspace)}) {
    auto* shortcut = new QShortcut(keys, stackPage_);
    shortcut->setContext(Qt::WidgetWithChildrenShortcut);
    connect(shortcut, &QShortcut::activated, this, [this] { popViewControllerAnimated(true); });
  }

  adopt(rootViewController);
  viewControllers_.push_back(rootViewController);
  screens_->setCurrentWidget(rootViewController);
  toolbars_->setCurrentWidget(rootViewController->toolbar());
  updateBar();
}

NavigationController::~NavigationController() = default;

void NavigationController::adopt(ViewController* viewController) {
  viewController->navigationController_ = this;
  screens_->addWidget(viewController);
  toolbars_->addWidget(viewController->toolbar());
  viewController->toolbar()->show();
  connect(viewController, &ViewController::titleChanged, this, &NavigationController::updateBar);
}

void NavigationController::release(ViewController* viewController) {
  disconnect(viewController, nullptr, this, nullptr);
  screens_->removeWidget(viewController);
  if (viewController->toolbar()) toolbars_->removeWidget(viewController->toolbar());
  viewController->hide();
  // Deleted later: the back button or a screen's own handler may be on the call stack.
  viewController->deleteLater();
}

void NavigationController::willShow(ViewController* viewController, bool animated) {
  if (delegate_) delegate_->navigationControllerWillShowViewController(*this, viewController, animated);
  viewController->viewWillAppear(animated);
}

void NavigationController::pushViewController(ViewController* viewController, bool animated) {
  if (!viewController) return;
  topViewController()->viewWillDisappear(animated);
  adopt(viewController);
  viewControllers_.push_back(viewController);
  willShow(viewController, animated);
  screens_->setCurrentWidget(viewController);
  toolbars_->setCurrentWidget(viewController->toolbar());
  updateBar();
}

void NavigationController::popViewControllerAnimated(bool animated) {
  if (viewControllers_.size() < 2) return;
  popToViewController(viewControllers_[viewControllers_.size() - 2], animated);
}

void NavigationController::popToViewController(ViewController* viewController, bool animated) {
  const auto found = std::find(viewControllers_.begin(), viewControllers_.end(), viewController);
  if (found == viewControllers_.end() || found + 1 == viewControllers_.end()) return;
  topViewController()->viewWillDisappear(animated);
  std::vector<ViewController*> popped(found + 1, viewControllers_.end());
  viewControllers_.erase(found + 1, viewControllers_.end());
  willShow(viewController, animated);
  screens_->setCurrentWidget(viewController);
  toolbars_->setCurrentWidget(viewController->toolbar());
  for (ViewController* gone : popped) release(gone);
  updateBar();
}

void NavigationController::setToolbarHidden(bool hidden) {
  toolbarHidden_ = hidden;
  toolbars_->setVisible(!hidden);
}

void NavigationController::presentModalViewController(ViewController* viewController, bool animated) {
  if (!viewController || modalViewController_) return;
  modalViewController_ = viewController;
  viewController->navigationController_ = this;
  presentation_->addWidget(viewController);
  viewController->viewWillAppear(animated);
  presentation_->setCurrentWidget(viewController);
}

void NavigationController::dismissModalViewControllerAnimated(bool animated) {
  ViewController* presented = modalViewController_;
  if (!presented) return;
  modalViewController_ = nullptr;
  presented->viewWillDisappear(animated);
  presentation_->setCurrentWidget(stackPage_);
  presentation_->removeWidget(presented);
  presented->hide();
  presented->deleteLater();
}

QString NavigationController::barTitle() const { return titleLabel_->text(); }

QString NavigationController::backButtonText() const {
  return backButton_->isHidden() ? QString() : backButton_->text();
}

void NavigationController::resizeEvent(QResizeEvent* event) {
  QWidget::resizeEvent(event);
  updateBar();
}

void NavigationController::showEvent(QShowEvent* event) {
  QWidget::showEvent(event);
  if (appeared_) return;
  // The root appears with the stack, without a "will show" to the delegate.
  appeared_ = true;
  topViewController()->viewWillAppear(false);
}

void NavigationController::updateBar() {
  titleLabel_->setText(topViewController()->title());
  titleLabel_->setToolTip(topViewController()->title());
  if (viewControllers_.size() < 2) {
    backButton_->hide();
    titleBalance_->setFixedWidth(0);
    return;
  }
  const QString previous = viewControllers_[viewControllers_.size() - 2]->title();
  const QString full = QStringLiteral("\u2039 ") + (previous.isEmpty() ? tr("Back") : previous);
  // The back button keeps room for the title: a long name is cut short.
  backButton_->setText(QFontMetrics(backButton_->font()).elidedText(full, Qt::ElideRight, kMaximumBackTextWidth));
  backButton_->setToolTip(full);
  backButton_->show();
  // The balance keeps the title centred while there is room; a long title
  // takes the balance's room first.
  const int back = backButton_->sizeHint().width();
  const int title = QFontMetrics(titleLabel_->font()).horizontalAdvance(titleLabel_->text());
  const int room = navigationBar_->width() - 8 - back;
  titleBalance_->setFixedWidth(std::clamp(room - title, 0, back));
}

}  // namespace corvane
