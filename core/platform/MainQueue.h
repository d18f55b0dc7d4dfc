// MainQueue: the one thread on which the monitor does everything, and the things it offers: run a
// function soon, run one after a delay, run one repeatedly, and run one whenever a file descriptor is
// readable (or writable: a non-blocking writer waits for room this way instead of blocking).
//
// Contract: every callback runs on the queue's thread, never re-entrantly from inside the call that
// scheduled it. Handles cancel what they scheduled; cancelling from inside the callback itself is allowed.
// Two bindings exist: PollMainQueue (poll(2), here) for the service, the terminal UI, headless and tests, and
// a Qt one in the GUI. MainQueue::current() is the queue that the process's monitor objects use.
#pragma once

#include <cstdint>
#include <functional>

namespace velmar {

class MainQueue {
  public:
    using Task = std::function<void()>;
    using Handle = std::uint64_t;  // 0 is never a valid handle

    virtual ~MainQueue() = default;

    virtual void async(Task task) = 0;
    virtual Handle after(double seconds, Task task) = 0;
    virtual Handle repeating(double intervalSeconds, Task task) = 0;
    virtual void cancelTimer(Handle timer) = 0;
    // Calls onReadable whenever fd has data or has hung up, until unwatched.
    virtual Handle watchReadable(int fd, Task onReadable) = 0;
    // Calls onWritable whenever fd can take more data (or has failed or hung up), until unwatched.
    virtual Handle watchWritable(int fd, Task onWritable) = 0;
    virtual void unwatch(Handle watch) = 0;

    static MainQueue& current();
    static void setCurrent(MainQueue* queue);
};

}  // namespace velmar
