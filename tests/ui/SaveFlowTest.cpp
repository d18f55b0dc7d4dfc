// The snapshot save flow without a toolkit: the shell's one save screen, the controller's table and file.
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>

#include "core/ArrayLock.h"
#include "core/platform/Clock.h"
#include "core/platform/PollMainQueue.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "tests/support/FakeTelephonyService.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"
#include "ui/DiagnosticLogDirectory.h"
#include "ui/VelmarSaveViewController.h"
#include "ui/VelmarShell.h"

namespace velmar {
namespace {

class StillPane : public Pane {
  public:
    const std::string& path() const override { return path_; }
    void reloadWithNode(const VelmarModelNodeRef&) override {}
    void setStatus(const std::string&, bool) override {}

  private:
    std::string path_ = "/";
};

class OnePaneStack : public NavigationStack {
  public:
    std::size_t paneCount() const override { return 1; }
    Pane& paneAt(std::size_t) override { return pane_; }
    void popToPane(std::size_t, bool) override {}

  private:
    StillPane pane_;
};

class FakeSaveView : public SaveScreenView {
  public:
    std::string descriptionText() const override { return text; }
    void resignDescriptionFocus() override { ++resigned; }
    std::string text;
    int resigned = 0;
};

// Presents by attaching a fake view; records dismissals and alerts.
class RecordingPresenter : public SaveScreenPresenter {
  public:
    void presentSaveScreen(VelmarSaveViewController& controller, bool animated) override {
        ++presented;
        presentedAnimated = animated;
        view.resigned = 0;
        controller.setView(&view);
        shown = &controller;
    }
    void dismissSaveScreen(bool animated) override {
        ++dismissed;
        dismissedAnimated = animated;
        if (shown != nullptr) {
            shown->setView(nullptr);
        }
        shown = nullptr;
    }
    void showAlert(const std::string& title, const std::string& message, const std::string& button) override {
        alerts.push_back(title + " / " + message + " / " + button);
    }
    FakeSaveView view;
    VelmarSaveViewController* shown = nullptr;
    int presented = 0;
    int dismissed = 0;
    bool presentedAnimated = false;
    bool dismissedAnimated = false;
    std::vector<std::string> alerts;
};

// A generator whose save contents are two history entries and the DLF entry.
class HistoryGenerator : public MonitorGenerator {
  public:
    void updateState(const PlistDictionaryRef&, ByteView) override {}
    PlistValue generateLogUsingState(const PlistDictionaryRef&) override {
        return PlistValue::newDictionary();
    }
    PlistValue getStartCommand() override {
        auto command = PlistDictionary::create();
        command->set("SetState", "Streaming");
        return command;
    }
    PlistValue getSaveContentsFromState(const PlistDictionaryRef&) override { return history(); }
    static PlistValue history() {
        auto first = PlistDictionary::create();
        first->set("Description", "2026-09-21 14:13:18 +0000");
        auto second = PlistDictionary::create();
        second->set("Description", "2026-09-21 14:13:20 +0000");
        auto dlf = PlistDictionary::create();
        dlf->set("Description", "DLF binary (161 bytes)");
        dlf->set("DLF", PlistValue::data(PlistData(161, 0)));
        auto entries = PlistArray::create();
        entries->append(first);
        entries->append(second);
        entries->append(dlf);
        return entries;
    }
};

PlistValue entries(std::initializer_list<PlistValue> items) {
    auto array = PlistArray::create();
    for (const PlistValue& item : items) {
        array->append(item);
    }
    return array;
}

PlistValue describedEntry(const char* description) {
    auto entry = PlistDictionary::create();
    entry->set("Description", description);
    return entry;
}

int fileMode(const std::string& path) {
    struct stat info {};
    return stat(path.c_str(), &info) == 0 ? static_cast<int>(info.st_mode & 07777) : -1;
}

std::vector<std::string> filesIn(const std::string& directory) {
    std::vector<std::string> names;
    std::error_code error;
    for (const auto& entry : std::filesystem::directory_iterator(directory, error)) {
        names.push_back(entry.path().filename().string());
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::vector<std::string> keysOf(const PlistValue& dictionary) {
    std::vector<std::string> keys;
    for (const auto& [key, value] : *dictionary.dictionary()) {
        keys.push_back(key);
    }
    return keys;
}

class SaveFlowTest : public ::testing::Test {
  protected:
    void SetUp() override {
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        setenv("XDG_CONFIG_HOME", config_.path().c_str(), 1);
        setenv("XDG_STATE_HOME", state_.path().c_str(), 1);
        unsetenv("VELMAR_SYSROOT");
        shell_.setSaveScreenPresenter(&presenter_);
    }
    void TearDown() override {
        Clock::setNowForTesting(std::nullopt);
        shell_.setSaveScreenPresenter(nullptr);
        ArrayLock::releaseOutstandingForTesting();
    }
    std::string diagnostics() const { return state_.path() + "/velmar/diagnostics"; }
    // Opens the save screen on contents of our choosing (the shell's own comes from the model).
    VelmarSaveViewController makeController(const PlistValue& contents) {
        return VelmarSaveViewController(contents, shell_);
    }

    testing::TemporaryDirectory runtime_;
    testing::TemporaryDirectory config_;
    testing::TemporaryDirectory state_;
    PollMainQueue queue_;
    VelmarShell shell_{[](std::string_view) { return std::make_unique<HistoryGenerator>(); }, queue_};
    RecordingPresenter presenter_;
};

TEST_F(SaveFlowTest, DiagnosticLogDirectoryFollowsXdgStateHome) {
    EXPECT_EQ(DiagnosticLogDirectory::path(), state_.path() + "/velmar/diagnostics");
    setenv("XDG_STATE_HOME", "relative/state", 1);
    setenv("HOME", "/home/fieldengineer", 1);
    EXPECT_EQ(DiagnosticLogDirectory::path(), "/home/fieldengineer/.local/state/velmar/diagnostics");
    unsetenv("XDG_STATE_HOME");
    EXPECT_EQ(DiagnosticLogDirectory::path(), "/home/fieldengineer/.local/state/velmar/diagnostics");
}

TEST_F(SaveFlowTest, ShowSaveViewTwiceInARowPresentsOneScreen) {
    OnePaneStack stack;
    shell_.launch(stack);
    shell_.showSaveView();
    VelmarSaveViewController* first = shell_.saveViewController();
    ASSERT_NE(first, nullptr);
    shell_.showSaveView();
    EXPECT_EQ(shell_.saveViewController(), first);
    EXPECT_EQ(presenter_.presented, 1);
    EXPECT_TRUE(presenter_.presentedAnimated);
    shell_.terminate();
}

TEST_F(SaveFlowTest, CloseSaveViewDismissesAnimatedAndReleasesAndIsHarmlessWithoutAScreen) {
    shell_.closeSaveView();
    EXPECT_EQ(presenter_.dismissed, 0);
    shell_.showSaveView();
    shell_.closeSaveView();
    EXPECT_EQ(presenter_.dismissed, 1);
    EXPECT_TRUE(presenter_.dismissedAnimated);
    EXPECT_EQ(shell_.saveViewController(), nullptr);
    // A new screen can be opened again afterwards.
    shell_.showSaveView();
    EXPECT_EQ(presenter_.presented, 2);
}

TEST_F(SaveFlowTest, TheScreenGetsTheModelsSaveContents) {
    testing::FakeTelephonyService service;
    OnePaneStack stack;
    shell_.launch(stack);
    ASSERT_TRUE(queue_.runUntil([&] { return shell_.model()->isConnected(); }, 5.0));
    shell_.showSaveView();
    ASSERT_NE(shell_.saveViewController(), nullptr);
    EXPECT_EQ(shell_.saveViewController()->saveHistory(), HistoryGenerator::history());
    ASSERT_EQ(shell_.saveViewController()->numberOfRows(), 3u);
    EXPECT_EQ(shell_.saveViewController()->rowText(0), "2026-09-21 14:13:18 +0000");
    EXPECT_EQ(shell_.saveViewController()->rowText(2), "DLF binary (161 bytes)");
    shell_.terminate();
}

TEST_F(SaveFlowTest, WithoutAGeneratorTheScreenHasNoRows) {
    OnePaneStack stack;
    shell_.launch(stack);  // not connected: no generator, so no save contents
    shell_.showSaveView();
    ASSERT_NE(shell_.saveViewController(), nullptr);
    EXPECT_TRUE(shell_.saveViewController()->saveHistory().isNone());
    EXPECT_EQ(shell_.saveViewController()->numberOfRows(), 0u);
    EXPECT_EQ(shell_.saveViewController()->numberOfSectionsInTableView(), 1);
    shell_.terminate();
}

TEST_F(SaveFlowTest, OneRowPerEntryShowingItsDescription) {
    auto noDescription = PlistDictionary::create();
    noDescription->set("DisplayState", PlistValue::data(PlistData{1, 2}));
    auto numberDescription = PlistDictionary::create();
    numberDescription->set("Description", PlistValue::integer(7));
    auto controller = makeController(
        entries({describedEntry("First"), noDescription, numberDescription, describedEntry("Läuft – ok")}));
    EXPECT_EQ(controller.numberOfSectionsInTableView(), 1);
    ASSERT_EQ(controller.numberOfRows(), 4u);
    EXPECT_EQ(controller.rowText(0), "First");
    EXPECT_EQ(controller.rowText(1), "");
    EXPECT_EQ(controller.rowText(2), "");
    EXPECT_EQ(controller.rowText(3), "Läuft – ok");
    EXPECT_EQ(controller.rowText(4), "");
}

TEST_F(SaveFlowTest, SaveWritesTimestampDataAndDescriptionAndClosesThroughTheMainQueue) {
    testing::FakeTelephonyService service;
    OnePaneStack stack;
    shell_.launch(stack);
    ASSERT_TRUE(queue_.runUntil([&] { return shell_.model()->isConnected(); }, 5.0));
    Clock::setNowForTesting(1'790'000'000.0);
    shell_.showSaveView();
    VelmarSaveViewController* controller = shell_.saveViewController();
    ASSERT_NE(controller, nullptr);
    presenter_.view.text = "Drive test, cell edge";
    Clock::setNowForTesting(1'790'000'005.0);
    controller->savePressed();
    // The screen closes after the button's own handling, through the main queue.
    EXPECT_NE(shell_.saveViewController(), nullptr);
    EXPECT_EQ(presenter_.dismissed, 0);
    queue_.runFor(0.05);
    EXPECT_EQ(shell_.saveViewController(), nullptr);
    EXPECT_EQ(presenter_.dismissed, 1);
    EXPECT_TRUE(presenter_.alerts.empty());

    const std::string path = diagnostics() + "/VelmarSnapshot-1790000005.velmar";
    EXPECT_EQ(filesIn(diagnostics()), std::vector<std::string>{"VelmarSnapshot-1790000005.velmar"});
    const auto saved = readDictionaryFile(path);
    ASSERT_TRUE(saved);
    EXPECT_EQ(keysOf(*saved), (std::vector<std::string>{"Timestamp", "Data", "Description"}));
    EXPECT_EQ(*saved->dictionary()->get("Timestamp").string(), "2026-09-21 14:13:20 +0000");
    EXPECT_EQ(saved->dictionary()->get("Data"), HistoryGenerator::history());
    EXPECT_EQ(*saved->dictionary()->get("Description").string(), "Drive test, cell edge");
    shell_.terminate();
}

TEST_F(SaveFlowTest, FullSnapshotFileHoldsTheContentsAsGiven) {
    Clock::setNowForTesting(1'790'000'000.0);
    auto controller = makeController(HistoryGenerator::history());
    FakeSaveView view;
    view.text = "Handover at the bridge";
    controller.setView(&view);
    controller.savePressed();
    const auto saved = readDictionaryFile(diagnostics() + "/VelmarSnapshot-1790000000.velmar");
    ASSERT_TRUE(saved);
    EXPECT_EQ(keysOf(*saved), (std::vector<std::string>{"Timestamp", "Data", "Description"}));
    EXPECT_EQ(*saved->dictionary()->get("Timestamp").string(), "2026-09-21 14:13:20 +0000");
    EXPECT_EQ(saved->dictionary()->get("Data"), HistoryGenerator::history());
    EXPECT_EQ(*saved->dictionary()->get("Description").string(), "Handover at the bridge");
}

TEST_F(SaveFlowTest, TheFileStopsAtTheFirstMissingValue) {
    Clock::setNowForTesting(1'790'000'000.0);
    FakeSaveView view;
    view.text = "described";
    {
        // No save contents: "Timestamp" alone, the description is left out as well.
        auto controller = makeController(PlistValue());
        controller.setView(&view);
        EXPECT_EQ(keysOf(controller.snapshotDictionary("described")), std::vector<std::string>{"Timestamp"});
        controller.savePressed();
        const auto saved = readDictionaryFile(diagnostics() + "/VelmarSnapshot-1790000000.velmar");
        ASSERT_TRUE(saved);
        EXPECT_EQ(keysOf(*saved), std::vector<std::string>{"Timestamp"});
    }
    {
        // No description text: "Timestamp" and "Data".
        Clock::setNowForTesting(1'790'000'001.0);
        auto controller = makeController(entries({describedEntry("only")}));
        view.text.clear();
        controller.setView(&view);
        controller.savePressed();
        const auto saved = readDictionaryFile(diagnostics() + "/VelmarSnapshot-1790000001.velmar");
        ASSERT_TRUE(saved);
        EXPECT_EQ(keysOf(*saved), (std::vector<std::string>{"Timestamp", "Data"}));
    }
}

TEST_F(SaveFlowTest, EmptyHistoryHasNoRowsAndSaveStillWritesAFile) {
    Clock::setNowForTesting(1'790'000'000.0);
    auto controller = makeController(PlistValue::newArray());
    EXPECT_EQ(controller.numberOfRows(), 0u);
    FakeSaveView view;
    view.text = "empty";
    controller.setView(&view);
    controller.savePressed();
    const auto saved = readDictionaryFile(diagnostics() + "/VelmarSnapshot-1790000000.velmar");
    ASSERT_TRUE(saved);
    EXPECT_EQ(keysOf(*saved), (std::vector<std::string>{"Timestamp", "Data", "Description"}));
    EXPECT_EQ(saved->dictionary()->get("Data"), PlistValue::newArray());
}

TEST_F(SaveFlowTest, TheTimestampIsThatOfOpeningTheScreen) {
    Clock::setNowForTesting(1'790'000'000.0);  // 2026-09-21 14:13:20 UTC
    auto controller = makeController(entries({describedEntry("a")}));
    EXPECT_EQ(controller.timeStamp(), 1'790'000'000.0);
    Clock::setNowForTesting(1'790'000'754.0);  // the user took 12 min 34 s to type
    FakeSaveView view;
    view.text = "slow typist";
    controller.setView(&view);
    controller.savePressed();
    EXPECT_EQ(filesIn(diagnostics()), std::vector<std::string>{"VelmarSnapshot-1790000754.velmar"});
    const auto saved = readDictionaryFile(diagnostics() + "/VelmarSnapshot-1790000754.velmar");
    ASSERT_TRUE(saved);
    EXPECT_EQ(*saved->dictionary()->get("Timestamp").string(), "2026-09-21 14:13:20 +0000");
}

TEST_F(SaveFlowTest, TwoSavesInTheSameSecondLeaveOneFileHoldingTheSecond) {
    FakeSaveView view;
    Clock::setNowForTesting(1'790'000'000.1);
    auto first = makeController(entries({describedEntry("a")}));
    first.setView(&view);
    view.text = "first";
    first.savePressed();
    Clock::setNowForTesting(1'790'000'000.9);
    auto second = makeController(entries({describedEntry("a")}));
    second.setView(&view);
    view.text = "second";
    second.savePressed();
    EXPECT_EQ(filesIn(diagnostics()), std::vector<std::string>{"VelmarSnapshot-1790000000.velmar"});
    const auto saved = readDictionaryFile(diagnostics() + "/VelmarSnapshot-1790000000.velmar");
    ASSERT_TRUE(saved);
    EXPECT_EQ(*saved->dictionary()->get("Description").string(), "second");
}

TEST_F(SaveFlowTest, TheDirectoryIsMadePrivateAndTheFileOwnerOnly) {
    Clock::setNowForTesting(1'790'000'000.0);
    auto controller = makeController(entries({describedEntry("a")}));
    controller.savePressed();
    EXPECT_EQ(fileMode(state_.path() + "/velmar"), 0700);
    EXPECT_EQ(fileMode(diagnostics()), 0700);
    EXPECT_EQ(fileMode(diagnostics() + "/VelmarSnapshot-1790000000.velmar"), 0600);
    // A file left readable by others is narrowed when it is written again.
    ASSERT_EQ(chmod((diagnostics() + "/VelmarSnapshot-1790000000.velmar").c_str(), 0644), 0);
    controller.savePressed();
    EXPECT_EQ(fileMode(diagnostics() + "/VelmarSnapshot-1790000000.velmar"), 0600);
}

TEST_F(SaveFlowTest, ExistingDirectoriesOpenToOthersAreNarrowed) {
    ASSERT_EQ(mkdir((state_.path() + "/velmar").c_str(), 0755), 0);
    ASSERT_EQ(mkdir(diagnostics().c_str(), 0777), 0);
    ASSERT_EQ(chmod(diagnostics().c_str(), 0777), 0);  // past the umask
    Clock::setNowForTesting(1'790'000'000.0);
    auto controller = makeController(entries({describedEntry("a")}));
    controller.savePressed();
    EXPECT_EQ(fileMode(state_.path() + "/velmar"), 0700);
    EXPECT_EQ(fileMode(diagnostics()), 0700);
    // The state home itself is the user's business, not the monitor's.
    EXPECT_NE(fileMode(state_.path()), -1);
}

TEST_F(SaveFlowTest, AWriteCutShortRemovesItsPartialFileAndLogsTheReason) {
    // A file-size limit stops the write after 100 bytes, whoever runs the test (root included).
    rlimit previous{};
    ASSERT_EQ(getrlimit(RLIMIT_FSIZE, &previous), 0);
    const auto previousHandler = signal(SIGXFSZ, SIG_IGN);
    rlimit small = previous;
    small.rlim_cur = 100;
    ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &small), 0);
    Clock::setNowForTesting(1'790'000'000.0);
    testing::LogCapture capture;
    auto controller = makeController(entries({describedEntry(std::string(500, 'x').c_str())}));
    controller.savePressed();
    setrlimit(RLIMIT_FSIZE, &previous);
    signal(SIGXFSZ, previousHandler);
    const std::string path = diagnostics() + "/VelmarSnapshot-1790000000.velmar";
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Unable to write snapshot to " + path,
                                        "Snapshot not written: cannot write " + path + ": File too large"}));
    EXPECT_TRUE(filesIn(diagnostics()).empty()) << "the partial file stayed";
    EXPECT_EQ(presenter_.alerts,
              std::vector<std::string>{"File Error / Unable to write file to disk / Close"});
}

TEST_F(SaveFlowTest, AFailedWriteIsLoggedShownAsAnAlertAndTheScreenClosesAnyway) {
    // A file where the state directory should be: nothing can be created below it.
    testing::writeWholeFile(state_.path() + "/blocked", "not a directory");
    setenv("XDG_STATE_HOME", (state_.path() + "/blocked").c_str(), 1);
    Clock::setNowForTesting(1'790'000'000.0);
    testing::LogCapture capture;
    shell_.showSaveView();
    ASSERT_NE(shell_.saveViewController(), nullptr);
    presenter_.view.text = "lost";
    shell_.saveViewController()->savePressed();
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Unable to write snapshot to " + state_.path() +
                                            "/blocked/velmar/diagnostics/VelmarSnapshot-1790000000.velmar",
                                        "Snapshot not written: cannot create directory " + state_.path() +
                                            "/blocked/velmar: Not a directory"}));
    EXPECT_EQ(presenter_.alerts,
              std::vector<std::string>{"File Error / Unable to write file to disk / Close"});
    queue_.runFor(0.05);
    EXPECT_EQ(shell_.saveViewController(), nullptr);
    EXPECT_EQ(presenter_.dismissed, 1);
}

TEST_F(SaveFlowTest, CancelClosesWithoutWriting) {
    shell_.showSaveView();
    shell_.saveViewController()->cancelPressed();
    EXPECT_NE(shell_.saveViewController(), nullptr);
    queue_.runFor(0.05);
    EXPECT_EQ(shell_.saveViewController(), nullptr);
    EXPECT_EQ(presenter_.dismissed, 1);
    EXPECT_TRUE(filesIn(diagnostics()).empty());
}

TEST_F(SaveFlowTest, ReturnBackgroundAndHistoryRowOnlyHideTheKeyboard) {
    shell_.showSaveView();
    VelmarSaveViewController* controller = shell_.saveViewController();
    ASSERT_NE(controller, nullptr);
    EXPECT_TRUE(controller->textFieldShouldReturn());
    EXPECT_EQ(presenter_.view.resigned, 1);
    controller->backgroundTouched();
    EXPECT_EQ(presenter_.view.resigned, 2);
    controller->didSelectRow(0);
    EXPECT_EQ(presenter_.view.resigned, 3);
    queue_.runFor(0.05);
    // Nothing else: still open, nothing written.
    EXPECT_EQ(shell_.saveViewController(), controller);
    EXPECT_EQ(presenter_.dismissed, 0);
    EXPECT_TRUE(filesIn(diagnostics()).empty());
}

TEST_F(SaveFlowTest, TerminationTakesTheSaveScreenAway) {
    OnePaneStack stack;
    shell_.launch(stack);
    shell_.showSaveView();
    shell_.terminate();
    EXPECT_EQ(shell_.saveViewController(), nullptr);
    EXPECT_EQ(presenter_.dismissed, 1);
    EXPECT_EQ(presenter_.shown, nullptr);
}

TEST_F(SaveFlowTest, ACloseQueuedBeforeTheShellWentDoesNothing) {
    auto shell = std::make_unique<VelmarShell>(
        [](std::string_view) { return std::make_unique<HistoryGenerator>(); }, queue_);
    shell->setSaveScreenPresenter(&presenter_);
    shell->showSaveView();
    shell->saveViewController()->cancelPressed();
    shell.reset();
    queue_.runFor(0.05);  // must not touch the shell that is gone
    EXPECT_EQ(presenter_.dismissed, 0);
}

}  // namespace
}  // namespace velmar
