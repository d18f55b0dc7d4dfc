// The monitor model against a telephony service on its own thread, built on the same port library.
#include "core/VelmarModel.h"

#include <gtest/gtest.h>

#include <cstdlib>

#include "core/ArrayLock.h"
#include "core/platform/Clock.h"
#include "core/platform/PollMainQueue.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "tests/support/FakeTelephonyService.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::FakeTelephonyService;

// A generator that counts blobs and shows the count.
class CountingGenerator : public MonitorGenerator {
  public:
    void updateState(const PlistDictionaryRef& state, ByteView data) override {
        ++blobs;
        state->set("Last length", std::to_string(data.size()));
    }
    PlistValue generateLogUsingState(const PlistDictionaryRef& state) override {
        ++refreshes;
        auto display = PlistDictionary::create();
        display->set("Blobs", std::to_string(blobs));
        display->set("Last length",
                     state->get("Last length").string() ? *state->get("Last length").string() : "-");
        auto cell = PlistDictionary::create();
        cell->set("PCI", "101");
        display->set("Cell", cell);
        return display;
    }
    PlistValue getStartCommand() override {
        auto command = PlistDictionary::create();
        command->set("SetState", "Streaming");
        command->set("SetOrvaneLogCodes", PlistArray::create({PlistValue::integer(45250)}));
        return command;
    }
    PlistValue getSaveContentsFromState(const PlistDictionaryRef&) override { return PlistValue::newArray(); }
    int blobs = 0;
    int refreshes = 0;
};

class RedrawCounter : public VelmarModelDelegate {
  public:
    void updateViewControllerFromModel() override { ++redraws; }
    int redraws = 0;
};

class VelmarModelTest : public ::testing::Test {
  protected:
    void SetUp() override {
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        MainQueue::setCurrent(&queue_);
    }
    void TearDown() override {
        model_.reset();
        Clock::setNowForTesting(std::nullopt);
        MainQueue::setCurrent(nullptr);
        ArrayLock::releaseOutstandingForTesting();
    }
    VelmarModel& model() {
        if (!model_) {
            model_ = std::make_unique<VelmarModel>(
                [this](std::string_view technology) -> std::unique_ptr<MonitorGenerator> {
                    requestedTechnologies_.emplace_back(technology);
                    if (technology != "kKxLogChannelTechnology_Orvane_LTE") {
                        return nullptr;
                    }
                    auto generator = std::make_unique<CountingGenerator>();
                    lastGenerator_ = generator.get();
                    return generator;
                },
                queue_, &redraws_);
        }
        return *model_;
    }
    static PlistData blob(std::size_t length) { return PlistData(length, 0x01); }

    testing::TemporaryDirectory runtime_;
    PollMainQueue queue_;
    RedrawCounter redraws_;
    std::unique_ptr<VelmarModel> model_;
    std::vector<std::string> requestedTechnologies_;
    CountingGenerator* lastGenerator_ = nullptr;
};

TEST_F(VelmarModelTest, WithoutAServiceEveryStepFailsAndOneRetryIsQueued) {
    testing::LogCapture capture;
    model().restartMonitor();
    EXPECT_EQ(capture.texts(), (std::vector<std::string>{"Could not create KxServerConnection",
                                                         "Could not create the ports necessary"}));
    EXPECT_FALSE(model().isConnected());
    EXPECT_FALSE(model().isRunning());
    EXPECT_TRUE(model().hasPendingRetry());
}

TEST_F(VelmarModelTest, StartsAgainstAWorkingServiceAndSendsTheStartCommand) {
    FakeTelephonyService service;
    testing::LogCapture capture;
    model().restartMonitor();
    ASSERT_TRUE(model().isConnected()) << ::testing::PrintToString(capture.texts());
    EXPECT_TRUE(model().isRunning());
    EXPECT_FALSE(model().hasPendingRetry());
    EXPECT_EQ(requestedTechnologies_, std::vector<std::string>{"kKxLogChannelTechnology_Orvane_LTE"});
    EXPECT_TRUE(service.waitFor([&] { return service.commands().size() >= 2; }, 5.0));
    const auto commands = service.commands();
    ASSERT_EQ(commands.size(), 2u);
    EXPECT_EQ(*commands[0].dictionary()->get("GetTechnology").string(), "GetTechnology");
    EXPECT_EQ(*commands[1].dictionary()->get("SetState").string(), "Streaming");
    const auto texts = capture.texts();
    ASSERT_EQ(texts.size(), 3u);
    EXPECT_EQ(texts[0].rfind(" ***** Created ports (send=0x", 0), 0u);
    EXPECT_EQ(texts[1].rfind("Got log generated: 0x", 0), 0u);
    EXPECT_EQ(texts[2], "Starting the display update timer");
}

