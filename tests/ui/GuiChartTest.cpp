// Charts of the graphical monitor (offscreen Qt, in this process) on live values of a real kxserverd: the
// chart button of a pane, the chart of one value by right click and by long press, the legend, zoom by wheel,
// pinch and keys, live updates, and the look at 400 x 720 and on a large screen (screenshots under
// <build>/screenshots).
//
// The simulator runs 30 times faster than the wall clock and the test drives the display ticks, with the
// clock the history reads pinned and moved on 2 s per tick: so the charts hold what three minutes of 2-s
// ticks of the simulated phone would have shown, gathered in a few seconds.
#ifdef VELMAR_WITH_QT

#include <gtest/gtest.h>

#include <QApplication>
#include <QGestureEvent>
#include <QPinchGesture>
#include <QRegularExpression>
#include <QTest>
#include <cmath>
#include <cstdlib>
#include <filesystem>

#include "LogGenerator/LogGenerator.h"
#include "core/ArrayLock.h"
#include "core/NumericValue.h"
#include "core/platform/Clock.h"
#include "tests/support/TestPaths.h"
#include "tests/ui/ChangingValues.h"
#include "tests/ui/KxServerProcess.h"
#include "tests/ui/LiveGuiTest.h"
#include "tests/ui/QtTestApplication.h"
#include "ui/qt/NavigationController.h"
#include "ui/qt/QtMainQueue.h"
#include "ui/qt/VelmarApp.h"
#include "ui/qt/VelmarCell.h"
#include "ui/qt/VelmarChartController.h"
#include "ui/qt/VelmarPaneController.h"

namespace velmar {
namespace {

constexpr const char* kMeasurementsPane = "/Serving Cell/Connected mode LTE Intra-frequency Measurement";
constexpr int kTicks = 90;

// Labels on round clock times within the axis, each naming its own instant.
void expectClockLabels(QCategoryAxis& axis, const char* format) {
    const QStringList labels = axis.categoriesLabels();
    ASSERT_GE(labels.size(), 2);
    const double step = std::string(format) == "%H:%M" ? 60.0 : 1.0;
    for (const QString& label : labels) {
        const double seconds = axis.endValue(label) / 1000.0;
        EXPECT_GE(axis.endValue(label), axis.min());
        EXPECT_LE(axis.endValue(label), axis.max());
        EXPECT_EQ(std::fmod(seconds, step), 0.0) << label.toStdString();
        EXPECT_EQ(label.toStdString(), Clock::localText(seconds, format));
    }
}

std::string screenshotPath(const std::string& name) {
    const std::string directory = std::string(VELMAR_BINARY_DIR) + "/screenshots";
    std::filesystem::create_directories(directory);
    return directory + "/" + name;
}

class GuiChartTest : public testing::LiveGuiTest {
  protected:
    VelmarModel& model() { return *app_->shell().model(); }
    VelmarPaneController* pane() { return navigation().topPane(); }
    VelmarChartController* chart() { return qobject_cast<VelmarChartController*>(navigation().topScreen()); }
    bool settled() {
        return QTest::qWaitFor([&] { return !navigation().isAnimating(); }, 3000);
    }

    // One display tick 2 s after the previous one, once new data has arrived; waits for its redraw.
    bool tick() {
        if (!QTest::qWaitFor([&] { return model().isUpdated(); }, 5000)) {
            return false;
        }
        now_ += 2.0;
        Clock::setNowForTesting(now_);
        const double newest = model().history().newestTime();
        model().refresh();
        return QTest::qWaitFor([&] { return model().history().newestTime() > newest; }, 5000);
    }
    VelmarCell* rowNamed(const std::string& name) {
        const NodeList* children = pane()->node() ? pane()->node()->childNodes() : nullptr;
        for (std::size_t i = 0; children != nullptr && i < children->size(); ++i) {
            if ((*children)[i]->displayName() == name) {
                pane()->tableView()->scrollToRow(static_cast<int>(i));
                return static_cast<VelmarCell*>(pane()->tableView()->cellForRow(static_cast<int>(i)));
            }
        }
        return nullptr;
    }
    bool openPath(const std::string& path) {
        navigation().popToPane(0, false);
        for (const std::string& name : testing::pathComponents(path)) {
            VelmarCell* cell = rowNamed(name);
            if (cell == nullptr) {
                return false;
            }
            QTest::mouseClick(cell, Qt::LeftButton, Qt::NoModifier, cell->rect().center());
            if (!settled()) {
                return false;
            }
        }
        return pane() != nullptr && pane()->path() == path;
    }
    void save(const std::string& name) {
        QApplication::processEvents();
        EXPECT_TRUE(app_->window()->grab().save(QString::fromStdString(screenshotPath(name))));
    }

