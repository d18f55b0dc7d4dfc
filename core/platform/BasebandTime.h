// BasebandTime: the baseband's timestamps and wall-clock time, in both directions.
//
// A packet's 64-bit timestamp counts, in its upper 48 bits, 1/800 s since 1980-01-06 00:00:00 UTC (no leap
// seconds); the lower 16 bits are a fraction of that unit, left out here. Zero means "no time": no baseband
// stamps a packet at its epoch, and records that carry no time hold zero.
#pragma once

#include <cstdint>
#include <optional>

namespace velmar {

// 1980-01-06 00:00:00 UTC, the baseband's epoch, in seconds since 1970-01-01.
inline constexpr std::int64_t kBasebandEpochUnixSeconds = 315964800;
// Microseconds per unit of the timestamp's upper 48 bits (1/800 s).
inline constexpr std::int64_t kBasebandMicrosecondsPerUnit = 1250;

// The timestamp of an instant given in microseconds since 1970; 0 for instants before the epoch.
std::uint64_t basebandTimestampOfUnixMicroseconds(std::int64_t microseconds);
// The instant of a timestamp in microseconds since 1970, or none for a zero timestamp.
std::optional<std::int64_t> unixMicrosecondsOfBasebandTimestamp(std::uint64_t timestamp);

}  // namespace velmar
