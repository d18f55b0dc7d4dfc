// The terminal chart without a terminal: the chart view drawn onto canvases in memory from a value history,
// and the front end's c key, zoom and way back on a fake service.
#ifdef VELMAR_WITH_TERMINAL

#include <gtest/gtest.h>

#include <algorithm>
#include <clocale>
#include <cstdlib>
#include <map>

#include "core/ArrayLock.h"
#include "core/platform/Clock.h"
#include "core/platform/StringFormat.h"
#include "tests/support/FakeTelephonyService.h"
#include "tests/support/TestPaths.h"
#include "tests/ui/TerminalFrame.h"
#include "ui/terminal/TerminalChartView.h"
#include "ui/terminal/TerminalFrontEnd.h"

namespace velmar {
namespace {

// 2026-09-22 14:03:20 UTC.
constexpr double kEnd = 1790085800.0;

std::string spaces(int count) {
    return std::string(static_cast<std::size_t>(count), ' ');
}

class TerminalChartTest : public ::testing::Test {
  protected:
    void SetUp() override {
        ASSERT_NE(std::setlocale(LC_CTYPE, "C.UTF-8"), nullptr);
        setenv("TZ", "UTC", 1);
        tzset();
    }
    void TearDown() override { std::setlocale(LC_CTYPE, "C"); }

    // "/Cell/RSRP" sampled every 2 s over the last five minutes: a ramp from -110 dBm up to -80 dBm.
    void sampleRamp() {
        for (int tick = 0; tick <= 150; ++tick) {
            auto cell = PlistDictionary::create();
            cell->set("RSRP", stringWithFormat("%.2f dBm", -110.0 + 0.2 * tick));
            auto root = PlistDictionary::create();
            root->set("Cell", cell);
            NodePathDictionary paths;
            VelmarModelNode::makeTreeFromObject(root, paths);
            history_.sample(paths, kEnd - 300.0 + 2.0 * tick);
        }
    }
    TerminalChart chart(const std::string& value = "-80.00 dBm") {
        return TerminalChart("/Cell/RSRP", std::make_shared<VelmarModelLeafNode>("RSRP", value));
    }

