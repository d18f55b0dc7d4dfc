// TerminalText: text as the terminal shows it: UTF-8 decoded into characters that each take 0, 1 or 2
// columns.
//
// Contract: decodeUtf8 never fails: a malformed sequence becomes U+FFFD, a control character U+FFFD as well
// (so no text can move the cursor or change the terminal's state). Widths come from wcwidth, which needs a
// UTF-8 LC_CTYPE; with ascii set (a terminal that is not UTF-8) every character outside ASCII is shown as
// "?".
#pragma once

#include <string>
#include <string_view>

namespace velmar {

struct TerminalText {
    static std::u32string decodeUtf8(std::string_view text);
    static std::string encodeUtf8(std::u32string_view text);
    // Columns one character takes (0, 1 or 2); a character the terminal cannot show counts as 1 ("?").
    static int charWidth(char32_t ch, bool ascii);
    // What is drawn for a character: itself, or '?' when it cannot be shown.
    static char32_t displayed(char32_t ch, bool ascii);
    static int width(std::u32string_view text, bool ascii);
    static int width(std::string_view utf8, bool ascii) { return width(decodeUtf8(utf8), ascii); }
    // The text cut to at most `columns` columns; "…" (or "~") replaces what is cut, at the end or at the
    // start.
    static std::u32string elideRight(const std::u32string& text, int columns, bool ascii);
    static std::u32string elideLeft(const std::u32string& text, int columns, bool ascii);
};

}  // namespace velmar
