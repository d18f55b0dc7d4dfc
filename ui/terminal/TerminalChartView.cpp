#include "ui/terminal/TerminalChartView.h"

#include <algorithm>
#include <cmath>
#include <optional>
#include <vector>

#include "core/platform/Clock.h"
#include "core/platform/StringFormat.h"
#include "ui/ChartScale.h"
#include "ui/ChartText.h"
#include "ui/terminal/TerminalText.h"

namespace velmar {

namespace {

constexpr char32_t kBrailleBlank = 0x2800;
// The braille dot of each position in a cell, by column and row.
constexpr std::uint8_t kBrailleDots[2][4] = {{0x01, 0x02, 0x04, 0x40}, {0x08, 0x10, 0x20, 0x80}};

struct Point {
    double time;
    double value;
};

// The samples of the span, oldest first, the first one moved onto the span's start when the line comes in
// from the left (its value taken on the segment that crosses the start).
std::vector<Point> visiblePoints(const ValueSeries& series, double start, double end) {
    std::vector<Point> points;
    std::size_t first = series.firstIndexAtOrAfter(start);
    if (first > 0 && first < series.size()) {
        const ValueSample& before = series.at(first - 1);
        const ValueSample& after = series.at(first);
        const double share =
            after.time > before.time ? (start - before.time) / (after.time - before.time) : 1.0;
        points.push_back({start, before.value + (after.value - before.value) * share});
    }
    for (std::size_t i = first; i < series.size() && series.at(i).time <= end; ++i) {
        points.push_back({series.at(i).time, series.at(i).value});
    }
    return points;
}

// Dots on a grid of cells, each cell dx dots wide and dy high.
class DotGrid {
  public:
    DotGrid(int columns, int rows, int dx, int dy)
        : columns_(columns),
          rows_(rows),
          dx_(dx),
          dy_(dy),
          cells_(static_cast<std::size_t>(columns) * static_cast<std::size_t>(rows), 0) {}
    int width() const { return columns_ * dx_; }
    int height() const { return rows_ * dy_; }

    void dot(int x, int y) {
        if (x < 0 || y < 0 || x >= width() || y >= height()) {
            return;
        }
        const std::size_t cell = static_cast<std::size_t>(y / dy_) * static_cast<std::size_t>(columns_) +
                                 static_cast<std::size_t>(x / dx_);
        cells_[cell] |= dx_ == 2 ? kBrailleDots[x % 2][y % 4] : 1;
    }
    // Bresenham's line; the ends are kept within one dot of the grid, so the walk is never longer than it.
    void line(int x0, int y0, int x1, int y1) {
        x0 = std::clamp(x0, -1, width());
        x1 = std::clamp(x1, -1, width());
        y0 = std::clamp(y0, -1, height());
        y1 = std::clamp(y1, -1, height());
        const int stepX = x0 < x1 ? 1 : -1;
        const int stepY = y0 < y1 ? 1 : -1;
        const int spanX = std::abs(x1 - x0);
        const int spanY = -std::abs(y1 - y0);
        int error = spanX + spanY;
        for (;;) {
            dot(x0, y0);
            if (x0 == x1 && y0 == y1) {
                return;
            }
            const int twice = 2 * error;
            if (twice >= spanY) {
                error += spanY;
                x0 += stepX;
            }
            if (twice <= spanX) {
                error += spanX;
                y0 += stepY;
            }
        }
    }
    std::uint8_t at(int column, int row) const {
        return cells_[static_cast<std::size_t>(row) * static_cast<std::size_t>(columns_) +
                      static_cast<std::size_t>(column)];
    }

