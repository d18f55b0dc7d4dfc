// The terminal interface without a terminal: text widths, the canvas, pane drawing, and the front end's keys,
// drawn onto canvases in memory.
#ifdef VELMAR_WITH_TERMINAL

#include <gtest/gtest.h>

#include <clocale>
#include <cstdlib>
#include <filesystem>

#include "core/ArrayLock.h"
#include "core/platform/Clock.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "tests/support/FakeTelephonyService.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"
#include "tests/ui/TerminalFrame.h"
#include "ui/terminal/TerminalCanvas.h"
#include "ui/terminal/TerminalFrontEnd.h"
#include "ui/terminal/TerminalPaneView.h"
#include "ui/terminal/TerminalText.h"

namespace velmar {
namespace {

class Utf8Locale : public ::testing::Test {
  protected:
    void SetUp() override { ASSERT_NE(std::setlocale(LC_CTYPE, "C.UTF-8"), nullptr); }
    void TearDown() override { std::setlocale(LC_CTYPE, "C"); }
};

// {"Cell": {"PCI": "101", "Band": "LTE Band 20 (800 MHz)"}, "Neighbours": ["-98 dBm", "-101 dBm"], "Mode":
// "Idle"}
PlistValue sampleDisplay(bool withNeighbours = true) {
    auto cell = PlistDictionary::create();
    cell->set("PCI", "101");
    cell->set("Band", "LTE Band 20 (800 MHz)");
    auto display = PlistDictionary::create();
    display->set("Cell", cell);
    if (withNeighbours) {
        auto neighbours = PlistArray::create();
        neighbours->append("-98 dBm");
        neighbours->append("-101 dBm");
        display->set("Neighbours", neighbours);
    }
    display->set("Mode", "Idle");
    return display;
}

VelmarModelNodeRef sampleTree(bool withNeighbours = true) {
    NodePathDictionary paths;
    return VelmarModelNode::makeTreeFromObject(sampleDisplay(withNeighbours), paths);
}

VelmarModelNodeRef childNamed(const VelmarModelNodeRef& node, const std::string& name) {
    for (const auto& child : *node->childNodes()) {
        if (child->displayName() == name) {
            return child;
        }
    }
    return nullptr;
}

std::string spaces(int count) {
    return std::string(static_cast<std::size_t>(count), ' ');
}

// The text of columns [from, to) of a canvas row.
std::string columnsOf(const TerminalCanvas& canvas, int row, int from, int to) {
    std::u32string text;
    for (int column = from; column < to; ++column) {
        if (!canvas.at(row, column).continuation) {
            text.push_back(canvas.at(row, column).ch);
        }
    }
    return TerminalText::encodeUtf8(text);
}

using TerminalTextTest = Utf8Locale;

TEST_F(TerminalTextTest, DecodesUtf8AndReplacesWhatCannotBeShown) {
    EXPECT_EQ(TerminalText::decodeUtf8("a›b"), std::u32string(U"a›b"));
    // A lone continuation byte, a truncated sequence, an overlong slash and a control character.
    EXPECT_EQ(TerminalText::decodeUtf8("\x80x\xE2\x80"), std::u32string(U"\uFFFDx\uFFFD\uFFFD"));
    EXPECT_EQ(TerminalText::decodeUtf8("\xC0\xAF"), std::u32string(U"\uFFFD\uFFFD"));
    EXPECT_EQ(TerminalText::decodeUtf8("a\x1b[2Jb"), std::u32string(U"a\uFFFD[2Jb"));
    EXPECT_EQ(TerminalText::encodeUtf8(U"Zürich ✓ 漢"), "Zürich ✓ 漢");
}

TEST_F(TerminalTextTest, WidthsCountColumns) {
    EXPECT_EQ(TerminalText::width("Filtered RSRP", false), 13);
    EXPECT_EQ(TerminalText::width("›", false), 1);
    EXPECT_EQ(TerminalText::width("漢字", false), 4);
    // An ASCII terminal shows one "?" per character it cannot show.
    EXPECT_EQ(TerminalText::width("漢字", true), 2);
    EXPECT_EQ(TerminalText::displayed(U'漢', true), U'?');
}

using TerminalCanvasTest = Utf8Locale;

TEST_F(TerminalCanvasTest, ClipsTextThatStartsLeftOfTheClipAndCutsWideCharactersToSpaces) {
    TerminalCanvas canvas(2, 10, false);
    EXPECT_EQ(canvas.put(0, -3, U"abcdefghijklmn", kAttrNormal, 0, 10), 11);
    EXPECT_EQ(canvas.rowText(0), "defghijklm");
    // "漢" at columns 8-9 fits; "字" at 10-11 is outside; with the clip at 9, "漢" is cut to a space.
    canvas.put(1, 0, U"ab      漢字", kAttrNormal, 0, 10);
    EXPECT_EQ(canvas.rowText(1), "ab      漢");
    EXPECT_TRUE(canvas.at(1, 9).continuation);
    canvas.put(1, 0, U"ab      漢字", kAttrNormal, 0, 9);
    EXPECT_EQ(canvas.rowText(1), "ab        ");
    // Nothing is drawn outside the canvas.
    canvas.put(5, 0, U"x", kAttrNormal, 0, 10);
    canvas.put(-1, 0, U"x", kAttrNormal, 0, 10);
    canvas.fill(0, -5, 50, kAttrBold, U'=');
    EXPECT_EQ(canvas.rowText(0), "==========");
}

TEST_F(TerminalCanvasTest, RowsCompareByCharactersAndAttributes) {
    TerminalCanvas first(2, 6, false);
    TerminalCanvas second(2, 6, false);
    first.put(0, 0, "abc", kAttrNormal);
    second.put(0, 0, "abc", kAttrNormal);
    EXPECT_TRUE(first.rowEquals(second, 0));
    second.put(0, 0, "abc", kAttrReverse);
    EXPECT_FALSE(first.rowEquals(second, 0));
    EXPECT_TRUE(first.rowEquals(second, 1));
}

using TerminalPaneViewTest = Utf8Locale;

TEST_F(TerminalPaneViewTest, RootPaneBeforeDataHasTheTitleVelmarNoRowsAndTheSpinner) {
    TerminalPane pane("/");
    pane.setStatus("Connecting", true);
    TerminalCanvas canvas(6, 40, false);
    TerminalPaneView::draw(canvas, pane, {0, false});
    EXPECT_EQ(canvas.rowText(0), " Velmar" + spaces(31) + "/ ");
    for (int row = 1; row < 5; ++row) {
        EXPECT_EQ(canvas.rowText(row), spaces(40)) << row;
    }
    EXPECT_EQ(canvas.rowText(5), " ⠋ Connecting" + spaces(18) + "[q] Quit ");
    EXPECT_TRUE(canvas.at(0, 1).attr & kAttrReverse);
    EXPECT_TRUE(canvas.at(0, 1).attr & kAttrBold);
    // The next frame turns the spinner.
    TerminalPaneView::draw(canvas, pane, {1, false});
    EXPECT_EQ(canvas.rowText(5), " ⠙ Connecting" + spaces(18) + "[q] Quit ");
}

TEST_F(TerminalPaneViewTest, InnerRowsShowTheirMarkAndLeavesTheirValueFlushRight) {
    TerminalPane root("/", sampleTree());
    root.setStatus("Updated 2026-09-21 at 14:13:20", false);
    TerminalCanvas canvas(6, 40, false);
    TerminalPaneView::draw(canvas, root, {0, true});
    EXPECT_EQ(canvas.rowText(1), " Cell" + spaces(33) + "› ");
    EXPECT_EQ(canvas.rowText(2), " Neighbours" + spaces(27) + "› ");
    // "Mode" 4 + 1 + 2 + "Idle" 4 = 11 < 40: the value ends in the last column.
    EXPECT_EQ(canvas.rowText(3), " Mode" + spaces(31) + "Idle");
    EXPECT_EQ(canvas.rowText(4), spaces(40));
    // No spinner while connected; the keys give way to the status where both do not fit.
    EXPECT_EQ(canvas.rowText(5), "   Updated 2026-09-21 at 14:13:20" + spaces(7));
    // The cursor row (the first) is in reverse video, the others are not.
    EXPECT_TRUE(canvas.at(1, 20).attr & kAttrReverse);
    EXPECT_FALSE(canvas.at(2, 20).attr & kAttrReverse);
}

TEST_F(TerminalPaneViewTest, TheSaveKeyIsShownWhereOfferedAndRoomAllows) {
    TerminalPane root("/", sampleTree());
    root.setStatus("Updated 2026-09-21 at 14:13:20", false);
    TerminalCanvas wide(4, 80, false);
    TerminalPaneView::draw(wide, root, {0, true});
    EXPECT_EQ(wide.rowText(3), "   Updated 2026-09-21 at 14:13:20" + spaces(28) + "[s] Save  [q] Quit ");
    TerminalPaneView::draw(wide, root, {0, false});
    EXPECT_EQ(wide.rowText(3), "   Updated 2026-09-21 at 14:13:20" + spaces(38) + "[q] Quit ");
}

TEST_F(TerminalPaneViewTest, TitleLineShowsTheTitleAndThePathCutFromTheLeft) {
    TerminalPane pane("/Serving Cell/Serving Cell Info", childNamed(sampleTree(), "Cell"));
    TerminalCanvas canvas(3, 30, false);
    TerminalPaneView::draw(canvas, pane, {0, false});
    // " Cell" ends at column 5; the path gets 30 - 5 - 3 = 22 columns: "…" and its last 21 characters.
    EXPECT_EQ(canvas.rowText(0), " Cell  …ell/Serving Cell Info ");
}

TEST_F(TerminalPaneViewTest, ALongPairFollowsTheKeyAndScrollsSideways) {
    TerminalPane pane("/Cell", childNamed(sampleTree(), "Cell"));
    pane.setStatus("", false);
    TerminalCanvas wide(4, 40, false);
    TerminalPaneView::draw(wide, pane, {0, false});
    EXPECT_EQ(wide.rowText(1), " PCI" + spaces(33) + "101");
    // "Band" 4 + 1 + 2 + 21 = 28 < 40: flush right at 40 - 21 = 19.
    EXPECT_EQ(wide.rowText(2), " Band" + spaces(14) + "LTE Band 20 (800 MHz)");

    // 24 columns: 28 > 24, the value follows the key at 1 + 4 + 2 = 7 and "»" marks the hidden rest.
    TerminalCanvas narrow(4, 24, false);
    pane.selectRow(1);
    TerminalPaneView::draw(narrow, pane, {0, false});
    EXPECT_EQ(narrow.rowText(2), " Band  LTE Band 20 (800»");
    const VelmarModelNode& band = *pane.childAt(1);
    // Far enough for the value's end and one blank: 7 + 21 + 1 - 24 = 5.
    EXPECT_EQ(TerminalPaneView::maximumSideways(band, 24, false), 5);
    EXPECT_EQ(TerminalPaneView::maximumSideways(*pane.childAt(0), 24, false), 0);
    pane.setSideways(8, TerminalPaneView::maximumSideways(band, 24, false));
    EXPECT_EQ(pane.sideways(), 5);
    TerminalPaneView::draw(narrow, pane, {0, false});
    EXPECT_EQ(narrow.rowText(2), "« LTE Band 20 (800 MHz) ");
    EXPECT_TRUE(narrow.at(2, 5).attr & kAttrReverse);
    // Moving the cursor starts the next row unscrolled.
    pane.moveSelection(-1);
    EXPECT_EQ(pane.sideways(), 0);
}

TEST_F(TerminalPaneViewTest, AReloadKeepsTheCursorAndTheScrollPosition) {
    // Twelve rows, a list of five lines: the cursor on row 9 scrolls the list to start at row 5.
    auto display = PlistDictionary::create();
    for (int i = 0; i < 12; ++i) {
        display->set("Row " + std::to_string(10 + i), std::to_string(i));
    }
    NodePathDictionary paths;
    TerminalPane pane("/", VelmarModelNode::makeTreeFromObject(display, paths));
    pane.selectRow(9);
    TerminalCanvas canvas(7, 30, false);
    TerminalPaneView::draw(canvas, pane, {0, false});
    EXPECT_EQ(pane.topRow(), 5);
    EXPECT_EQ(canvas.rowText(1), " Row 15" + spaces(22) + "5");
    display->set("Row 19", "changed");
    NodePathDictionary newPaths;
    pane.reloadWithNode(VelmarModelNode::makeTreeFromObject(display, newPaths));
    TerminalPaneView::draw(canvas, pane, {0, false});
    EXPECT_EQ(pane.selectedRow(), 9);
    EXPECT_EQ(pane.topRow(), 5);
    EXPECT_EQ(canvas.rowText(5), " Row 19" + spaces(16) + "changed");
    EXPECT_TRUE(canvas.at(5, 3).attr & kAttrReverse);
    // When the rows shrink below the cursor, it stays on the last row.
    auto shorter = PlistDictionary::create();
    shorter->set("Only", "1");
    shorter->set("Two", "2");
    NodePathDictionary shortPaths;
    pane.reloadWithNode(VelmarModelNode::makeTreeFromObject(shorter, shortPaths));
    TerminalPaneView::draw(canvas, pane, {0, false});
    EXPECT_EQ(pane.selectedRow(), 1);
    EXPECT_EQ(pane.topRow(), 0);
    EXPECT_EQ(canvas.rowText(1), " Only" + spaces(24) + "1");
}

// The front end on a fake service, drawn on canvases.
class ShowingGenerator : public MonitorGenerator {
  public:
    void updateState(const PlistDictionaryRef&, ByteView) override { ++blobs; }
    PlistValue generateLogUsingState(const PlistDictionaryRef&) override {
        return sampleDisplay(withNeighbours);
    }
    PlistValue getStartCommand() override {
        auto command = PlistDictionary::create();
        command->set("SetState", "Streaming");
        return command;
    }
    PlistValue getSaveContentsFromState(const PlistDictionaryRef&) override {
        auto entry = PlistDictionary::create();
        entry->set("Description", "2026-09-21 14:13:20 +0000");
        auto entries = PlistArray::create();
        entries->append(entry);
        return entries;
    }
    bool withNeighbours = true;
    int blobs = 0;
};

class TerminalFrontEndTest : public Utf8Locale {
  protected:
    void SetUp() override {
        Utf8Locale::SetUp();
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        setenv("XDG_CONFIG_HOME", config_.path().c_str(), 1);
        setenv("XDG_STATE_HOME", state_.path().c_str(), 1);
        setenv("VELMAR_SYSROOT", sysroot_.path().c_str(), 1);
    }
    void TearDown() override {
        unsetenv("VELMAR_SYSROOT");
        Clock::setNowForTesting(std::nullopt);
        ArrayLock::releaseOutstandingForTesting();
        Utf8Locale::TearDown();
    }
    GeneratorFactory factory() {
        return [this](std::string_view) -> std::unique_ptr<MonitorGenerator> {
            auto generator = std::make_unique<ShowingGenerator>();
            generator_ = generator.get();
            return generator;
        };
    }
    void allowSaving() {
        std::filesystem::create_directories(
            sysroot_.path() + "/BrindleInternal/Library/PreferenceBundles/Carrier Settings.bundle");
    }
    // Connects, delivers one blob and waits for the redraw.
    void connectAndRedraw(TerminalFrontEnd& frontEnd, testing::FakeTelephonyService& service) {
        frontEnd.launch();
        ASSERT_TRUE(frontEnd.queue().runUntil([&] { return frontEnd.shell().model()->isConnected(); }, 5.0));
        service.sendBlob(PlistData(20, 1));
        ASSERT_TRUE(frontEnd.queue().runUntil([&] { return generator_ && generator_->blobs > 0; }, 5.0));
        frontEnd.shell().model()->refresh();
        ASSERT_TRUE(frontEnd.queue().runUntil([&] { return frontEnd.topPane().node() != nullptr; }, 5.0));
    }
    std::vector<std::string> frame(TerminalFrontEnd& frontEnd, int rows = 8, int columns = 40) {
        return testing::terminalFrame(frontEnd, rows, columns);
    }

