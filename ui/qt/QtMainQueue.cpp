#include "ui/qt/QtMainQueue.h"

#include <QMetaObject>
#include <QSocketNotifier>
#include <QTimer>
#include <cmath>

namespace velmar {

namespace {

int milliseconds(double seconds) {
    if (!(seconds > 0)) {
        return 0;
    }
    const double ms = std::ceil(seconds * 1000.0);
    return ms > 2'000'000'000.0 ? 2'000'000'000 : static_cast<int>(ms);
}

}  // namespace

QtMainQueue::QtMainQueue() : context_(std::make_unique<QObject>()) {}

QtMainQueue::~QtMainQueue() {
    timers_.clear();
    watches_.clear();
    context_.reset();
}

void QtMainQueue::async(Task task) {
    QMetaObject::invokeMethod(
        context_.get(), [task = std::move(task)] { task(); }, Qt::QueuedConnection);
}

MainQueue::Handle QtMainQueue::startTimer(double seconds, bool repeat, Task task) {
    const Handle handle = nextHandle_++;
    auto* timer = new QTimer(context_.get());
    timer->setSingleShot(!repeat);
    // Display ticks and retries are seconds apart; precise timers keep the 2-second rhythm steady.
    timer->setTimerType(Qt::PreciseTimer);
    timer->setInterval(milliseconds(seconds));
    auto shared = std::make_shared<Task>(std::move(task));
    QObject::connect(timer, &QTimer::timeout, timer, [this, handle, repeat, shared] {
        // Held by the lambda's copy: cancelling from inside the task cannot destroy it mid-call.
        const std::shared_ptr<Task> keep = shared;
        if (!repeat) {
            cancelTimer(handle);
        }
        (*keep)();
    });
    timers_.emplace(handle, timer);
    timer->start();
    return handle;
}

MainQueue::Handle QtMainQueue::after(double seconds, Task task) {
    return startTimer(seconds, false, std::move(task));
}

MainQueue::Handle QtMainQueue::repeating(double intervalSeconds, Task task) {
    return startTimer(intervalSeconds, true, std::move(task));
}

void QtMainQueue::cancelTimer(Handle handle) {
    const auto found = timers_.find(handle);
    if (found == timers_.end()) {
        return;
    }
    QTimer* timer = found->second;
    timers_.erase(found);
    timer->stop();
    timer->disconnect();
    timer->deleteLater();
}

MainQueue::Handle QtMainQueue::watchReadable(int fd, Task onReadable) {
    return watch(fd, false, std::move(onReadable));
}

MainQueue::Handle QtMainQueue::watchWritable(int fd, Task onWritable) {
    return watch(fd, true, std::move(onWritable));
}

MainQueue::Handle QtMainQueue::watch(int fd, bool writable, Task callback) {
    const Handle handle = nextHandle_++;
    auto* notifier = new QSocketNotifier(
        static_cast<qintptr>(fd), writable ? QSocketNotifier::Write : QSocketNotifier::Read, context_.get());
    auto shared = std::make_shared<Task>(std::move(callback));
    QObject::connect(notifier, &QSocketNotifier::activated, notifier, [shared] {
        const std::shared_ptr<Task> keep = shared;
        (*keep)();
    });
    watches_.emplace(handle, notifier);
    return handle;
}

void QtMainQueue::unwatch(Handle handle) {
    const auto found = watches_.find(handle);
    if (found == watches_.end()) {
        return;
    }
    QSocketNotifier* notifier = found->second;
    watches_.erase(found);
    notifier->setEnabled(false);
    notifier->disconnect();
    notifier->deleteLater();
}

}  // namespace velmar
