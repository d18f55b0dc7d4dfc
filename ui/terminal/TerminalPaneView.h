// TerminalPaneView: draws a pane on the terminal canvas: the title line (the pane's title on the left, its
// path on the right), one line per child and the footer (a spinner while loading, the status text, and the
// keys of the actions on offer: "[c] Chart" while the cursor is on a value that reads as a number).
//
// Contract: rows follow the CellLayout rules in columns (margin 1, gap 2): a leaf's value sits flush against
// the right edge when the pair fits and follows the key when it does not; then the row can be scrolled
// sideways, the selected row by its pane's offset, up to where the value's end is in view; "«" and "»" mark
// text hidden to the left and right. An inner child shows "›" at the right edge. The selected row is drawn
// in reverse video. Every line is drawn in full, so a frame never depends on the one before.
#pragma once

#include <string>

#include "ui/CellLayout.h"
#include "ui/terminal/TerminalCanvas.h"
#include "ui/terminal/TerminalPane.h"

namespace velmar {

struct PaneChrome {
    int spinnerFrame = 0;
    bool allowSaveButton = false;
};

class TerminalPaneView {
  public:
    static const CellMetrics kMetrics;
    static constexpr int kAccessoryColumns = 2;

    // Rows of the list between the title line and the footer.
    static int listHeight(const TerminalCanvas& canvas) { return canvas.rows() > 2 ? canvas.rows() - 2 : 0; }
    // How far the row can scroll sideways in a canvas this wide (0 when it fits or is an inner node).
    static int maximumSideways(const VelmarModelNode& child, int columns, bool ascii);
    static std::u32string spinnerFrame(int frame, bool ascii);

    static void draw(TerminalCanvas& canvas, TerminalPane& pane, const PaneChrome& chrome);
    // The last line: a spinner while loading, the status, and the keys on the right where both fit.
    static void drawStatusLine(TerminalCanvas& canvas, const std::string& status, bool loading, int spinner,
                               std::u32string_view keys);

  private:
    static void drawTitle(TerminalCanvas& canvas, const TerminalPane& pane);
    static void drawRow(TerminalCanvas& canvas, int line, const VelmarModelNode& child, bool selected,
                        int sideways);
    static void drawFooter(TerminalCanvas& canvas, const TerminalPane& pane, const PaneChrome& chrome);
};

}  // namespace velmar