    testing::TemporaryDirectory runtime_;
    testing::TemporaryDirectory config_;
    testing::TemporaryDirectory state_;
    testing::TemporaryDirectory sysroot_;
    ShowingGenerator* generator_ = nullptr;
};

TEST_F(TerminalFrontEndTest, TheSpinnerTurnsOnlyWhileConnecting) {
    testing::FakeTelephonyService service;
    TerminalFrontEnd frontEnd(factory());
    frontEnd.launch();
    frontEnd.queue().runFor(0.05);
    EXPECT_TRUE(frontEnd.isSpinning());
    EXPECT_EQ(frontEnd.topPane().status(), "Connecting");
    connectAndRedraw(frontEnd, service);
    frontEnd.queue().runFor(0.05);
    EXPECT_FALSE(frontEnd.isSpinning());
    EXPECT_EQ(frontEnd.topPane().status().rfind("Updated ", 0), 0u);
    frontEnd.terminate();
}

TEST_F(TerminalFrontEndTest, EnterOpensAnInnerRowAtTheJoinedPathAndEscGoesBack) {
    testing::FakeTelephonyService service;
    TerminalFrontEnd frontEnd(factory());
    connectAndRedraw(frontEnd, service);
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Down));
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Enter));
    ASSERT_EQ(frontEnd.paneCount(), 2u);
    EXPECT_EQ(frontEnd.topPane().path(), "/Neighbours");
    // The pushed pane shows the current status as it comes on screen.
    EXPECT_EQ(frontEnd.topPane().status().rfind("Updated ", 0), 0u);
    EXPECT_FALSE(frontEnd.topPane().isLoading());
    const auto lines = frame(frontEnd);
    EXPECT_EQ(lines[0], " Neighbours" + spaces(17) + "/Neighbours ");
    EXPECT_EQ(lines[1], " 0" + spaces(31) + "-98 dBm");
    EXPECT_EQ(lines[2], " 1" + spaces(30) + "-101 dBm");
    // Enter on a leaf does nothing but keep the cursor.
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Enter));
    EXPECT_EQ(frontEnd.paneCount(), 2u);
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Escape));
    ASSERT_EQ(frontEnd.paneCount(), 1u);
    // The root pane kept its cursor on the row that was opened.
    EXPECT_EQ(frontEnd.topPane().selectedRow(), 1);
    // → opens too; ← and Backspace go back.
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Right));
    EXPECT_EQ(frontEnd.topPane().path(), "/Neighbours");
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Left));
    EXPECT_EQ(frontEnd.paneCount(), 1u);
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Up));
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Enter));
    EXPECT_EQ(frontEnd.topPane().path(), "/Cell");
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Backspace));
    EXPECT_EQ(frontEnd.paneCount(), 1u);
    frontEnd.terminate();
}

