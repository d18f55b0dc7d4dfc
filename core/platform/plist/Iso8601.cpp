#include "core/platform/plist/Iso8601.h"

#include <charconv>
#include <cmath>

namespace velmar {

namespace {

constexpr std::int64_t kSecondsPerDay = 86400;

struct CivilDate {
    std::int64_t year;
    unsigned month;
    unsigned day;
};

// The inverse of daysFromCivil: eras of 400 years (146097 days) starting on March 1st, so that the leap day
// is the last day of each computed year.
CivilDate civilFromDays(std::int64_t days) {
    days += 719468;
    const std::int64_t era = (days >= 0 ? days : days - 146096) / 146097;
    const auto dayOfEra = static_cast<std::uint64_t>(days - era * 146097);
    const std::uint64_t yearOfEra = (dayOfEra - dayOfEra / 1460 + dayOfEra / 36524 - dayOfEra / 146096) / 365;
    const std::uint64_t dayOfYear = dayOfEra - (365 * yearOfEra + yearOfEra / 4 - yearOfEra / 100);
    const std::uint64_t monthFromMarch = (5 * dayOfYear + 2) / 153;
    const auto day = static_cast<unsigned>(dayOfYear - (153 * monthFromMarch + 2) / 5 + 1);
    const auto month = static_cast<unsigned>(monthFromMarch < 10 ? monthFromMarch + 3 : monthFromMarch - 9);
    const std::int64_t year = static_cast<std::int64_t>(yearOfEra) + era * 400 + (month <= 2 ? 1 : 0);
    return {year, month, day};
}

bool isLeapYear(std::int64_t year) {
    return year % 4 == 0 && (year % 100 != 0 || year % 400 == 0);
}

unsigned daysInMonth(std::int64_t year, unsigned month) {
    static constexpr unsigned kDays[12] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    return month == 2 && isLeapYear(year) ? 29 : kDays[month - 1];
}

// Reads exactly count decimal digits at text[at]; false when any of them is not a digit.
bool readDigits(std::string_view text, std::size_t at, std::size_t count, unsigned& value) {
    if (at + count > text.size()) {
        return false;
    }
    value = 0;
    for (std::size_t i = at; i < at + count; ++i) {
        const char c = text[i];
        if (c < '0' || c > '9') {
            return false;
        }
        value = value * 10 + static_cast<unsigned>(c - '0');
    }
    return true;
}

void putDigits(char* out, unsigned value, int count) {
    for (int i = count - 1; i >= 0; --i) {
        out[i] = static_cast<char>('0' + value % 10);
        value /= 10;
    }
}

}  // namespace

std::int64_t daysFromCivil(std::int64_t year, unsigned month, unsigned day) {
    year -= month <= 2 ? 1 : 0;
    const std::int64_t era = (year >= 0 ? year : year - 399) / 400;
    const auto yearOfEra = static_cast<std::uint64_t>(year - era * 400);
    const std::uint64_t dayOfYear = (153 * (month > 2 ? month - 3 : month + 9) + 2) / 5 + day - 1;
    const std::uint64_t dayOfEra = yearOfEra * 365 + yearOfEra / 4 - yearOfEra / 100 + dayOfYear;
    return era * 146097 + static_cast<std::int64_t>(dayOfEra) - 719468;
}

std::optional<double> parseIso8601Utc(std::string_view text) {
    // YYYY-MM-DDTHH:MM:SS is 19 characters; the "Z" and an optional fraction follow.
    unsigned year = 0;
    unsigned month = 0;
    unsigned day = 0;
    unsigned hour = 0;
    unsigned minute = 0;
    unsigned second = 0;
    if (text.size() < 20 || !readDigits(text, 0, 4, year) || text[4] != '-' ||
        !readDigits(text, 5, 2, month) || text[7] != '-' || !readDigits(text, 8, 2, day) || text[10] != 'T' ||
        !readDigits(text, 11, 2, hour) || text[13] != ':' || !readDigits(text, 14, 2, minute) ||
        text[16] != ':' || !readDigits(text, 17, 2, second)) {
        return std::nullopt;
    }
    if (month < 1 || month > 12 || day < 1 || day > daysInMonth(year, month) || hour > 23 || minute > 59 ||
        second > 59) {
        return std::nullopt;
    }
    double fraction = 0;
    std::size_t at = 19;
    if (text[at] == '.') {
        std::size_t end = at + 1;
        while (end < text.size() && text[end] >= '0' && text[end] <= '9') {
            ++end;
        }
        if (end == at + 1) {
            return std::nullopt;
        }
        // ".ddd" is a complete decimal number for from_chars, which is locale-independent.
        const auto parsed = std::from_chars(text.data() + at, text.data() + end, fraction);
        if (parsed.ec != std::errc() || parsed.ptr != text.data() + end) {
            return std::nullopt;
        }
        at = end;
    }
    if (at + 1 != text.size() || text[at] != 'Z') {
        return std::nullopt;
    }
    const std::int64_t seconds = daysFromCivil(year, month, day) * kSecondsPerDay + hour * 3600 +
                                 minute * 60 + static_cast<std::int64_t>(second);
    return static_cast<double>(seconds) + fraction;
}

std::optional<std::string> formatIso8601Utc(double secondsSince1970) {
    static const double kEarliest = static_cast<double>(daysFromCivil(0, 1, 1) * kSecondsPerDay);
    static const double kEnd = static_cast<double>(daysFromCivil(10000, 1, 1) * kSecondsPerDay);
    const double whole = std::floor(secondsSince1970);
    if (!std::isfinite(whole) || whole < kEarliest || whole >= kEnd) {
        return std::nullopt;
    }
    const auto seconds = static_cast<std::int64_t>(whole);
    // Floor division, so that instants before 1970 fall into the day that contains them.
    std::int64_t days = seconds / kSecondsPerDay;
    std::int64_t secondOfDay = seconds % kSecondsPerDay;
    if (secondOfDay < 0) {
        secondOfDay += kSecondsPerDay;
        --days;
    }
    const CivilDate date = civilFromDays(days);
    std::string text(20, '\0');
    putDigits(&text[0], static_cast<unsigned>(date.year), 4);
    text[4] = '-';
    putDigits(&text[5], date.month, 2);
    text[7] = '-';
    putDigits(&text[8], date.day, 2);
    text[10] = 'T';
    putDigits(&text[11], static_cast<unsigned>(secondOfDay / 3600), 2);
    text[13] = ':';
    putDigits(&text[14], static_cast<unsigned>(secondOfDay / 60 % 60), 2);
    text[16] = ':';
    putDigits(&text[17], static_cast<unsigned>(secondOfDay % 60), 2);
    text[19] = 'Z';
    return text;
}

}  // namespace velmar
