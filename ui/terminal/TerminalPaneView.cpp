#include "ui/terminal/TerminalPaneView.h"

#include <algorithm>

#include "core/ValueHistory.h"
#include "ui/terminal/TerminalText.h"

namespace velmar {

const CellMetrics TerminalPaneView::kMetrics{1, 2, 1};

namespace {

constexpr std::u32string_view kBrailleSpinner = U"⠋⠙⠹⠸⠼⠴⠦⠧⠇⠏";
constexpr std::u32string_view kAsciiSpinner = U"|/-\\";

}  // namespace

std::u32string TerminalPaneView::spinnerFrame(int frame, bool ascii) {
    const std::u32string_view frames = ascii ? kAsciiSpinner : kBrailleSpinner;
    const auto count = static_cast<int>(frames.size());
    return std::u32string(1, frames[static_cast<std::size_t>(((frame % count) + count) % count)]);
}

int TerminalPaneView::maximumSideways(const VelmarModelNode& child, int columns, bool ascii) {
    const std::string* value = child.value();
    if (child.childNodes() != nullptr || value == nullptr) {
        return 0;
    }
    const int kw = TerminalText::width(child.displayName(), ascii);
    const int vw = TerminalText::width(*value, ascii);
    const KeyValueCellLayout layout = layoutKeyValueCell({0, 0, columns, 1}, {kw, 1}, {vw, 1}, kMetrics);
    if (!layout.scrolls()) {
        return 0;
    }
    // Far enough to bring the value's last column, and one blank after it, into view.
    return std::max(0, layout.value.x + layout.value.width + kMetrics.margin - columns);
}

void TerminalPaneView::draw(TerminalCanvas& canvas, TerminalPane& pane, const PaneChrome& chrome) {
    if (canvas.rows() <= 0 || canvas.columns() <= 0) {
        return;
    }
    drawTitle(canvas, pane);
    const int height = listHeight(canvas);
    pane.scrollToSelection(height);
    for (int line = 0; line < height; ++line) {
        const int row = pane.topRow() + line;
        const VelmarModelNode* child = pane.childAt(row);
        if (child == nullptr) {
            canvas.fill(1 + line, 0, canvas.columns(), kAttrNormal);
            continue;
        }
        const bool selected = row == pane.selectedRow();
        drawRow(canvas, 1 + line, *child, selected, selected ? pane.sideways() : 0);
    }
    if (canvas.rows() >= 2) {
        drawFooter(canvas, pane, chrome);
    }
}

void TerminalPaneView::drawTitle(TerminalCanvas& canvas, const TerminalPane& pane) {
    const bool ascii = canvas.ascii();
    const int columns = canvas.columns();
    const std::uint8_t attr = kAttrReverse;
    canvas.fill(0, 0, columns, attr);
    const std::u32string title =
        TerminalText::elideRight(TerminalText::decodeUtf8(pane.title()), std::max(0, columns - 2), ascii);
    const int titleEnd = canvas.put(0, 1, title, attr | kAttrBold, 0, columns);
    // The path takes what the title leaves, cut from the left so that its end (the current pane) stays.
    const int room = columns - titleEnd - 3;
    if (room > 0) {
        const std::u32string path =
            TerminalText::elideLeft(TerminalText::decodeUtf8(pane.path()), room, ascii);
        const int width = TerminalText::width(path, ascii);
        canvas.put(0, columns - 1 - width, path, attr, 0, columns);
    }
}

void TerminalPaneView::drawRow(TerminalCanvas& canvas, int line, const VelmarModelNode& child, bool selected,
                               int sideways) {
    const bool ascii = canvas.ascii();
    const int columns = canvas.columns();
    const std::uint8_t base = selected ? kAttrReverse : kAttrNormal;
    canvas.fill(line, 0, columns, base);
    const std::u32string key = TerminalText::decodeUtf8(child.displayName());
    const int kw = TerminalText::width(key, ascii);
    if (child.childNodes() != nullptr) {
        // Key-only row; the accessory takes the last columns.
        const int content = std::max(0, columns - kAccessoryColumns);
        const CellRect keyFrame = layoutKeyOnlyCell({0, 0, content, 1}, {kw, 1}, kMetrics);
        const std::u32string shown = TerminalText::elideRight(key, std::max(0, content - keyFrame.x), ascii);
        canvas.put(line, keyFrame.x, shown, base | kAttrBold, 0, content);
        canvas.put(line, columns - kAccessoryColumns, std::u32string(1, ascii ? U'>' : U'›'), base, 0,
                   columns);
        return;
    }
    const std::string* valueText = child.value();
    const std::u32string value = TerminalText::decodeUtf8(valueText ? *valueText : std::string());
    const int vw = TerminalText::width(value, ascii);
    const KeyValueCellLayout layout = layoutKeyValueCell({0, 0, columns, 1}, {kw, 1}, {vw, 1}, kMetrics);
    const int maximum = maximumSideways(child, columns, ascii);
    const int offset = std::min(sideways, maximum);
    canvas.put(line, layout.key.x - offset, key, base | kAttrBold, 0, columns);
    canvas.put(line, layout.value.x - offset, value, base, 0, columns);
    if (offset > 0) {
        canvas.fill(line, 0, 1, base | kAttrDim, ascii ? U'<' : U'«');
    }
    if (offset < maximum) {
        canvas.fill(line, columns - 1, columns, base | kAttrDim, ascii ? U'>' : U'»');
    }
}

void TerminalPaneView::drawFooter(TerminalCanvas& canvas, const TerminalPane& pane,
                                  const PaneChrome& chrome) {
    // "[c] Chart" where the cursor is on a value that reads as a number.
    std::u32string keys = isNumericLeaf(pane.childAt(pane.selectedRow())) ? U"[c] Chart  " : U"";
    keys += chrome.allowSaveButton ? U"[s] Save  [q] Quit" : U"[q] Quit";
    drawStatusLine(canvas, pane.status(), pane.isLoading(), chrome.spinnerFrame, keys);
}

void TerminalPaneView::drawStatusLine(TerminalCanvas& canvas, const std::string& statusText, bool loading,
                                      int spinner, std::u32string_view keys) {
    const bool ascii = canvas.ascii();
    const int columns = canvas.columns();
    const int line = canvas.rows() - 1;
    const std::uint8_t attr = kAttrReverse;
    canvas.fill(line, 0, columns, attr);
    const int keysWidth = TerminalText::width(keys, ascii);
    const std::u32string status = TerminalText::decodeUtf8(statusText);
    // The status comes first: the keys are shown only where both fit.
    const bool showKeys = 3 + TerminalText::width(status, ascii) + 2 + keysWidth + 1 <= columns;
    const int statusRoom = columns - 3 - (showKeys ? keysWidth + 2 : 0) - 1;
    if (loading) {
        canvas.put(line, 1, spinnerFrame(spinner, ascii), attr, 0, columns);
    }
    canvas.put(line, 3, TerminalText::elideRight(status, std::max(0, statusRoom), ascii), attr, 0, columns);
    if (showKeys) {
        canvas.put(line, columns - 1 - keysWidth, keys, attr, 0, columns);
    }
}

}  // namespace velmar
