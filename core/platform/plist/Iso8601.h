// Iso8601: the UTC timestamp text that property lists use for dates, "YYYY-MM-DDTHH:MM:SSZ".
//
// Contract: times are seconds since 1970-01-01T00:00:00Z on the proleptic Gregorian calendar, without leap
// seconds, computed with plain calendar arithmetic (no time zone, no locale, no C library time functions).
// parseIso8601Utc accepts exactly a four-digit year, two-digit month, day, hour, minute and second, an
// optional fraction of a second (".", one or more digits) and a final "Z"; every field is range-checked
// (month 1-12, day within its month, hour < 24, minute < 60, second < 60). formatIso8601Utc writes the whole
// second that contains the instant (the fraction is dropped, rounding toward the past); it answers nullopt
// when the instant is not finite or falls outside the years 0000..9999 the text form can hold.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace velmar {

std::optional<double> parseIso8601Utc(std::string_view text);
std::optional<std::string> formatIso8601Utc(double secondsSince1970);

// Days from 1970-01-01 to the given civil date (negative before it). month is 1-12, day 1-31.
std::int64_t daysFromCivil(std::int64_t year, unsigned month, unsigned day);

}  // namespace velmar
