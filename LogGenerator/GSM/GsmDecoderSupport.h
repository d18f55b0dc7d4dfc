// GsmDecoderSupport: the walk over the 0xFF0001 cell array that several GSM/UMTS decoders share, with its
// fixed error messages.
#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <span>
#include <string_view>

#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::gsm {

// Parses the cell-monitor record and answers its first cell whose technology is one of technologies and whose
// type is cellType. Logs "Failed to get Cell Array\n" at error priority when the record holds no cell array;
// answers null, silently, when the array is empty or no cell matches.
PlistDictionaryRef firstMatchingCell(ByteView record, std::initializer_list<std::string_view> technologies,
                                     std::string_view cellType);
// Writes "%d" of the cell's number under cellKey into section under sectionKey; when the number is missing
// or not a number, logs failureMessage at error priority and leaves the section's key as it was.
void writeCellNumber(const PlistDictionary& cell, std::string_view cellKey, PlistDictionary* section,
                     std::string_view sectionKey, const char* failureMessage);

}  // namespace velmar::gsm
