// Clock: wall-clock time and the local time zone, from the C library.
//
// Contract: now() is seconds since 1970-01-01 UTC. localZoneAt() reads the zone through localtime_r
// (tm_gmtoff, tm_isdst), so TZ decides it. Tests may pin now() with setNowForTesting.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace velmar {

struct LocalZoneInfo {
    long utcOffsetSeconds = 0;  // east of UTC positive
    bool daylightSaving = false;
};

class Clock {
  public:
    static double now();
    static LocalZoneInfo localZoneAt(std::int64_t secondsSince1970);
    // "YYYY-MM-DD HH:MM:SS +0000" of the instant, in UTC.
    static std::string utcDescription(double secondsSince1970);
    // "YYYY-MM-DD HH:MM:SS" of the instant in local time, with a custom separator between date and time
    // given by the format (strftime form).
    static std::string localText(double secondsSince1970, const char* strftimeFormat);
    static void setNowForTesting(std::optional<double> pinned);
};

}  // namespace velmar
