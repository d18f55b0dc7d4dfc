// TerminalChartView: draws the full-screen chart of one value on the terminal canvas.
//
// Contract: line 0 is the title line (the value's name on the left, the value as the pane shows it on the
// right); line 1 tells the least and greatest value of the span with the unit, and the span; the lines
// below, down to the last two, are the plot: value labels on round numbers left of an axis, and the line of
// the samples of the span drawn in braille dots (two across and four down per cell), or with "*" on a
// terminal that is not UTF-8; under the plot stand the round local clock times; the last line is the footer
// (spinner, status, keys). The time axis ends at the history's newest sample. A terminal too small for a
// plot shows the title, the summary and the footer only. Nothing is drawn outside the canvas whatever the
// samples hold.
#pragma once

#include "core/ValueHistory.h"
#include "ui/terminal/TerminalCanvas.h"
#include "ui/terminal/TerminalChart.h"
#include "ui/terminal/TerminalPaneView.h"

namespace velmar {

class TerminalChartView {
  public:
    // Rows a plot needs besides the title, summary, time and footer lines.
    static constexpr int kMinimumPlotRows = 3;
    static constexpr const char32_t* kKeys = U"[+/-] Zoom  [Esc] Back  [q] Quit";

    // series may be null (no samples yet); newestTime is the history's newest sample time.
    static void draw(TerminalCanvas& canvas, const TerminalChart& chart, const ValueSeries* series,
                     double newestTime, const PaneChrome& chrome);
};

}  // namespace velmar
