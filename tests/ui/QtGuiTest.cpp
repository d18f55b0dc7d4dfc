// The graphical front end on Qt's offscreen platform: panes, cells, the toolbar, navigation and the save
// screen, driven with Qt Test's simulated clicks and keys. Screenshots go to <build>/screenshots.
#ifdef VELMAR_WITH_QT

#include <gtest/gtest.h>

#include <QApplication>
#include <QDir>
#include <QFontMetrics>
#include <QLabel>
#include <QMessageBox>
#include <QPushButton>
#include <QScrollBar>
#include <QScroller>
#include <QTest>
#include <cstdlib>
#include <filesystem>

#include "core/ArrayLock.h"
#include "core/platform/Clock.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "tests/support/FakeTelephonyService.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"
#include "tests/ui/QtTestApplication.h"
#include "ui/qt/NavigationController.h"
#include "ui/qt/QtMainQueue.h"
#include "ui/qt/VelmarApp.h"
#include "ui/qt/VelmarCell.h"
#include "ui/qt/VelmarPaneController.h"
#include "ui/qt/VelmarSaveView.h"

namespace velmar {
namespace {

const char* const kLongBand = "LTE Band 20 (800 MHz) FDD, downlink 791-821 MHz, uplink 832-862 MHz";

std::string screenshotPath(const std::string& name) {
    const std::string directory = std::string(VELMAR_BINARY_DIR) + "/screenshots";
    std::filesystem::create_directories(directory);
    return directory + "/" + name;
}

// {"Serving Cell": {"Physical Cell ID", "E-ARFCN", "Band"}, "Neighbours": [{"PCI", "RSRP"} x 3], "Mode":
// "Idle"}
class GuiGenerator : public MonitorGenerator {
  public:
    void updateState(const PlistDictionaryRef&, ByteView) override { ++blobs; }
    PlistValue generateLogUsingState(const PlistDictionaryRef&) override {
        auto serving = PlistDictionary::create();
        serving->set("Physical Cell ID", std::to_string(pci));
        serving->set("E-ARFCN", "6300");
        serving->set("Band", kLongBand);
        auto display = PlistDictionary::create();
        display->set(servingName, serving);
        if (withNeighbours) {
            auto neighbours = PlistArray::create();
            for (int i = 0; i < neighbourCount; ++i) {
                auto neighbour = PlistDictionary::create();
                neighbour->set("PCI", std::to_string(200 + i));
                neighbour->set("RSRP", std::to_string(-95 - 3 * i) + ".50 dBm");
                neighbours->append(neighbour);
            }
            display->set("Neighbours", neighbours);
        }
        display->set("Mode", "Idle");
        return display;
    }
    PlistValue getStartCommand() override {
        auto command = PlistDictionary::create();
        command->set("SetState", "Streaming");
        return command;
    }
    PlistValue getSaveContentsFromState(const PlistDictionaryRef&) override {
        auto entries = PlistArray::create();
        for (const char* description :
             {"2026-09-21 14:13:16 +0000", "2026-09-21 14:13:18 +0000", "DLF binary (161 bytes)"}) {
            auto entry = PlistDictionary::create();
            entry->set("Description", description);
            entries->append(entry);
        }
        return entries;
    }
    int pci = 101;
    std::string servingName = "Serving Cell";
    bool withNeighbours = true;
    int neighbourCount = 3;
    int blobs = 0;
};

class QtGuiTest : public ::testing::Test {
  protected:
    void SetUp() override {
        testing::qtTestApplication();
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        setenv("XDG_CONFIG_HOME", config_.path().c_str(), 1);
        setenv("XDG_STATE_HOME", state_.path().c_str(), 1);
        setenv("VELMAR_SYSROOT", sysroot_.path().c_str(), 1);
        MainQueue::setCurrent(&queue_);
    }
    void TearDown() override {
        app_.reset();
        QApplication::processEvents();
        MainQueue::setCurrent(nullptr);
        unsetenv("VELMAR_SYSROOT");
        Clock::setNowForTesting(std::nullopt);
        ArrayLock::releaseOutstandingForTesting();
    }
    GeneratorFactory factory() {
        return [this](std::string_view) -> std::unique_ptr<MonitorGenerator> {
            auto generator = std::make_unique<GuiGenerator>();
            generator_ = generator.get();
            return generator;
        };
    }
    void allowSaving() {
        std::filesystem::create_directories(
            sysroot_.path() + "/BrindleInternal/Library/PreferenceBundles/Carrier Settings.bundle");
    }
    VelmarApp& launch() {
        app_ = std::make_unique<VelmarApp>(factory(), queue_);
        app_->applicationDidFinishLaunching(false);
        EXPECT_TRUE(QTest::qWaitForWindowExposed(app_->window()));
        return *app_;
    }
    // Connects to the fake service, delivers one blob and waits for the redraw.
    void connectAndRedraw(testing::FakeTelephonyService& service) {
        ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().model()->isConnected(); }, 5000));
        deliverAndRedraw(service);
    }
    void deliverAndRedraw(testing::FakeTelephonyService& service) {
        const int before = generator_->blobs;
        service.sendBlob(PlistData(20, 1));
        ASSERT_TRUE(QTest::qWaitFor([&] { return generator_->blobs > before; }, 5000));
        app_->shell().model()->refresh();
        // The redraw is queued; one turn of the event loop runs it.
        QTest::qWait(20);
    }
    NavigationController& navigation() { return *app_->navigationController(); }
    VelmarPaneController& top() { return *navigation().topPane(); }
    VelmarCell* cell(VelmarPaneController& pane, int row) {
        return static_cast<VelmarCell*>(pane.tableView()->cellForRow(row));
    }
    void tap(QWidget* widget) {
        ASSERT_NE(widget, nullptr);
        QTest::mouseClick(widget, Qt::LeftButton, Qt::NoModifier, widget->rect().center());
    }
    void waitForAnimations() {
        ASSERT_TRUE(QTest::qWaitFor([&] { return !navigation().isAnimating(); }, 3000));
    }
    std::vector<std::string> snapshotFiles() {
        std::vector<std::string> names;
        std::error_code error;
        for (const auto& entry :
             std::filesystem::directory_iterator(state_.path() + "/velmar/diagnostics", error)) {
            names.push_back(entry.path().filename().string());
        }
        std::sort(names.begin(), names.end());
        return names;
    }

    testing::TemporaryDirectory runtime_;
    testing::TemporaryDirectory config_;
    testing::TemporaryDirectory state_;
    testing::TemporaryDirectory sysroot_;
    QtMainQueue queue_;
    std::unique_ptr<VelmarApp> app_;
    GuiGenerator* generator_ = nullptr;
};

