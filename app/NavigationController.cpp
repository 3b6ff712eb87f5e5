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
  _toolbar = makeBar("Toolbar", this);
  _toolbar->hide();
  _toolbar->setFixedHeight(kToolbarHeight);
  _toolbarLayout = new QHBoxLayout(_toolbar);
  _toolbarLayout->setContentsMargins(12, 0, 8, 0);
  _toolbarLayout->setSpacing(8);
}

ViewController::~ViewController() {
  // While this screen is on a stack, its toolbar lives in the stack's toolbar area.
  delete _toolbar.data();
}

void ViewController::setTitle(const QString& title) {
  if (title == _title) return;
  _title = title;
  emit titleChanged(_title);
}

void ViewController::setToolbarItems(std::vector<BarItem> items, bool /*animated*/) {
  while (QLayoutItem* old = _toolbarLayout->takeAt(0)) {
    if (QWidget* widget = old->widget()) {
      // Deleted later: the call may come from one of these very widgets.
      widget->hide();
      widget->deleteLater();
    }
    delete old;
  }
  _toolbarItems = std::move(items);
  for (const BarItem& item : _toolbarItems) {
    if (item.kind == BarItem::Kind::FlexibleSpace) {
      _toolbarLayout->addStretch(1);
    } else if (item.widget) {
      _toolbarLayout->addWidget(item.widget, 0, Qt::AlignVCenter);
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
  _presentation = new QStackedLayout(this);
  _presentation->setContentsMargins(0, 0, 0, 0);

  _stackPage = new QWidget(this);
  auto* page = new QVBoxLayout(_stackPage);
  page->setContentsMargins(0, 0, 0, 0);
  page->setSpacing(0);

  _navigationBar = makeBar("NavigationBar", _stackPage);
  _navigationBar->setFixedHeight(kNavigationBarHeight);
  auto* bar = new QHBoxLayout(_navigationBar);
  bar->setContentsMargins(4, 0, 4, 0);
  bar->setSpacing(0);
  _backButton = new QToolButton(_navigationBar);
  _backButton->setObjectName(QStringLiteral("BackButton"));
  _backButton->setFont(theme::systemFont(17));
  _backButton->setCursor(Qt::PointingHandCursor);
  _backButton->setAutoRaise(true);
  _backButton->setFocusPolicy(Qt::NoFocus);
  connect(_backButton, &QToolButton::clicked, this, [this] { popViewControllerAnimated(true); });
  _titleLabel = new TitleLabel(_navigationBar);
  _titleLabel->setObjectName(QStringLiteral("NavigationTitle"));
  _titleLabel->setFont(theme::boldSystemFont(17));
  _titleLabel->setAlignment(Qt::AlignCenter);
  _titleLabel->setTextFormat(Qt::PlainText);
  // A long title is clipped, never widening the window (section names such as
  // "Connected mode LTE Intra-frequency Measurement" are wider than a phone).
  _titleLabel->setSizePolicy(QSizePolicy::Ignored, QSizePolicy::Preferred);
  _titleBalance = new QWidget(_navigationBar);
  bar->addWidget(_backButton);
  bar->addWidget(_titleLabel, 1);
  bar->addWidget(_titleBalance);

  _screens = new QStackedWidget(_stackPage);
  _toolbars = new QStackedWidget(_stackPage);
  _toolbars->setFixedHeight(kToolbarHeight);
  _toolbars->hide();

  page->addWidget(_navigationBar);
  page->addWidget(_screens, 1);
  page->addWidget(_toolbars);
  _presentation->addWidget(_stackPage);

  // Desktop habits for going back: Alt+Left and Backspace.
  for (const QKeySequence& keys : {QKeySequence(QKeySequence::Back), QKeySequence(Qt::Key_Backspace)}) {
    auto* shortcut = new QShortcut(keys, _stackPage);
    shortcut->setContext(Qt::WidgetWithChildrenShortcut);
    connect(shortcut, &QShortcut::activated, this, [this] { popViewControllerAnimated(true); });
  }

  adopt(rootViewController);
  _viewControllers.push_back(rootViewController);
  _screens->setCurrentWidget(rootViewController);
  _toolbars->setCurrentWidget(rootViewController->toolbar());
  updateBar();
}

NavigationController::~NavigationController() = default;

void NavigationController::adopt(ViewController* viewController) {
  viewController->_navigationController = this;
  _screens->addWidget(viewController);
  _toolbars->addWidget(viewController->toolbar());
  viewController->toolbar()->show();
  connect(viewController, &ViewController::titleChanged, this, &NavigationController::updateBar);
}

void NavigationController::release(ViewController* viewController) {
  disconnect(viewController, nullptr, this, nullptr);
  _screens->removeWidget(viewController);
  if (viewController->toolbar()) _toolbars->removeWidget(viewController->toolbar());
  viewController->hide();
  // Deleted later: the back button or a screen's own handler may be on the call stack.
  viewController->deleteLater();
}

void NavigationController::willShow(ViewController* viewController, bool animated) {
  if (_delegate) _delegate->navigationControllerWillShowViewController(*this, viewController, animated);
  viewController->viewWillAppear(animated);
}

void NavigationController::pushViewController(ViewController* viewController, bool animated) {
  if (!viewController) return;
  topViewController()->viewWillDisappear(animated);
  adopt(viewController);
  _viewControllers.push_back(viewController);
  willShow(viewController, animated);
  _screens->setCurrentWidget(viewController);
  _toolbars->setCurrentWidget(viewController->toolbar());
  updateBar();
}

void NavigationController::popViewControllerAnimated(bool animated) {
  if (_viewControllers.size() < 2) return;
  popToViewController(_viewControllers[_viewControllers.size() - 2], animated);
}

void NavigationController::popToViewController(ViewController* viewController, bool animated) {
  const auto found = std::find(_viewControllers.begin(), _viewControllers.end(), viewController);
  if (found == _viewControllers.end() || found + 1 == _viewControllers.end()) return;
  topViewController()->viewWillDisappear(animated);
  std::vector<ViewController*> popped(found + 1, _viewControllers.end());
  _viewControllers.erase(found + 1, _viewControllers.end());
  willShow(viewController, animated);
  _screens->setCurrentWidget(viewController);
  _toolbars->setCurrentWidget(viewController->toolbar());
  for (ViewController* gone : popped) release(gone);
  updateBar();
}

void NavigationController::setToolbarHidden(bool hidden) {
  _toolbarHidden = hidden;
  _toolbars->setVisible(!hidden);
}

void NavigationController::presentModalViewController(ViewController* viewController, bool animated) {
  if (!viewController || _modalViewController) return;
  _modalViewController = viewController;
  viewController->_navigationController = this;
  _presentation->addWidget(viewController);
  viewController->viewWillAppear(animated);
  _presentation->setCurrentWidget(viewController);
}

void NavigationController::dismissModalViewControllerAnimated(bool animated) {
  ViewController* presented = _modalViewController;
  if (!presented) return;
  _modalViewController = nullptr;
  presented->viewWillDisappear(animated);
  _presentation->setCurrentWidget(_stackPage);
  _presentation->removeWidget(presented);
  presented->hide();
  presented->deleteLater();
}

QString NavigationController::barTitle() const { return _titleLabel->text(); }

QString NavigationController::backButtonText() const {
  return _backButton->isHidden() ? QString() : _backButton->text();
}

void NavigationController::resizeEvent(QResizeEvent* event) {
  QWidget::resizeEvent(event);
  updateBar();
}

void NavigationController::showEvent(QShowEvent* event) {
  QWidget::showEvent(event);
  if (_appeared) return;
  // The root appears with the stack, without a "will show" to the delegate.
  _appeared = true;
  topViewController()->viewWillAppear(false);
}

void NavigationController::updateBar() {
  _titleLabel->setText(topViewController()->title());
  _titleLabel->setToolTip(topViewController()->title());
  if (_viewControllers.size() < 2) {
    _backButton->hide();
    _titleBalance->setFixedWidth(0);
    return;
  }
  const QString previous = _viewControllers[_viewControllers.size() - 2]->title();
  const QString full = QStringLiteral("\u2039 ") + (previous.isEmpty() ? tr("Back") : previous);
  // The back button keeps room for the title: a long name is cut short.
  _backButton->setText(QFontMetrics(_backButton->font()).elidedText(full, Qt::ElideRight, kMaximumBackTextWidth));
  _backButton->setToolTip(full);
  _backButton->show();
  // The balance keeps the title centred while there is room; a long title
  // takes the balance's room first.
  const int back = _backButton->sizeHint().width();
  const int title = QFontMetrics(_titleLabel->font()).horizontalAdvance(_titleLabel->text());
  const int room = _navigationBar->width() - 8 - back;
  _titleBalance->setFixedWidth(std::clamp(room - title, 0, back));
}

}  // namespace corvane