TEST_F(VelmarModelTest, StartMonitorWhileRunningDoesNothing) {
    FakeTelephonyService service;
    model().restartMonitor();
    ASSERT_TRUE(model().isRunning());
    testing::LogCapture capture;
    model().startMonitor();
    EXPECT_TRUE(capture.lines().empty());
    EXPECT_EQ(service.channelsCreated(), 1);
}

TEST_F(VelmarModelTest, ReplyWithoutTheAnswerConfiguresNothing) {
    FakeTelephonyService service({.technologyReply = FakeTelephonyService::TechnologyReply::NoAnswerKey});
    testing::LogCapture capture;
    model().restartMonitor();
    EXPECT_TRUE(capture.contains(" ***** Reply to GetTechnology had no answer; cannot configure"));
    EXPECT_TRUE(capture.contains("No log generator technology works"));
    EXPECT_FALSE(model().isConnected());
    EXPECT_FALSE(model().isRunning());
    EXPECT_TRUE(model().hasPendingRetry());
}

TEST_F(VelmarModelTest, ReplyThatIsNotAPropertyListIsReported) {
    FakeTelephonyService service(
        {.technologyReply = FakeTelephonyService::TechnologyReply::NotAPropertyList});
    testing::LogCapture capture;
    model().restartMonitor();
    EXPECT_TRUE(capture.contains(" ***** Could not parse reply to GetTechnology; cannot configure"));
    EXPECT_TRUE(capture.contains("No log generator technology works"));
}

TEST_F(VelmarModelTest, EmptyReplyIsNoResponse) {
    FakeTelephonyService service({.technologyReply = FakeTelephonyService::TechnologyReply::EmptyReply});
    testing::LogCapture capture;
    model().restartMonitor();
    EXPECT_TRUE(capture.contains(" ***** No response to GetTechnology; cannot configure"));
}

TEST_F(VelmarModelTest, ServiceThatNeverAnswersTimesOutAfterOneSecond) {
    FakeTelephonyService service({.technologyReply = FakeTelephonyService::TechnologyReply::Stall});
    testing::LogCapture capture;
    model().restartMonitor();
    EXPECT_TRUE(capture.contains(stringWithFormat(
        " ***** Could not send the GetTechnology command (got error=%d)", kMessagePortReceiveTimeout)));
    EXPECT_FALSE(model().isRunning());
}

TEST_F(VelmarModelTest, UnknownTechnologyLeavesNoGenerator) {
    FakeTelephonyService service({.technology = "kKxLogChannelTechnology_Unknown"});
    testing::LogCapture capture;
    model().restartMonitor();
    EXPECT_TRUE(capture.contains("Got log generated: (nil)"));
    EXPECT_TRUE(capture.contains("No log generator technology works"));
    EXPECT_EQ(model().topLevelNodes(), nullptr);
    EXPECT_EQ(model().nodeAtPath("/"), nullptr);
    EXPECT_TRUE(model().getSaveContents().isNone());
}

TEST_F(VelmarModelTest, RefusedChannelIsReportedWithItsErrorCode) {
    FakeTelephonyService service({.channelError = 2});
    testing::LogCapture capture;
    model().restartMonitor();
    EXPECT_TRUE(capture.contains("_KxServerConnectionNetworkMonitorCreateLogChannel returns error: 2!"));
    EXPECT_TRUE(capture.contains("Could not create the ports necessary"));
}

