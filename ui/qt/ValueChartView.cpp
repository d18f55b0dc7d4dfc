#include "ui/qt/ValueChartView.h"

#include <QApplication>
#include <QGestureEvent>
#include <QKeyEvent>
#include <QLegend>
#include <QPinchGesture>
#include <QWheelEvent>
#include <algorithm>
#include <cmath>
#include <functional>

#include "core/platform/Clock.h"
#include "ui/ChartScale.h"

namespace velmar {

namespace {

constexpr int kFontPixels = 12;

// Ten colours that stay apart on white and from each other.
const QColor kLineColours[] = {QColor(0x1f, 0x77, 0xb4), QColor(0xd6, 0x27, 0x28), QColor(0x2c, 0xa0, 0x2c),
                               QColor(0xff, 0x7f, 0x0e), QColor(0x94, 0x67, 0xbd), QColor(0x8c, 0x56, 0x4b),
                               QColor(0xe3, 0x77, 0xc2), QColor(0x7f, 0x7f, 0x7f), QColor(0xbc, 0xbd, 0x22),
                               QColor(0x17, 0xbe, 0xcf)};

QFont chartFont(bool bold = false) {
    QFont font = QApplication::font();
    font.setPixelSize(kFontPixels);
    font.setBold(bold);
    return font;
}

qint64 milliseconds(double seconds) {
    return static_cast<qint64>(std::llround(seconds * 1000.0));
}

// Pixels per label: along the time axis, and up the value axes.
constexpr int kTimeLabelPixels = 80;
constexpr int kValueLabelPixels = 55;

}  // namespace

ValueChartView::ValueChartView(QWidget* parent) : QChartView(parent) {
    // The view comes with a chart of its own; a chart set in its place would leave that one to nobody.
    QChart* chart = this->chart();
    chart->setTheme(QChart::ChartThemeLight);
    chart->setBackgroundRoundness(0);
    chart->setDropShadowEnabled(false);
    chart->setMargins(QMargins(2, 4, 2, 2));
    chart->setAnimationOptions(QChart::NoAnimation);
    chart->legend()->hide();
    setRenderHint(QPainter::Antialiasing);
    setFrameShape(QFrame::NoFrame);
    setFocusPolicy(Qt::StrongFocus);

    timeAxis_ = new QCategoryAxis(chart);
    timeAxis_->setLabelsFont(chartFont());
    timeAxis_->setTitleVisible(false);
    timeAxis_->setLabelsPosition(QCategoryAxis::AxisLabelsPositionOnValue);
    chart->addAxis(timeAxis_, Qt::AlignBottom);

    viewport()->setAttribute(Qt::WA_AcceptTouchEvents);
    viewport()->grabGesture(Qt::PinchGesture);
}

QValueAxis* ValueChartView::valueAxis(std::string_view unit) const {
    for (const UnitAxis& entry : axes_) {
        if (entry.unit == unit) {
            return entry.axis;
        }
    }
    return nullptr;
}

QValueAxis* ValueChartView::axisForUnit(const std::string& unit) {
    if (QValueAxis* existing = valueAxis(unit)) {
        return existing;
    }
    auto* axis = new QValueAxis(chart());
    axis->setLabelsFont(chartFont());
    axis->setTitleFont(chartFont(true));
    axis->setTitleText(QString::fromStdString(unit));
    axis->setTitleVisible(!unit.empty());
    // The first unit on the left, the second on the right, and so on.
    chart()->addAxis(axis, axes_.size() % 2 == 0 ? Qt::AlignLeft : Qt::AlignRight);
    axes_.push_back({unit, axis});
    return axis;
}

void ValueChartView::showLines(const std::vector<Line>& requested, const ValueHistory& history) {
    maximumSpan_ = std::max(kMinimumSpanSeconds, history.limits().windowSeconds);
    span_ = std::clamp(span_, kMinimumSpanSeconds, maximumSpan_);
    newestTime_ = history.newestTime();

    std::vector<const Line*> kept;
    for (const Line& line : requested) {
        if (history.series(line.path) != nullptr) {
            kept.push_back(&line);
        }
    }
    const bool samePaths =
        kept.size() == lines_.size() &&
        std::equal(kept.begin(), kept.end(), lines_.begin(),
                   [](const Line* line, const ChartLine& shown) { return line->path == shown.path; });
    if (!samePaths) {
        chart()->removeAllSeries();
        for (const UnitAxis& entry : axes_) {
            chart()->removeAxis(entry.axis);
            delete entry.axis;
        }
        axes_.clear();
        lines_.clear();
        for (const Line* line : kept) {
            auto* series = new QLineSeries();
            chart()->addSeries(series);
            // After addSeries, which gives the theme's pen.
            series->setPen(QPen(lineColour(lines_.size()), 2.0));
            series->attachAxis(timeAxis_);
            lines_.push_back({line->path, series, std::string(), {}});
        }
        // Units in their order of appearance, plain numbers last.
        for (const Line* line : kept) {
            const std::string_view unit = history.series(line->path)->unit();
            if (!unit.empty()) {
                axisForUnit(std::string(unit));
            }
        }
    }

    for (std::size_t i = 0; i < lines_.size(); ++i) {
        ChartLine& line = lines_[i];
        const ValueSeries& samples = *history.series(line.path);
        line.series->setName(kept[i]->name);
        // The series' unit decides its axis; a line whose unit changed moves to the other axis.
        const std::string unit(samples.unit());
        if (unit != line.unit || line.series->attachedAxes().size() < 2) {
            if (QValueAxis* previous = line.unit == unit ? nullptr : valueAxis(line.unit)) {
                line.series->detachAxis(previous);
            }
            line.unit = unit;
            line.series->attachAxis(axisForUnit(unit));
        }
        line.samples.clear();
        line.samples.reserve(samples.size());
        QList<QPointF> points;
        points.reserve(static_cast<qsizetype>(samples.size()));
        for (std::size_t s = 0; s < samples.size(); ++s) {
            const ValueSample& sample = samples.at(s);
            line.samples.push_back(sample);
            points.append(QPointF(static_cast<double>(milliseconds(sample.time)), sample.value));
        }
        line.series->replace(points);
    }
    if (!samePaths) {
        auto moves = [](const ChartLine& line) {
            return std::any_of(line.samples.begin(), line.samples.end(), [&line](const ValueSample& sample) {
                return sample.value != line.samples[0].value;
            });
        };
        auto withUnitMoving = [&moves](const ChartLine& line) { return !line.unit.empty() && moves(line); };
        auto withUnit = [](const ChartLine& line) { return !line.unit.empty(); };
        auto any = [](const ChartLine&) { return true; };
        std::function<bool(const ChartLine&)> shown = any;
        if (std::any_of(lines_.begin(), lines_.end(), withUnitMoving)) {
            shown = withUnitMoving;
        } else if (std::any_of(lines_.begin(), lines_.end(), withUnit)) {
            shown = withUnit;
        }
        for (ChartLine& line : lines_) {
            line.series->setVisible(shown(line));
        }
    }
    fitAxes();
}

void ValueChartView::setLineVisible(std::size_t line, bool visible) {
    lines_.at(line).series->setVisible(visible);
    fitAxes();
}

QColor ValueChartView::lineColour(std::size_t line) const {
    return kLineColours[line % std::size(kLineColours)];
}

std::optional<std::pair<double, double>> ValueChartView::visibleRange(std::size_t line) const {
    const double start = newestTime_ - span_;
    std::optional<std::pair<double, double>> range;
    for (const ValueSample& sample : lines_.at(line).samples) {
        if (sample.time < start || sample.time > newestTime_) {
            continue;
        }
        if (!range) {
            range = std::make_pair(sample.value, sample.value);
        } else {
            range->first = std::min(range->first, sample.value);
            range->second = std::max(range->second, sample.value);
        }
    }
    return range;
}

std::optional<ValueSample> ValueChartView::newestSample(std::size_t line) const {
    const std::vector<ValueSample>& samples = lines_.at(line).samples;
    if (samples.empty()) {
        return std::nullopt;
    }
    return samples.back();
}

void ValueChartView::fitAxes() {
    const double end = newestTime_;
    const double start = end - span_;
    for (const QString& label : timeAxis_->categoriesLabels()) {
        timeAxis_->remove(label);
    }
    timeAxis_->setStartValue(static_cast<double>(milliseconds(start)));
    timeAxis_->setRange(static_cast<double>(milliseconds(start)), static_cast<double>(milliseconds(end)));
    const QRectF plot = chart()->plotArea();
    const TimeTicks ticks =
        timeTicks(start, end, std::max(2, static_cast<int>(plot.width()) / kTimeLabelPixels));
    for (const double instant : ticks.instants) {
        timeAxis_->append(QString::fromStdString(Clock::localText(instant, ticks.format)),
                          static_cast<double>(milliseconds(instant)));
    }

    // Every axis gets the tick count of the one that needs most, so that their grid lines coincide.
    const int maxTicks = std::clamp(static_cast<int>(plot.height()) / kValueLabelPixels + 1, 3, 11);
    std::vector<std::optional<AxisScale>> scales;
    int ticksNeeded = 2;
    for (const UnitAxis& entry : axes_) {
        std::optional<std::pair<double, double>> range;
        for (std::size_t i = 0; i < lines_.size(); ++i) {
            if (lines_[i].unit != entry.unit || !lines_[i].series->isVisible()) {
                continue;
            }
            if (const auto lineRange = visibleRange(i)) {
                range = range ? std::make_pair(std::min(range->first, lineRange->first),
                                               std::max(range->second, lineRange->second))
                              : *lineRange;
            }
        }
        bool used = false;
        for (const ChartLine& line : lines_) {
            used = used || (line.unit == entry.unit && line.series->isVisible());
        }
        entry.axis->setVisible(used);
        if (!range) {
            scales.emplace_back();
            continue;
        }
        // Room above and below the lines, so that none runs along the frame.
        const double pad = (range->second - range->first) * 0.05;
        const AxisScale scale = niceScale(range->first - pad, range->second + pad, maxTicks);
        ticksNeeded = std::max(ticksNeeded, scale.ticks);
        scales.push_back(scale);
    }
    for (std::size_t i = 0; i < axes_.size(); ++i) {
        if (!scales[i]) {
            continue;
        }
        const AxisScale& scale = *scales[i];
        QValueAxis* axis = axes_[i].axis;
        axis->setTickCount(ticksNeeded);
        axis->setRange(scale.low, scale.low + scale.step * (ticksNeeded - 1));
        axis->setLabelFormat(QStringLiteral("%.") + QString::number(scale.decimals()) + QStringLiteral("f"));
    }
}

void ValueChartView::setSpanSeconds(double seconds) {
    const double clamped = std::clamp(seconds, kMinimumSpanSeconds, maximumSpan_);
    if (clamped != span_) {
        span_ = clamped;
        fitAxes();
        emit spanChanged(span_);
    }
}

void ValueChartView::zoomBy(double factor) {
    if (factor > 0.0 && std::isfinite(factor)) {
        setSpanSeconds(span_ / factor);
    }
}

void ValueChartView::wheelEvent(QWheelEvent* event) {
    const double steps = event->angleDelta().y() / 120.0;
    if (steps != 0.0) {
        zoomBy(std::pow(kZoomStep, steps));
    }
    event->accept();
}

void ValueChartView::keyPressEvent(QKeyEvent* event) {
    switch (event->key()) {
        case Qt::Key_Plus:
        case Qt::Key_Equal:
            zoomBy(kZoomStep);
            event->accept();
            return;
        case Qt::Key_Minus:
            zoomBy(1.0 / kZoomStep);
            event->accept();
            return;
        default:
            // Back, Escape and the rest belong to the navigation stack.
            event->ignore();
    }
}

void ValueChartView::resizeEvent(QResizeEvent* event) {
    QChartView::resizeEvent(event);
    fitAxes();
}

bool ValueChartView::viewportEvent(QEvent* event) {
    if (event->type() == QEvent::Gesture) {
        auto* gestures = static_cast<QGestureEvent*>(event);
        if (auto* pinch = static_cast<QPinchGesture*>(gestures->gesture(Qt::PinchGesture))) {
            // Fingers spreading (a factor above 1) zoom in, by the change since the previous event.
            if (pinch->changeFlags() & QPinchGesture::ScaleFactorChanged) {
                zoomBy(pinch->scaleFactor());
            }
            gestures->accept(pinch);
            return true;
        }
    }
    return QChartView::viewportEvent(event);
}

}  // namespace velmar
