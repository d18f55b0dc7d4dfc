#include "tools/decode/RecordingClock.h"

#include <algorithm>

namespace velmar {

RecordingClock::RecordingClock(std::int64_t periodMicroseconds)
    : period_(std::max<std::int64_t>(periodMicroseconds, 1)) {}

std::int64_t RecordingClock::endOfPeriodHolding(std::int64_t time) const {
    std::int64_t index = time / period_;
    if (time % period_ < 0) {
        --index;  // floor division for instants before 1970
    }
    return (index + 1) * period_;
}

std::optional<std::int64_t> RecordingClock::refreshBefore(std::int64_t packetTime) {
    if (!periodEnd_) {
        periodEnd_ = endOfPeriodHolding(packetTime);
        return std::nullopt;
    }
    if (packetTime < *periodEnd_) {
        return std::nullopt;
    }
    const std::int64_t due = *periodEnd_;
    periodEnd_ = endOfPeriodHolding(packetTime);
    return due;
}

}  // namespace velmar
