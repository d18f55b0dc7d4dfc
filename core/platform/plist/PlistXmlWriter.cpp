// The XML encoding of a property list: serializeXml and writeXmlFile.
//
// Layout: the standard header and document type, then the root value at column 0 inside <plist>, each nested
// element one tab deeper. Base64 data goes on lines of at most 76 characters, each indented one tab deeper
// than its <data> tag, with the closing tag on a line of its own (an empty value has no data lines).
//
// Text is escaped for &, < and >; a carriage return is written as "&#13;" because a reader would otherwise
// turn it into a line feed. Text that XML cannot carry at all (invalid UTF-8, control characters other than
// tab, line feed and carriage return, U+FFFE, U+FFFF) makes the whole serialisation fail, as does a none
// value, a date outside the years 0000-9999, or nesting deeper than kMaxPlistDepth (which also stops a tree
// that contains itself).
#include <algorithm>
#include <array>
#include <charconv>
#include <span>
#include <string>
#include <string_view>

#include "core/platform/WholeFile.h"
#include "core/platform/plist/Base64.h"
#include "core/platform/plist/Iso8601.h"
#include "core/platform/plist/PlistCodec.h"
#include "core/platform/plist/Utf8.h"

namespace velmar {

namespace {

constexpr std::string_view kHeader =
    "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
    "<!DOCTYPE plist PUBLIC \"-//Brindle//DTD PLIST 1.0//EN\" \"PropertyList-1.0.dtd\">\n"
    "<plist version=\"1.0\">\n";
constexpr std::string_view kFooter = "</plist>\n";

// Base64 characters per data line: 57 input bytes make exactly 76 characters.
constexpr std::size_t kDataBytesPerLine = 57;

// How each byte of text is treated when it is written.
enum ByteClass : std::uint8_t { kPlain, kEscape, kForbidden, kMultiByte };

constexpr std::array<std::uint8_t, 256> makeByteClasses() {
    std::array<std::uint8_t, 256> classes{};
    for (int b = 0; b < 256; ++b) {
        if (b >= 0x80) {
            classes[b] = kMultiByte;
        } else if (b < 0x20 && b != '\t' && b != '\n' && b != '\r') {
            classes[b] = kForbidden;
        } else if (b == '&' || b == '<' || b == '>' || b == '\r') {
            classes[b] = kEscape;
        } else {
            classes[b] = kPlain;
        }
    }
    return classes;
}

constexpr std::array<std::uint8_t, 256> kByteClass = makeByteClasses();

class XmlWriter {
  public:
    explicit XmlWriter(std::string& out) : out_(out) {}

    bool writeValue(const PlistValue& value, std::size_t level) {
        switch (value.kind()) {
            case PlistValue::Kind::None:
                return false;
            case PlistValue::Kind::Dictionary:
                return writeDictionary(*value.dictionary(), level);
            case PlistValue::Kind::Array:
                return writeArray(*value.array(), level);
            case PlistValue::Kind::String:
                indent(level);
                out_.append("<string>");
                if (!appendText(*value.string())) {
                    return false;
                }
                out_.append("</string>\n");
                return true;
            case PlistValue::Kind::Integer: {
                indent(level);
                out_.append("<integer>");
                appendNumber(*value.integerValue());
                out_.append("</integer>\n");
                return true;
            }
            case PlistValue::Kind::Real: {
                indent(level);
                out_.append("<real>");
                appendNumber(*value.realValue());
                out_.append("</real>\n");
                return true;
            }
            case PlistValue::Kind::Boolean:
                indent(level);
                out_.append(*value.booleanValue() ? "<true/>\n" : "<false/>\n");
                return true;
            case PlistValue::Kind::Data:
                writeData(*value.dataValue(), level);
                return true;
            case PlistValue::Kind::Date: {
                const auto text = formatIso8601Utc(value.dateValue()->secondsSince1970);
                if (!text) {
                    return false;
                }
                indent(level);
                out_.append("<date>");
                out_.append(*text);
                out_.append("</date>\n");
                return true;
            }
        }
        return false;
    }

