// TerminalCanvas: one frame of the terminal screen, cell by cell, drawn before anything reaches the terminal,
// so that only the lines that differ from the previous frame are written (no flicker, little output).
//
// Contract: a cell holds a character and its attributes; a character two columns wide fills its cell and
// marks the next one as its continuation. put() draws text from a column that may lie left of the clip
// (a row scrolled sideways) and clips it to [clipLeft, clipRight): a wide character cut by an edge is drawn
// as a space. Zero-width characters are dropped. Nothing is ever drawn outside the canvas.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace velmar {

enum TerminalAttribute : std::uint8_t {
    kAttrNormal = 0,
    kAttrBold = 1,
    kAttrReverse = 2,
    kAttrDim = 4,
    kAttrUnderline = 8,
};

struct TerminalCell {
    char32_t ch = U' ';
    std::uint8_t attr = kAttrNormal;
    bool continuation = false;
    bool operator==(const TerminalCell&) const = default;
};

class TerminalCanvas {
  public:
    TerminalCanvas() = default;
    TerminalCanvas(int rows, int columns, bool ascii);

    int rows() const { return rows_; }
    int columns() const { return columns_; }
    bool ascii() const { return ascii_; }

    void fill(int row, int fromColumn, int toColumn, std::uint8_t attr, char32_t ch = U' ');
    // Draws text at column x (which may be negative) of row, clipped to [clipLeft, clipRight); answers the
    // column after the text, as if nothing were clipped.
    int put(int row, int x, std::u32string_view text, std::uint8_t attr, int clipLeft, int clipRight);
    int put(int row, int x, std::string_view utf8, std::uint8_t attr);
    // A blank box with a frame (line-drawing characters, or + - | on an ASCII terminal).
    void box(int top, int left, int height, int width);

    const TerminalCell& at(int row, int column) const { return cells_[index(row, column)]; }
    bool rowEquals(const TerminalCanvas& other, int row) const;
    // The row's characters as UTF-8, continuation cells left out (for tests and logs).
    std::string rowText(int row) const;

  private:
    // Writes one cell; a wide character that the write cuts in two loses its other half to a space.
    void setCell(int row, int column, const TerminalCell& cell);
    std::size_t index(int row, int column) const {
        return static_cast<std::size_t>(row) * static_cast<std::size_t>(columns_) +
               static_cast<std::size_t>(column);
    }

    int rows_ = 0;
    int columns_ = 0;
    bool ascii_ = false;
    std::vector<TerminalCell> cells_;
};

}  // namespace velmar
