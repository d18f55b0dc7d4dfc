// The XML side of parsePropertyList, on the expat tokenizer.
//
// Safety: a document type may name an external DTD but is never allowed an internal subset, so no entity can
// be declared; external entities are never loaded and parameter entities never parsed; a reference to an
// entity that was not declared (which expat would otherwise skip silently when an external DTD is named)
// fails. Container nesting is limited to kMaxPlistDepth. Every value is checked as it closes, and the first
// problem stops the parser: the caller gets nullopt and one line naming the problem and its line number.
//
// Leniency: the <plist> wrapper and its version attribute are optional (a value element may be the document
// element), attributes on value elements are ignored, white space between elements is ignored, and numbers
// and dates may be surrounded by white space. A duplicate key keeps its first position and its last value.
#include <expat.h>

#include <charconv>
#include <climits>
#include <cstdint>
#include <exception>
#include <iterator>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "core/platform/plist/Base64.h"
#include "core/platform/plist/Iso8601.h"
#include "core/platform/plist/PlistCodec.h"
#include "core/platform/plist/Utf8.h"

namespace velmar::plist_detail {

std::optional<PlistValue> parseXmlPropertyList(std::span<const std::uint8_t> bytes, std::string* error);

namespace {

enum class Element : std::uint8_t {
    Plist,
    Dict,
    Array,
    Key,
    String,
    Integer,
    Real,
    True,
    False,
    Data,
    Date,
    Unknown
};

Element classify(std::string_view name) {
    switch (name.size()) {
        case 3:
            return name == "key" ? Element::Key : Element::Unknown;
        case 4:
            if (name == "dict") {
                return Element::Dict;
            }
            if (name == "real") {
                return Element::Real;
            }
            if (name == "true") {
                return Element::True;
            }
            if (name == "data") {
                return Element::Data;
            }
            if (name == "date") {
                return Element::Date;
            }
            return Element::Unknown;
        case 5:
            if (name == "plist") {
                return Element::Plist;
            }
            if (name == "array") {
                return Element::Array;
            }
            if (name == "false") {
                return Element::False;
            }
            return Element::Unknown;
        case 6:
            return name == "string" ? Element::String : Element::Unknown;
        case 7:
            return name == "integer" ? Element::Integer : Element::Unknown;
        default:
            return Element::Unknown;
    }
}

// Elements whose character data is their value.
bool collectsText(Element element) {
    switch (element) {
        case Element::Key:
        case Element::String:
        case Element::Integer:
        case Element::Real:
        case Element::Data:
        case Element::Date:
            return true;
        default:
            return false;
    }
}

bool isXmlSpace(char c) {
    return c == ' ' || c == '\t' || c == '\n' || c == '\r';
}

std::string_view trimXmlSpace(std::string_view text) {
    while (!text.empty() && isXmlSpace(text.front())) {
        text.remove_prefix(1);
    }
    while (!text.empty() && isXmlSpace(text.back())) {
        text.remove_suffix(1);
    }
    return text;
}

// Appends a short, single-line rendering of document text for an error message: printable ASCII is kept,
// anything else shows as '?', and long text is cut.
void appendPrintable(std::string& out, std::string_view text) {
    constexpr std::size_t kLimit = 40;
    for (std::size_t i = 0; i < text.size() && i < kLimit; ++i) {
        const auto c = static_cast<unsigned char>(text[i]);
        out.push_back(c >= 0x20 && c < 0x7F ? static_cast<char>(c) : '?');
    }
    if (text.size() > kLimit) {
        out.append("...");
    }
}

std::string printable(std::string_view text) {
    std::string out;
    appendPrintable(out, text);
    return out;
}

// The rendering between single quotes, built in one string.
std::string quoted(std::string_view text) {
    std::string out(1, '\'');
    appendPrintable(out, text);
    out.push_back('\'');
    return out;
}

std::optional<std::int64_t> parseInteger(std::string_view text) {
    text = trimXmlSpace(text);
    bool negative = false;
    if (!text.empty() && (text.front() == '-' || text.front() == '+')) {
        negative = text.front() == '-';
        text.remove_prefix(1);
    }
    unsigned base = 10;
    if (text.size() > 2 && text[0] == '0' && (text[1] == 'x' || text[1] == 'X')) {
        base = 16;
        text.remove_prefix(2);
    }
    if (text.empty()) {
        return std::nullopt;
    }
    // The magnitude is gathered unsigned so that INT64_MIN, whose magnitude is 2^63, can be read.
    const std::uint64_t limit = negative ? std::uint64_t{1} << 63 : (std::uint64_t{1} << 63) - 1;
    std::uint64_t magnitude = 0;
    for (const char c : text) {
        unsigned digit;
        if (c >= '0' && c <= '9') {
            digit = static_cast<unsigned>(c - '0');
        } else if (base == 16 && c >= 'a' && c <= 'f') {
            digit = static_cast<unsigned>(c - 'a' + 10);
        } else if (base == 16 && c >= 'A' && c <= 'F') {
            digit = static_cast<unsigned>(c - 'A' + 10);
        } else {
            return std::nullopt;
        }
        if (magnitude > (limit - digit) / base) {
            return std::nullopt;
        }
        magnitude = magnitude * base + digit;
    }
    if (negative) {
        // 0 - magnitude in unsigned arithmetic is the two's complement, which is exact for 2^63 as well.
        return static_cast<std::int64_t>(std::uint64_t{0} - magnitude);
    }
    return static_cast<std::int64_t>(magnitude);
}

std::optional<double> parseReal(std::string_view text) {
    text = trimXmlSpace(text);
    // from_chars reads what strtod reads (decimal and exponent forms, "inf", "infinity", "nan") except a
    // leading plus sign, and does so without regard to the locale.
    if (text.size() > 1 && text.front() == '+' && text[1] != '-' && text[1] != '+') {
        text.remove_prefix(1);
    }
    double value = 0;
    const char* end = text.data() + text.size();
    const auto result = std::from_chars(text.data(), end, value);
    if (text.empty() || result.ec != std::errc() || result.ptr != end) {
        return std::nullopt;
    }
    return value;
}

// One open <plist>, <dict> or <array>. Levels are kept and reused as the parser goes up and down, so the
// vectors that gather a container's children keep their capacity from one container to the next and each
// finished container is built once, at its exact size.
struct Level {
    Element element = Element::Plist;
    std::vector<PlistDictionary::Entry> entries;  // a dictionary's children
    std::vector<PlistValue> items;                // an array's children, or the value of a <plist>
    std::string key;                              // a dictionary's key waiting for its value
    bool hasKey = false;
};

class XmlReader {
  public:
    XmlReader() : parser_(XML_ParserCreate(nullptr)) {}
    ~XmlReader() {
        if (parser_ != nullptr) {
            XML_ParserFree(parser_);
        }
    }
    XmlReader(const XmlReader&) = delete;
    XmlReader& operator=(const XmlReader&) = delete;