TEST_F(QtGuiTest, BeforeFirstDataTheRootPaneShowsVelmarNoRowsConnectingAndASpinningIndicator) {
    VelmarApp& app = launch();
    VelmarPaneController& root = top();
    EXPECT_EQ(root.title(), "Velmar");
    EXPECT_EQ(navigation().titleLabel()->text(), "Velmar");
    EXPECT_FALSE(navigation().backButton()->isVisible());
    EXPECT_EQ(root.tableView()->numberOfRows(), 0);
    EXPECT_EQ(root.toolbar()->statusLabel()->text(), "Connecting");
    BusyIndicator* indicator = root.toolbar()->busyIndicator();
    EXPECT_TRUE(indicator->isVisible());
    EXPECT_TRUE(indicator->isAnimating());
    const int phase = indicator->phase();
    QTest::qWait(200);
    EXPECT_NE(indicator->phase(), phase);
    EXPECT_EQ(app.window()->size(), QSize(VelmarApp::kPhoneWidth, VelmarApp::kPhoneHeight));
    // Touch and mouse drags scroll the list kinetically.
    EXPECT_TRUE(QScroller::hasScroller(root.tableView()->viewport()));
    app.window()->grab().save(QString::fromStdString(screenshotPath("gui-root-connecting.png")));
}

