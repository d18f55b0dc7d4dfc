#include "ui/terminal/TerminalCanvas.h"

#include <algorithm>

#include "ui/terminal/TerminalText.h"

namespace velmar {

TerminalCanvas::TerminalCanvas(int rows, int columns, bool ascii)
    : rows_(std::max(0, rows)),
      columns_(std::max(0, columns)),
      ascii_(ascii),
      cells_(static_cast<std::size_t>(rows_) * static_cast<std::size_t>(columns_)) {}

void TerminalCanvas::setCell(int row, int column, const TerminalCell& cell) {
    TerminalCell& target = cells_[index(row, column)];
    if (target.continuation && column > 0) {
        cells_[index(row, column - 1)] = {U' ', cells_[index(row, column - 1)].attr, false};
    }
    if (column + 1 < columns_ && cells_[index(row, column + 1)].continuation) {
        cells_[index(row, column + 1)] = {U' ', cells_[index(row, column + 1)].attr, false};
    }
    target = cell;
}

void TerminalCanvas::fill(int row, int fromColumn, int toColumn, std::uint8_t attr, char32_t ch) {
    if (row < 0 || row >= rows_) {
        return;
    }
    const int from = std::max(0, fromColumn);
    const int to = std::min(columns_, toColumn);
    for (int column = from; column < to; ++column) {
        setCell(row, column, {ch, attr, false});
    }
}

int TerminalCanvas::put(int row, int x, std::u32string_view text, std::uint8_t attr, int clipLeft,
                        int clipRight) {
    const int left = std::max(0, clipLeft);
    const int right = std::min(columns_, clipRight);
    int column = x;
    for (char32_t ch : text) {
        const int width = TerminalText::charWidth(ch, ascii_);
        if (width == 0) {
            continue;
        }
        if (row >= 0 && row < rows_ && column + width > left && column < right) {
            if (column >= left && column + width <= right) {
                setCell(row, column, {TerminalText::displayed(ch, ascii_), attr, false});
                if (width == 2) {
                    setCell(row, column + 1, {U' ', attr, true});
                }
            } else {
                // Cut by an edge: the visible half becomes a space.
                for (int k = std::max(column, left); k < std::min(column + width, right); ++k) {
                    setCell(row, k, {U' ', attr, false});
                }
            }
        }
        column += width;
    }
    return column;
}

int TerminalCanvas::put(int row, int x, std::string_view utf8, std::uint8_t attr) {
    return put(row, x, TerminalText::decodeUtf8(utf8), attr, 0, columns_);
}

void TerminalCanvas::box(int top, int left, int height, int width) {
    if (height < 2 || width < 2) {
        return;
    }
    const char32_t horizontal = ascii_ ? U'-' : U'─';
    const char32_t vertical = ascii_ ? U'|' : U'│';
    for (int row = top; row < top + height; ++row) {
        fill(row, left, left + width, kAttrNormal);
        fill(row, left, left + 1, kAttrNormal, vertical);
        fill(row, left + width - 1, left + width, kAttrNormal, vertical);
    }
    fill(top, left, left + width, kAttrNormal, horizontal);
    fill(top + height - 1, left, left + width, kAttrNormal, horizontal);
    fill(top, left, left + 1, kAttrNormal, ascii_ ? U'+' : U'┌');
    fill(top, left + width - 1, left + width, kAttrNormal, ascii_ ? U'+' : U'┐');
    fill(top + height - 1, left, left + 1, kAttrNormal, ascii_ ? U'+' : U'└');
    fill(top + height - 1, left + width - 1, left + width, kAttrNormal, ascii_ ? U'+' : U'┘');
}

bool TerminalCanvas::rowEquals(const TerminalCanvas& other, int row) const {
    if (other.columns_ != columns_ || row < 0 || row >= rows_ || row >= other.rows_) {
        return false;
    }
    return std::equal(
        cells_.begin() + static_cast<std::ptrdiff_t>(index(row, 0)),
        cells_.begin() + static_cast<std::ptrdiff_t>(index(row, 0) + static_cast<std::size_t>(columns_)),
        other.cells_.begin() + static_cast<std::ptrdiff_t>(other.index(row, 0)));
}

std::string TerminalCanvas::rowText(int row) const {
    std::u32string text;
    for (int column = 0; column < columns_; ++column) {
        const TerminalCell& cell = at(row, column);
        if (!cell.continuation) {
            text.push_back(cell.ch);
        }
    }
    return TerminalText::encodeUtf8(text);
}

}  // namespace velmar
