// Json: JSON text for scripts and tests, written by the offline decoder and the headless monitor.
//
// Contract: appendJsonString writes a quoted JSON string (escapes ", \ and control characters; other bytes
// pass through, so UTF-8 text stays UTF-8). appendPlistJson writes a property-list value: dictionaries as
// objects in their own key order, arrays, strings, integers and reals as numbers (a real that JSON cannot
// carry, NaN or infinite, as null), booleans, data as {"$data": "<base64>"}, dates as
// {"$date": "<ISO 8601 UTC>"}, none as null. With indent > 0 the output is pretty-printed with that many
// spaces per level; with 0 it is one line.
#pragma once

#include <string>
#include <string_view>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

void appendJsonString(std::string& out, std::string_view text);
void appendPlistJson(std::string& out, const PlistValue& value, int indent = 0);
std::string plistToJson(const PlistValue& value, int indent = 0);

}  // namespace velmar