TEST_F(VelmarModelTest, EmptyChannelPortNameCountsAsNoPort) {
    FakeTelephonyService service({.emptyChannelPort = true});
    testing::LogCapture capture;
    model().restartMonitor();
    EXPECT_TRUE(capture.contains("Could not create a log channel (Kx returned null port)!"));
}

TEST_F(VelmarModelTest, SecondModelFindsTheReceivePortTaken) {
    FakeTelephonyService service;
    model().restartMonitor();
    ASSERT_TRUE(model().isConnected());
    RedrawCounter otherRedraws;
    VelmarModel second([](std::string_view) { return nullptr; }, queue_, &otherRedraws);
    testing::LogCapture capture;
    second.restartMonitor();
    EXPECT_EQ(capture.texts(), (std::vector<std::string>{"Local messsage port already exists",
                                                         "Could not create the ports necessary"}));
    EXPECT_TRUE(model().isConnected());
}

TEST_F(VelmarModelTest, MessageWithNonZeroIdIsIgnored) {
    FakeTelephonyService service;
    model().restartMonitor();
    service.sendBlob(blob(20), 5);
    queue_.runFor(0.2);
    EXPECT_FALSE(model().isUpdated());
    EXPECT_EQ(lastGenerator_->blobs, 0);
}

TEST_F(VelmarModelTest, BlobsMarkTheModelUpdatedAndATickRequestsOneRedraw) {
    FakeTelephonyService service;
    model().restartMonitor();
    service.sendBlob(blob(20));
    service.sendBlob(blob(30));
    ASSERT_TRUE(queue_.runUntil([&] { return lastGenerator_->blobs == 2; }, 5.0));
    EXPECT_TRUE(model().isUpdated());
    auto first = model().topLevelNodes();
    ASSERT_TRUE(first);
    model().refresh();
    EXPECT_FALSE(model().isUpdated());
    EXPECT_EQ(redraws_.redraws, 0);  // the redraw request is queued, not called
    queue_.runUntil([&] { return redraws_.redraws == 1; }, 1.0);
    EXPECT_EQ(redraws_.redraws, 1);
    // The tree was dropped and is rebuilt once, lazily.
    const int refreshesBefore = lastGenerator_->refreshes;
    auto rebuilt = model().nodeAtPath("/Cell/PCI");
    ASSERT_TRUE(rebuilt);
    EXPECT_EQ(*rebuilt->value(), "101");
    EXPECT_NE(model().topLevelNodes(), first);
    model().topLevelNodes();
    EXPECT_EQ(lastGenerator_->refreshes, refreshesBefore + 1);
}

TEST_F(VelmarModelTest, TickWithoutNewDataKeepsTheTree) {
    FakeTelephonyService service;
    model().restartMonitor();
    auto tree = model().topLevelNodes();
    model().refresh();
    queue_.runFor(0.1);
    EXPECT_EQ(redraws_.redraws, 0);
    EXPECT_EQ(model().topLevelNodes(), tree);
}

TEST_F(VelmarModelTest, DeliberateTeardownNeverRestarts) {
    FakeTelephonyService service;
    model().restartMonitor();
    testing::LogCapture capture;
    model().destroyPorts();
    queue_.runFor(0.2);
    EXPECT_TRUE(capture.lines().empty());
    EXPECT_FALSE(model().isConnected());
    EXPECT_FALSE(model().isRunning());
    EXPECT_FALSE(model().hasPendingRetry());
}

TEST_F(VelmarModelTest, ServiceGoingAwayInvalidatesOnceAndRestarts) {
    auto service = std::make_unique<FakeTelephonyService>();
    model().restartMonitor();
    service->sendBlob(blob(20));
    ASSERT_TRUE(queue_.runUntil([&] { return lastGenerator_ && lastGenerator_->blobs == 1; }, 5.0));
    testing::LogCapture capture;
    service.reset();  // the whole service goes
    queue_.runUntil([&] { return capture.texts().size() >= 2; }, 5.0);
    const auto texts = capture.texts();
    int invalidations = 0;
    for (const auto& text : texts) {
        invalidations += text.rfind(" ***** INVALIDATED 0x", 0) == 0 && text.size() > 6 &&
                         text.compare(text.size() - 6, 6, " *****") == 0;
    }
    EXPECT_EQ(invalidations, 1) << ::testing::PrintToString(texts);
    EXPECT_TRUE(capture.contains("Could not create KxServerConnection"));
    EXPECT_TRUE(model().hasPendingRetry());
    // The state decoded before the service went is still there.
    EXPECT_EQ(*model().state()->get("Last length").string(), "20");
}

