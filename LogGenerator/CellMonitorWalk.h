// CellMonitorWalk: the one walker over the cell-monitor array that the telephony service supplies as the
// extra record 0xFF0001. A decoder declares which numbers of a cell it shows as a table of CellMonitorField
// rows, and either copies the serving cell of its technology into its key section (showServingCell) or shows
// every neighbour cell of its technology as a row of its list section (showNeighbourCells).
//
// Contract: a cell counts when it is a dictionary whose radio-access-technology entry is one of the walk's
// technologies and whose cell-type entry is the serving (or neighbour) type; cells lacking either entry are
// skipped. Each field reads one entry as a cell-monitor number (CellInfoArray::cellNumber) and shows it in
// its format under its display key (and its second display key, if it has one). A missing or non-numeric
// entry logs the field's failure message at error priority (the messages carry their own trailing newline)
// and leaves its keys as they were; the remaining fields are still read. When the record holds no cell array,
// the holder logs its own message and the walk then logs "Failed to get Cell Array\n" at error priority,
// unless a serving walk is told to stay silent. A null section (an unbound decoder) is logged for all the
// same and written nowhere.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "LogGenerator/RecordFields.h"
#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

struct CellMonitorField {
    std::string_view monitorKey;
    const char* displayKey;
    const char* failureMessage;
    ValueFormat format = asInt();
    const char* secondDisplayKey = nullptr;  // the value goes under one key only when null
};

// The value that the telephony service reports when it has no reading.
inline constexpr std::int64_t kCellMonitorNoReading = 32767;

struct ServingCellWalk {
    // FirstMatch shows only the first serving cell of the technologies; EveryMatch visits each in array
    // order, so the last one's values remain.
    enum class Pick : std::uint8_t { FirstMatch, EveryMatch };
    enum class UnreadableArray : std::uint8_t { Reported, Silent };

    std::span<const std::string_view> technologies;
    std::span<const CellMonitorField> fields;
    Pick pick = Pick::FirstMatch;
    UnreadableArray unreadableArray = UnreadableArray::Reported;
};

// Copies the fields of the serving cell(s) that the walk picks into section.
void showServingCell(ByteView record, const ServingCellWalk& walk, PlistDictionary* section);

// The serving-cell walk as the writer of a decoder's cell-monitor rule (RecordRule::write).
template <const ServingCellWalk& walk>
void writeServingCell(ByteView record, const PlistDictionaryRef& section) {
    showServingCell(record, walk, section.get());
}

// Empties section (whether or not the record parses) and, when it parses, replaces its content with one row
// per neighbour cell of the technology, in array order. A row is added even when all of its fields failed.
void showNeighbourCells(ByteView record, std::string_view technology,
                        std::span<const CellMonitorField> fields, const PlistArrayRef& section);

}  // namespace velmar
