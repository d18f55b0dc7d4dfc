#include "LogGenerator/C2K/C2KSortedPilots.h"

#include "core/platform/StringFormat.h"

namespace velmar::c2k {

PlistDictionaryRef newSortedPilotDictionary() {
    auto pilots = PlistDictionary::create();
    pilots->set(kSortedMarker, kSortedMarker);
    return pilots;
}

std::string sortedPilotKey(int index, int pilot) {
    return stringWithFormat("%d;%d", index, pilot);
}

}  // namespace velmar::c2k
