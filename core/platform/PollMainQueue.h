// PollMainQueue: the poll(2) binding of MainQueue.
//
// Contract: run() turns the loop until stop(); runFor() and runUntil() turn it for a bounded time (tests).
// Timers use the monotonic clock. A repeating timer keeps its phase (the next firing is scheduled from the
// previous due time, not from when the callback ran), and never fires twice to catch up.
#pragma once

#include <chrono>
#include <deque>
#include <map>
#include <vector>

#include "core/platform/MainQueue.h"

namespace velmar {

class PollMainQueue : public MainQueue {
  public:
    PollMainQueue();
    ~PollMainQueue() override;

    void async(Task task) override;
    Handle after(double seconds, Task task) override;
    Handle repeating(double intervalSeconds, Task task) override;
    void cancelTimer(Handle timer) override;
    Handle watchReadable(int fd, Task onReadable) override;
    Handle watchWritable(int fd, Task onWritable) override;
    void unwatch(Handle watch) override;

    void run();
    void stop();
    void runFor(double seconds);
    // Turns the loop until predicate holds or the time is up; answers whether it held.
    bool runUntil(const std::function<bool()>& predicate, double timeoutSeconds);
    // Wakes the loop from another thread or a signal handler (async-signal-safe).
    void wake();

  private:
    using Clock = std::chrono::steady_clock;
    struct Timer {
        Clock::time_point due;
        Clock::duration interval;  // zero for one-shot
        Task task;
    };
    struct Watch {
        int fd;
        short events;  // POLLIN or POLLOUT
        Task callback;
    };

    // One pass: waits at most until the deadline (or the next timer), then runs what is due.
    void turn(Clock::time_point deadline);

    std::deque<Task> pending_;
    std::map<Handle, Timer> timers_;
    std::map<Handle, Watch> watches_;
    Handle nextHandle_ = 1;
    bool stopped_ = false;
    int wakePipe_[2] = {-1, -1};
};

}  // namespace velmar
