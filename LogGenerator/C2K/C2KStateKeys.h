// C2KStateKeys: the keys of the state dictionary that the CDMA2000 generator keeps besides the common ones
// ("Template", "Display", "ExtraInfo", "DisplayState", "History").
#pragma once

#include <string_view>

namespace velmar::c2k {

// Display key → array of places (see C2KDisplaySetter.h).
inline constexpr std::string_view kLookupKey = "Lookup";
// The filtered frame-error rate of the 1x traffic channel, a real number between 0 and 1.
inline constexpr std::string_view kTrafficFerKey = "TrafficFER";

}  // namespace velmar::c2k
