#pragma once

// Screens and the stack that holds them. A ViewController is one screen with a
// title and a toolbar of its own; the NavigationController shows the topmost
// screen under a bar with its title and a back button, and its toolbar below.
// One screen at a time can be presented modally over the whole stack.
//
// Pushes and pops happen at once whatever `animated` says: nothing waits for
// an animation, so what a caller sees right after a call is final.

#include <QPointer>
#include <QWidget>

#include <vector>

class QHBoxLayout;
class QLabel;
class QStackedLayout;
class QStackedWidget;
class QToolButton;

namespace corvane {

class NavigationController;

// One item of a toolbar: a widget, or a flexible space that takes up what the
// other items leave.
struct BarItem {
  enum class Kind { Widget, FlexibleSpace };
  Kind kind = Kind::FlexibleSpace;
  QPointer<QWidget> widget;

  static BarItem item(QWidget* widget) { return BarItem{Kind::Widget, widget}; }
  static BarItem flexibleSpace() { return BarItem{}; }
};

class ViewController : public QWidget {
  Q_OBJECT

 public:
  explicit ViewController(QWidget* parent = nullptr);
  ~ViewController() override;

  const QString& title() const { return title_; }
  void setTitle(const QString& title);

  const std::vector<BarItem>& toolbarItems() const { return toolbarItems_; }
  // Replaces the toolbar's items; the widgets of the previous items are deleted.
  void setToolbarItems(std::vector<BarItem> items, bool animated);
  // The toolbar that shows the items (the navigation controller shows it while
  // this screen is on top). Item widgets are best made as its children.
  QWidget* toolbar() const { return toolbar_; }

  // The stack this screen is on (or is presented over); nullptr for none.
  NavigationController* navigationController() const { return navigationController_; }

  virtual void viewWillAppear(bool animated);
  virtual void viewWillDisappear(bool animated);

 signals:
  void titleChanged(const QString& title);

 private:
  friend class NavigationController;

  QString title_;
  std::vector<BarItem> toolbarItems_;
  QPointer<QWidget> toolbar_;
  QHBoxLayout* toolbarLayout_ = nullptr;
  NavigationController* navigationController_ = nullptr;
};

class NavigationControllerDelegate {
 public:
  // Called before `viewController` becomes the visible screen by a push or a pop.
  virtual void navigationControllerWillShowViewController(NavigationController& navigationController,
                                                          ViewController* viewController, bool animated) = 0;

 protected:
  ~NavigationControllerDelegate() = default;
};

class NavigationController final : public QWidget {
  Q_OBJECT

 public:
  // Takes the root screen over; it is never popped.
  explicit NavigationController(ViewController* rootViewController, QWidget* parent = nullptr);
  ~NavigationController() override;

  void setDelegate(NavigationControllerDelegate* delegate) { delegate_ = delegate; }
  NavigationControllerDelegate* delegate() const { return delegate_; }

  // Takes the screen over and shows it on top.
  void pushViewController(ViewController* viewController, bool animated);
  // Pops the top screen (never the root); the popped screens are deleted.
  void popViewControllerAnimated(bool animated);
  // Pops every screen above `viewController`.
  void popToViewController(ViewController* viewController, bool animated);

  const std::vector<ViewController*>& viewControllers() const { return viewControllers_; }
  ViewController* topViewController() const { return viewControllers_.back(); }

  void setToolbarHidden(bool hidden);
  bool isToolbarHidden() const { return toolbarHidden_; }

  // Shows `viewController` over the whole stack (taking it over) until it is dismissed.
  void presentModalViewController(ViewController* viewController, bool animated);
  // Takes the presented screen away and deletes it.
  void dismissModalViewControllerAnimated(bool animated);
  ViewController* modalViewController() const { return modalViewController_; }

  // What the bar shows: the top screen's title, and the back button's text
  // (empty when the root is on top).
  QString barTitle() const;
  QString backButtonText() const;
  QToolButton* backButton() const { return backButton_; }

 protected:
  void showEvent(QShowEvent* event) override;
  void resizeEvent(QResizeEvent* event) override;

 private:
  void willShow(ViewController* viewController, bool animated);
  void adopt(ViewController* viewController);
  void release(ViewController* viewController);
  void updateBar();

  std::vector<ViewController*> viewControllers_;
  NavigationControllerDelegate* delegate_ = nullptr;
  ViewController* modalViewController_ = nullptr;
  bool toolbarHidden_ = true;
  bool appeared_ = false;

  QStackedLayout* presentation_ = nullptr;  // the stack's page, or the modal screen
  QWidget* stackPage_ = nullptr;
  QWidget* navigationBar_ = nullptr;
  QToolButton* backButton_ = nullptr;
  QLabel* titleLabel_ = nullptr;
  QWidget* titleBalance_ = nullptr;
  QStackedWidget* screens_ = nullptr;
  QStackedWidget* toolbars_ = nullptr;
};

}  // namespace corvane
