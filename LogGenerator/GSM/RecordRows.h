// RecordRows: a list section filled from a counted list of fixed-size elements inside a record, one row per
// element, each row made from a field table.
//
// Contract: showRecordRows empties the section; when the count is 0 it stops there, otherwise it builds a
// complete new list of rows in element order and swaps it in under the array lock. Elements are fetched
// through the bounds-checked CountedList; the buffer's length is not compared with the count, so fields past
// the end of the record read as zero.
#pragma once

#include <cstddef>
#include <span>

#include "LogGenerator/RecordFields.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

struct RecordRowList {
    std::size_t countOffset;  // one unsigned byte
    std::size_t first;
    std::size_t stride;
    std::span<const RecordField> fields;  // relative to the element
};

void showRecordRows(const RecordRowList& list, const RecordReader& record, const PlistArrayRef& section);

}  // namespace velmar