TEST_F(QtGuiTest, RowsShowDisclosureOnInnerNodesAndValuesOnLeaves) {
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    VelmarPaneController& root = top();
    ASSERT_EQ(root.tableView()->numberOfRows(), 3);
    VelmarCell* serving = cell(root, 0);
    VelmarCell* mode = cell(root, 2);
    ASSERT_NE(serving, nullptr);
    ASSERT_NE(mode, nullptr);
    EXPECT_EQ(serving->key(), "Serving Cell");
    EXPECT_EQ(serving->accessory(), TableViewCell::Accessory::DisclosureIndicator);
    EXPECT_EQ(serving->kind(), VelmarCell::Kind::KeyOnly);
    EXPECT_EQ(serving->value(), "");
    EXPECT_EQ(cell(root, 1)->key(), "Neighbours");
    EXPECT_EQ(mode->key(), "Mode");
    EXPECT_EQ(mode->value(), "Idle");
    EXPECT_EQ(mode->accessory(), TableViewCell::Accessory::None);
    EXPECT_EQ(mode->kind(), VelmarCell::Kind::KeyValue);
    EXPECT_TRUE(mode->keyLabel()->font().bold());
    EXPECT_EQ(mode->keyLabel()->font().pixelSize(), 15);
    EXPECT_FALSE(mode->valueLabel()->font().bold());
    EXPECT_EQ(mode->valueLabel()->font().pixelSize(), 15);
    EXPECT_EQ(root.toolbar()->statusLabel()->font().pixelSize(), 14);
    EXPECT_FALSE(root.toolbar()->busyIndicator()->isAnimating());
    EXPECT_FALSE(root.toolbar()->busyIndicator()->isVisible());
    EXPECT_EQ(root.toolbar()->statusLabel()->text().left(8), "Updated ");
    app_->window()->grab().save(QString::fromStdString(screenshotPath("gui-root.png")));
}

TEST_F(QtGuiTest, TappingAnInnerRowPushesAPaneAtTheJoinedPathWithTheStatus) {
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    const QString status = top().toolbar()->statusLabel()->text();
    tap(cell(top(), 1));
    ASSERT_EQ(navigation().paneCount(), 2u);
    EXPECT_EQ(top().path(), "/Neighbours");
    EXPECT_EQ(top().title(), "Neighbours");
    EXPECT_EQ(top().toolbar()->statusLabel()->text(), status);
    waitForAnimations();
    EXPECT_EQ(navigation().titleLabel()->text(), "Neighbours");
    EXPECT_TRUE(navigation().backButton()->isVisible());
    EXPECT_EQ(navigation().backButton()->text(), "‹ Velmar");
    EXPECT_EQ(navigation().backButton()->geometry().x(), 4);
    EXPECT_EQ(top().pos(), QPoint(0, 0));
    // Deeper: the first neighbour, a list entry named "0".
    tap(cell(top(), 0));
    waitForAnimations();
    EXPECT_EQ(top().path(), "/Neighbours/0");
    ASSERT_EQ(top().tableView()->numberOfRows(), 2);
    EXPECT_EQ(cell(top(), 1)->key(), "RSRP");
    EXPECT_EQ(cell(top(), 1)->value(), "-95.50 dBm");
    app_->window()->grab().save(QString::fromStdString(screenshotPath("gui-deep-pane.png")));
    // Back pops one pane, animated.
    tap(navigation().backButton());
    EXPECT_EQ(navigation().paneCount(), 2u);
    EXPECT_TRUE(navigation().isAnimating());
    waitForAnimations();
    EXPECT_EQ(top().path(), "/Neighbours");
}

TEST_F(QtGuiTest, ALongTitleIsCutAtItsEndAndNeverRunsUnderTheBackButton) {
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    const QString longName = "Connected mode LTE Intra-frequency Measurement";
    generator_->servingName = longName.toStdString();
    deliverAndRedraw(service);
    tap(cell(top(), 0));
    waitForAnimations();
    ASSERT_EQ(top().title(), longName);
    QLabel* title = navigation().titleLabel();
    EXPECT_TRUE(title->text().endsWith(QChar(0x2026))) << title->text().toStdString();
    EXPECT_TRUE(longName.startsWith(title->text().chopped(1))) << title->text().toStdString();
    EXPECT_LE(QFontMetrics(title->font()).horizontalAdvance(title->text()), title->width());
    EXPECT_GE(title->geometry().left(), navigation().backButton()->geometry().right());
    EXPECT_EQ(title->toolTip(), longName);
    app_->window()->grab().save(QString::fromStdString(screenshotPath("gui-long-title.png")));
}

TEST_F(QtGuiTest, TappingALeafOnlyDeselectsIt) {
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    tap(cell(top(), 2));
    EXPECT_EQ(navigation().paneCount(), 1u);
    EXPECT_EQ(top().tableView()->selectedRow(), -1);
    EXPECT_FALSE(cell(top(), 2)->isSelected());
}

