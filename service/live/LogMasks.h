// LogMasks: which log masks make a modem log exactly what the streaming channels ask for.
//
// Contract: a log code splits into equipment id (code >> 12) and item (code & 0xFFF). logMasksFor() answers
// one mask per equipment id that has wanted codes, ascending by id, with N = max(the device's reported value
// for that id, highest wanted item + 1), at most kMaxLogMaskItems: devices disagree on whether the reported
// value is a count or a last index, and some emit codes above it, so it is never trusted alone. A demand
// that takes everything (the object-based technology) asks for every item below N of every id whose
// reported value is not zero. maskUpdates() answers what to send to go from the masks in force to the
// wanted ones: the masks that changed, and an empty mask (same N) for each id that is no longer wanted.
#pragma once

#include <vector>

#include "service/LogCodeFilter.h"
#include "service/live/DiagCommands.h"

namespace velmar::live {

std::vector<EquipmentLogMask> logMasksFor(const LogCodeFilter& demand, const EquipmentRanges& ranges);

std::vector<EquipmentLogMask> maskUpdates(const std::vector<EquipmentLogMask>& inForce,
                                          const std::vector<EquipmentLogMask>& wanted);

// The number of codes a mask asks for.
std::size_t codesInMask(const EquipmentLogMask& mask);

}  // namespace velmar::live
