#include "core/platform/SystemLog.h"

#include <gtest/gtest.h>

#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

TEST(SystemLog, CapturesExactTextAndPriority) {
    testing::LogCapture capture;
    SystemLog::log(kLogError, "Invalid log type: %x. Dropping.", 2);
    SystemLog::log(kLogWarning, " ***** Created ports (send=%s, recv=%s)", "a", "b");
    ASSERT_EQ(capture.lines().size(), 2u);
    EXPECT_EQ(capture.lines()[0], (testing::LogCapture::Line{3, "Invalid log type: 2. Dropping."}));
    EXPECT_EQ(capture.lines()[1], (testing::LogCapture::Line{4, " ***** Created ports (send=a, recv=b)"}));
}

TEST(SystemLog, ThresholdSkipsLessSevereLines) {
    testing::LogCapture capture;
    SystemLog::setThreshold(kLogError);
    SystemLog::log(kLogWarning, "not shown");
    SystemLog::log(kLogError, "shown");
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"shown"});
    EXPECT_FALSE(SystemLog::isEnabled(kLogWarning));
    EXPECT_TRUE(SystemLog::isEnabled(kLogError));
}

TEST(SystemLog, RawPriority16IsKeptForTheSinkButFilteredAsAnError) {
    testing::LogCapture capture;
    SystemLog::setThreshold(kLogError);
    EXPECT_TRUE(SystemLog::isEnabled(kLogRaw16));
    SystemLog::log(kLogRaw16, "Could not write DLF header (result=%d)", 3);
    ASSERT_EQ(capture.lines().size(), 1u);
    EXPECT_EQ(capture.lines()[0].priority, 16);
    EXPECT_EQ(capture.lines()[0].text, "Could not write DLF header (result=3)");
    SystemLog::setThreshold(1);
    EXPECT_FALSE(SystemLog::isEnabled(kLogRaw16));
}

TEST(SystemLog, StderrMirrorWritesPriorityAndText) {
    testing::LogCapture capture;
    SystemLog::setMirrorToStderr(true);
    ::testing::internal::CaptureStderr();
    SystemLog::log(kLogError, "Cannot load template for display");
    SystemLog::log(kLogRaw16, "sixteen");
    const std::string mirrored = ::testing::internal::GetCapturedStderr();
    SystemLog::setMirrorToStderr(false);
    EXPECT_EQ(mirrored, "<3> Cannot load template for display\n<16> sixteen\n");
}

TEST(SystemLog, LongLinesAreNotTruncated) {
    testing::LogCapture capture;
    const std::string longText(2000, 'x');
    SystemLog::log(kLogError, "%s!", longText.c_str());
    EXPECT_EQ(capture.texts().at(0), longText + "!");
}

TEST(SystemLog, LevelNamesAndNumbers) {
    EXPECT_EQ(SystemLog::parseLevel("error"), 3);
    EXPECT_EQ(SystemLog::parseLevel("warning"), 4);
    EXPECT_EQ(SystemLog::parseLevel("notice"), 5);
    EXPECT_EQ(SystemLog::parseLevel("debug"), 7);
    EXPECT_EQ(SystemLog::parseLevel("4"), 4);
    EXPECT_EQ(SystemLog::parseLevel("loud"), -1);
}

}  // namespace
}  // namespace velmar