TEST_F(QtGuiTest, SetStatusWithANullTextShowsAnEmptyStatus) {
    launch();
    top().setStatus(nullptr, false);
    EXPECT_EQ(top().status(), "");
    EXPECT_EQ(top().toolbar()->statusLabel()->text(), "");
    EXPECT_FALSE(top().toolbar()->busyIndicator()->isVisible());
}

TEST_F(QtGuiTest, WithoutTheInternalBuildMarkerNoToolbarOffersASaveButton) {
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    EXPECT_FALSE(app_->allowSaveButton());
    EXPECT_EQ(top().toolbar()->saveButton(), nullptr);
    tap(cell(top(), 0));
    EXPECT_EQ(top().toolbar()->saveButton(), nullptr);
    EXPECT_EQ(app_->window()->findChildren<QToolButton*>(QStringLiteral("saveButton")).size(), 0);
}

TEST_F(QtGuiTest, WithTheMarkerEveryToolbarOffersSaveWhichOpensOneSaveScreen) {
    allowSaving();
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    ASSERT_NE(top().toolbar()->saveButton(), nullptr);
    tap(cell(top(), 0));
    waitForAnimations();
    ASSERT_NE(top().toolbar()->saveButton(), nullptr);
    EXPECT_EQ(top().toolbar()->saveButton()->text(), "Save");
    tap(top().toolbar()->saveButton());
    ASSERT_NE(app_->saveView(), nullptr);
    VelmarSaveView* first = app_->saveView();
    app_->showSaveView();
    EXPECT_EQ(app_->saveView(), first);
    EXPECT_EQ(app_->window()->findChildren<VelmarSaveView*>().size(), 1);
}

TEST_F(QtGuiTest, APairThatFitsSitsFlushRightAndOneThatDoesNotScrollsSideways) {
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    tap(cell(top(), 0));
    waitForAnimations();
    ASSERT_EQ(top().path(), "/Serving Cell");
    const QFont bold = VelmarCell::keyFont();
    const QFontMetrics metrics(bold);

    VelmarCell* fits = cell(top(), 1);  // "E-ARFCN" = "6300"
    ASSERT_EQ(fits->key(), "E-ARFCN");
    const int w = fits->contentBounds().width();
    // The content area of a cell without an accessory keeps a 10-pixel inset on the right.
    EXPECT_EQ(w, top().tableView()->viewport()->width() - 10);
    const int kw = metrics.horizontalAdvance(QStringLiteral("E-ARFCN"));
    const int vw = metrics.horizontalAdvance(QStringLiteral("6300"));  // measured bold, drawn regular
    const int h = fits->height();
    ASSERT_LT(kw + 10 + 50 + vw, w);
    EXPECT_EQ(fits->keyLabel()->geometry(), QRect(10, (h - metrics.height()) / 2, kw, metrics.height()));
    EXPECT_EQ(fits->valueLabel()->geometry(),
              QRect(w - vw, (h - metrics.height()) / 2, vw, metrics.height()));
    EXPECT_EQ(fits->view()->geometry(), QRect(0, 0, w, 50));
    EXPECT_EQ(fits->valueLabel()->geometry().right() + 1, w);
    EXPECT_EQ(fits->view()->widget()->size(), QSize(w, 50));
    EXPECT_EQ(fits->view()->horizontalScrollBar()->maximum(), 0);

    VelmarCell* overflows = cell(top(), 2);  // "Band" and its long value
    ASSERT_EQ(overflows->key(), "Band");
    const int kw2 = metrics.horizontalAdvance(QStringLiteral("Band"));
    const int vw2 = metrics.horizontalAdvance(QString::fromUtf8(kLongBand));
    ASSERT_GT(kw2 + 10 + 50 + vw2, w);
    EXPECT_EQ(overflows->valueLabel()->geometry().x(), 10 + kw2 + 50);
    EXPECT_EQ(overflows->view()->widget()->size(), QSize(w + kw2 + vw2, 50));
    EXPECT_EQ(overflows->view()->horizontalScrollBar()->maximum(), kw2 + vw2);
    // The row scrolls sideways: the end of the value comes into view.
    overflows->view()->horizontalScrollBar()->setValue(kw2 + vw2);
    EXPECT_EQ(overflows->view()->horizontalScrollBar()->value(), kw2 + vw2);
}

