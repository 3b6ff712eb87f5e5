#include "platform/QtRunLoop.h"

#include <QCoreApplication>
#include <QObject>
#include <QPointer>
#include <QSocketNotifier>
#include <QTimer>

#include <unordered_map>
#include <utility>

namespace corvane {

struct QtRunLoop::Impl {
  // Parent of every timer and notifier, and the receiver of queued calls: when
  // the loop goes, Qt drops whatever is still pending for it.
  QObject context;
  std::unordered_map<Handle, QPointer<QObject>> live;
  Handle next = 1;

  Handle add(QObject* object) {
    const Handle handle = next++;
    live.emplace(handle, object);
    return handle;
  }

  // Stops the object at once but deletes it later: cancel() may be called from
  // inside the object's own signal, and Qt must not delete the sender there.
  void retire(Handle handle) {
    auto it = live.find(handle);
    if (it == live.end()) return;
    QPointer<QObject> object = it->second;
    live.erase(it);
    if (!object) return;
    if (auto* timer = qobject_cast<QTimer*>(object.data())) timer->stop();
    if (auto* notifier = qobject_cast<QSocketNotifier*>(object.data())) notifier->setEnabled(false);
    object->deleteLater();
  }

  static std::chrono::milliseconds milliseconds(Duration duration) {
    // Qt timers count whole milliseconds; round up so a task never runs early.
    auto ms = std::chrono::ceil<std::chrono::milliseconds>(duration);
    return ms.count() < 0 ? std::chrono::milliseconds(0) : ms;
  }
};

QtRunLoop::QtRunLoop() : impl_(std::make_unique<Impl>()) {
  Q_ASSERT_X(QCoreApplication::instance(), "QtRunLoop", "a QCoreApplication must exist first");
}

QtRunLoop::~QtRunLoop() = default;

void QtRunLoop::dispatchAsync(Task task) {
  QMetaObject::invokeMethod(&impl_->context, std::move(task), Qt::QueuedConnection);
}

RunLoop::Handle QtRunLoop::dispatchAfter(Duration delay, Task task) {
  auto* timer = new QTimer(&impl_->context);
  timer->setSingleShot(true);
  timer->setTimerType(Qt::PreciseTimer);
  const Handle handle = impl_->add(timer);
  Impl* impl = impl_.get();
  QObject::connect(timer, &QTimer::timeout, &impl_->context, [impl, handle, task = std::move(task)] {
    impl->retire(handle);
    task();
  });
  timer->start(Impl::milliseconds(delay));
  return handle;
}

RunLoop::Handle QtRunLoop::scheduleRepeatingTimer(Duration interval, Task tick) {
  auto* timer = new QTimer(&impl_->context);
  timer->setTimerType(Qt::PreciseTimer);
  const Handle handle = impl_->add(timer);
  QObject::connect(timer, &QTimer::timeout, &impl_->context, std::move(tick));
  timer->start(Impl::milliseconds(interval));
  return handle;
}

RunLoop::Handle QtRunLoop::watchReadable(int fd, Task onReadable) {
  // Qt reports hang-up and errors on a read notifier too, which is what the
  // ports rely on to notice a peer that has gone.
  auto* notifier = new QSocketNotifier(fd, QSocketNotifier::Read, &impl_->context);
  const Handle handle = impl_->add(notifier);
  QObject::connect(notifier, &QSocketNotifier::activated, &impl_->context, std::move(onReadable));
  return handle;
}

void QtRunLoop::cancel(Handle handle) { impl_->retire(handle); }

RunLoop::Duration QtRunLoop::now() const {
  return std::chrono::duration_cast<Duration>(std::chrono::steady_clock::now().time_since_epoch());
}

}  // namespace corvane
