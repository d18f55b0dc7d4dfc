#include "core/platform/BasebandTime.h"

namespace velmar {

namespace {
constexpr std::int64_t kEpochMicroseconds = kBasebandEpochUnixSeconds * 1000000;
}  // namespace

std::uint64_t basebandTimestampOfUnixMicroseconds(std::int64_t microseconds) {
    const std::int64_t sinceEpoch = microseconds - kEpochMicroseconds;
    if (sinceEpoch <= 0) {
        return 0;
    }
    return (static_cast<std::uint64_t>(sinceEpoch) / kBasebandMicrosecondsPerUnit) << 16;
}

std::optional<std::int64_t> unixMicrosecondsOfBasebandTimestamp(std::uint64_t timestamp) {
    if (timestamp == 0) {
        return std::nullopt;
    }
    // 48 bits of 1.25 ms units reach about 11 000 years: the product fits in 64 bits.
    const auto units = static_cast<std::int64_t>(timestamp >> 16);
    return kEpochMicroseconds + units * kBasebandMicrosecondsPerUnit;
}

}  // namespace velmar
