#include "ui/terminal/TerminalText.h"

#include <cwchar>

namespace velmar {

namespace {
constexpr char32_t kReplacement = 0xFFFD;

bool isControl(char32_t ch) {
    return ch < 0x20 || (ch >= 0x7F && ch < 0xA0);
}
}  // namespace

std::u32string TerminalText::decodeUtf8(std::string_view text) {
    std::u32string out;
    out.reserve(text.size());
    std::size_t i = 0;
    while (i < text.size()) {
        const auto lead = static_cast<unsigned char>(text[i]);
        int length = 0;
        char32_t ch = 0;
        char32_t minimum = 0;
        if (lead < 0x80) {
            length = 1;
            ch = lead;
        } else if (lead >= 0xC2 && lead <= 0xDF) {
            length = 2;
            ch = lead & 0x1F;
            minimum = 0x80;
        } else if (lead >= 0xE0 && lead <= 0xEF) {
            length = 3;
            ch = lead & 0x0F;
            minimum = 0x800;
        } else if (lead >= 0xF0 && lead <= 0xF4) {
            length = 4;
            ch = lead & 0x07;
            minimum = 0x10000;
        }
        bool valid = length > 0 && i + static_cast<std::size_t>(length) <= text.size();
        for (int k = 1; valid && k < length; ++k) {
            const auto next = static_cast<unsigned char>(text[i + static_cast<std::size_t>(k)]);
            if ((next & 0xC0) != 0x80) {
                valid = false;
            } else {
                ch = (ch << 6) | (next & 0x3F);
            }
        }
        if (valid && (ch < minimum || ch > 0x10FFFF || (ch >= 0xD800 && ch <= 0xDFFF))) {
            valid = false;
        }
        if (!valid) {
            out.push_back(kReplacement);
            ++i;
            continue;
        }
        out.push_back(isControl(ch) ? kReplacement : ch);
        i += static_cast<std::size_t>(length);
    }
    return out;
}

std::string TerminalText::encodeUtf8(std::u32string_view text) {
    std::string out;
    out.reserve(text.size());
    for (char32_t ch : text) {
        if (ch > 0x10FFFF || (ch >= 0xD800 && ch <= 0xDFFF)) {
            ch = kReplacement;
        }
        if (ch < 0x80) {
            out.push_back(static_cast<char>(ch));
        } else if (ch < 0x800) {
            out.push_back(static_cast<char>(0xC0 | (ch >> 6)));
            out.push_back(static_cast<char>(0x80 | (ch & 0x3F)));
        } else if (ch < 0x10000) {
            out.push_back(static_cast<char>(0xE0 | (ch >> 12)));
            out.push_back(static_cast<char>(0x80 | ((ch >> 6) & 0x3F)));
            out.push_back(static_cast<char>(0x80 | (ch & 0x3F)));
        } else {
            out.push_back(static_cast<char>(0xF0 | (ch >> 18)));
            out.push_back(static_cast<char>(0x80 | ((ch >> 12) & 0x3F)));
            out.push_back(static_cast<char>(0x80 | ((ch >> 6) & 0x3F)));
            out.push_back(static_cast<char>(0x80 | (ch & 0x3F)));
        }
    }
    return out;
}

char32_t TerminalText::displayed(char32_t ch, bool ascii) {
    if (isControl(ch)) {
        return U'?';
    }
    if (ch < 0x80) {
        return ch;
    }
    if (ascii) {
        return U'?';
    }
    return wcwidth(static_cast<wchar_t>(ch)) < 0 ? U'?' : ch;
}

int TerminalText::charWidth(char32_t ch, bool ascii) {
    const char32_t shown = displayed(ch, ascii);
    if (shown < 0x80) {
        return 1;
    }
    const int columns = wcwidth(static_cast<wchar_t>(shown));
    return columns < 0 ? 1 : columns;
}

int TerminalText::width(std::u32string_view text, bool ascii) {
    int total = 0;
    for (char32_t ch : text) {
        total += charWidth(ch, ascii);
    }
    return total;
}

std::u32string TerminalText::elideRight(const std::u32string& text, int columns, bool ascii) {
    if (width(text, ascii) <= columns) {
        return text;
    }
    if (columns <= 0) {
        return {};
    }
    std::u32string out;
    int used = 0;
    for (char32_t ch : text) {
        const int columnsOfCh = charWidth(ch, ascii);
        if (used + columnsOfCh > columns - 1) {
            break;
        }
        out.push_back(ch);
        used += columnsOfCh;
    }
    out.push_back(ascii ? U'~' : U'…');
    return out;
}

std::u32string TerminalText::elideLeft(const std::u32string& text, int columns, bool ascii) {
    if (width(text, ascii) <= columns) {
        return text;
    }
    if (columns <= 0) {
        return {};
    }
    std::u32string tail;
    int used = 0;
    for (auto it = text.rbegin(); it != text.rend(); ++it) {
        const int columnsOfCh = charWidth(*it, ascii);
        if (used + columnsOfCh > columns - 1) {
            break;
        }
        tail.insert(tail.begin(), *it);
        used += columnsOfCh;
    }
    return std::u32string(1, ascii ? U'~' : U'…') + tail;
}

}  // namespace velmar
