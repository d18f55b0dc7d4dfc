// ValueChartView: a line chart of display values over time, drawn from the model's value history: one line
// per display path, one value axis per unit, wall-clock time along the bottom.
//
// Contract: showLines names the lines (display path, legend text) and takes each line's samples from the
// history; a new set of paths rebuilds the chart, the same set keeps its lines and which of them are hidden.
// A line whose path has no series in the history is left out. Then the axes are fitted: the time axis ends at
// the newest sample and spans spanSeconds() (10 minutes at first) with labels on round local times, each
// value axis covers what its visible lines show in that span on round numbers, with the unit as its title
// (units in their order of appearance, alternately left and right, plain numbers last; all with the same
// number of ticks, so that their grid lines coincide), and an axis with no visible line is hidden. Each line
// keeps the colour of its place in the set. The chart draws no legend of its own (ChartLegend is the toggling
// legend beside it). The wheel, a pinch and the + and - keys zoom the time span between one minute and the
// history's whole window; other keys go on to the navigation stack. Lines are not broken where a value was
// missing: the chart joins the samples it has. A new set of lines opens on what moves: the lines with a unit
// whose value changed within the history; where there are none, the lines with a unit; where there are none,
// all. So RSRP and RSRQ get the chart's height, and the cell's identity, its frequency and fixed thresholds
// wait in the legend.
#pragma once

#include <QCategoryAxis>
#include <QChartView>
#include <QLineSeries>
#include <QValueAxis>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "core/ValueHistory.h"

namespace velmar {

class ValueChartView : public QChartView {
    Q_OBJECT

  public:
    static constexpr double kDefaultSpanSeconds = 600.0;
    static constexpr double kMinimumSpanSeconds = 60.0;
    // Each wheel step or + / - press changes the span by this factor.
    static constexpr double kZoomStep = 1.25;

    struct Line {
        std::string path;
        QString name;
    };

    explicit ValueChartView(QWidget* parent = nullptr);

    void showLines(const std::vector<Line>& lines, const ValueHistory& history);

    double spanSeconds() const { return span_; }
    // Clamped to [kMinimumSpanSeconds, the history's window]; refits the axes.
    void setSpanSeconds(double seconds);
    // factor > 1 zooms in (a shorter span), < 1 out.
    void zoomBy(double factor);

    std::size_t lineCount() const { return lines_.size(); }
    QLineSeries* series(std::size_t line) const { return lines_.at(line).series; }
    QColor lineColour(std::size_t line) const;
    bool isLineVisible(std::size_t line) const { return lines_.at(line).series->isVisible(); }
    void setLineVisible(std::size_t line, bool visible);
    // Milliseconds since 1970 along the bottom, labelled with round local clock times.
    QCategoryAxis* timeAxis() const { return timeAxis_; }
    // The value axis of a unit ("" for plain numbers), or null.
    QValueAxis* valueAxis(std::string_view unit) const;
    // The least and greatest value of a line within the span shown, if it has samples there.
    std::optional<std::pair<double, double>> visibleRange(std::size_t line) const;
    // The newest sample of a line, if any.
    std::optional<ValueSample> newestSample(std::size_t line) const;
    std::string_view unitOf(std::size_t line) const { return lines_.at(line).unit; }
    const std::string& pathOf(std::size_t line) const { return lines_.at(line).path; }

  signals:
    void spanChanged(double seconds);

  protected:
    void wheelEvent(QWheelEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    bool viewportEvent(QEvent* event) override;

  private:
    struct ChartLine {
        std::string path;
        QLineSeries* series = nullptr;
        std::string unit;
        std::vector<ValueSample> samples;
    };
    struct UnitAxis {
        std::string unit;
        QValueAxis* axis;
    };

    QValueAxis* axisForUnit(const std::string& unit);
    void fitAxes();

    std::vector<ChartLine> lines_;
    std::vector<UnitAxis> axes_;
    QCategoryAxis* timeAxis_;
    double span_ = kDefaultSpanSeconds;
    double maximumSpan_ = 3600.0;
    double newestTime_ = 0.0;
};

}  // namespace velmar
