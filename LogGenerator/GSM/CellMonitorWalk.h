// CellMonitorWalk: the neighbour walk over the cell-monitor extra record (0xFF0001): every neighbour cell of
// one technology becomes a row of a list section. (The serving-cell walk is gsm::firstMatchingCell.)
//
// Contract: each shown number is declared as a NeighbourCellField row (cell-monitor key, display key, format,
// failure message). A cell whose key is missing or not a number gets no display key and the row's failure
// message is logged at error priority (the messages carry their own trailing newline); the remaining fields
// are still read. When the record cannot be parsed, the walk logs "Failed to get Cell Array\n" (error
// priority) after the holder's own message. The section may be null (an unbound decoder): the walk then logs
// all the same and writes nowhere.
#pragma once

#include <span>
#include <string_view>

#include "LogGenerator/RecordFields.h"
#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

struct NeighbourCellField {
    std::string_view monitorKey;
    const char* displayKey;
    ValueFormat format;
    const char* failureMessage;
};

// The value that the telephony service reports when it has no reading.
inline constexpr std::int64_t kCellMonitorNoReading = 32767;

// Writes the fields of one cell into target (if not null), logging the failure of each missing field.
void writeNeighbourCellFields(std::span<const NeighbourCellField> fields, const PlistDictionary& cell,
                              PlistDictionary* target);

// Parses the record, empties section (whether or not parsing succeeded) and, when it parsed, replaces its
// content with one row per neighbour cell of the technology, in array order. A row is added even when all of
// its fields failed.
void showNeighbourCells(ByteView record, std::string_view technology,
                        std::span<const NeighbourCellField> fields, const PlistArrayRef& section);

}  // namespace velmar
