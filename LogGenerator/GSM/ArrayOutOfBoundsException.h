// ArrayOutOfBoundsException: thrown by a record's bounds-checked list accessor when it is asked for element i
// while the record's own count field is not greater than i.
//
// Contract: the decoders' loops never ask beyond the count, so it is not thrown in practice; nothing catches
// it, so one that escapes a decoder ends the program. Note that the accessors check the count field only,
// never the buffer's length: elements past the end of the buffer read as zero through RecordReader.
#pragma once

#include <exception>

namespace velmar {

class ArrayOutOfBoundsException : public std::exception {
  public:
    const char* what() const noexcept override { return "ArrayOutOfBoundsException"; }
};

}  // namespace velmar