TEST_F(TerminalFrontEndTest, APaneWhoseNodeVanishedPopsToItsParent) {
    testing::FakeTelephonyService service;
    TerminalFrontEnd frontEnd(factory());
    connectAndRedraw(frontEnd, service);
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Down));
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Enter));
    ASSERT_EQ(frontEnd.topPane().path(), "/Neighbours");
    generator_->withNeighbours = false;
    service.sendBlob(PlistData(20, 1));
    ASSERT_TRUE(frontEnd.queue().runUntil([&] { return generator_->blobs == 2; }, 5.0));
    frontEnd.shell().model()->refresh();
    ASSERT_TRUE(frontEnd.queue().runUntil([&] { return frontEnd.paneCount() == 1; }, 5.0));
    const auto lines = frame(frontEnd);
    EXPECT_EQ(lines[1], " Cell" + spaces(33) + "› ");
    EXPECT_EQ(lines[2], " Mode" + spaces(31) + "Idle");
    frontEnd.terminate();
}

TEST_F(TerminalFrontEndTest, WithoutTheMarkerSDoesNothingAndTheFooterOffersNoSave) {
    testing::FakeTelephonyService service;
    TerminalFrontEnd frontEnd(factory());
    connectAndRedraw(frontEnd, service);
    frontEnd.handleKey(TerminalKey::character(U's'));
    EXPECT_EQ(frontEnd.saveForm(), nullptr);
    EXPECT_EQ(frontEnd.shell().saveViewController(), nullptr);
    EXPECT_EQ(frame(frontEnd, 8, 80)[7].find("[s] Save"), std::string::npos);
    frontEnd.handleKey(TerminalKey::character(U'q'));
    EXPECT_TRUE(frontEnd.isQuitRequested());
    frontEnd.terminate();
}

