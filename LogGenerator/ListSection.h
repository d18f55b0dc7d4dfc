// ListSection: how a list decoder rewrites its section: the list is emptied, and when the record reports any
// entries, a complete new list of rows is built in record order and swapped in whole, both under ArrayLock
// (Base::clearElementsInArray / Base::replaceArray), so that the display never sees half a list.
//
// Contract: makeRow(index) answers the row of entry index; indexes run from 0 to count - 1. The rows are
// built even when the decoder is unbound (a null section), so that the decoder's logging is the same.
#pragma once

#include <cstddef>

#include "LogGenerator/Base.h"

namespace velmar {

template <typename MakeRow>
void rebuildListSection(const PlistArrayRef& section, std::size_t count, MakeRow&& makeRow) {
    Base::clearElementsInArray(section);
    if (count == 0) {
        return;
    }
    auto rows = PlistArray::create();
    rows->reserve(count);
    for (std::size_t index = 0; index < count; ++index) {
        rows->append(makeRow(index));
    }
    Base::replaceArray(section, rows);
}

}  // namespace velmar