    ValueHistory history_;
};

bool isBraille(char32_t ch) {
    return ch > 0x2800 && ch <= 0x28FF;
}

TEST_F(TerminalChartTest, TitleSummaryAxesAndTheLineInBraille) {
    sampleRamp();
    TerminalChart shown = chart();
    shown.setStatus("Updated 2026-09-22 at 14:03:20", false);
    TerminalCanvas canvas(16, 80, false);
    TerminalChartView::draw(canvas, shown, history_.series("/Cell/RSRP"), history_.newestTime(), {0, false});
    EXPECT_EQ(canvas.rowText(0), " RSRP" + spaces(64) + "-80.00 dBm ");
    EXPECT_TRUE(canvas.at(0, 1).attr & kAttrReverse);
    EXPECT_TRUE(canvas.at(0, 1).attr & kAttrBold);
    EXPECT_EQ(canvas.rowText(1), " min -110.00 dBm   max -80.00 dBm   last 10 min" + spaces(33));
    // Twelve plot lines (2..13), the axis in column 5, labels every 10 dB from -80 down to -110.
    const std::map<int, std::string> labelRows = {
        {2, "  -80┤"}, {6, "  -90┤"}, {9, " -100┤"}, {13, " -110┤"}};
    for (int row = 2; row <= 13; ++row) {
        const auto label = labelRows.find(row);
        const std::string text = canvas.rowText(row);
        if (label != labelRows.end()) {
            EXPECT_EQ(text.substr(0, label->second.size()), label->second) << row;
        } else {
            EXPECT_EQ(text.substr(0, 8), "     │") << row;
        }
    }
    // The ramp fills the right half of the ten minutes, rising from the bottom line to the top one.
    int firstColumn = 80;
    int lastColumn = 0;
    for (int row = 2; row <= 13; ++row) {
        for (int column = 6; column < 80; ++column) {
            if (isBraille(canvas.at(row, column).ch)) {
                firstColumn = std::min(firstColumn, column);
                lastColumn = std::max(lastColumn, column);
            }
        }
    }
    EXPECT_NEAR(firstColumn, 6 + 73 / 2, 1);
    EXPECT_EQ(lastColumn, 78);
    EXPECT_TRUE(isBraille(canvas.at(13, firstColumn).ch));
    EXPECT_TRUE(isBraille(canvas.at(2, 78).ch));
    EXPECT_EQ(canvas.at(2, firstColumn).ch, U' ');
    EXPECT_EQ(canvas.at(13, 78).ch, U' ');
    // Round clock times under the plot, two minutes apart in a ten-minute span.
    const std::string times = canvas.rowText(14);
    std::size_t previous = 0;
    for (const char* time : {"13:54", "13:56", "13:58", "14:00", "14:02"}) {
        const std::size_t at = times.find(time);
        ASSERT_NE(at, std::string::npos) << time << " in " << times;
        EXPECT_GT(at, previous);
        previous = at;
    }
    EXPECT_EQ(canvas.rowText(15),
              "   Updated 2026-09-22 at 14:03:20" + spaces(14) + "[+/-] Zoom  [Esc] Back  [q] Quit ");
}

TEST_F(TerminalChartTest, AsciiTerminalsGetStarsAndPlainAxes) {
    sampleRamp();
    TerminalChart shown = chart();
    TerminalCanvas canvas(16, 60, true);
    TerminalChartView::draw(canvas, shown, history_.series("/Cell/RSRP"), history_.newestTime(), {0, false});
    int stars = 0;
    for (int row = 0; row < 16; ++row) {
        const std::string text = canvas.rowText(row);
        for (const char c : text) {
            ASSERT_GE(static_cast<unsigned char>(c), 0x20) << row;
            ASSERT_LT(static_cast<unsigned char>(c), 0x7F) << row << ": " << text;
        }
        stars += static_cast<int>(std::count(text.begin(), text.end(), '*'));
    }
    EXPECT_GT(stars, 20);
    EXPECT_EQ(canvas.rowText(2).substr(0, 6), "  -80+");
    EXPECT_EQ(canvas.rowText(3).substr(0, 6), "     |");
}

TEST_F(TerminalChartTest, ZoomStepsAndTheSpanShown) {
    sampleRamp();
    TerminalChart shown = chart();
    shown.zoomIn();
    EXPECT_EQ(shown.spanSeconds(), 300.0);
    shown.zoomIn();
    shown.zoomIn();
    shown.zoomIn();
    EXPECT_EQ(shown.spanSeconds(), 60.0);
    TerminalCanvas canvas(16, 60, false);
    TerminalChartView::draw(canvas, shown, history_.series("/Cell/RSRP"), history_.newestTime(), {0, false});
    // The last minute: -86 up to -80, printed as the pane prints them, and its times to the second.
    EXPECT_EQ(canvas.rowText(1), " min -86.00 dBm   max -80.00 dBm   last 1 min" + spaces(15));
    EXPECT_NE(canvas.rowText(14).find("14:03:00"), std::string::npos) << canvas.rowText(14);
    shown.zoomOut(3600.0);
    shown.zoomOut(3600.0);
    EXPECT_EQ(shown.spanSeconds(), 300.0);
    for (int i = 0; i < 10; ++i) {
        shown.zoomOut(1800.0);
    }
    EXPECT_EQ(shown.spanSeconds(), 1800.0);
}

TEST_F(TerminalChartTest, NoSamplesASmallTerminalAndWildValuesDrawSafely) {
    TerminalChart shown = chart("Not Present");
    TerminalCanvas canvas(16, 60, false);
    TerminalChartView::draw(canvas, shown, nullptr, 0.0, {0, false});
    EXPECT_EQ(canvas.rowText(1), " no values in the last 10 min" + spaces(31));
    // Too small for a plot: title, summary and footer only.
    sampleRamp();
    for (const auto& [rows, columns] : {std::pair{1, 1}, {2, 10}, {3, 80}, {6, 80}, {24, 12}, {40, 300}}) {
        TerminalCanvas small(rows, columns, false);
        TerminalChartView::draw(small, shown, history_.series("/Cell/RSRP"), history_.newestTime(),
                                {0, false});
        EXPECT_EQ(small.rows(), rows);
    }
    // Values far apart and a step of the clock far back leave the drawing inside the canvas.
    ValueHistory wild;
    for (int tick = 0; tick < 40; ++tick) {
        auto root = PlistDictionary::create();
        root->set("V", tick % 2 ? "999999999999999" : "-999999999999999");
        NodePathDictionary paths;
        VelmarModelNode::makeTreeFromObject(root, paths);
        wild.sample(paths, 1000.0 + 100.0 * tick);
    }
    TerminalChart far("/V", std::make_shared<VelmarModelLeafNode>("V", "1"));
    TerminalCanvas big(30, 100, false);
    TerminalChartView::draw(big, far, wild.series("/V"), wild.newestTime(), {0, false});
    EXPECT_EQ(big.rowText(1).substr(0, 25), " min -999999999999999   m");
}

// The front end with a fake service whose display has a level, a plain number and a name.
class LevelsGenerator : public MonitorGenerator {
  public:
    void updateState(const PlistDictionaryRef&, ByteView) override { ++blobs; }
    PlistValue generateLogUsingState(const PlistDictionaryRef&) override {
        auto cell = PlistDictionary::create();
        cell->set("RSRP", std::to_string(-100 + blobs) + ".00 dBm");
        cell->set("PCI", "101");
        cell->set("Bandwidth", "10 MHz");
        auto root = PlistDictionary::create();
        if (withCell) {
            root->set("Cell", cell);
        }
        root->set("Mode", "Idle");
        return root;
    }
    PlistValue getStartCommand() override {
        auto command = PlistDictionary::create();
        command->set("SetState", "Streaming");
        return command;
    }
    PlistValue getSaveContentsFromState(const PlistDictionaryRef&) override { return PlistValue::newArray(); }
    int blobs = 0;
    bool withCell = true;
};

class TerminalChartFrontEndTest : public TerminalChartTest {
  protected:
    void SetUp() override {
        TerminalChartTest::SetUp();
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        setenv("XDG_CONFIG_HOME", config_.path().c_str(), 1);
        setenv("XDG_STATE_HOME", state_.path().c_str(), 1);
        unsetenv("VELMAR_SYSROOT");
    }
    void TearDown() override {
        Clock::setNowForTesting(std::nullopt);
        ArrayLock::releaseOutstandingForTesting();
        TerminalChartTest::TearDown();
    }
    GeneratorFactory factory() {
        return [this](std::string_view) -> std::unique_ptr<MonitorGenerator> {
            auto generator = std::make_unique<LevelsGenerator>();
            generator_ = generator.get();
            return generator;
        };
    }
    // One blob, one tick 2 s after the previous, and its redraw.
    void tick(TerminalFrontEnd& frontEnd, testing::FakeTelephonyService& service) {
        const int before = generator_ ? generator_->blobs : 0;
        service.sendBlob(PlistData(20, 1));
        ASSERT_TRUE(frontEnd.queue().runUntil([&] { return generator_ && generator_->blobs > before; }, 5.0));
        now_ += 2.0;
        Clock::setNowForTesting(now_);
        const double newest = frontEnd.shell().model()->history().newestTime();
        frontEnd.shell().model()->refresh();
        ASSERT_TRUE(frontEnd.queue().runUntil(
            [&] { return frontEnd.shell().model()->history().newestTime() > newest; }, 5.0));
    }
    std::vector<std::string> frame(TerminalFrontEnd& frontEnd, int rows = 12, int columns = 60) {
        return testing::terminalFrame(frontEnd, rows, columns);
    }

