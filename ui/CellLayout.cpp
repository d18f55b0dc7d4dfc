#include "ui/CellLayout.h"

namespace velmar {

CellRect layoutKeyOnlyCell(const CellRect& content, CellSize key, const CellMetrics& metrics) {
    return {content.x + metrics.margin, (content.height - key.height) / 2, key.width, key.height};
}

KeyValueCellLayout layoutKeyValueCell(const CellRect& content, CellSize key, CellSize value,
                                      const CellMetrics& metrics) {
    KeyValueCellLayout layout;
    layout.key = layoutKeyOnlyCell(content, key, metrics);
    const int need = key.width + metrics.margin + metrics.gap + value.width;
    const int valueX = need < content.width ? content.width - value.width
                                            : content.x + metrics.margin + key.width + metrics.gap;
    layout.value = {valueX, (content.height - value.height) / 2, value.width, value.height};
    // Wider than need on purpose: the overflowing row scrolls by the key's and the value's widths.
    layout.contentSize = {need > content.width ? content.width + key.width + value.width : content.width,
                          metrics.rowHeight};
    layout.scrollFrame = {content.x, content.y, content.width, metrics.rowHeight};
    return layout;
}

}  // namespace velmar
