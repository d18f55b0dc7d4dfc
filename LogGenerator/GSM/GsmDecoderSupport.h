// GsmDecoderSupport: the steps that every GSM/UMTS record decoder repeats on each call.
//
// Contract: a decoder describes the codes it handles as RecordRule rows (code, minimum record length, and,
// for records that are flat lists of fields, the field table written into its key section). admitRecord runs
// the common preamble: log the decoder's entry line at warning priority; answer null after logging
// "Received an unknown log message: %d" at error priority for a code without a rule; answer null, silently,
// for a record shorter than the rule's minimum; otherwise answer the rule. The cell-monitor helpers implement
// the walk over the 0xFF0001 cell array that several decoders share, with its fixed error messages.
#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <span>
#include <string_view>

#include "LogGenerator/Base.h"
#include "LogGenerator/RecordFields.h"
#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::gsm {

// One log code that a decoder handles.
struct RecordRule {
    std::int32_t code;
    // Records shorter than this are ignored without a message; 0 admits any length (extra records).
    std::size_t minimumLength;
    // Fields written, in order, into the key section; empty when the decoder reads the record itself.
    std::span<const RecordField> fields = {};
};

// Writes the decoder's entry line (its class name, or the fixed text it uses) at warning priority.
void logDecoderEntry(const char* entryLine);
// "Received an unknown log message: %d" at error priority.
void logUnknownCode(std::int32_t logCode);
// The rule of logCode, or null.
const RecordRule* findRule(std::span<const RecordRule> rules, std::int32_t logCode);
// The common preamble described above.
const RecordRule* admitRecord(const char* entryLine, std::span<const RecordRule> rules, ByteView record,
                              std::int32_t logCode);
// The codes of the rules, in rule order: the decoder's code array.
LogCodeArray codesOf(std::span<const RecordRule> rules);
// Writes the rule's fields into section (when bound).
void writeRuleFields(const RecordRule& rule, ByteView record, PlistDictionary* section);

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
