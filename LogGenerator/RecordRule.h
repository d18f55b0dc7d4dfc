// RecordRule: the checks that every record decoder makes before it decodes anything, declared as a table.
//
// Contract: a decoder declares its DecoderRules: the title it logs on every call, one RecordRule per log code
// it handles (the code, the minimum record length, and what the record shows in a key section: the table of
// its fields when it is a flat list of fields, else the function that writes it) and what it does with any
// other code. admitRecord logs the title
// (warning priority unless the rules name another); answers null for a code without a rule, after logging
// "Received an unknown log message: %d" (error priority) unless the decoder ignores other codes; answers
// null, silently, for a record shorter than the rule's minimum, which then changes nothing; otherwise answers
// the rule. A decoder's rules list exactly the codes of its row in the class-index table, in the row's order
// (rulesMatch, checked at compile time beside each decoder's constructor).
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "LogGenerator/DecoderTable.h"
#include "LogGenerator/RecordFields.h"
#include "core/platform/ByteView.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

// Writes what an admitted record shows into a key section; the section is null when the decoder is unbound.
using RecordWriter = void (*)(ByteView record, const PlistDictionaryRef& section);

// One log code that a decoder handles.
struct RecordRule {
    std::int32_t code;
    // Records shorter than this are dropped without a message; 0 admits any length (extra records).
    std::size_t minimumLength;
    // Fields written, in order, into the key section, for a record that is a flat list of fields.
    std::span<const RecordField> fields = {};
    // Writes the record instead of the fields, for a record that is not.
    RecordWriter write = nullptr;
};

struct DecoderRules {
    enum class OtherCodes : std::uint8_t { Reported, Ignored };

    const char* title;
    std::span<const RecordRule> rules;
    OtherCodes otherCodes = OtherCodes::Reported;
    int titlePriority = kLogWarning;
};

void logDecoderTitle(const char* title, int priority = kLogWarning);
// "Received an unknown log message: %d" (error priority).
void reportUnknownLogMessage(std::int32_t logCode);
// The common preamble described above: the rule of the record, or null when it is not to be decoded.
const RecordRule* admitRecord(const DecoderRules& decoder, ByteView record, std::int32_t logCode);
// Writes an admitted record into a key section by its rule: through the rule's writer when it has one, else
// the rule's fields (when there is a section).
void writeRecord(const RecordRule& rule, ByteView record, const PlistDictionaryRef& section);

// Whether the rules handle exactly the codes of row, in the same order.
constexpr bool rulesMatch(std::span<const RecordRule> rules, const DecoderRow& row) {
    const std::span<const std::int32_t> codes = row.codes.codes();
    if (rules.size() != codes.size()) {
        return false;
    }
    for (std::size_t i = 0; i < rules.size(); ++i) {
        if (rules[i].code != codes[i]) {
            return false;
        }
    }
    return true;
}

}  // namespace velmar
