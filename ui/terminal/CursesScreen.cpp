#include "ui/terminal/CursesScreen.h"

#include <langinfo.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <clocale>
#include <cstring>
#include <string>

#ifndef NCURSES_WIDECHAR
#define NCURSES_WIDECHAR 1
#endif
#include <curses.h>

namespace velmar {

namespace {

attr_t cursesAttributes(std::uint8_t attr) {
    attr_t out = A_NORMAL;
    if (attr & kAttrBold) {
        out |= A_BOLD;
    }
    if (attr & kAttrReverse) {
        out |= A_REVERSE;
    }
    if (attr & kAttrDim) {
        out |= A_DIM;
    }
    if (attr & kAttrUnderline) {
        out |= A_UNDERLINE;
    }
    return out;
}

}  // namespace

CursesScreen::~CursesScreen() {
    close();
}

bool CursesScreen::open(std::FILE* output) {
    if (open_) {
        return true;
    }
    std::setlocale(LC_ALL, "");
    const char* codeset = nl_langinfo(CODESET);
    utf8_ = codeset != nullptr && (std::strcmp(codeset, "UTF-8") == 0 || std::strcmp(codeset, "utf8") == 0);
    if (!isatty(STDIN_FILENO) || !isatty(fileno(output))) {
        return false;
    }
    // newterm, unlike initscr, answers an error instead of ending the program.
    if (newterm(nullptr, output, stdin) == nullptr) {
        return false;
    }
    outputDescriptor_ = fileno(output);
    open_ = true;
    cbreak();
    noecho();
    nonl();
    intrflush(stdscr, FALSE);
    keypad(stdscr, TRUE);
    nodelay(stdscr, TRUE);
    set_escdelay(25);
    curs_set(0);
    leaveok(stdscr, TRUE);
    fullRedraw_ = true;
    return true;
}

void CursesScreen::close() {
    if (!open_) {
        return;
    }
    curs_set(1);
    endwin();
    delscreen(set_term(nullptr));
    open_ = false;
}

int CursesScreen::rows() const {
    return open_ ? LINES : 0;
}

int CursesScreen::columns() const {
    return open_ ? COLS : 0;
}

void CursesScreen::resize() {
    if (!open_) {
        return;
    }
    winsize size{};
    if (ioctl(outputDescriptor_, TIOCGWINSZ, &size) == 0 && size.ws_row > 0 && size.ws_col > 0) {
        resize_term(size.ws_row, size.ws_col);
    }
    // Whatever the terminal kept of the old frame is stale.
    clearok(curscr, TRUE);
    fullRedraw_ = true;
}

void CursesScreen::writeRow(const TerminalCanvas& frame, int row) {
    // One cchar_t per character; the continuation cell of a wide character is its own.
    std::vector<cchar_t> cells;
    cells.reserve(static_cast<std::size_t>(frame.columns()));
    for (int column = 0; column < frame.columns(); ++column) {
        const TerminalCell& cell = frame.at(row, column);
        if (cell.continuation) {
            continue;
        }
        wchar_t text[2] = {static_cast<wchar_t>(cell.ch), L'\0'};
        cchar_t out{};
        setcchar(&out, text, cursesAttributes(cell.attr), 0, nullptr);
        cells.push_back(out);
    }
    // mvadd_wchnstr does not move the cursor, so the bottom-right cell is written like any other.
    mvadd_wchnstr(row, 0, cells.data(), static_cast<int>(cells.size()));
}

void CursesScreen::present(const TerminalCanvas& frame) {
    if (!open_) {
        return;
    }
    const bool full = fullRedraw_ || shown_.rows() != frame.rows() || shown_.columns() != frame.columns();
    for (int row = 0; row < frame.rows(); ++row) {
        if (full || !frame.rowEquals(shown_, row)) {
            writeRow(frame, row);
        }
    }
    wnoutrefresh(stdscr);
    doupdate();
    shown_ = frame;
    fullRedraw_ = false;
}

std::vector<TerminalKey> CursesScreen::readKeys() {
    std::vector<TerminalKey> keys;
    if (!open_) {
        return keys;
    }
    using Kind = TerminalKey::Kind;
    wint_t ch = 0;
    for (;;) {
        const int kind = wget_wch(stdscr, &ch);
        if (kind == ERR) {
            break;
        }
        if (kind == KEY_CODE_YES) {
            switch (ch) {
                case KEY_UP:
                    keys.push_back(TerminalKey::of(Kind::Up));
                    break;
                case KEY_DOWN:
                    keys.push_back(TerminalKey::of(Kind::Down));
                    break;
                case KEY_LEFT:
                    keys.push_back(TerminalKey::of(Kind::Left));
                    break;
                case KEY_RIGHT:
                    keys.push_back(TerminalKey::of(Kind::Right));
                    break;
                case KEY_PPAGE:
                    keys.push_back(TerminalKey::of(Kind::PageUp));
                    break;
                case KEY_NPAGE:
                    keys.push_back(TerminalKey::of(Kind::PageDown));
                    break;
                case KEY_HOME:
                    keys.push_back(TerminalKey::of(Kind::Home));
                    break;
                case KEY_END:
                    keys.push_back(TerminalKey::of(Kind::End));
                    break;
                case KEY_ENTER:
                    keys.push_back(TerminalKey::of(Kind::Enter));
                    break;
                case KEY_BACKSPACE:
                    keys.push_back(TerminalKey::of(Kind::Backspace));
                    break;
                case KEY_DC:
                    keys.push_back(TerminalKey::of(Kind::Delete));
                    break;
                case KEY_BTAB:
                    keys.push_back(TerminalKey::of(Kind::BackTab));
                    break;
                default:
                    keys.push_back(TerminalKey::of(Kind::Other));
                    break;
            }
            continue;
        }
        switch (ch) {
            case L'\r':
            case L'\n':
                keys.push_back(TerminalKey::of(Kind::Enter));
                break;
            case 0x1B:
                keys.push_back(TerminalKey::of(Kind::Escape));
                break;
            case L'\t':
                keys.push_back(TerminalKey::of(Kind::Tab));
                break;
            case 0x7F:
            case 0x08:
                keys.push_back(TerminalKey::of(Kind::Backspace));
                break;
            default:
                if (ch >= 0x20) {
                    keys.push_back(TerminalKey::character(static_cast<char32_t>(ch)));
                } else {
                    keys.push_back(TerminalKey::of(Kind::Other));
                }
                break;
        }
    }
    return keys;
}

}  // namespace velmar
