#include "core/platform/PollMainQueue.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>

namespace velmar {

namespace {
MainQueue* currentQueue = nullptr;
}

MainQueue& MainQueue::current() {
    if (currentQueue == nullptr) {
        static PollMainQueue fallback;
        currentQueue = &fallback;
    }
    return *currentQueue;
}

void MainQueue::setCurrent(MainQueue* queue) {
    currentQueue = queue;
}

PollMainQueue::PollMainQueue() {
    if (pipe2(wakePipe_, O_CLOEXEC | O_NONBLOCK) != 0) {
        wakePipe_[0] = wakePipe_[1] = -1;
    }
}

PollMainQueue::~PollMainQueue() {
    if (currentQueue == this) {
        currentQueue = nullptr;
    }
    for (const int fd : wakePipe_) {
        if (fd >= 0) {
            close(fd);
        }
    }
}

void PollMainQueue::async(Task task) {
    pending_.push_back(std::move(task));
}

MainQueue::Handle PollMainQueue::after(double seconds, Task task) {
    const Handle handle = nextHandle_++;
    const auto delay =
        std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(std::max(0.0, seconds)));
    timers_.emplace(handle, Timer{Clock::now() + delay, Clock::duration::zero(), std::move(task)});
    return handle;
}

MainQueue::Handle PollMainQueue::repeating(double intervalSeconds, Task task) {
    const Handle handle = nextHandle_++;
    const auto interval = std::chrono::duration_cast<Clock::duration>(
        std::chrono::duration<double>(std::max(0.001, intervalSeconds)));
    timers_.emplace(handle, Timer{Clock::now() + interval, interval, std::move(task)});
    return handle;
}

void PollMainQueue::cancelTimer(Handle timer) {
    timers_.erase(timer);
}

MainQueue::Handle PollMainQueue::watchReadable(int fd, Task onReadable) {
    const Handle handle = nextHandle_++;
    watches_.emplace(handle, Watch{fd, POLLIN, std::move(onReadable)});
    return handle;
}

MainQueue::Handle PollMainQueue::watchWritable(int fd, Task onWritable) {
    const Handle handle = nextHandle_++;
    watches_.emplace(handle, Watch{fd, POLLOUT, std::move(onWritable)});
    return handle;
}

void PollMainQueue::unwatch(Handle watch) {
    watches_.erase(watch);
}

void PollMainQueue::wake() {
    if (wakePipe_[1] >= 0) {
        const char byte = 1;
        [[maybe_unused]] const ssize_t ignored = write(wakePipe_[1], &byte, 1);
    }
}

void PollMainQueue::stop() {
    stopped_ = true;
    wake();
}

void PollMainQueue::turn(Clock::time_point deadline) {
    // Tasks queued so far run first; tasks they queue wait for the next turn.
    std::deque<Task> ready;
    ready.swap(pending_);
    for (Task& task : ready) {
        task();
        if (stopped_) {
            return;
        }
    }

    Clock::time_point wakeAt = deadline;
    for (const auto& [handle, timer] : timers_) {
        wakeAt = std::min(wakeAt, timer.due);
    }
    if (!pending_.empty()) {
        wakeAt = Clock::now();
    }
    const auto wait = std::chrono::duration_cast<std::chrono::milliseconds>(wakeAt - Clock::now());
    const int timeoutMs =
        static_cast<int>(std::clamp<long long>(wait.count() + (wait.count() >= 0 ? 1 : 0), 0, 60'000));

    std::vector<pollfd> fds;
    std::vector<Handle> owners;
    fds.push_back({wakePipe_[0], POLLIN, 0});
    owners.push_back(0);
    for (const auto& [handle, watch] : watches_) {
        fds.push_back({watch.fd, watch.events, 0});
        owners.push_back(handle);
    }
    const int ready_count = poll(fds.data(), fds.size(), timeoutMs);
    if (ready_count > 0) {
        if (fds[0].revents != 0) {
            char drain[64];
            while (read(wakePipe_[0], drain, sizeof drain) > 0) {
            }
        }
        for (std::size_t i = 1; i < fds.size() && !stopped_; ++i) {
            if (fds[i].revents == 0) {
                continue;
            }
            // The watch may have been removed by an earlier callback of this turn.
            const auto found = watches_.find(owners[i]);
            if (found != watches_.end()) {
                Task callback = found->second.callback;
                callback();
            }
        }
    }

    const Clock::time_point now = Clock::now();
    std::vector<Handle> due;
    for (const auto& [handle, timer] : timers_) {
        if (timer.due <= now) {
            due.push_back(handle);
        }
    }
    for (const Handle handle : due) {
        if (stopped_) {
            return;
        }
        auto found = timers_.find(handle);
        if (found == timers_.end()) {
            continue;  // cancelled by an earlier callback
        }
        Task task = found->second.task;
        if (found->second.interval == Clock::duration::zero()) {
            timers_.erase(found);
        } else {
            Timer& timer = found->second;
            do {
                timer.due += timer.interval;
            } while (timer.due <= now);
        }
        task();
    }
}

void PollMainQueue::run() {
    stopped_ = false;
    while (!stopped_) {
        turn(Clock::now() + std::chrono::seconds(60));
    }
}

void PollMainQueue::runFor(double seconds) {
    const auto deadline =
        Clock::now() + std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(seconds));
    stopped_ = false;
    while (!stopped_ && Clock::now() < deadline) {
        turn(deadline);
    }
}

bool PollMainQueue::runUntil(const std::function<bool()>& predicate, double timeoutSeconds) {
    const auto deadline = Clock::now() + std::chrono::duration_cast<Clock::duration>(
                                             std::chrono::duration<double>(timeoutSeconds));
    stopped_ = false;
    while (!predicate()) {
        if (stopped_ || Clock::now() >= deadline) {
            return predicate();
        }
        turn(deadline);
    }
    return true;
}

}  // namespace velmar
