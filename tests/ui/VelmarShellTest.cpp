// The toolkit-free application shell with panes that record what they are shown.
#include "ui/VelmarShell.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>

#include "core/ArrayLock.h"
#include "core/platform/Clock.h"
#include "core/platform/PollMainQueue.h"
#include "core/platform/PreferencesStore.h"
#include "core/platform/plist/PlistCodec.h"
#include "tests/support/FakeTelephonyService.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

class RecordingPane : public Pane {
  public:
    explicit RecordingPane(std::string path) : path_(std::move(path)) {}
    const std::string& path() const override { return path_; }
    void reloadWithNode(const VelmarModelNodeRef& node) override {
        node_ = node;
        ++reloads;
        reloadOrder().push_back(path_);
    }
    void setStatus(const std::string& status, bool isLoading) override {
        status_ = status;
        loading_ = isLoading;
    }
    static std::vector<std::string>& reloadOrder() {
        static std::vector<std::string> order;
        return order;
    }
    VelmarModelNodeRef node_;
    std::string status_;
    bool loading_ = false;
    int reloads = 0;

  private:
    std::string path_;
};

class RecordingStack : public NavigationStack {
  public:
    explicit RecordingStack(std::vector<std::string> paths) {
        for (auto& path : paths) {
            panes.push_back(std::make_unique<RecordingPane>(path));
        }
    }
    std::size_t paneCount() const override { return panes.size(); }
    Pane& paneAt(std::size_t index) override { return *panes.at(index); }
    void popToPane(std::size_t index, bool animated) override {
        popsTo.push_back(index);
        lastPopAnimated = animated;
        panes.resize(index + 1);
    }
    RecordingPane& pane(std::size_t index) { return *panes.at(index); }
    std::vector<std::unique_ptr<RecordingPane>> panes;
    std::vector<std::size_t> popsTo;
    bool lastPopAnimated = false;
};

// Shows {"Cell": {"PCI": "101", "Neighbours": {"A": "1"}}} until told to drop the neighbours.
class ShrinkingGenerator : public MonitorGenerator {
  public:
    void updateState(const PlistDictionaryRef&, ByteView) override { ++blobs; }
    PlistValue generateLogUsingState(const PlistDictionaryRef&) override {
        auto cell = PlistDictionary::create();
        cell->set("PCI", "101");
        if (withNeighbours) {
            auto neighbours = PlistDictionary::create();
            neighbours->set("A", "1");
            cell->set("Neighbours", neighbours);
        }
        auto display = PlistDictionary::create();
        display->set("Cell", cell);
        return display;
    }
    PlistValue getStartCommand() override {
        auto command = PlistDictionary::create();
        command->set("SetState", "Streaming");
        return command;
    }
    PlistValue getSaveContentsFromState(const PlistDictionaryRef&) override { return PlistValue::newArray(); }
    bool withNeighbours = true;
    int blobs = 0;
};

class VelmarShellTest : public ::testing::Test {
  protected:
    void SetUp() override {
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        setenv("XDG_CONFIG_HOME", config_.path().c_str(), 1);
        unsetenv("VELMAR_SYSROOT");
        RecordingPane::reloadOrder().clear();
    }
    void TearDown() override { ArrayLock::releaseOutstandingForTesting(); }

    GeneratorFactory factory() {
        return [this](std::string_view) -> std::unique_ptr<MonitorGenerator> {
            auto generator = std::make_unique<ShrinkingGenerator>();
            generator_ = generator.get();
            return generator;
        };
    }

    testing::TemporaryDirectory runtime_;
    testing::TemporaryDirectory config_;
    PollMainQueue queue_;
    ShrinkingGenerator* generator_ = nullptr;
};

TEST_F(VelmarShellTest, BeforeFirstDataTheRootPaneShowsConnectingWithTheIndicator) {
    VelmarShell shell(factory(), queue_);
    RecordingStack stack({"/"});
    shell.launch(stack);
    EXPECT_EQ(stack.pane(0).status_, "Connecting");
    EXPECT_TRUE(stack.pane(0).loading_);
    EXPECT_EQ(stack.pane(0).node_, nullptr);
    EXPECT_EQ(shell.updateMessage(), "Connecting...");
    // The first connection attempt is queued, not made during launch.
    EXPECT_FALSE(shell.model()->isConnected());
    EXPECT_FALSE(shell.model()->hasPendingRetry());
    queue_.runFor(0.05);
    EXPECT_TRUE(shell.model()->hasPendingRetry());  // no service: it tried and will retry
    shell.terminate();
}

TEST_F(VelmarShellTest, DisconnectedStatusIsConnectingWithDotsAndTheIndicator) {
    VelmarShell shell(factory(), queue_);
    RecordingStack stack({"/"});
    shell.launch(stack);
    shell.updateStatusForViewController(stack.pane(0));
    EXPECT_EQ(stack.pane(0).status_, "Connecting...");
    EXPECT_TRUE(stack.pane(0).loading_);
    shell.terminate();
}

