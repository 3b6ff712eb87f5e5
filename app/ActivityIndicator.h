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
  bool isAnimating() const { return animating_; }

  QSize sizeHint() const override { return {20, 20}; }

 protected:
  void paintEvent(QPaintEvent* event) override;

 private:
  QTimer timer_;
  int step_ = 0;
  bool animating_ = false;
};

}  // namespace corvane