  private:
    int columns_;
    int rows_;
    int dx_;
    int dy_;
    std::vector<std::uint8_t> cells_;
};

void drawTitle(TerminalCanvas& canvas, const TerminalChart& chart) {
    const bool ascii = canvas.ascii();
    const int columns = canvas.columns();
    const std::uint8_t attr = kAttrReverse;
    canvas.fill(0, 0, columns, attr);
    const std::string* valueText = chart.node() ? chart.node()->value() : nullptr;
    const std::u32string value = TerminalText::decodeUtf8(valueText ? *valueText : std::string());
    const int valueWidth = TerminalText::width(value, ascii);
    // The value keeps its place; the name takes what is left.
    const bool showValue = !value.empty() && valueWidth + 6 <= columns;
    const int titleRoom = columns - 2 - (showValue ? valueWidth + 3 : 0);
    canvas.put(
        0, 1,
        TerminalText::elideRight(TerminalText::decodeUtf8(chart.title()), std::max(0, titleRoom), ascii),
        attr | kAttrBold, 0, columns);
    if (showValue) {
        canvas.put(0, columns - 1 - valueWidth, value, attr | kAttrBold, 0, columns);
    }
}

}  // namespace

void TerminalChartView::draw(TerminalCanvas& canvas, const TerminalChart& chart, const ValueSeries* series,
                             double newestTime, const PaneChrome& chrome) {
    const int rows = canvas.rows();
    const int columns = canvas.columns();
    if (rows <= 0 || columns <= 0) {
        return;
    }
    const bool ascii = canvas.ascii();
    for (int row = 0; row < rows; ++row) {
        canvas.fill(row, 0, columns, kAttrNormal);
    }
    drawTitle(canvas, chart);
    if (rows >= 2) {
        TerminalPaneView::drawStatusLine(canvas, chart.status(), chart.isLoading(), chrome.spinnerFrame,
                                         kKeys);
    }
    if (rows < 3) {
        return;
    }

    const double end = newestTime;
    const double start = end - chart.spanSeconds();
    const std::vector<Point> points =
        series != nullptr ? visiblePoints(*series, start, end) : std::vector<Point>();
    const std::string unit(series != nullptr ? series->unit() : std::string_view());
    const std::string span = "last " + formatSpan(chart.spanSeconds());
    if (points.empty()) {
        canvas.put(1, 1, "no values in the " + span, kAttrNormal);
        return;
    }
    double low = points.front().value;
    double high = low;
    for (const Point& point : points) {
        low = std::min(low, point.value);
        high = std::max(high, point.value);
    }
    canvas.put(1, 1,
               "min " + formatReading(low, series->decimals(), unit) + "   max " +
                   formatReading(high, series->decimals(), unit) + "   " + span,
               kAttrNormal);

    // The plot between the summary and the time labels.
    const int plotTop = 2;
    const int plotRows = rows - 4;
    if (plotRows < kMinimumPlotRows || columns < 20) {
        return;
    }
    // At most one label every other line.
    const AxisScale scale = niceScale(low, high, std::max(3, (plotRows - 1) / 2 + 1));
    std::vector<std::string> labels;
    int gutter = 0;
    for (int tick = 0; tick < scale.ticks; ++tick) {
        labels.push_back(stringWithFormat("%.*f", scale.decimals(), scale.low + scale.step * tick));
        gutter = std::max(gutter, static_cast<int>(labels.back().size()));
    }
    const int axisColumn = std::min(gutter + 1, columns / 3);
    const int plotLeft = axisColumn + 1;
    const int plotColumns = columns - plotLeft - 1;
    DotGrid grid(plotColumns, plotRows, ascii ? 1 : 2, ascii ? 1 : 4);
    const double range = scale.high - scale.low;
    auto xOf = [&](double time) {
        return static_cast<int>(std::lround((time - start) / chart.spanSeconds() * (grid.width() - 1)));
    };
    auto yOf = [&](double value) {
        return static_cast<int>(std::lround((scale.high - value) / range * (grid.height() - 1)));
    };

    // The axis, its ticks and their labels.
    for (int row = plotTop; row < plotTop + plotRows; ++row) {
        canvas.put(row, axisColumn, std::u32string(1, ascii ? U'|' : U'│'), kAttrNormal, 0, columns);
    }
    int lastLabelRow = -1;
    for (int tick = scale.ticks - 1; tick >= 0; --tick) {
        const int row = plotTop + yOf(scale.low + scale.step * tick) / (ascii ? 1 : 4);
        if (row == lastLabelRow) {
            continue;
        }
        lastLabelRow = row;
        canvas.put(row, axisColumn, std::u32string(1, ascii ? U'+' : U'┤'), kAttrNormal, 0, columns);
        const std::u32string label = TerminalText::decodeUtf8(labels[static_cast<std::size_t>(tick)]);
        canvas.put(row, axisColumn - static_cast<int>(label.size()), label, kAttrNormal, 0, axisColumn);
    }

    // The line.
    grid.dot(xOf(points.front().time), yOf(points.front().value));
    for (std::size_t i = 1; i < points.size(); ++i) {
        grid.line(xOf(points[i - 1].time), yOf(points[i - 1].value), xOf(points[i].time),
                  yOf(points[i].value));
    }
    for (int row = 0; row < plotRows; ++row) {
        for (int column = 0; column < plotColumns; ++column) {
            const std::uint8_t dots = grid.at(column, row);
            if (dots != 0) {
                const char32_t ch = ascii ? U'*' : kBrailleBlank + dots;
                canvas.put(plotTop + row, plotLeft + column, std::u32string(1, ch), kAttrNormal, 0, columns);
            }
        }
    }

    // Round clock times under the plot, where they do not run into each other.
    const TimeTicks ticks = timeTicks(start, end, std::max(2, plotColumns / 10));
    int freeFrom = plotLeft;
    for (const double instant : ticks.instants) {
        const std::u32string label = TerminalText::decodeUtf8(Clock::localText(instant, ticks.format));
        const int width = static_cast<int>(label.size());
        const int centre = plotLeft + xOf(instant) / (ascii ? 1 : 2);
        const int left = std::clamp(centre - width / 2, 0, std::max(0, columns - width));
        if (left < freeFrom) {
            continue;
        }
        canvas.put(rows - 2, left, label, kAttrNormal, 0, columns);
        freeFrom = left + width + 1;
    }
}

}  // namespace velmar