TEST_F(VelmarShellTest, RedrawReloadsPanesBottomFirstAndShowsTheUpdateTime) {
    testing::FakeTelephonyService service;
    VelmarShell shell(factory(), queue_);
    RecordingStack stack({"/", "/Cell", "/Cell/Neighbours"});
    shell.launch(stack);
    ASSERT_TRUE(queue_.runUntil([&] { return shell.model()->isConnected(); }, 5.0));
    service.sendBlob(PlistData(20, 1));
    ASSERT_TRUE(queue_.runUntil([&] { return generator_ && generator_->blobs == 1; }, 5.0));
    Clock::setNowForTesting(1'790'000'000.0);
    shell.model()->refresh();
    ASSERT_TRUE(queue_.runUntil([&] { return stack.pane(2).reloads == 1; }, 2.0));
    Clock::setNowForTesting(std::nullopt);
    EXPECT_EQ(RecordingPane::reloadOrder(), (std::vector<std::string>{"/", "/Cell", "/Cell/Neighbours"}));
    EXPECT_EQ(stack.pane(0).node_->displayName(), "Velmar");
    EXPECT_EQ(stack.pane(2).node_->displayName(), "Neighbours");
    // TZ=UTC in the test environment.
    EXPECT_EQ(stack.pane(2).status_, "Updated 2026-09-21 at 14:13:20");
    EXPECT_FALSE(stack.pane(2).loading_);
    shell.terminate();
}

TEST_F(VelmarShellTest, PaneWhosePathHasGonePopsToItsParentAfterTheLowerPanesReload) {
    testing::FakeTelephonyService service;
    VelmarShell shell(factory(), queue_);
    RecordingStack stack({"/", "/Cell", "/Cell/Neighbours", "/Cell/Neighbours/A"});
    shell.launch(stack);
    ASSERT_TRUE(queue_.runUntil([&] { return shell.model()->isConnected(); }, 5.0));
    generator_->withNeighbours = false;
    service.sendBlob(PlistData(20, 1));
    ASSERT_TRUE(queue_.runUntil([&] { return generator_->blobs == 1; }, 5.0));
    shell.model()->refresh();
    ASSERT_TRUE(queue_.runUntil([&] { return !stack.popsTo.empty(); }, 2.0));
    EXPECT_EQ(stack.popsTo, std::vector<std::size_t>{1});
    EXPECT_TRUE(stack.lastPopAnimated);
    EXPECT_EQ(RecordingPane::reloadOrder(), (std::vector<std::string>{"/", "/Cell"}));
    ASSERT_EQ(stack.paneCount(), 2u);
    EXPECT_EQ(stack.pane(1).status_.rfind("Updated ", 0), 0u);
    shell.terminate();
}

TEST_F(VelmarShellTest, SaveButtonOnlyWithTheInternalBuildMarker) {
    testing::TemporaryDirectory sysroot;
    setenv("VELMAR_SYSROOT", sysroot.path().c_str(), 1);
    VelmarShell shell(factory(), queue_);
    shell.getSaveButtonPref();
    EXPECT_FALSE(shell.allowSaveButton());
    std::filesystem::create_directories(sysroot.path() + VelmarShell::kInternalBuildMarker);
    shell.getSaveButtonPref();
    EXPECT_TRUE(shell.allowSaveButton());
    EXPECT_EQ(VelmarShell::internalBuildMarkerPath(),
              sysroot.path() + "/BrindleInternal/Library/PreferenceBundles/Carrier Settings.bundle");
    unsetenv("VELMAR_SYSROOT");
}

TEST_F(VelmarShellTest, TerminationSetsTheHomeScreenRssiPreferenceToFalse) {
    PreferencesStore before(PreferencesStore::kHomeScreenDomain);
    before.setValue("HxShowGSMRSSI", PlistValue::boolean(true));
    before.setValue("Other", "kept");
    ASSERT_TRUE(before.synchronize());
    VelmarShell shell(factory(), queue_);
    RecordingStack stack({"/"});
    shell.launch(stack);
    shell.terminate();
    EXPECT_EQ(shell.model(), nullptr);
    const auto saved = readDictionaryFile(config_.path() + "/velmar/preferences/com.velmar.homescreen.plist");
    ASSERT_TRUE(saved);
    EXPECT_EQ(saved->dictionary()->get("HxShowGSMRSSI"), PlistValue::boolean(false));
    EXPECT_EQ(*saved->dictionary()->get("Other").string(), "kept");
}

TEST_F(VelmarShellTest, UpdateMessageIsFormattedInLocalTime) {
    const char* previous = std::getenv("TZ");
    const std::string saved = previous ? previous : "";
    setenv("TZ", "NPT-5:45", 1);
    EXPECT_EQ(VelmarShell::formatUpdateMessage(1'790'000'000.0), "Updated 2026-09-21 at 19:58:20");
    setenv("TZ", saved.c_str(), 1);
}

}  // namespace
}  // namespace velmar