TEST_F(TerminalFrontEndTest, TheSaveFormWritesTheTypedDescriptionAndCloses) {
    allowSaving();
    testing::FakeTelephonyService service;
    TerminalFrontEnd frontEnd(factory());
    connectAndRedraw(frontEnd, service);
    EXPECT_NE(frame(frontEnd, 8, 80)[7].find("[s] Save"), std::string::npos);
    Clock::setNowForTesting(1'790'000'000.0);
    frontEnd.handleKey(TerminalKey::character(U's'));
    ASSERT_NE(frontEnd.saveForm(), nullptr);
    EXPECT_EQ(frontEnd.saveForm()->focus(), TerminalSaveForm::Focus::Description);
    // A 46-column form of 9 rows at row 3, column 2: its title in the frame, the history heading and the
    // entry with its check mark.
    TerminalCanvas form(16, 50, false);
    frontEnd.render(form);
    EXPECT_EQ(columnsOf(form, 3, 2, 22), "┌─ Save Snapshot ───");
    EXPECT_EQ(columnsOf(form, 5, 2, 17), "│ Description: ");
    EXPECT_EQ(columnsOf(form, 7, 2, 21), "│ History: 1 entry ");
    EXPECT_EQ(columnsOf(form, 8, 2, 32), "│  ✓ 2026-09-21 14:13:20 +0000");
    EXPECT_EQ(columnsOf(form, 10, 14, 35), "[ Save ]   [ Cancel ]");
    for (char32_t ch : std::u32string(U"Tür")) {
        frontEnd.handleKey(TerminalKey::character(ch));
    }
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Backspace));
    frontEnd.handleKey(TerminalKey::character(U'm'));
    // Return in the description saves.
    Clock::setNowForTesting(1'790'000'003.0);
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Enter));
    ASSERT_TRUE(frontEnd.queue().runUntil([&] { return frontEnd.saveForm() == nullptr; }, 2.0));
    EXPECT_EQ(frontEnd.shell().saveViewController(), nullptr);
    const auto saved =
        readDictionaryFile(state_.path() + "/velmar/diagnostics/VelmarSnapshot-1790000003.velmar");
    ASSERT_TRUE(saved);
    EXPECT_EQ(*saved->dictionary()->get("Description").string(), "Tüm");
    EXPECT_EQ(*saved->dictionary()->get("Timestamp").string(), "2026-09-21 14:13:20 +0000");
    frontEnd.terminate();
}

