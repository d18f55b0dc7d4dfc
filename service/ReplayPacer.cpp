#include "service/ReplayPacer.h"

#include <algorithm>

#include "core/platform/BasebandPacket.h"

namespace velmar {

ReplayPacer::ReplayPacer(double speed) : speed_(speed > 0 ? speed : 1.0) {}

std::optional<std::uint64_t> ReplayPacer::timestampTicks(ByteView blob) {
    const BasebandPacket framed = frameBasebandPacket(blob);
    if (!framed.hasHeader() || (!framed.isPlain() && !framed.isExtended())) {
        return std::nullopt;
    }
    const std::uint64_t ticks = framed.timestamp >> 16;
    if (ticks == 0) {
        return std::nullopt;
    }
    return ticks;
}

double ReplayPacer::next(ByteView blob) {
    const std::optional<std::uint64_t> ticks = timestampTicks(blob);
    double gap = 1.0 / kDefaultRate;
    if (first_) {
        gap = 0;
        first_ = false;
    } else if (ticks && previousTicks_) {
        const double seconds =
            (static_cast<double>(*ticks) - static_cast<double>(*previousTicks_)) / kTicksPerSecond;
        gap = std::clamp(seconds, 0.0, kMaxGapSeconds);
    }
    previousTicks_ = ticks;
    recordingSeconds_ += gap;
    return recordingSeconds_ / speed_;
}

void ReplayPacer::newRound() {
    previousTicks_.reset();
}

}  // namespace velmar