    double now_ = 0.0;
};

TEST_F(GuiChartTest, PaneChartAndValueChartOfLiveValues) {
    testing::KxServerProcess service(runtime_.path(), "lte", {"--rate-multiplier", "30"});
    ASSERT_TRUE(service.start()) << service.description();
    makeApp().applicationDidFinishLaunching(false);
    ASSERT_TRUE(QTest::qWaitFor([&] { return model().isConnected(); }, 5000));
    now_ = Clock::now();
    Clock::setNowForTesting(now_);
    for (int i = 0; i < kTicks; ++i) {
        ASSERT_TRUE(tick()) << "tick " << i;
    }

    // The root pane holds no leaves: no chart button. The measurements pane holds levels: a chart button.
    EXPECT_FALSE(pane()->toolbar()->chartButton()->isVisible());
    ASSERT_TRUE(openPath(kMeasurementsPane));
    QToolButton* chartButton = pane()->toolbar()->chartButton();
    ASSERT_TRUE(chartButton->isVisible());
    EXPECT_EQ(chartButton->text(), "Chart");
    std::vector<std::string> numericLeaves;
    for (const VelmarModelNodeRef& child : *pane()->node()->childNodes()) {
        if (child->value() != nullptr && parseNumericValue(*child->value())) {
            numericLeaves.push_back(child->displayName());
        }
    }
    ASSERT_GE(numericLeaves.size(), 4u);

    QTest::mouseClick(chartButton, Qt::LeftButton);
    ASSERT_TRUE(settled());
    VelmarChartController* paneChart = chart();
    ASSERT_NE(paneChart, nullptr);
    EXPECT_EQ(paneChart->kind(), ChartKind::Pane);
    EXPECT_EQ(paneChart->path(), kMeasurementsPane);
    EXPECT_EQ(paneChart->title(), "Connected mode LTE Intra-frequency Measurement");
    EXPECT_EQ(navigation().titleLabel()->toolTip(), "Connected mode LTE Intra-frequency Measurement");
    EXPECT_TRUE(navigation().backButton()->text().startsWith("‹ Co"))
        << navigation().backButton()->text().toStdString();
    EXPECT_EQ(paneChart->toolbar()->statusLabel()->text().left(8), "Updated ");
    ValueChartView* view = paneChart->chartView();
    // One line per numeric leaf, named by the leaf; it opens on the levels that moved, the cell's numbers and
    // fixed levels wait in the legend.
    ASSERT_EQ(view->lineCount(), numericLeaves.size());
    std::size_t shown = 0;
    for (std::size_t i = 0; i < view->lineCount(); ++i) {
        EXPECT_EQ(view->series(i)->name().toStdString(), numericLeaves[i]);
        // Every sample of the history (the record comes and goes with the simulated phone's state).
        const ValueSeries* samples =
            model().history().series(std::string(kMeasurementsPane) + "/" + numericLeaves[i]);
        ASSERT_NE(samples, nullptr) << numericLeaves[i];
        EXPECT_GE(samples->size(), 10u) << numericLeaves[i];
        EXPECT_EQ(static_cast<std::size_t>(view->series(i)->count()), samples->size()) << numericLeaves[i];
        bool moved = false;
        for (std::size_t s = 0; s < samples->size(); ++s) {
            moved = moved || samples->at(s).value != samples->at(0).value;
        }
        EXPECT_EQ(view->isLineVisible(i), moved && !samples->unit().empty()) << numericLeaves[i];
        shown += view->isLineVisible(i);
    }
    EXPECT_GE(shown, 2u);
    ChartLegend* legend = paneChart->legend();
    EXPECT_TRUE(legend->isVisible());
    ASSERT_EQ(static_cast<std::size_t>(legend->entryCount()), view->lineCount());
    for (std::size_t i = 0; i < view->lineCount(); ++i) {
        EXPECT_EQ(legend->entry(static_cast<int>(i))->text(), view->series(i)->name());
        EXPECT_TRUE(legend->entry(static_cast<int>(i))->toolTip().startsWith(view->series(i)->name() + "  "));
    }
    ASSERT_NE(view->valueAxis("dBm"), nullptr);
    ASSERT_NE(view->valueAxis("dB"), nullptr);
    EXPECT_EQ(view->valueAxis("dBm")->titleText(), "dBm");
    EXPECT_TRUE(view->valueAxis("dBm")->isVisible());
    EXPECT_TRUE(view->valueAxis("dB")->isVisible());
    ASSERT_NE(view->valueAxis(""), nullptr);
    EXPECT_FALSE(view->valueAxis("")->isVisible());
    // The last ten minutes, ending at the newest sample, in wall-clock time.
    const double newest = model().history().newestTime();
    EXPECT_EQ(view->spanSeconds(), 600.0);
    EXPECT_EQ(view->timeAxis()->max(), std::llround(newest * 1000.0));
    EXPECT_EQ(view->timeAxis()->min(), std::llround((newest - 600.0) * 1000.0));
    expectClockLabels(*view->timeAxis(), "%H:%M");
    // Each level axis covers what its lines show.
    for (std::size_t i = 0; i < view->lineCount(); ++i) {
        const auto range = view->visibleRange(i);
        ASSERT_TRUE(range);
        if (view->isLineVisible(i)) {
            QValueAxis* axis = view->valueAxis(view->unitOf(i));
            EXPECT_LE(axis->min(), range->first);
            EXPECT_GE(axis->max(), range->second);
        }
    }
    // In the phone-sized window every name stands whole, in one column if need be.
    for (int i = 0; i < legend->entryCount(); ++i) {
        EXPECT_GE(legend->entry(i)->width(), legend->widestEntryWidth()) << i;
    }
    save("gui-chart-pane.png");

    // A tap on a legend entry hides its line, and another shows it again; a hidden plain number shows too.
    std::size_t level = 0;
    while (!view->isLineVisible(level)) {
        ++level;
    }
    QTest::mouseClick(legend->entry(static_cast<int>(level)), Qt::LeftButton);
    EXPECT_FALSE(view->isLineVisible(level));
    EXPECT_TRUE(legend->entry(static_cast<int>(level))->isVisible());
    QTest::mouseClick(legend->entry(static_cast<int>(level)), Qt::LeftButton);
    EXPECT_TRUE(view->isLineVisible(level));
    QTest::mouseClick(legend->entry(0), Qt::LeftButton);
    EXPECT_TRUE(view->isLineVisible(0));
    EXPECT_TRUE(view->valueAxis("")->isVisible());
    QTest::mouseClick(legend->entry(0), Qt::LeftButton);
    EXPECT_FALSE(view->valueAxis("")->isVisible());

    // Zoom: the wheel, a pinch, the keys; never below a minute nor beyond the hour.
    QWheelEvent wheelIn(QPointF(100, 100), view->mapToGlobal(QPointF(100, 100)), QPoint(), QPoint(0, 120),
                        Qt::NoButton, Qt::NoModifier, Qt::NoScrollPhase, false);
    QApplication::sendEvent(view->viewport(), &wheelIn);
    EXPECT_EQ(view->spanSeconds(), 480.0);
    EXPECT_EQ(view->timeAxis()->min(), std::llround((newest - 480.0) * 1000.0));
    QPinchGesture pinch;
    pinch.setChangeFlags(QPinchGesture::ScaleFactorChanged);
    pinch.setScaleFactor(4.0);
    QGestureEvent pinchEvent({&pinch});
    QApplication::sendEvent(view->viewport(), &pinchEvent);
    EXPECT_EQ(view->spanSeconds(), 120.0);
    expectClockLabels(*view->timeAxis(), "%H:%M");
    for (int i = 0; i < 10; ++i) {
        QTest::keyClick(view, Qt::Key_Plus);
    }
    EXPECT_EQ(view->spanSeconds(), 60.0);
    for (int i = 0; i < 20; ++i) {
        QWheelEvent wheelOut(QPointF(100, 100), view->mapToGlobal(QPointF(100, 100)), QPoint(),
                             QPoint(0, -120), Qt::NoButton, Qt::NoModifier, Qt::NoScrollPhase, false);
        QApplication::sendEvent(view->viewport(), &wheelOut);
    }
    EXPECT_EQ(view->spanSeconds(), 3600.0);
    view->setSpanSeconds(600.0);

    // Live: the next tick adds a sample to every line.
    const qsizetype points = view->series(level)->count();
    ASSERT_TRUE(tick());
    EXPECT_EQ(view->series(level)->count(), points + 1);
    EXPECT_EQ(view->timeAxis()->max(), std::llround(now_ * 1000.0));

    // At home on a large screen too.
    app_->window()->resize(1280, 800);
    QApplication::processEvents();
    // No more columns than entries, and every name whole.
    EXPECT_LE(legend->columns(), legend->entryCount());
    for (int i = 0; i < legend->entryCount(); ++i) {
        EXPECT_GE(legend->entry(i)->width(), legend->widestEntryWidth()) << i;
    }
    save("gui-chart-pane-large.png");
    app_->window()->resize(VelmarApp::kPhoneWidth, VelmarApp::kPhoneHeight);
    QApplication::processEvents();

    // Escape goes back to the pane; a right click on a level's row opens the chart of that value alone.
    QTest::keyClick(view, Qt::Key_Escape);
    ASSERT_TRUE(settled());
    ASSERT_NE(pane(), nullptr);
    EXPECT_EQ(pane()->path(), kMeasurementsPane);
    VelmarCell* rsrp = rowNamed("Serving Filtered RSRP");
    ASSERT_NE(rsrp, nullptr);
    QTest::mouseClick(rsrp, Qt::RightButton, Qt::NoModifier, rsrp->rect().center());
    ASSERT_TRUE(settled());
    VelmarChartController* valueChart = chart();
    ASSERT_NE(valueChart, nullptr);
    EXPECT_EQ(valueChart->kind(), ChartKind::Value);
    EXPECT_EQ(valueChart->path(), std::string(kMeasurementsPane) + "/Serving Filtered RSRP");
    EXPECT_EQ(navigation().titleLabel()->text(), "Serving Filtered RSRP");
    EXPECT_EQ(navigation().backButton()->text().left(4), "‹ Co");
    ASSERT_EQ(valueChart->chartView()->lineCount(), 1u);
    EXPECT_TRUE(valueChart->chartView()->isLineVisible(0));
    EXPECT_FALSE(valueChart->legend()->isVisible());
    const QString summary = valueChart->summary()->text();
    const std::string shownValue = *model().nodeAtPath(valueChart->path())->value();
    // The least and greatest printed as the pane prints levels, with two decimals.
    const QRegularExpression summaryPattern(QRegularExpression::anchoredPattern(
        QRegularExpression::escape(QString::fromStdString("now " + shownValue)) +
        QStringLiteral("   min -\\d+\\.\\d\\d   max -\\d+\\.\\d\\d")));
    EXPECT_TRUE(summaryPattern.match(summary).hasMatch()) << summary.toStdString();
    save("gui-chart-value.png");
    ASSERT_TRUE(tick());
    EXPECT_EQ(valueChart->chartView()->series(0)->count(),
              model().history().series(valueChart->path())->size());

    // Back: a long press opens the same chart, and the release that ends it is no tap.
    navigation().popPane(false);
    ASSERT_NE(pane(), nullptr);
    VelmarCell* rsrq = rowNamed("Serving Filtered RSRQ");
    ASSERT_NE(rsrq, nullptr);
    QTest::mousePress(rsrq, Qt::LeftButton, Qt::NoModifier, rsrq->rect().center());
    ASSERT_TRUE(QTest::qWaitFor([&] { return chart() != nullptr; }, 3000));
    QTest::mouseRelease(rsrq, Qt::LeftButton, Qt::NoModifier, rsrq->rect().center());
    ASSERT_TRUE(settled());
    EXPECT_EQ(chart()->path(), std::string(kMeasurementsPane) + "/Serving Filtered RSRQ");
    EXPECT_EQ(navigation().pane(navigation().paneCount() - 2)->tableView()->selectedRow(), -1);

    // A row that is no number ("20 MHz", a name from a table) opens nothing.
    ASSERT_TRUE(openPath("/Serving Cell/Serving Cell Info"));
    VelmarCell* bandwidth = rowNamed("Download Bandwidth");
    ASSERT_NE(bandwidth, nullptr);
    ASSERT_FALSE(parseNumericValue(bandwidth->value().toStdString())) << bandwidth->value().toStdString();
    QTest::mouseClick(bandwidth, Qt::RightButton, Qt::NoModifier, bandwidth->rect().center());
    EXPECT_EQ(chart(), nullptr);
    app_->applicationWillTerminate();
}

}  // namespace
}  // namespace velmar

#endif  // VELMAR_WITH_QT