TEST_F(VelmarModelTest, SendPortDyingIsFoundByTheNextTick) {
    FakeTelephonyService service;
    model().restartMonitor();
    ASSERT_TRUE(model().isConnected());
    testing::LogCapture capture;
    service.closeChannel();
    // The receive port may learn first from its own connection; either way exactly one invalidation.
    queue_.runFor(0.2);
    model().refresh();
    queue_.runFor(0.2);
    int invalidations = 0;
    for (const auto& text : capture.texts()) {
        invalidations += text.rfind(" ***** INVALIDATED", 0) == 0;
    }
    EXPECT_EQ(invalidations, 1);
    // The restart finds the service still there and comes up on a new channel.
    EXPECT_EQ(service.channelsCreated(), 2);
    EXPECT_TRUE(model().isConnected());
}

TEST_F(VelmarModelTest, EachTreeBuildSamplesTheNumericLeavesKeptAcrossReconnectsClearedOnAnotherTechnology) {
    Clock::setNowForTesting(1000.0);
    std::vector<std::string> served;
    VelmarModel model(
        [&served](std::string_view technology) -> std::unique_ptr<MonitorGenerator> {
            served.emplace_back(technology);
            return std::make_unique<CountingGenerator>();
        },
        queue_, &redraws_);
    auto service = std::make_unique<FakeTelephonyService>();
    model.restartMonitor();
    ASSERT_TRUE(model.isConnected());
    service->sendBlob(blob(20));
    ASSERT_TRUE(queue_.runUntil([&] { return model.isUpdated(); }, 5.0));
    ASSERT_TRUE(model.topLevelNodes());
    // "Blobs", "Last length" and "Cell/PCI" read as numbers.
    EXPECT_EQ(model.history().seriesCount(), 3u);
    ASSERT_TRUE(model.history().series("/Cell/PCI"));
    EXPECT_EQ(model.history().series("/Cell/PCI")->newest().value, 101.0);
    EXPECT_EQ(model.history().series("/Last length")->newest().time, 1000.0);
    // The tree is built once per acting tick: asking again samples nothing more.
    model.nodeAtPath("/Cell/PCI");
    model.topLevelNodes();
    EXPECT_EQ(model.history().series("/Cell/PCI")->size(), 1u);
    model.refresh();
    Clock::setNowForTesting(1002.0);
    service->sendBlob(blob(30));
    ASSERT_TRUE(queue_.runUntil([&] { return model.isUpdated(); }, 5.0));
    model.refresh();
    model.topLevelNodes();
    EXPECT_EQ(model.history().series("/Cell/PCI")->size(), 2u);
    EXPECT_EQ(model.history().series("/Last length")->newest().value, 30.0);

    // The service goes and comes back with the same technology: the history stays.
    service.reset();
    queue_.runUntil([&] { return !model.isConnected(); }, 5.0);
    service = std::make_unique<FakeTelephonyService>();
    model.restartMonitor();
    ASSERT_TRUE(model.isConnected());
    EXPECT_EQ(model.history().series("/Cell/PCI")->size(), 2u);
    service->sendBlob(blob(40));
    ASSERT_TRUE(queue_.runUntil([&] { return model.isUpdated(); }, 5.0));

    // Another technology: other paths, other meanings; the history starts again.
    service.reset();
    queue_.runUntil([&] { return !model.isConnected(); }, 5.0);
    service = std::make_unique<FakeTelephonyService>(
        FakeTelephonyService::Behaviour{.technology = "kKxLogChannelTechnology_Orvane_GSM"});
    model.restartMonitor();
    ASSERT_TRUE(model.isConnected());
    EXPECT_EQ(served.size(), 3u);
    EXPECT_EQ(model.history().seriesCount(), 0u);
    model.destroyPorts();
}

}  // namespace
}  // namespace velmar
