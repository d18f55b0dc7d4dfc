// LogCode_0xFF0000: the SIM-file extra record (0xFF0000): a 13-byte packet header followed by a serialised
// property list (any encoding) whose root is a dictionary of SIM elementary files.
//
// Contract: SimFileDictionary drops the record's header and parses the rest; it holds the parsed
// dictionary until it goes out of scope, on every path. When the data cannot be parsed, or its root is not a
// dictionary, it logs "SIM File dictionary data could not be constructed" (error priority) and throws
// UnknownDataException. Nothing catches that exception: it ends the program.
#pragma once

#include <exception>

#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::LogCode_0xFF0000 {

class UnknownDataException : public std::exception {};

class SimFileDictionary {
  public:
    explicit SimFileDictionary(ByteView record);
    SimFileDictionary(const SimFileDictionary&) = delete;
    SimFileDictionary& operator=(const SimFileDictionary&) = delete;

    const PlistDictionary& files() const { return *files_; }

  private:
    PlistDictionaryRef files_;
};

}  // namespace velmar::LogCode_0xFF0000
