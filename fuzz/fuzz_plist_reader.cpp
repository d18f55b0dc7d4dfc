// Fuzzes parsePropertyList with arbitrary bytes (XML and binary alike). Whatever it accepts must survive both
// writers: the XML text and the binary document must read back as the same tree. The comparison allows for
// what each encoding cannot keep: NaN payloads (text has just "nan"), fractions of a second in XML dates,
// and the last bit of a binary date (stored from a different epoch). serializeXml may refuse a tree only
// when the tree holds text that XML cannot carry or a date outside the years 0000-9999.
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <span>
#include <string>
#include <string_view>

#include "core/platform/plist/PlistCodec.h"

namespace {

using velmar::PlistValue;

enum class Through { Xml, Binary };

bool sameReal(double a, double b) {
    if (std::isnan(a) || std::isnan(b)) {
        return std::isnan(a) && std::isnan(b);
    }
    std::uint64_t bitsA = 0;
    std::uint64_t bitsB = 0;
    std::memcpy(&bitsA, &a, sizeof a);
    std::memcpy(&bitsB, &b, sizeof b);
    return bitsA == bitsB;
}

bool sameDate(double original, double back, Through through) {
    if (through == Through::Xml) {
        return std::floor(original) == back;
    }
    const double scale = std::fmax(std::fmax(std::fabs(original), std::fabs(back)), 978307200.0);
    return std::fabs(original - back) <= 4 * 2.220446049250313e-16 * scale;
}

bool equivalent(const PlistValue& a, const PlistValue& b, Through through) {
    if (a.kind() != b.kind()) {
        return false;
    }
    switch (a.kind()) {
        case PlistValue::Kind::Dictionary: {
            const auto& x = a.dictionary()->entries();
            const auto& y = b.dictionary()->entries();
            if (x.size() != y.size()) {
                return false;
            }
            for (std::size_t i = 0; i < x.size(); ++i) {
                if (x[i].first != y[i].first || !equivalent(x[i].second, y[i].second, through)) {
                    return false;
                }
            }
            return true;
        }
        case PlistValue::Kind::Array: {
            const auto& x = a.array()->items();
            const auto& y = b.array()->items();
            if (x.size() != y.size()) {
                return false;
            }
            for (std::size_t i = 0; i < x.size(); ++i) {
                if (!equivalent(x[i], y[i], through)) {
                    return false;
                }
            }
            return true;
        }
        case PlistValue::Kind::Real:
            return sameReal(*a.realValue(), *b.realValue());
        case PlistValue::Kind::Date:
            return sameDate(a.dateValue()->secondsSince1970, b.dateValue()->secondsSince1970, through);
        default:
            return a == b;
    }
}

// Text XML 1.0 cannot hold: control characters other than tab, line feed and carriage return, and the
// non-characters U+FFFE and U+FFFF.
bool xmlCannotHold(std::string_view text) {
    for (const char c : text) {
        const auto byte = static_cast<unsigned char>(c);
        if (byte < 0x20 && byte != '\t' && byte != '\n' && byte != '\r') {
            return true;
        }
    }
    return text.find("\xEF\xBF\xBE") != std::string_view::npos ||
           text.find("\xEF\xBF\xBF") != std::string_view::npos;
}

bool hasValueXmlCannotHold(const PlistValue& value) {
    switch (value.kind()) {
        case PlistValue::Kind::Dictionary:
            for (const auto& [key, item] : *value.dictionary()) {
                if (xmlCannotHold(key) || hasValueXmlCannotHold(item)) {
                    return true;
                }
            }
            return false;
        case PlistValue::Kind::Array:
            for (const auto& item : *value.array()) {
                if (hasValueXmlCannotHold(item)) {
                    return true;
                }
            }
            return false;
        case PlistValue::Kind::String:
            return xmlCannotHold(*value.string());
        case PlistValue::Kind::Date: {
            // 0000-01-01T00:00:00Z and 10000-01-01T00:00:00Z.
            const double whole = std::floor(value.dateValue()->secondsSince1970);
            return !(whole >= -62167219200.0 && whole < 253402300800.0);
        }
        default:
            return false;
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::string error;
    const auto value = velmar::parsePropertyList(std::span<const std::uint8_t>(data, size), &error);
    if (!value) {
        if (error.empty() || error.find('\n') != std::string::npos) {
            std::abort();  // every failure explains itself on one line
        }
        return 0;
    }
    if (value->isNone()) {
        std::abort();
    }

    const auto xml = velmar::serializeXml(*value);
    if (!xml) {
        if (!hasValueXmlCannotHold(*value)) {
            std::abort();
        }
    } else {
        const auto back = velmar::parsePropertyList(*xml, &error);
        if (!back || !equivalent(*value, *back, Through::Xml)) {
            std::abort();
        }
    }

    const auto binary = velmar::serializeBinary(*value);
    if (!binary) {
        std::abort();
    }
    const auto back = velmar::parsePropertyList(*binary, &error);
    if (!back || !equivalent(*value, *back, Through::Binary)) {
        std::abort();
    }
    return 0;
}
