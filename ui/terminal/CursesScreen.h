// CursesScreen: the terminal itself, through the wide-character curses library: full-screen mode, key input
// and the output of canvas frames.
//
// Contract: open(output) takes the terminal on output and the standard input over (no echo, keys unbuffered,
// keypad keys decoded, cursor hidden, Esc recognised after 25 ms) and answers false, leaving the terminal
// alone, when it cannot. present() writes only the lines that differ from the frame presented before (all of
// them after a resize), then updates the terminal once. readKeys() drains every key waiting, without
// blocking. close() gives the terminal back as it was; the destructor does so too.
#pragma once

#include <cstdio>
#include <vector>

#include "ui/terminal/TerminalCanvas.h"
#include "ui/terminal/TerminalKey.h"

namespace velmar {

class CursesScreen {
  public:
    CursesScreen() = default;
    ~CursesScreen();
    CursesScreen(const CursesScreen&) = delete;
    CursesScreen& operator=(const CursesScreen&) = delete;

    bool open(std::FILE* output);
    void close();
    bool isOpen() const { return open_; }
    // Whether the terminal takes UTF-8 (from the locale's character set).
    bool isUtf8() const { return utf8_; }

    int rows() const;
    int columns() const;
    // Reads the terminal's new size (after SIGWINCH) and makes the next frame a full one.
    void resize();
    void present(const TerminalCanvas& frame);
    std::vector<TerminalKey> readKeys();

  private:
    void writeRow(const TerminalCanvas& frame, int row);

    bool open_ = false;
    bool utf8_ = false;
    int outputDescriptor_ = -1;  // the terminal the screen is drawn on, for its size
    TerminalCanvas shown_;
    bool fullRedraw_ = true;
};

}  // namespace velmar