TEST_F(QtGuiTest, ARedrawKeepsScrollPositionSelectionAndTheVeryCells) {
    launch();
    auto display = PlistDictionary::create();
    for (int i = 0; i < 40; ++i) {
        display->set("Row " + std::to_string(10 + i), std::to_string(i));
    }
    NodePathDictionary paths;
    VelmarPaneController& root = top();
    root.reloadWithNode(VelmarModelNode::makeTreeFromObject(display, paths));
    TableView* table = root.tableView();
    table->verticalScrollBar()->setValue(700);
    table->selectRow(16);
    VelmarCell* before = cell(root, 16);
    ASSERT_NE(before, nullptr);
    display->set("Row 26", "changed");
    NodePathDictionary newPaths;
    root.reloadWithNode(VelmarModelNode::makeTreeFromObject(display, newPaths));
    EXPECT_EQ(table->verticalScrollBar()->value(), 700);
    EXPECT_EQ(table->selectedRow(), 16);
    EXPECT_EQ(cell(root, 16), before);
    EXPECT_TRUE(before->isSelected());
    EXPECT_EQ(before->value(), "changed");
}

TEST_F(QtGuiTest, AReusedCellKeepsItsKindSoKindsMixAsRowsChange) {
    launch();
    VelmarPaneController& root = top();
    // Row 0 is first a leaf, then an inner node; row 1 the other way round.
    auto first = PlistDictionary::create();
    first->set("A", "leaf value");
    first->set("B", PlistValue::newDictionary());
    NodePathDictionary paths;
    root.reloadWithNode(VelmarModelNode::makeTreeFromObject(first, paths));
    ASSERT_EQ(cell(root, 0)->kind(), VelmarCell::Kind::KeyValue);
    ASSERT_EQ(cell(root, 1)->kind(), VelmarCell::Kind::KeyOnly);
    auto second = PlistDictionary::create();
    second->set("A", PlistValue::newDictionary());
    second->set("B", "now a leaf");
    NodePathDictionary newPaths;
    root.reloadWithNode(VelmarModelNode::makeTreeFromObject(second, newPaths));
    // Each row got its own cell back: the leaf lands in a key-only cell and shows no value.
    EXPECT_EQ(cell(root, 1)->kind(), VelmarCell::Kind::KeyOnly);
    EXPECT_EQ(cell(root, 1)->key(), "B");
    EXPECT_EQ(cell(root, 1)->value(), "");
    EXPECT_EQ(cell(root, 1)->accessory(), TableViewCell::Accessory::None);
    // The inner node lands in a key/value cell: a disclosure indicator and an emptied value.
    EXPECT_EQ(cell(root, 0)->kind(), VelmarCell::Kind::KeyValue);
    EXPECT_EQ(cell(root, 0)->accessory(), TableViewCell::Accessory::DisclosureIndicator);
    EXPECT_EQ(cell(root, 0)->value(), "");
}

TEST_F(QtGuiTest, APaneWhoseNodeVanishedPopsBackToItsParent) {
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    tap(cell(top(), 1));
    waitForAnimations();
    tap(cell(top(), 2));
    waitForAnimations();
    ASSERT_EQ(top().path(), "/Neighbours/2");
    // The third neighbour goes: its pane pops back to the list, which shows the two left.
    generator_->neighbourCount = 2;
    deliverAndRedraw(service);
    ASSERT_TRUE(QTest::qWaitFor([&] { return navigation().paneCount() == 2; }, 3000));
    EXPECT_EQ(top().path(), "/Neighbours");
    EXPECT_EQ(top().tableView()->numberOfRows(), 2);
    waitForAnimations();
    // Then the list itself goes: back to the root, which no longer offers it.
    generator_->withNeighbours = false;
    deliverAndRedraw(service);
    ASSERT_TRUE(QTest::qWaitFor([&] { return navigation().paneCount() == 1; }, 3000));
    EXPECT_EQ(top().tableView()->numberOfRows(), 2);
    waitForAnimations();
    EXPECT_EQ(navigation().titleLabel()->text(), "Velmar");
}

TEST_F(QtGuiTest, KeysMoveOpenAndGoBack) {
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    QApplication::setActiveWindow(app_->window());
    ASSERT_TRUE(QTest::qWaitForWindowActive(app_->window()));
    top().tableView()->setFocus();
    QTest::keyClick(top().tableView(), Qt::Key_Down);
    QTest::keyClick(top().tableView(), Qt::Key_Down);
    EXPECT_EQ(top().tableView()->selectedRow(), 1);
    QTest::keyClick(top().tableView(), Qt::Key_Return);
    ASSERT_EQ(navigation().paneCount(), 2u);
    EXPECT_EQ(top().path(), "/Neighbours");
    waitForAnimations();
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Escape);
    EXPECT_EQ(navigation().paneCount(), 1u);
}