    std::optional<PlistValue> parse(std::span<const std::uint8_t> bytes, unsigned long skippedLines,
                                    std::string* error) {
        if (parser_ == nullptr) {
            return report(error, 0, "cannot create the XML parser");
        }
        XML_SetUserData(parser_, this);
        XML_SetParamEntityParsing(parser_, XML_PARAM_ENTITY_PARSING_NEVER);
        XML_SetElementHandler(parser_, &XmlReader::onStart, &XmlReader::onEnd);
        XML_SetCharacterDataHandler(parser_, &XmlReader::onText);
        XML_SetStartDoctypeDeclHandler(parser_, &XmlReader::onDoctype);
        XML_SetEntityDeclHandler(parser_, &XmlReader::onEntityDeclaration);
        XML_SetSkippedEntityHandler(parser_, &XmlReader::onSkippedEntity);
        XML_SetExternalEntityRefHandler(parser_, &XmlReader::onExternalEntity);

        // expat takes an int length: hand over very large documents in slices.
        constexpr std::size_t kSlice = std::size_t{1} << 30;
        const char* data = reinterpret_cast<const char*>(bytes.data());
        std::size_t left = bytes.size();
        XML_Status status = XML_STATUS_OK;
        do {
            const std::size_t slice = left < kSlice ? left : kSlice;
            left -= slice;
            status = XML_Parse(parser_, data, static_cast<int>(slice), left == 0 ? XML_TRUE : XML_FALSE);
            data += slice;
        } while (status == XML_STATUS_OK && left > 0);

        if (failed_) {
            return report(error, failedLine_ + skippedLines, message_);
        }
        if (status != XML_STATUS_OK) {
            const auto line = static_cast<unsigned long>(XML_GetCurrentLineNumber(parser_));
            const XML_LChar* text = XML_ErrorString(XML_GetErrorCode(parser_));
            return report(error, line + skippedLines, text != nullptr ? text : "malformed XML");
        }
        if (!result_ || depth_ != 0) {
            return report(error, static_cast<unsigned long>(XML_GetCurrentLineNumber(parser_)) + skippedLines,
                          "no property-list value in the document");
        }
        return std::move(result_);
    }

