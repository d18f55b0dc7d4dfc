// ServingCellWalk: finding a technology's serving cell in the cell-monitor array (extra record 0xFF0001) and
// copying its numbers into a key section.
//
// Contract: a cell counts when it is a dictionary whose radio-access-technology entry equals the given
// technology value and whose cell-type entry is the serving type; cells lacking either entry are skipped.
// FirstMatch visits only the first such cell (the LTE rule); EveryMatch visits each of them in array order,
// so the last one's values remain (the UTRAN rule). Each CellMonitorField reads one entry as a signed 32-bit
// number and stores it as "%d" under one or two section keys; a missing or non-numeric entry logs the
// field's message (error priority) and leaves its keys as they were. A null section is written nowhere.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

struct CellMonitorField {
    std::string_view entryKey;
    const char* sectionKey;
    const char* secondSectionKey;  // null when the value goes under one key only
    const char* missingMessage;
};

enum class ServingCellPick : std::uint8_t { FirstMatch, EveryMatch };

// Copies the fields of every picked serving cell of the technology into section.
void writeServingCellFields(const PlistArray& cells, std::string_view technology, ServingCellPick pick,
                            std::span<const CellMonitorField> fields, PlistDictionary* section);

}  // namespace velmar
