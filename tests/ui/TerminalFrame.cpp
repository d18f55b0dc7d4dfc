#include "tests/ui/TerminalFrame.h"

#include "ui/terminal/TerminalCanvas.h"
#include "ui/terminal/TerminalFrontEnd.h"

namespace velmar::testing {

std::vector<std::string> terminalFrame(TerminalFrontEnd& frontEnd, int rows, int columns) {
    TerminalCanvas canvas(rows, columns, false);
    frontEnd.render(canvas);
    std::vector<std::string> lines;
    lines.reserve(static_cast<std::size_t>(rows));
    for (int row = 0; row < rows; ++row) {
        lines.push_back(canvas.rowText(row));
    }
    return lines;
}

}  // namespace velmar::testing