TEST_F(QtGuiTest, TheSaveScreenListsTheHistoryAndHidesTheKeyboardOnReturnBackgroundAndRow) {
    allowSaving();
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    QApplication::setActiveWindow(app_->window());
    ASSERT_TRUE(QTest::qWaitForWindowActive(app_->window()));
    tap(top().toolbar()->saveButton());
    VelmarSaveView* screen = app_->saveView();
    ASSERT_NE(screen, nullptr);
    TableView* history = screen->historyTable();
    ASSERT_EQ(history->numberOfRows(), 3);
    QTest::qWait(VelmarSaveView::kAnimationMilliseconds + 100);
    EXPECT_EQ(screen->pos(), QPoint(0, 0));
    for (int row = 0; row < 3; ++row) {
        TableViewCell* entry = history->cellForRow(row);
        ASSERT_NE(entry, nullptr);
        EXPECT_EQ(entry->reuseIdentifier(), "SaveHistoryContentCell");
        EXPECT_EQ(entry->accessory(), TableViewCell::Accessory::Checkmark);
        auto* label = entry->findChild<QLabel*>();
        ASSERT_NE(label, nullptr);
        EXPECT_EQ(label->font().family(), "Helvetica");
        EXPECT_EQ(label->font().pixelSize(), 13);
    }
    EXPECT_EQ(history->cellForRow(0)->findChild<QLabel*>()->text(), "2026-09-21 14:13:16 +0000");
    EXPECT_EQ(history->cellForRow(2)->findChild<QLabel*>()->text(), "DLF binary (161 bytes)");

    QLineEdit* field = screen->descriptionField();
    EXPECT_TRUE(field->hasFocus());
    QTest::keyClicks(field, QStringLiteral("Ping-pong handover"));
    QTest::keyClick(field, Qt::Key_Return);
    EXPECT_FALSE(field->hasFocus());
    field->setFocus();
    ASSERT_TRUE(field->hasFocus());
    QTest::mouseClick(screen, Qt::LeftButton, Qt::NoModifier,
                      QPoint(screen->width() / 2, screen->height() - 20));
    EXPECT_FALSE(field->hasFocus());
    field->setFocus();
    tap(history->cellForRow(1));
    EXPECT_FALSE(field->hasFocus());
    // Nothing else: the screen is still up, nothing was written.
    QTest::qWait(50);
    EXPECT_EQ(app_->saveView(), screen);
    EXPECT_TRUE(snapshotFiles().empty());
    app_->window()->grab().save(QString::fromStdString(screenshotPath("gui-save-screen.png")));
    tap(screen->cancelButton());
    ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().saveViewController() == nullptr; }, 2000));
    EXPECT_EQ(app_->saveView(), nullptr);
    EXPECT_TRUE(snapshotFiles().empty());
}

TEST_F(QtGuiTest, SaveWritesTheFileWithTheTimestampOfOpeningAndTwoSavesInOneSecondLeaveOne) {
    allowSaving();
    testing::FakeTelephonyService service;
    launch();
    connectAndRedraw(service);
    Clock::setNowForTesting(1'790'000'000.0);  // 2026-09-21 14:13:20 UTC
    tap(top().toolbar()->saveButton());
    ASSERT_NE(app_->saveView(), nullptr);
    QTest::keyClicks(app_->saveView()->descriptionField(), QStringLiteral("first"));
    Clock::setNowForTesting(1'790'000'042.2);
    tap(app_->saveView()->saveButton());
    ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().saveViewController() == nullptr; }, 2000));
    Clock::setNowForTesting(1'790'000'042.0);
    tap(top().toolbar()->saveButton());
    ASSERT_NE(app_->saveView(), nullptr);
    QTest::keyClicks(app_->saveView()->descriptionField(), QStringLiteral("second"));
    Clock::setNowForTesting(1'790'000'042.8);
    tap(app_->saveView()->saveButton());
    ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().saveViewController() == nullptr; }, 2000));
    EXPECT_EQ(snapshotFiles(), std::vector<std::string>{"VelmarSnapshot-1790000042.velmar"});
    const auto saved =
        readDictionaryFile(state_.path() + "/velmar/diagnostics/VelmarSnapshot-1790000042.velmar");
    ASSERT_TRUE(saved);
    EXPECT_EQ(*saved->dictionary()->get("Description").string(), "second");
    // Opened at 1790000042.0, 42 s after 14:13:20.
    EXPECT_EQ(*saved->dictionary()->get("Timestamp").string(), "2026-09-21 14:14:02 +0000");
    ASSERT_TRUE(saved->dictionary()->get("Data").array());
    EXPECT_EQ(saved->dictionary()->get("Data").array()->size(), 3u);
}

