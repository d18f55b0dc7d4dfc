// QtMainQueue: the MainQueue binding on Qt's event loop, so that the monitor model runs on the GUI thread.
//
// Contract: as MainQueue. async() posts to the event loop (never runs inside the call); after() and
// repeating() are QTimers; watchReadable() and watchWritable() are QSocketNotifiers for reading (which also
// fire when the peer hung up) and writing. Cancelling or unwatching from inside the callback is allowed: the
// Qt object is deleted later, once its signal has returned. Objects still scheduled when the queue goes are
// dropped without running.
#pragma once

#include <QObject>
#include <map>
#include <memory>

#include "core/platform/MainQueue.h"

class QTimer;
class QSocketNotifier;

namespace velmar {

class QtMainQueue : public MainQueue {
  public:
    QtMainQueue();
    ~QtMainQueue() override;

    void async(Task task) override;
    Handle after(double seconds, Task task) override;
    Handle repeating(double intervalSeconds, Task task) override;
    void cancelTimer(Handle timer) override;
    Handle watchReadable(int fd, Task onReadable) override;
    Handle watchWritable(int fd, Task onWritable) override;
    void unwatch(Handle watch) override;

    std::size_t activeTimers() const { return timers_.size(); }

  private:
    Handle startTimer(double seconds, bool repeat, Task task);
    Handle watch(int fd, bool writable, Task callback);

    // Parent of every timer and notifier, and the context of queued calls: deleting it drops them all.
    std::unique_ptr<QObject> context_;
    std::map<Handle, QTimer*> timers_;
    std::map<Handle, QSocketNotifier*> watches_;
    Handle nextHandle_ = 1;
};

}  // namespace velmar