  private:
    static std::optional<PlistValue> report(std::string* error, unsigned long line, std::string_view what) {
        if (error != nullptr) {
            *error = "line " + std::to_string(line) + ": " + std::string(what);
        }
        return std::nullopt;
    }

    void fail(std::string message) {
        if (!failed_) {
            failed_ = true;
            failedLine_ = static_cast<unsigned long>(XML_GetCurrentLineNumber(parser_));
            message_ = std::move(message);
            XML_StopParser(parser_, XML_FALSE);
        }
    }

    // Runs a handler body; an exception (an allocation failure) must not unwind through the C parser.
    template <typename Body>
    static void guarded(void* userData, Body&& body) {
        auto* self = static_cast<XmlReader*>(userData);
        if (self->failed_) {
            return;  // expat may still deliver an event or two after being stopped
        }
        try {
            body(*self);
        } catch (const std::exception& problem) {
            self->fail(std::string("cannot build the value: ") + problem.what());
        }
    }

    static void XMLCALL onStart(void* userData, const XML_Char* name, const XML_Char** /*attributes*/) {
        guarded(userData, [name](XmlReader& self) { self.startElement(name); });
    }
    static void XMLCALL onEnd(void* userData, const XML_Char* /*name*/) {
        guarded(userData, [](XmlReader& self) { self.endElement(); });
    }
    static void XMLCALL onText(void* userData, const XML_Char* text, int length) {
        guarded(userData, [text, length](XmlReader& self) {
            self.characters(std::string_view(text, static_cast<std::size_t>(length)));
        });
    }
    static void XMLCALL onDoctype(void* userData, const XML_Char* /*name*/, const XML_Char* /*systemId*/,
                                  const XML_Char* /*publicId*/, int hasInternalSubset) {
        guarded(userData, [hasInternalSubset](XmlReader& self) {
            if (hasInternalSubset != 0) {
                self.fail("document type declarations with an internal subset are not accepted");
            }
        });
    }
    static void XMLCALL onEntityDeclaration(void* userData, const XML_Char* name, int /*isParameterEntity*/,
                                            const XML_Char* /*value*/, int /*valueLength*/,
                                            const XML_Char* /*base*/, const XML_Char* /*systemId*/,
                                            const XML_Char* /*publicId*/, const XML_Char* /*notationName*/) {
        guarded(userData, [name](XmlReader& self) { self.fail("entity declaration " + quoted(name)); });
    }
    static void XMLCALL onSkippedEntity(void* userData, const XML_Char* name, int /*isParameterEntity*/) {
        guarded(userData,
                [name](XmlReader& self) { self.fail("reference to undeclared entity " + quoted(name)); });
    }
    static int XMLCALL onExternalEntity(XML_Parser parser, const XML_Char* /*context*/,
                                        const XML_Char* /*base*/, const XML_Char* systemId,
                                        const XML_Char* /*publicId*/) {
        guarded(XML_GetUserData(parser), [systemId](XmlReader& self) {
            self.fail("external entity " + quoted(systemId != nullptr ? systemId : "") + " is not loaded");
        });
        return XML_STATUS_ERROR;
    }

