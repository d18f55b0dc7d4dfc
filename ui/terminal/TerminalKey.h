// TerminalKey: one key press as the terminal interface understands it, independent of the curses library.
#pragma once

namespace velmar {

struct TerminalKey {
    enum class Kind {
        Character,  // a printable character in ch
        Up,
        Down,
        Left,
        Right,
        PageUp,
        PageDown,
        Home,
        End,
        Enter,
        Backspace,
        Delete,
        Escape,
        Tab,
        BackTab,
        Other,
    };
    Kind kind = Kind::Other;
    char32_t ch = 0;

    static TerminalKey character(char32_t c) { return {Kind::Character, c}; }
    static TerminalKey of(Kind kind) { return {kind, 0}; }
    bool is(char32_t c) const { return kind == Kind::Character && ch == c; }
};

}  // namespace velmar
