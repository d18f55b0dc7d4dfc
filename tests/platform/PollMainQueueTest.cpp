// The poll binding of the main queue watching descriptors: readable data and hang-ups, and room to write
// again for a writer that must not block.
#include "core/platform/PollMainQueue.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <string>

#include "tests/support/FullPipe.h"

namespace velmar {
namespace {

TEST(PollMainQueue, WatchReadableFiresOnDataAndOnHangUpUntilUnwatched) {
    PollMainQueue queue;
    int fds[2];
    ASSERT_EQ(pipe2(fds, O_NONBLOCK), 0);
    std::string received;
    bool hungUp = false;
    MainQueue::Handle watch = 0;
    watch = queue.watchReadable(fds[0], [&] {
        char buffer[16];
        const ssize_t count = read(fds[0], buffer, sizeof buffer);
        if (count > 0) {
            received.append(buffer, static_cast<std::size_t>(count));
        } else if (count == 0) {
            hungUp = true;
            queue.unwatch(watch);
        }
    });
    ASSERT_EQ(write(fds[1], "ping", 4), 4);
    ASSERT_TRUE(queue.runUntil([&] { return received == "ping"; }, 5));
    close(fds[1]);
    ASSERT_TRUE(queue.runUntil([&] { return hungUp; }, 5));
    close(fds[0]);
}

TEST(PollMainQueue, WatchWritableFiresOnceTheDescriptorHasRoomAgain) {
    PollMainQueue queue;
    testing::FullPipe pipe;
    ASSERT_TRUE(pipe.isOpen());
    int fired = 0;
    MainQueue::Handle watch = 0;
    watch = queue.watchWritable(pipe.writeEnd(), [&] {
        ++fired;
        queue.unwatch(watch);
    });
    queue.runFor(0.05);
    EXPECT_EQ(fired, 0) << "the pipe is full";
    pipe.drain();
    ASSERT_TRUE(queue.runUntil([&] { return fired == 1; }, 5));
    queue.runFor(0.05);
    EXPECT_EQ(fired, 1) << "unwatched from its own callback";
}

}  // namespace
}  // namespace velmar