    testing::TemporaryDirectory runtime_;
    testing::TemporaryDirectory config_;
    testing::TemporaryDirectory state_;
    LevelsGenerator* generator_ = nullptr;
    double now_ = kEnd;
};

TEST_F(TerminalChartFrontEndTest, COnANumberOpensItsLiveChartAndEscLeftOrBackspaceGoBack) {
    testing::FakeTelephonyService service;
    TerminalFrontEnd frontEnd(factory());
    frontEnd.launch();
    ASSERT_TRUE(frontEnd.queue().runUntil([&] { return frontEnd.shell().model()->isConnected(); }, 5.0));
    Clock::setNowForTesting(now_);
    for (int i = 0; i < 3; ++i) {
        tick(frontEnd, service);
    }
    using Kind = TerminalKey::Kind;
    frontEnd.handleKey(TerminalKey::of(Kind::Enter));  // "Cell"
    ASSERT_EQ(frontEnd.topPane().path(), "/Cell");
    // Rows in order: RSRP, PCI, Bandwidth. A name from a table has no chart and no key for one.
    EXPECT_NE(frame(frontEnd)[11].find("[c] Chart  [q] Quit"), std::string::npos) << frame(frontEnd)[11];
    frontEnd.handleKey(TerminalKey::of(Kind::End));
    EXPECT_EQ(frame(frontEnd)[11].find("[c] Chart"), std::string::npos);
    frontEnd.handleKey(TerminalKey::character(U'c'));
    EXPECT_EQ(frontEnd.chart(), nullptr);
    frontEnd.handleKey(TerminalKey::of(Kind::Home));
    frontEnd.handleKey(TerminalKey::character(U'c'));
    ASSERT_NE(frontEnd.chart(), nullptr);
    EXPECT_EQ(frontEnd.paneCount(), 3u);
    EXPECT_EQ(frontEnd.chart()->path(), "/Cell/RSRP");
    EXPECT_EQ(frontEnd.chart()->status().rfind("Updated ", 0), 0u);
    std::vector<std::string> lines = frame(frontEnd);
    EXPECT_EQ(lines[0], " RSRP" + spaces(44) + "-97.00 dBm ");
    EXPECT_EQ(lines[1], " min -99.00 dBm   max -97.00 dBm   last 10 min" + spaces(14));
    // Live: the next redraw brings the new value and sample.
    tick(frontEnd, service);
    lines = frame(frontEnd);
    EXPECT_EQ(lines[0], " RSRP" + spaces(44) + "-96.00 dBm ");
    EXPECT_EQ(lines[1], " min -99.00 dBm   max -96.00 dBm   last 10 min" + spaces(14));
    // + and - zoom; the pane keys do nothing here.
    frontEnd.handleKey(TerminalKey::character(U'+'));
    EXPECT_EQ(frontEnd.chart()->spanSeconds(), 300.0);
    frontEnd.handleKey(TerminalKey::character(U'-'));
    frontEnd.handleKey(TerminalKey::character(U'-'));
    EXPECT_EQ(frontEnd.chart()->spanSeconds(), 1200.0);
    frontEnd.handleKey(TerminalKey::of(Kind::Down));
    EXPECT_NE(frontEnd.chart(), nullptr);
    // Each way back closes the chart and keeps the pane's cursor.
    for (const Kind back : {Kind::Escape, Kind::Left, Kind::Backspace}) {
        ASSERT_NE(frontEnd.chart(), nullptr);
        frontEnd.handleKey(TerminalKey::of(back));
        EXPECT_EQ(frontEnd.chart(), nullptr);
        EXPECT_EQ(frontEnd.paneCount(), 2u);
        EXPECT_EQ(frontEnd.topPane().path(), "/Cell");
        EXPECT_EQ(frontEnd.topPane().selectedRow(), 0);
        frontEnd.handleKey(TerminalKey::character(U'c'));
    }
    // The value's path gone from the tree: the chart closes with its pane.
    generator_->withCell = false;
    tick(frontEnd, service);
    EXPECT_EQ(frontEnd.chart(), nullptr);
    EXPECT_EQ(frontEnd.paneCount(), 1u);
    frontEnd.terminate();
}

}  // namespace
}  // namespace velmar

#endif  // VELMAR_WITH_TERMINAL