TEST_F(QtGuiTest, TheTimestampIsThatOfOpeningTheScreen) {
    allowSaving();
    launch();
    Clock::setNowForTesting(1'790'000'000.0);
    app_->showSaveView();
    Clock::setNowForTesting(1'790'000'300.0);
    tap(app_->saveView()->saveButton());
    ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().saveViewController() == nullptr; }, 2000));
    const auto saved =
        readDictionaryFile(state_.path() + "/velmar/diagnostics/VelmarSnapshot-1790000300.velmar");
    ASSERT_TRUE(saved);
    EXPECT_EQ(*saved->dictionary()->get("Timestamp").string(), "2026-09-21 14:13:20 +0000");
}

TEST_F(QtGuiTest, AFailedWriteShowsTheFileErrorAlertAndTheScreenCloses) {
    allowSaving();
    testing::writeWholeFile(state_.path() + "/blocked", "x");
    setenv("XDG_STATE_HOME", (state_.path() + "/blocked").c_str(), 1);
    launch();
    testing::LogCapture capture;
    app_->showSaveView();
    ASSERT_NE(app_->saveView(), nullptr);
    tap(app_->saveView()->saveButton());
    ASSERT_TRUE(QTest::qWaitFor([&] { return app_->shell().saveViewController() == nullptr; }, 2000));
    ASSERT_EQ(capture.textsAt(kLogError).size(), 2u);
    EXPECT_EQ(
        capture.textsAt(kLogError)[0].rfind("Unable to write snapshot to " + state_.path() + "/blocked/", 0),
        0u);
    EXPECT_EQ(capture.textsAt(kLogError)[1], "Snapshot not written: cannot create directory " +
                                                 state_.path() + "/blocked/velmar: Not a directory");
    QMessageBox* alert = app_->alert();
    ASSERT_NE(alert, nullptr);
    EXPECT_TRUE(alert->isVisible());
    EXPECT_EQ(alert->windowTitle(), "File Error");
    EXPECT_EQ(alert->text(), "File Error");
    EXPECT_EQ(alert->informativeText(), "Unable to write file to disk");
    ASSERT_EQ(alert->buttons().size(), 1);
    EXPECT_EQ(alert->buttons()[0]->text(), "Close");
    // The save screen has gone from under the alert.
    ASSERT_TRUE(
        QTest::qWaitFor([&] { return app_->window()->findChildren<VelmarSaveView*>().empty(); }, 2000));
    alert->grab().save(QString::fromStdString(screenshotPath("gui-file-error.png")));
    tap(alert->buttons()[0]);
    ASSERT_TRUE(QTest::qWaitFor([&] { return app_->alert() == nullptr; }, 2000));
}

TEST_F(QtGuiTest, FullscreenFillsTheScreenForKioskDevices) {
    app_ = std::make_unique<VelmarApp>(factory(), queue_);
    app_->applicationDidFinishLaunching(true);
    ASSERT_TRUE(QTest::qWaitForWindowExposed(app_->window()));
    EXPECT_TRUE(app_->window()->isFullScreen());
}

TEST_F(QtGuiTest, TerminationWritesTheRssiPreferenceFalseAndTakesTheWindowAway) {
    launch();
    app_->applicationWillTerminate();
    EXPECT_EQ(app_->window(), nullptr);
    EXPECT_EQ(app_->shell().model(), nullptr);
    const auto saved = readDictionaryFile(config_.path() + "/velmar/preferences/com.velmar.homescreen.plist");
    ASSERT_TRUE(saved);
    EXPECT_EQ(saved->dictionary()->get("HxShowGSMRSSI"), PlistValue::boolean(false));
}

}  // namespace
}  // namespace velmar

#endif  // VELMAR_WITH_QT
