#include "core/platform/Clock.h"

#include <chrono>
#include <cmath>
#include <ctime>

namespace velmar {

namespace {
std::optional<double>& pinnedNow() {
    static std::optional<double> pinned;
    return pinned;
}
}  // namespace

double Clock::now() {
    if (pinnedNow()) {
        return *pinnedNow();
    }
    const auto since = std::chrono::system_clock::now().time_since_epoch();
    return std::chrono::duration<double>(since).count();
}

LocalZoneInfo Clock::localZoneAt(std::int64_t secondsSince1970) {
    const std::time_t when = static_cast<std::time_t>(secondsSince1970);
    std::tm local{};
    tzset();
    localtime_r(&when, &local);
    return LocalZoneInfo{local.tm_gmtoff, local.tm_isdst > 0};
}

std::string Clock::utcDescription(double secondsSince1970) {
    const std::time_t when = static_cast<std::time_t>(std::floor(secondsSince1970));
    std::tm utc{};
    gmtime_r(&when, &utc);
    char text[64];
    std::strftime(text, sizeof text, "%Y-%m-%d %H:%M:%S +0000", &utc);
    return text;
}

std::string Clock::localText(double secondsSince1970, const char* strftimeFormat) {
    const std::time_t when = static_cast<std::time_t>(std::floor(secondsSince1970));
    std::tm local{};
    tzset();
    localtime_r(&when, &local);
    char text[128];
    const std::size_t length = std::strftime(text, sizeof text, strftimeFormat, &local);
    return std::string(text, length);
}

void Clock::setNowForTesting(std::optional<double> pinned) {
    pinnedNow() = pinned;
}

}  // namespace velmar
