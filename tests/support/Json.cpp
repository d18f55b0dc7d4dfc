#include "tests/support/Json.h"

#include <cctype>
#include <charconv>
#include <cstdlib>
#include <string>

namespace velmar::testing {

namespace {

class JsonReader {
  public:
    explicit JsonReader(std::string_view text) : text_(text) {}

    std::optional<PlistValue> document() {
        auto value = parseValue(0);
        skipSpace();
        if (!value || at_ != text_.size()) {
            return std::nullopt;
        }
        return value;
    }

  private:
    void skipSpace() {
        while (at_ < text_.size() && std::isspace(static_cast<unsigned char>(text_[at_]))) {
            ++at_;
        }
    }
    bool take(char expected) {
        skipSpace();
        if (at_ < text_.size() && text_[at_] == expected) {
            ++at_;
            return true;
        }
        return false;
    }
    bool takeWord(std::string_view word) {
        if (text_.substr(at_, word.size()) == word) {
            at_ += word.size();
            return true;
        }
        return false;
    }

    static void appendUtf8(std::string& out, unsigned code) {
        if (code < 0x80) {
            out.push_back(static_cast<char>(code));
        } else if (code < 0x800) {
            out.push_back(static_cast<char>(0xC0 | (code >> 6)));
            out.push_back(static_cast<char>(0x80 | (code & 0x3F)));
        } else if (code < 0x10000) {
            out.push_back(static_cast<char>(0xE0 | (code >> 12)));
            out.push_back(static_cast<char>(0x80 | ((code >> 6) & 0x3F)));
            out.push_back(static_cast<char>(0x80 | (code & 0x3F)));
        } else {
            out.push_back(static_cast<char>(0xF0 | (code >> 18)));
            out.push_back(static_cast<char>(0x80 | ((code >> 12) & 0x3F)));
            out.push_back(static_cast<char>(0x80 | ((code >> 6) & 0x3F)));
            out.push_back(static_cast<char>(0x80 | (code & 0x3F)));
        }
    }

    std::optional<unsigned> hex4() {
        if (at_ + 4 > text_.size()) {
            return std::nullopt;
        }
        unsigned value = 0;
        const auto result = std::from_chars(text_.data() + at_, text_.data() + at_ + 4, value, 16);
        if (result.ptr != text_.data() + at_ + 4) {
            return std::nullopt;
        }
        at_ += 4;
        return value;
    }

    std::optional<std::string> parseString() {
        if (!take('"')) {
            return std::nullopt;
        }
        std::string out;
        while (at_ < text_.size()) {
            const char c = text_[at_++];
            if (c == '"') {
                return out;
            }
            if (static_cast<unsigned char>(c) < 0x20) {
                return std::nullopt;
            }
            if (c != '\\') {
                out.push_back(c);
                continue;
            }
            if (at_ >= text_.size()) {
                return std::nullopt;
            }
            const char escape = text_[at_++];
            switch (escape) {
                case '"':
                    out.push_back('"');
                    break;
                case '\\':
                    out.push_back('\\');
                    break;
                case '/':
                    out.push_back('/');
                    break;
                case 'b':
                    out.push_back('\b');
                    break;
                case 'f':
                    out.push_back('\f');
                    break;
                case 'n':
                    out.push_back('\n');
                    break;
                case 'r':
                    out.push_back('\r');
                    break;
                case 't':
                    out.push_back('\t');
                    break;
                case 'u': {
                    auto code = hex4();
                    if (!code) {
                        return std::nullopt;
                    }
                    if (*code >= 0xD800 && *code < 0xDC00 && takeWord("\\u")) {
                        auto low = hex4();
                        if (!low || *low < 0xDC00 || *low > 0xDFFF) {
                            return std::nullopt;
                        }
                        *code = 0x10000 + ((*code - 0xD800) << 10) + (*low - 0xDC00);
                    }
                    appendUtf8(out, *code);
                    break;
                }
                default:
                    return std::nullopt;
            }
        }
        return std::nullopt;
    }

    std::optional<PlistValue> parseNumber() {
        const std::size_t start = at_;
        if (at_ < text_.size() && text_[at_] == '-') {
            ++at_;
        }
        bool real = false;
        while (at_ < text_.size()) {
            const char c = text_[at_];
            if (std::isdigit(static_cast<unsigned char>(c))) {
                ++at_;
            } else if (c == '.' || c == 'e' || c == 'E' || c == '+' || c == '-') {
                real = true;
                ++at_;
            } else {
                break;
            }
        }
        const std::string token(text_.substr(start, at_ - start));
        if (token.empty() || token == "-") {
            return std::nullopt;
        }
        if (!real) {
            long long value = 0;
            const auto result = std::from_chars(token.data(), token.data() + token.size(), value);
            if (result.ec == std::errc() && result.ptr == token.data() + token.size()) {
                return PlistValue::integer(value);
            }
        }
        char* end = nullptr;
        const double value = std::strtod(token.c_str(), &end);
        if (end != token.c_str() + token.size()) {
            return std::nullopt;
        }
        return PlistValue::real(value);
    }

    std::optional<PlistValue> parseValue(int depth) {
        if (depth > 512) {
            return std::nullopt;
        }
        skipSpace();
        if (at_ >= text_.size()) {
            return std::nullopt;
        }
        const char c = text_[at_];
        if (c == '{') {
            ++at_;
            auto dictionary = PlistDictionary::create();
            if (take('}')) {
                return PlistValue(dictionary);
            }
            do {
                auto key = parseString();
                if (!key || !take(':')) {
                    return std::nullopt;
                }
                auto value = parseValue(depth + 1);
                if (!value) {
                    return std::nullopt;
                }
                dictionary->set(*key, std::move(*value));
            } while (take(','));
            return take('}') ? std::optional<PlistValue>(PlistValue(dictionary)) : std::nullopt;
        }
        if (c == '[') {
            ++at_;
            auto array = PlistArray::create();
            if (take(']')) {
                return PlistValue(array);
            }
            do {
                auto value = parseValue(depth + 1);
                if (!value) {
                    return std::nullopt;
                }
                array->append(std::move(*value));
            } while (take(','));
            return take(']') ? std::optional<PlistValue>(PlistValue(array)) : std::nullopt;
        }
        if (c == '"') {
            auto text = parseString();
            return text ? std::optional<PlistValue>(PlistValue(std::move(*text))) : std::nullopt;
        }
        if (takeWord("true")) {
            return PlistValue::boolean(true);
        }
        if (takeWord("false")) {
            return PlistValue::boolean(false);
        }
        if (takeWord("null")) {
            return PlistValue();
        }
        return parseNumber();
    }

    std::string_view text_;
    std::size_t at_ = 0;
};

}  // namespace

std::optional<PlistValue> parseJson(std::string_view text) {
    return JsonReader(text).document();
}

}  // namespace velmar::testing
