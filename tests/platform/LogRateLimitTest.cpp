#include <gtest/gtest.h>

#include "core/platform/LogRateLimit.h"
#include "core/platform/SystemLog.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using Clock = LogRateLimit::Clock;

TEST(LogRateLimit, LetsAFewLinesAWindowThroughAndCountsTheRest) {
    testing::LogCapture capture;
    const Clock::time_point start = Clock::now();
    {
        LogRateLimit limit("requests rejected", kLogError, 3, 1.0);
        int allowed = 0;
        for (int i = 0; i < 1000; ++i) {
            allowed += limit.allow(start + std::chrono::microseconds(i)) ? 1 : 0;
        }
        EXPECT_EQ(allowed, 3);
        EXPECT_EQ(limit.heldBack(), 997u);
        EXPECT_TRUE(capture.lines().empty()) << "nothing is logged while the lines are held back";
        // The next window: the count comes first, then the caller's line may follow.
        EXPECT_TRUE(limit.allow(start + std::chrono::milliseconds(1500)));
        EXPECT_EQ(capture.lines(), (std::vector<testing::LogCapture::Line>{
                                       {kLogError, "requests rejected: 997 similar lines were not logged"}}));
        EXPECT_TRUE(limit.allow(start + std::chrono::milliseconds(1501)));
        EXPECT_TRUE(limit.allow(start + std::chrono::milliseconds(1502)));
        EXPECT_FALSE(limit.allow(start + std::chrono::milliseconds(1503)));
        capture.clear();
    }
    // Lines still unreported when the limit goes are counted then.
    EXPECT_EQ(capture.texts(),
              std::vector<std::string>{"requests rejected: 1 similar lines were not logged"});
}

}  // namespace
}  // namespace velmar