  private:
    void indent(std::size_t level) { out_.append(level, '\t'); }

    bool enter() { return ++depth_ <= static_cast<std::size_t>(kMaxPlistDepth); }

    bool writeDictionary(const PlistDictionary& dictionary, std::size_t level) {
        if (!enter()) {
            return false;
        }
        indent(level);
        if (dictionary.empty()) {
            out_.append("<dict/>\n");
        } else {
            out_.append("<dict>\n");
            for (const auto& [key, item] : dictionary) {
                indent(level + 1);
                out_.append("<key>");
                if (!appendText(key)) {
                    return false;
                }
                out_.append("</key>\n");
                if (!writeValue(item, level + 1)) {
                    return false;
                }
            }
            indent(level);
            out_.append("</dict>\n");
        }
        --depth_;
        return true;
    }

    bool writeArray(const PlistArray& array, std::size_t level) {
        if (!enter()) {
            return false;
        }
        indent(level);
        if (array.empty()) {
            out_.append("<array/>\n");
        } else {
            out_.append("<array>\n");
            for (const auto& item : array) {
                if (!writeValue(item, level + 1)) {
                    return false;
                }
            }
            indent(level);
            out_.append("</array>\n");
        }
        --depth_;
        return true;
    }

    void writeData(const PlistData& bytes, std::size_t level) {
        indent(level);
        out_.append("<data>\n");
        const std::span<const std::uint8_t> all(bytes);
        for (std::size_t at = 0; at < all.size(); at += kDataBytesPerLine) {
            indent(level + 1);
            appendBase64(out_, all.subspan(at, std::min(kDataBytesPerLine, all.size() - at)));
            out_.push_back('\n');
        }
        indent(level);
        out_.append("</data>\n");
    }

    template <typename Number>
    void appendNumber(Number number) {
        char buffer[32];
        // Without a precision, to_chars writes the shortest text that reads back as the same value.
        const auto result = std::to_chars(buffer, buffer + sizeof buffer, number);
        out_.append(buffer, result.ptr);
    }

    // Appends text with markup characters escaped; false when XML cannot carry the text.
    bool appendText(std::string_view text) {
        std::size_t at = 0;
        const std::size_t size = text.size();
        while (at < size) {
            std::size_t run = at;
            while (run < size && kByteClass[static_cast<unsigned char>(text[run])] == kPlain) {
                ++run;
            }
            out_.append(text.data() + at, run - at);
            at = run;
            if (at == size) {
                break;
            }
            switch (kByteClass[static_cast<unsigned char>(text[at])]) {
                case kEscape:
                    switch (text[at]) {
                        case '&':
                            out_.append("&amp;");
                            break;
                        case '<':
                            out_.append("&lt;");
                            break;
                        case '>':
                            out_.append("&gt;");
                            break;
                        default:
                            out_.append("&#13;");
                            break;
                    }
                    ++at;
                    break;
                case kMultiByte: {
                    const std::size_t start = at;
                    const auto codePoint = decodeUtf8(text, at);
                    if (!codePoint || *codePoint == 0xFFFE || *codePoint == 0xFFFF) {
                        return false;
                    }
                    out_.append(text.data() + start, at - start);
                    break;
                }
                default:
                    return false;
            }
        }
        return true;
    }

    std::string& out_;
    std::size_t depth_ = 0;
};

}  // namespace

std::optional<PlistData> serializeXml(const PlistValue& value) {
    std::string text;
    text.reserve(4096);
    text.append(kHeader);
    XmlWriter writer(text);
    if (!writer.writeValue(value, 0)) {
        return std::nullopt;
    }
    text.append(kFooter);
    return PlistData(text.begin(), text.end());
}

bool writeXmlFile(const PlistValue& dictionary, const std::string& path) {
    if (!dictionary.isDictionary()) {
        return false;
    }
    const auto document = serializeXml(dictionary);
    if (!document) {
        return false;
    }
    return writeWholeFile(path, *document).ok();
}

}  // namespace velmar
