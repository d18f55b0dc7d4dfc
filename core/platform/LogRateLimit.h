// LogRateLimit: keeps a log line that a peer can provoke at will (a rejected request, a refused connection)
// from flooding the system log and the thread that writes it.
//
// Contract: allow() answers whether the caller may write its line now: at most `lines` lines per window of
// `windowSeconds`. Lines held back are counted, not formatted. The first line allowed after some were held
// back is preceded by one line "<topic>: <n> similar lines were not logged" at the limit's priority; so is
// the limit's end, when lines are still unreported. Nothing here blocks or allocates per line.
#pragma once

#include <chrono>
#include <cstdint>
#include <string>

namespace velmar {

class LogRateLimit {
  public:
    using Clock = std::chrono::steady_clock;

    LogRateLimit(std::string topic, int priority, unsigned lines = 20, double windowSeconds = 1.0);
    ~LogRateLimit();
    LogRateLimit(const LogRateLimit&) = delete;
    LogRateLimit& operator=(const LogRateLimit&) = delete;

    bool allow() { return allow(Clock::now()); }
    bool allow(Clock::time_point now);

    std::uint64_t heldBack() const { return heldBack_; }

  private:
    void reportHeldBack();

    std::string topic_;
    int priority_;
    unsigned lines_;
    Clock::duration window_;
    Clock::time_point windowStart_{};
    unsigned inWindow_ = 0;
    std::uint64_t heldBack_ = 0;
};

}  // namespace velmar
