// parseJson: a strict JSON reader for checking the programs' output in tests. Objects become insertion-
// ordered dictionaries, arrays arrays, strings strings, integers integers, other numbers reals, true/false
// booleans, null none. Anything malformed, or trailing text, answers nullopt.
#pragma once

#include <optional>
#include <string_view>

#include "core/platform/plist/PlistValue.h"

namespace velmar::testing {

std::optional<PlistValue> parseJson(std::string_view text);

}  // namespace velmar::testing
