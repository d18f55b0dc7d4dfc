#include "core/platform/LogRateLimit.h"

#include <cinttypes>

#include "core/platform/SystemLog.h"

namespace velmar {

LogRateLimit::LogRateLimit(std::string topic, int priority, unsigned lines, double windowSeconds)
    : topic_(std::move(topic)),
      priority_(priority),
      lines_(lines == 0 ? 1 : lines),
      window_(std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(windowSeconds))) {}

LogRateLimit::~LogRateLimit() {
    reportHeldBack();
}

bool LogRateLimit::allow(Clock::time_point now) {
    if (inWindow_ == 0 || now - windowStart_ >= window_) {
        windowStart_ = now;
        inWindow_ = 0;
    }
    if (inWindow_ >= lines_) {
        ++heldBack_;
        return false;
    }
    ++inWindow_;
    reportHeldBack();
    return true;
}

void LogRateLimit::reportHeldBack() {
    if (heldBack_ == 0) {
        return;
    }
    SystemLog::log(priority_, "%s: %" PRIu64 " similar lines were not logged", topic_.c_str(), heldBack_);
    heldBack_ = 0;
}

}  // namespace velmar
