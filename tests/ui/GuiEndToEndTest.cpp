// The graphical monitor (offscreen Qt, in this process) against a real kxserverd: it connects, shows values
// that change, keeps them when the service dies, shows "Connecting..." with the spinner at the next pane
// change, and reconnects when the service is back.
#ifdef VELMAR_WITH_QT

#include <gtest/gtest.h>

#include <QApplication>
#include <QElapsedTimer>
#include <QTest>
#include <cstdlib>

#include "LogGenerator/LogGenerator.h"
#include "core/ArrayLock.h"
#include "tests/support/TestPaths.h"
#include "tests/ui/ChangingValues.h"
#include "tests/ui/KxServerProcess.h"
#include "tests/ui/LiveGuiTest.h"
#include "tests/ui/QtTestApplication.h"
#include "ui/qt/NavigationController.h"
#include "ui/qt/QtMainQueue.h"
#include "ui/qt/VelmarApp.h"
#include "ui/qt/VelmarCell.h"
#include "ui/qt/VelmarPaneController.h"

namespace velmar {
namespace {

class GuiEndToEndTest : public testing::LiveGuiTest {
  protected:
    VelmarPaneController& top() { return *navigation().topPane(); }
    QString status() { return top().toolbar()->statusLabel()->text(); }
    // Waits for the next redraw that brings a new update time.
    bool nextRedraw(int milliseconds) {
        const QString before = status();
        return QTest::qWaitFor([&] { return status().startsWith("Updated ") && status() != before; },
                               milliseconds);
    }
    // The values of the leaf rows on screen, in row order.
    std::vector<std::string> shownValues() {
        std::vector<std::string> values;
        TableView* table = top().tableView();
        for (int row = 0; row < table->numberOfRows(); ++row) {
            if (auto* cell = static_cast<VelmarCell*>(table->cellForRow(row))) {
                values.push_back(cell->key().toStdString() + "=" + cell->value().toStdString());
            }
        }
        return values;
    }
    // Opens the panes of path from the root by tapping their rows.
    bool openPath(const std::string& path) {
        navigation().popToPane(0, false);
        for (const std::string& name : testing::pathComponents(path)) {
            const NodeList* children = top().node() ? top().node()->childNodes() : nullptr;
            if (children == nullptr) {
                return false;
            }
            int row = -1;
            for (std::size_t i = 0; i < children->size(); ++i) {
                if ((*children)[i]->displayName() == name) {
                    row = static_cast<int>(i);
                }
            }
            if (row < 0) {
                return false;
            }
            top().tableView()->scrollToRow(row);
            TableViewCell* cell = top().tableView()->cellForRow(row);
            if (cell == nullptr) {
                return false;
            }
            QTest::mouseClick(cell, Qt::LeftButton, Qt::NoModifier, cell->rect().center());
            if (!QTest::qWaitFor([&] { return !navigation().isAnimating(); }, 3000)) {
                return false;
            }
        }
        return top().path() == (path.empty() ? "/" : path);
    }
};

TEST_F(GuiEndToEndTest, ConnectsShowsChangingValuesSurvivesTheServiceDyingAndReconnects) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    std::cout << "service: " << service.description() << std::endl;

