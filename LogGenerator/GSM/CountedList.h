// CountedList: a list of fixed-size elements inside a record, described by where it starts, the element
// stride and the count that the record's own count field gives.
//
// Contract: elementOffset(i) answers the record offset of element i and throws ArrayOutOfBoundsException when
// i >= count. The buffer's length is deliberately not compared with the count: the fields of an element that
// lies past the end of the record read as zero through RecordReader.
#pragma once

#include <cstddef>

#include "LogGenerator/GSM/ArrayOutOfBoundsException.h"

namespace velmar {

struct CountedList {
    std::size_t first;   // record offset of element 0
    std::size_t stride;  // bytes from one element to the next
    std::size_t count;   // from the record's count field

    std::size_t elementOffset(std::size_t index) const {
        if (index >= count) {
            throw ArrayOutOfBoundsException();
        }
        return first + stride * index;
    }
};

}  // namespace velmar
