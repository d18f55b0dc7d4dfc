// Recording the port's frames: a private file written as received, flushed by size and by time, and a
// write failure that stops the recording once without stopping anything else.
#include "service/live/CaptureRecorder.h"

#include <gtest/gtest.h>

#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <csignal>

#include "core/platform/PollMainQueue.h"
#include "core/platform/SystemLog.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar::live {
namespace {

using Bytes = std::vector<std::uint8_t>;

TEST(CaptureRecorder, WritesEachFrameAsReceivedToAPrivateFile) {
    testing::TemporaryDirectory files;
    const std::string path = files.file("port.qmdl");
    testing::writeWholeFile(path, "old contents");
    chmod(path.c_str(), 0644);
    PollMainQueue queue;
    CaptureRecorder recorder(path);
    std::string error;
    ASSERT_TRUE(recorder.open(error)) << error;
    recorder.attach(queue);
    struct stat info {};
    ASSERT_EQ(stat(path.c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 0777, 0600U);
    EXPECT_EQ(info.st_size, 0);

    recorder.append(Bytes{0x00, 0x78, 0xF0});
    recorder.append(Bytes{0x7D, 0x5E, 0x01, 0x02});
    EXPECT_EQ(testing::readWholeFile(path), "") << "buffered";
    ASSERT_TRUE(queue.runUntil([&] { return !testing::readWholeFile(path).empty(); }, 5))
        << "flushed in time";
    EXPECT_EQ(testing::readWholeFile(path), std::string("\x00\x78\xF0\x7E\x7D\x5E\x01\x02\x7E", 9));

    // A full buffer is written at once.
    const Bytes large(CaptureRecorder::kFlushBytes, 0x11);
    recorder.append(large);
    EXPECT_EQ(testing::readWholeFile(path).size(), 9 + large.size() + 1);
    recorder.append(Bytes{0x22});
    recorder.close();
    EXPECT_EQ(testing::readWholeFile(path).size(), 9 + large.size() + 1 + 2);
    EXPECT_EQ(recorder.written(), 9 + large.size() + 1 + 2);
}

TEST(CaptureRecorder, RefusesWhatIsNotARegularFile) {
    testing::TemporaryDirectory files;
    const std::string fifo = files.file("fifo");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    std::string error;
    CaptureRecorder toFifo(fifo);
    EXPECT_FALSE(toFifo.open(error));
    EXPECT_EQ(error, fifo + ": cannot record: No such device or address");  // no reader: never blocks
    CaptureRecorder toDevice("/dev/null");
    EXPECT_FALSE(toDevice.open(error));
    EXPECT_EQ(error, "/dev/null: cannot record: not a regular file");
    CaptureRecorder toMissingFolder(files.file("no/such.qmdl"));
    EXPECT_FALSE(toMissingFolder.open(error));
    EXPECT_EQ(error, files.file("no/such.qmdl") + ": cannot record: No such file or directory");
}

TEST(CaptureRecorder, AFailedWriteStopsTheRecordingOnceAndQuietly) {
    testing::TemporaryDirectory files;
    const std::string path = files.file("full.qmdl");
    testing::LogCapture log;
    // A file-size limit stands in for a full disk: the write past it fails.
    std::signal(SIGXFSZ, SIG_IGN);
    rlimit before{};
    getrlimit(RLIMIT_FSIZE, &before);
    rlimit limit = before;
    limit.rlim_cur = 1000;
    ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &limit), 0);
    {
        CaptureRecorder recorder(path);
        std::string error;
        ASSERT_TRUE(recorder.open(error)) << error;
        const Bytes frame(CaptureRecorder::kFlushBytes, 0x33);
        recorder.append(frame);
        EXPECT_FALSE(recorder.recording());
        recorder.append(frame);  // dropped, nothing more said
        recorder.close();
    }
    setrlimit(RLIMIT_FSIZE, &before);
    std::signal(SIGXFSZ, SIG_DFL);
    EXPECT_EQ(log.textsAt(kLogError), std::vector<std::string>{"live: recording to " + path +
                                                               " stopped after 1000 bytes: File too large"});
    EXPECT_EQ(testing::readWholeFile(path).size(), 1000U);
}

}  // namespace
}  // namespace velmar::live