    makeApp();
    QElapsedTimer clock;
    clock.start();
    app_->applicationDidFinishLaunching(false);
    ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().model()->isConnected(); }, 5000));
    EXPECT_LT(clock.elapsed(), 5000);

    // A pane whose values change at almost every tick; it is watched on screen.
    const std::string pane = testing::livelyPaneOf("lte");
    ASSERT_TRUE(nextRedraw(15000)) << "no redraw with new data";
    ASSERT_TRUE(openPath(pane)) << pane;
    app_->window()->grab().save(
        QString::fromStdString(std::string(VELMAR_BINARY_DIR) + "/screenshots/gui-live-pane.png"));
    bool changed = false;
    for (int i = 0; i < 8 && !changed; ++i) {
        const std::vector<std::string> before = shownValues();
        ASSERT_TRUE(nextRedraw(15000));
        if (top().path() != pane) {
            ASSERT_TRUE(openPath(pane)) << pane << " came back";  // a list entry went and came back
            continue;
        }
        changed = shownValues() != before;
    }
    EXPECT_TRUE(changed) << "the values of " << pane << " did not change on screen";

    // The service dies: the monitor notices, keeps what it shows, and says "Connecting..." at the next
    // pane change, with the indicator spinning.
    const std::vector<std::string> kept = shownValues();
    const std::string keptPath = top().path();
    ASSERT_FALSE(kept.empty());
    service.kill();
    ASSERT_TRUE(QTest::qWaitFor([&] { return !app_->shell().model()->isConnected(); }, 5000));
    QTest::qWait(300);
    EXPECT_EQ(shownValues(), kept);
    navigation().popPane(true);
    ASSERT_TRUE(QTest::qWaitFor([&] { return !navigation().isAnimating(); }, 3000));
    EXPECT_EQ(status(), "Connecting...");
    EXPECT_TRUE(top().toolbar()->busyIndicator()->isAnimating());
    EXPECT_TRUE(top().toolbar()->busyIndicator()->isVisible());
    ASSERT_TRUE(openPath(keptPath));
    EXPECT_EQ(status(), "Connecting...");
    EXPECT_EQ(shownValues(), kept);
    app_->window()->grab().save(
        QString::fromStdString(std::string(VELMAR_BINARY_DIR) + "/screenshots/gui-service-gone.png"));

    // Back again: connected (a retry comes within 5 s), the values kept meanwhile.
    ASSERT_TRUE(service.start());
    ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().model()->isConnected(); }, 8000));
    EXPECT_EQ(shownValues().size(), kept.size());
    ASSERT_TRUE(nextRedraw(15000));
    EXPECT_FALSE(top().toolbar()->busyIndicator()->isVisible());
    app_->applicationWillTerminate();
}

TEST_F(GuiEndToEndTest, ValuesLiveAgainAfterEveryRestartOfTheServiceWhateverItsTechnology) {
    // One window; the service is killed and started again with another seed, then with each other
    // technology in turn. Each time the values of a lively pane must change on screen again.
    const std::vector<std::pair<std::string, std::string>> phases = {
        {"lte", "1"}, {"lte", "2"}, {"gsm", "3"}, {"utran", "4"}, {"cdma", "5"}, {"ifx", "6"}};
    std::unique_ptr<testing::KxServerProcess> service;
    for (std::size_t phase = 0; phase < phases.size(); ++phase) {
        const auto& [technology, seed] = phases[phase];
        if (service) {
            service->kill();
            ASSERT_TRUE(QTest::qWaitFor([&] { return !app_->shell().model()->isConnected(); }, 5000));
        }
        service = std::make_unique<testing::KxServerProcess>(
            runtime_.path(), technology, std::vector<std::string>{"--rate-multiplier", "4", "--seed", seed});
        QElapsedTimer clock;
        clock.start();
        ASSERT_TRUE(service->start()) << service->description();
        if (phase == 0) {
            app_ = std::make_unique<VelmarApp>(
                [](std::string_view name) { return LogGenerator::generatorFromTechnology(name); }, queue_);
            app_->applicationDidFinishLaunching(false);
        }
        ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().model()->isConnected(); }, 10000))
            << technology;
        // This technology's tree arrives with the first redraw that follows.
        const std::string pane = testing::livelyPaneOf(technology);
        ASSERT_TRUE(QTest::qWaitFor([&] { return openPath(pane); }, 15000)) << technology << ": " << pane;
        bool changed = false;
        for (int redraw = 0; redraw < 6 && !changed; ++redraw) {
            const std::vector<std::string> before = shownValues();
            ASSERT_TRUE(nextRedraw(15000)) << technology;
            if (top().path() != pane) {
                ASSERT_TRUE(openPath(pane)) << pane << " came back";
                continue;
            }
            changed = shownValues() != before;
        }
        EXPECT_TRUE(changed) << technology << " (seed " << seed << "): the values of " << pane
                             << " did not change on screen";
        std::printf("%s, seed %s: values changed on screen %.1f s after the service started\n",
                    technology.c_str(), seed.c_str(), clock.elapsed() / 1000.0);
        app_->window()->grab().save(QString::fromStdString(
            std::string(VELMAR_BINARY_DIR) + "/screenshots/gui-restart-" + technology + "-" + seed + ".png"));
    }
    app_->applicationWillTerminate();
}

}  // namespace
}  // namespace velmar

#endif  // VELMAR_WITH_QT
