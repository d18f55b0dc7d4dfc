#include "core/platform/Json.h"

#include <charconv>
#include <cmath>
#include <cstdio>

#include "core/platform/plist/Base64.h"
#include "core/platform/plist/Iso8601.h"

namespace velmar {

namespace {

void newline(std::string& out, int indent, int depth) {
    if (indent > 0) {
        out.push_back('\n');
        out.append(static_cast<std::size_t>(indent * depth), ' ');
    }
}

void appendValue(std::string& out, const PlistValue& value, int indent, int depth) {
    const char* separator = indent > 0 ? ": " : ": ";
    switch (value.kind()) {
        case PlistValue::Kind::None:
            out += "null";
            return;
        case PlistValue::Kind::String:
            appendJsonString(out, *value.string());
            return;
        case PlistValue::Kind::Integer: {
            char digits[24];
            const auto result = std::to_chars(digits, digits + sizeof digits, *value.integerValue());
            out.append(digits, result.ptr);
            return;
        }
        case PlistValue::Kind::Real: {
            const double number = *value.realValue();
            if (!std::isfinite(number)) {
                out += "null";
                return;
            }
            char digits[32];
            const auto result = std::to_chars(digits, digits + sizeof digits, number);
            out.append(digits, result.ptr);
            return;
        }
        case PlistValue::Kind::Boolean:
            out += *value.booleanValue() ? "true" : "false";
            return;
        case PlistValue::Kind::Data:
            out += "{\"$data\"";
            out += separator;
            out.push_back('"');
            appendBase64(out, *value.dataValue());
            out += "\"}";
            return;
        case PlistValue::Kind::Date:
            out += "{\"$date\"";
            out += separator;
            appendJsonString(out, formatIso8601Utc(value.dateValue()->secondsSince1970).value_or(""));
            out.push_back('}');
            return;
        case PlistValue::Kind::Dictionary: {
            const PlistDictionary& dictionary = *value.dictionary();
            if (dictionary.empty()) {
                out += "{}";
                return;
            }
            out.push_back('{');
            bool first = true;
            for (const auto& [key, child] : dictionary) {
                if (!first) {
                    out.push_back(',');
                    if (indent == 0) {
                        out.push_back(' ');
                    }
                }
                first = false;
                newline(out, indent, depth + 1);
                appendJsonString(out, key);
                out += separator;
                appendValue(out, child, indent, depth + 1);
            }
            newline(out, indent, depth);
            out.push_back('}');
            return;
        }
        case PlistValue::Kind::Array: {
            const PlistArray& array = *value.array();
            if (array.empty()) {
                out += "[]";
                return;
            }
            out.push_back('[');
            bool first = true;
            for (const PlistValue& child : array) {
                if (!first) {
                    out.push_back(',');
                    if (indent == 0) {
                        out.push_back(' ');
                    }
                }
                first = false;
                newline(out, indent, depth + 1);
                appendValue(out, child, indent, depth + 1);
            }
            newline(out, indent, depth);
            out.push_back(']');
            return;
        }
    }
}

}  // namespace

void appendJsonString(std::string& out, std::string_view text) {
    out.push_back('"');
    for (const char c : text) {
        const auto byte = static_cast<unsigned char>(c);
        switch (c) {
            case '"':
                out += "\\\"";
                break;
            case '\\':
                out += "\\\\";
                break;
            case '\n':
                out += "\\n";
                break;
            case '\r':
                out += "\\r";
                break;
            case '\t':
                out += "\\t";
                break;
            default:
                if (byte < 0x20 || byte == 0x7F) {
                    char escape[8];
                    std::snprintf(escape, sizeof escape, "\\u%04x", byte);
                    out += escape;
                } else {
                    out.push_back(c);
                }
        }
    }
    out.push_back('"');
}

void appendPlistJson(std::string& out, const PlistValue& value, int indent) {
    appendValue(out, value, indent, 0);
}

std::string plistToJson(const PlistValue& value, int indent) {
    std::string out;
    appendPlistJson(out, value, indent);
    return out;
}

}  // namespace velmar