    Level* top() { return depth_ == 0 ? nullptr : &levels_[depth_ - 1]; }

    void startElement(std::string_view name) {
        const Element element = classify(name);
        if (element == Element::Unknown) {
            return fail("unknown element <" + printable(name) + ">");
        }
        if (scalar_ != Element::Unknown) {
            return fail("element <" + std::string(name) + "> inside <" + elementName(scalar_) + ">");
        }
        if (Level* parent = top()) {
            if (element == Element::Plist) {
                return fail(parent->element == Element::Plist ? "<plist> inside <plist>"
                                                              : "<plist> inside a value");
            }
            switch (parent->element) {
                case Element::Plist:
                    if (element == Element::Key) {
                        return fail("<key> outside a dictionary");
                    }
                    if (!parent->items.empty()) {
                        return fail("more than one value in <plist>");
                    }
                    break;
                case Element::Dict:
                    if (!parent->hasKey && element != Element::Key) {
                        return fail("expected <key> in <dict>, found <" + std::string(name) + ">");
                    }
                    if (parent->hasKey && element == Element::Key) {
                        return fail("key " + quoted(parent->key) + " has no value");
                    }
                    break;
                default:
                    if (element == Element::Key) {
                        return fail("<key> outside a dictionary");
                    }
                    break;
            }
        } else if (element == Element::Key) {
            return fail("<key> outside a dictionary");
        }

        if (element == Element::Dict || element == Element::Array || element == Element::Plist) {
            if (element != Element::Plist && ++containerDepth_ > static_cast<std::size_t>(kMaxPlistDepth)) {
                return fail("containers nested deeper than " + std::to_string(kMaxPlistDepth) + " levels");
            }
            if (depth_ == levels_.size()) {
                levels_.emplace_back();
            }
            Level& level = levels_[depth_++];
            level.element = element;
            level.entries.clear();
            level.items.clear();
            level.hasKey = false;
            return;
        }
        scalar_ = element;
        text_.clear();
    }

    void endElement() {
        if (scalar_ != Element::Unknown) {
            const Element element = scalar_;
            scalar_ = Element::Unknown;
            return endScalar(element);
        }
        Level& level = levels_[--depth_];
        switch (level.element) {
            case Element::Plist:
                if (level.items.empty()) {
                    return fail("<plist> holds no value");
                }
                result_ = std::move(level.items.front());
                level.items.clear();
                return;
            case Element::Dict: {
                if (level.hasKey) {
                    return fail("key " + quoted(level.key) + " has no value");
                }
                --containerDepth_;
                auto dictionary = PlistDictionary::create();
                dictionary->reserve(level.entries.size());
                for (auto& [key, value] : level.entries) {
                    dictionary->set(key, std::move(value));
                }
                level.entries.clear();
                return attach(PlistValue(std::move(dictionary)));
            }
            case Element::Array: {
                --containerDepth_;
                auto array =
                    PlistArray::create(std::vector<PlistValue>(std::make_move_iterator(level.items.begin()),
                                                               std::make_move_iterator(level.items.end())));
                level.items.clear();
                return attach(PlistValue(std::move(array)));
            }
            default:
                return;
        }
    }

