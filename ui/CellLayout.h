// CellLayout: where a pane row puts its key and value, for every front end (the GUI in pixels, the terminal
// in columns, each with its own margin, gap and row height).
//
// Contract, with the row's content bounds (x, y, w, h) and the measured key (kw, kh) and value (vw, vh):
// - key-only row (an inner node): key at (x + margin, (h - kh) / 2, kw, kh).
// - key/value row (a leaf): the key as above; need = kw + margin + gap + vw. When need < w the value sits
// flush
//   against the right edge (x = w - vw); otherwise it follows the key (x + margin + kw + gap). The value's y
//   is (h - vh) / 2. The scrollable content is w + kw + vw wide when need > w, else w, and rowHeight high;
//   the scroll frame is (x, y, w, rowHeight). Both labels lie inside the scroll frame, in its coordinates.
// Divisions truncate toward zero.
#pragma once

namespace velmar {

struct CellRect {
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
    bool operator==(const CellRect&) const = default;
};

struct CellSize {
    int width = 0;
    int height = 0;
};

struct CellMetrics {
    int margin = 10;
    int gap = 50;
    int rowHeight = 50;
};

struct KeyValueCellLayout {
    CellRect key;
    CellRect value;
    CellSize contentSize;
    CellRect scrollFrame;
    // Whether the content is wider than the frame, so that the row scrolls sideways.
    bool scrolls() const { return contentSize.width > scrollFrame.width; }
};

CellRect layoutKeyOnlyCell(const CellRect& content, CellSize key, const CellMetrics& metrics);
KeyValueCellLayout layoutKeyValueCell(const CellRect& content, CellSize key, CellSize value,
                                      const CellMetrics& metrics);

}  // namespace velmar
