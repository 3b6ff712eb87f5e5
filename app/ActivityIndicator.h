#pragma once

// A small spinning indicator of work in progress: twelve grey spokes, the
// brightest one going round. It hides itself while stopped.

#include <QTimer>
#include <QWidget>

namespace corvane {

class ActivityIndicator final : public QWidget {
  Q_OBJECT

 public:
  explicit ActivityIndicator(QWidget* parent = nullptr);

  void startAnimating();
  void stopAnimating();
  bool isAnimating() const { return _animating; }

  QSize sizeHint() const override { return {20, 20}; }

 protected:
  void paintEvent(QPaintEvent* event) override;

 private:
  QTimer _timer;
  int _step = 0;
  bool _animating = false;
};

}  // namespace corvane