TEST_F(TerminalFrontEndTest, AFailedSaveShowsTheAlertOverThePanesUntilClosed) {
    allowSaving();
    testing::writeWholeFile(state_.path() + "/blocked", "x");
    setenv("XDG_STATE_HOME", (state_.path() + "/blocked").c_str(), 1);
    testing::FakeTelephonyService service;
    TerminalFrontEnd frontEnd(factory());
    connectAndRedraw(frontEnd, service);
    testing::LogCapture capture;
    frontEnd.handleKey(TerminalKey::character(U's'));
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Tab));  // history
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Tab));  // Save
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Enter));
    ASSERT_TRUE(frontEnd.queue().runUntil([&] { return frontEnd.saveForm() == nullptr; }, 2.0));
    EXPECT_TRUE(frontEnd.isAlertShown());
    // The fixed line, then the reason.
    ASSERT_EQ(capture.textsAt(kLogError).size(), 2u);
    EXPECT_EQ(
        capture.textsAt(kLogError)[0].rfind("Unable to write snapshot to " + state_.path() + "/blocked/", 0),
        0u);
    EXPECT_EQ(capture.textsAt(kLogError)[1], "Snapshot not written: cannot create directory " +
                                                 state_.path() + "/blocked/velmar: Not a directory");
    const auto lines = frame(frontEnd, 12, 40);
    // A box of 28 + 6 = 34 columns at column 3, rows 3 to 8.
    EXPECT_EQ(lines[4], "   │           File Error           │   ");
    EXPECT_EQ(lines[5], "   │  Unable to write file to disk  │   ");
    EXPECT_EQ(lines[7], "   │           [ Close ]            │   ");
    // Keys go to the alert while it is up; Enter closes it.
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Down));
    EXPECT_EQ(frontEnd.topPane().selectedRow(), 0);
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Enter));
    EXPECT_FALSE(frontEnd.isAlertShown());
    frontEnd.terminate();
}

TEST_F(TerminalFrontEndTest, EscCancelsTheSaveFormWithoutWriting) {
    allowSaving();
    testing::FakeTelephonyService service;
    TerminalFrontEnd frontEnd(factory());
    connectAndRedraw(frontEnd, service);
    frontEnd.handleKey(TerminalKey::character(U's'));
    ASSERT_NE(frontEnd.saveForm(), nullptr);
    // While the form is up, q is text, not quit.
    frontEnd.handleKey(TerminalKey::character(U'q'));
    EXPECT_FALSE(frontEnd.isQuitRequested());
    frontEnd.handleKey(TerminalKey::of(TerminalKey::Kind::Escape));
    ASSERT_TRUE(frontEnd.queue().runUntil([&] { return frontEnd.saveForm() == nullptr; }, 2.0));
    EXPECT_FALSE(std::filesystem::exists(state_.path() + "/velmar/diagnostics") &&
                 !std::filesystem::is_empty(state_.path() + "/velmar/diagnostics"));
    EXPECT_EQ(frontEnd.paneCount(), 1u);
    frontEnd.terminate();
}

}  // namespace
}  // namespace velmar

#endif  // VELMAR_WITH_TERMINAL