    void endScalar(Element element) {
        switch (element) {
            case Element::Key: {
                if (!isValidUtf8(text_)) {
                    return fail("key is not valid UTF-8");
                }
                Level& dictionary = *top();
                dictionary.key.assign(text_);
                dictionary.hasKey = true;
                return;
            }
            case Element::String:
                if (!isValidUtf8(text_)) {
                    return fail("string is not valid UTF-8");
                }
                // A copy rather than a move, so that text_ keeps its capacity for the next value.
                return attach(PlistValue(std::string_view(text_)));
            case Element::Integer: {
                const auto number = parseInteger(text_);
                if (!number) {
                    return fail("invalid or out-of-range integer " + quoted(text_));
                }
                return attach(PlistValue::integer(*number));
            }
            case Element::Real: {
                const auto number = parseReal(text_);
                if (!number) {
                    return fail("invalid or out-of-range real " + quoted(text_));
                }
                return attach(PlistValue::real(*number));
            }
            case Element::True:
                return attach(PlistValue::boolean(true));
            case Element::False:
                return attach(PlistValue::boolean(false));
            case Element::Data: {
                auto bytes = decodeBase64(text_);
                if (!bytes) {
                    return fail("invalid base64 in <data>");
                }
                return attach(PlistValue::data(std::move(*bytes)));
            }
            case Element::Date: {
                const auto seconds = parseIso8601Utc(trimXmlSpace(text_));
                if (!seconds) {
                    return fail("invalid date " + quoted(text_));
                }
                return attach(PlistValue::date(PlistDate{*seconds}));
            }
            default:
                return;
        }
    }

    void attach(PlistValue value) {
        Level* parent = top();
        if (parent == nullptr) {
            result_ = std::move(value);  // a bare value as the document element
        } else if (parent->element == Element::Dict) {
            parent->entries.emplace_back(parent->key, std::move(value));
            parent->hasKey = false;
        } else {
            parent->items.push_back(std::move(value));
        }
    }

    void characters(std::string_view text) {
        if (collectsText(scalar_)) {
            text_.append(text);
            return;
        }
        for (const char c : text) {
            if (!isXmlSpace(c)) {
                const Element where = scalar_ != Element::Unknown ? scalar_
                                      : top()                     ? top()->element
                                                                  : Element::Plist;
                return fail("unexpected text " + quoted(text) + " in <" + elementName(where) + ">");
            }
        }
    }

    static std::string elementName(Element element) {
        static constexpr std::string_view kNames[] = {"plist", "dict", "array", "key",  "string", "integer",
                                                      "real",  "true", "false", "data", "date",   "?"};
        return std::string(kNames[static_cast<std::size_t>(element)]);
    }

    XML_Parser parser_;
    std::vector<Level> levels_;  // levels_[0, depth_) are open
    std::size_t depth_ = 0;
    std::size_t containerDepth_ = 0;     // open dictionaries and arrays
    Element scalar_ = Element::Unknown;  // the open value element that is not a container, if any
    std::string text_;
    std::optional<PlistValue> result_;
    bool failed_ = false;
    unsigned long failedLine_ = 0;
    std::string message_;
};

}  // namespace

std::optional<PlistValue> parseXmlPropertyList(std::span<const std::uint8_t> bytes, std::string* error) {
    // expat wants the XML declaration at the very start: step over a UTF-8 byte-order mark and white space,
    // counting the lines skipped so that reported line numbers still match the file.
    std::size_t start = 0;
    if (bytes.size() >= 3 && bytes[0] == 0xEF && bytes[1] == 0xBB && bytes[2] == 0xBF) {
        start = 3;
    }
    unsigned long skippedLines = 0;
    while (start < bytes.size() && isXmlSpace(static_cast<char>(bytes[start]))) {
        const bool lineEnd =
            bytes[start] == '\n' ||
            (bytes[start] == '\r' && (start + 1 == bytes.size() || bytes[start + 1] != '\n'));
        skippedLines += lineEnd ? 1 : 0;
        ++start;
    }
    XmlReader reader;
    return reader.parse(bytes.subspan(start), skippedLines, error);
}

}  // namespace velmar::plist_detail
