// The Qt binding of the main queue: the monitor's kinds of work on Qt's event loop.
#ifdef VELMAR_WITH_QT

#include "ui/qt/QtMainQueue.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <QElapsedTimer>
#include <QTest>

#include "tests/support/FullPipe.h"
#include "tests/ui/QtTestApplication.h"

namespace velmar {
namespace {

class QtMainQueueTest : public ::testing::Test {
  protected:
    void SetUp() override { testing::qtTestApplication(); }
    QtMainQueue queue_;
};

TEST_F(QtMainQueueTest, AsyncRunsLaterInOrderNeverInsideTheCall) {
    std::vector<int> order;
    queue_.async([&] { order.push_back(1); });
    queue_.async([&] {
        order.push_back(2);
        queue_.async([&] { order.push_back(4); });
        order.push_back(3);
    });
    EXPECT_TRUE(order.empty());
    ASSERT_TRUE(QTest::qWaitFor([&] { return order.size() == 4; }, 1000));
    EXPECT_EQ(order, (std::vector<int>{1, 2, 3, 4}));
}

TEST_F(QtMainQueueTest, AfterRunsOnceAfterTheDelayAndCanBeCancelled) {
    int fired = 0;
    int cancelled = 0;
    QElapsedTimer clock;
    clock.start();
    qint64 firedAt = 0;
    queue_.after(0.15, [&] {
        ++fired;
        firedAt = clock.elapsed();
    });
    const MainQueue::Handle never = queue_.after(0.05, [&] { ++cancelled; });
    queue_.cancelTimer(never);
    ASSERT_TRUE(QTest::qWaitFor([&] { return fired == 1; }, 2000));
    EXPECT_GE(firedAt, 150);
    QTest::qWait(200);
    EXPECT_EQ(fired, 1);
    EXPECT_EQ(cancelled, 0);
    EXPECT_EQ(queue_.activeTimers(), 0u);
}

TEST_F(QtMainQueueTest, ARepeatingTimerCancelledFromItsOwnCallbackStops) {
    int ticks = 0;
    MainQueue::Handle timer = 0;
    timer = queue_.repeating(0.02, [&] {
        if (++ticks == 3) {
            queue_.cancelTimer(timer);
        }
    });
    ASSERT_TRUE(QTest::qWaitFor([&] { return ticks == 3; }, 2000));
    QTest::qWait(100);
    EXPECT_EQ(ticks, 3);
    EXPECT_EQ(queue_.activeTimers(), 0u);
}

TEST_F(QtMainQueueTest, WatchReadableFiresOnDataAndOnHangUpUntilUnwatched) {
    int fds[2];
    ASSERT_EQ(pipe(fds), 0);
    std::string received;
    bool hungUp = false;
    MainQueue::Handle watch = 0;
    watch = queue_.watchReadable(fds[0], [&] {
        char buffer[16];
        const ssize_t count = read(fds[0], buffer, sizeof buffer);
        if (count > 0) {
            received.append(buffer, static_cast<std::size_t>(count));
        } else {
            hungUp = true;
            queue_.unwatch(watch);
        }
    });
    ASSERT_EQ(write(fds[1], "ping", 4), 4);
    ASSERT_TRUE(QTest::qWaitFor([&] { return received == "ping"; }, 1000));
    close(fds[1]);
    ASSERT_TRUE(QTest::qWaitFor([&] { return hungUp; }, 1000));
    QTest::qWait(50);
    close(fds[0]);
}

TEST_F(QtMainQueueTest, WatchWritableFiresOnceTheDescriptorHasRoomAgain) {
    testing::FullPipe pipe;
    ASSERT_TRUE(pipe.isOpen());
    int fired = 0;
    MainQueue::Handle watch = 0;
    watch = queue_.watchWritable(pipe.writeEnd(), [&] {
        ++fired;
        queue_.unwatch(watch);
    });
    QTest::qWait(50);
    EXPECT_EQ(fired, 0) << "the pipe is full";
    pipe.drain();
    ASSERT_TRUE(QTest::qWaitFor([&] { return fired == 1; }, 1000));
    QTest::qWait(50);
    EXPECT_EQ(fired, 1);
}

TEST_F(QtMainQueueTest, WorkStillScheduledWhenTheQueueGoesNeverRuns) {
    int ran = 0;
    {
        QtMainQueue local;
        local.async([&] { ++ran; });
        local.after(0.01, [&] { ++ran; });
    }
    QTest::qWait(100);
    EXPECT_EQ(ran, 0);
}

}  // namespace
}  // namespace velmar

#endif  // VELMAR_WITH_QT
