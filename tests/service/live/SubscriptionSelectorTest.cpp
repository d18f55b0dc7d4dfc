// Which subscription of a multi-SIM modem streams, and what is said about the others.
#include "service/live/SubscriptionSelector.h"

#include <gtest/gtest.h>

#include "core/platform/SystemLog.h"
#include "tests/support/LogCapture.h"

namespace velmar::live {
namespace {

TEST(SubscriptionSelector, TheLowestIdSeenStreamsByDefaultAndUnwrappedFramesAlways) {
    testing::LogCapture log;
    SubscriptionSelector selector;
    EXPECT_TRUE(selector.streams(std::nullopt));
    EXPECT_TRUE(selector.streams(2));
    EXPECT_TRUE(selector.streams(2));
    EXPECT_TRUE(selector.streams(1)) << "a lower id takes over";
    EXPECT_FALSE(selector.streams(2));
    EXPECT_FALSE(selector.streams(2));
    EXPECT_TRUE(selector.streams(std::nullopt));
    EXPECT_FALSE(selector.streams(0xFFFFFFFF));
    EXPECT_EQ(selector.streaming(), 1U);
    EXPECT_EQ(selector.skipped(), 3U);
    EXPECT_EQ(log.textsAt(kLogNotice),
              (std::vector<std::string>{
                  "live: streaming subscription 2 (the lowest seen; --subscription picks another)",
                  "live: streaming subscription 1 (the lowest seen; --subscription picks another)",
                  "live: subscription 2: not streamed (streaming subscription 1)",
                  "live: subscription 4294967295: not streamed (streaming subscription 1)",
              }));
}

TEST(SubscriptionSelector, TheChosenIdStreamsAndTheOthersAreCountedAndLoggedOnce) {
    testing::LogCapture log;
    SubscriptionSelector selector(2);
    EXPECT_FALSE(selector.streams(1));
    EXPECT_TRUE(selector.streams(2));
    EXPECT_FALSE(selector.streams(1));
    EXPECT_FALSE(selector.streams(0));
    EXPECT_TRUE(selector.streams(std::nullopt));
    EXPECT_EQ(selector.skipped(), 3U);
    EXPECT_EQ(log.textsAt(kLogNotice), (std::vector<std::string>{
                                           "live: subscription 1: not streamed (streaming subscription 2)",
                                           "live: subscription 0: not streamed (streaming subscription 2)",
                                       }));
}

TEST(SubscriptionSelector, AFloodOfIdsIsCountedButLoggedForAFewOnly) {
    testing::LogCapture log;
    SubscriptionSelector selector(0);
    for (std::uint32_t id = 1; id <= 1000; ++id) {
        EXPECT_FALSE(selector.streams(id));
    }
    EXPECT_EQ(selector.skipped(), 1000U);
    EXPECT_EQ(log.textsAt(kLogNotice).size(), SubscriptionSelector::kMaxLoggedIds);
}

}  // namespace
}  // namespace velmar::live
