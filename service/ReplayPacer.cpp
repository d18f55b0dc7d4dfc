#include "service/ReplayPacer.h"

#include <algorithm>

#include "service/BasebandBlob.h"

namespace velmar {

namespace {
constexpr std::size_t kPacketHeaderSize = 13;
constexpr std::size_t kTimestampOffset = 5;
constexpr std::uint8_t kTypeOrdinary = 0x01;
constexpr std::uint8_t kTypeExtended = 0xFF;
}  // namespace

ReplayPacer::ReplayPacer(double speed) : speed_(speed > 0 ? speed : 1.0) {}

std::optional<std::uint64_t> ReplayPacer::timestampTicks(ByteView blob) {
    const ByteView packet = basebandPacket(blob);
    if (packet.size() < kPacketHeaderSize || (packet[0] != kTypeOrdinary && packet[0] != kTypeExtended)) {
        return std::nullopt;
    }
    std::uint64_t raw = 0;
    for (std::size_t i = 0; i < 8; ++i) {
        raw |= static_cast<std::uint64_t>(packet[kTimestampOffset + i]) << (8 * i);
    }
    const std::uint64_t ticks = raw >> 16;
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
