// C2KDisplaySetter: how the CDMA2000 parsers write their values into the display.
//
// Contract: the lookup maps a display key (such as "kChannel") to an array of places, each place the
// two-entry dictionary {"key": the label, "dict": the display dictionary in which that label stands}.
// setDisplayValue stores the value under the label in every place listed for the key, in the order of the
// array; a key without places, or a null lookup (no display could be built), writes nothing.
// C2KRecordContext bundles what a parser reaches: the lookup and the state dictionary.
#pragma once

#include <span>
#include <string_view>

#include "LogGenerator/RecordFields.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::c2k {

inline constexpr std::string_view kPlaceLabelKey = "key";
inline constexpr std::string_view kPlaceDictionaryKey = "dict";

void setDisplayValue(const PlistDictionary* lookup, std::string_view key, const PlistValue& value);

// Renders every field of the table (offsets relative to base) and shows it under the field's key.
void writeDisplayFields(std::span<const RecordField> fields, const RecordReader& record, std::size_t base,
                        const PlistDictionary* lookup);

struct C2KRecordContext {
    const PlistDictionary* lookup;  // null when the display could not be built
    PlistDictionary& state;

    void show(std::string_view key, const PlistValue& value) const { setDisplayValue(lookup, key, value); }
};

}  // namespace velmar::c2k
