// C2KSortedPilots: the pilot and finger lists of the CDMA2000 display.
//
// Contract: a list is a dictionary that holds the marker entry "_sorted" (key and value alike), which asks
// the display for sorted children, and one entry per element keyed "%d;%d" (the element's index, then its
// pilot PN): the display orders by the whole key and shows only the part after the ";".
#pragma once

#include <string>
#include <string_view>

#include "core/platform/plist/PlistValue.h"

namespace velmar::c2k {

inline constexpr std::string_view kSortedMarker = "_sorted";
// What a list shows when it has no elements (EV-DO active set, fingers).
inline constexpr std::string_view kNoPilots = "(none)";

PlistDictionaryRef newSortedPilotDictionary();
std::string sortedPilotKey(int index, int pilot);

}  // namespace velmar::c2k
