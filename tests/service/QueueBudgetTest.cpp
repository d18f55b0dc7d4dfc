#include "service/QueueBudget.h"

#include <gtest/gtest.h>

#include <deque>

namespace velmar {
namespace {

// A queue of blobs of given sizes that counts itself into the budget, as a log channel does.
class FakeQueue : public QueueBudget::Member {
  public:
    FakeQueue(QueueBudget& budget, bool stalled) : budget_(budget), stalled_(stalled) { budget_.join(*this); }
    ~FakeQueue() override { budget_.leave(*this); }

    void push(std::size_t bytes) {
        blobs_.push_back(bytes);
        budget_.add(bytes);
        budget_.enforce();
    }
    std::size_t queuedBytes() const override {
        std::size_t total = 0;
        for (const std::size_t bytes : blobs_) {
            total += bytes;
        }
        return total;
    }
    bool clientStalled() const override { return stalled_; }
    bool shedOldest() override {
        if (blobs_.empty()) {
            return false;
        }
        budget_.remove(blobs_.front());
        blobs_.pop_front();
        ++shed;
        return true;
    }

    int shed = 0;

  private:
    QueueBudget& budget_;
    bool stalled_;
    std::deque<std::size_t> blobs_;
};

TEST(QueueBudgetTest, AStalledClientLosesItsOldestBlobsBeforeAReaderThatHoldsMore) {
    QueueBudget budget(1000);
    FakeQueue reader(budget, false);
    FakeQueue stalled(budget, true);
    for (int i = 0; i < 3; ++i) {
        stalled.push(100);
    }
    for (int i = 0; i < 6; ++i) {
        reader.push(100);  // a reader a little behind holds more than the stalled client
    }
    reader.push(100);
    reader.push(100);
    EXPECT_EQ(budget.used(), 1000u);
    EXPECT_EQ(reader.shed, 0);
    EXPECT_EQ(stalled.shed, 1);
    EXPECT_EQ(stalled.queuedBytes(), 200u);
}

TEST(QueueBudgetTest, OfStalledClientsTheOneHoldingMostShedsAndWithoutAnyTheLargestQueueDoes) {
    QueueBudget budget(600);
    FakeQueue small(budget, true);
    FakeQueue large(budget, true);
    small.push(100);
    large.push(200);
    large.push(200);
    small.push(200);  // 700 in all: the larger stalled queue loses its oldest
    EXPECT_EQ(large.shed, 1);
    EXPECT_EQ(small.shed, 0);
    EXPECT_EQ(budget.used(), 500u);

    QueueBudget readersOnly(300);
    FakeQueue first(readersOnly, false);
    FakeQueue second(readersOnly, false);
    first.push(100);
    second.push(150);
    second.push(150);  // no stalled client: the queue holding the most sheds
    EXPECT_EQ(second.shed, 1);
    EXPECT_EQ(first.shed, 0);
    EXPECT_EQ(readersOnly.used(), 250u);
}

TEST(QueueBudgetTest, AStalledClientWithNothingQueuedDoesNotStopTheShedding) {
    QueueBudget budget(200);
    FakeQueue emptyStalled(budget, true);
    FakeQueue reader(budget, false);
    reader.push(150);
    reader.push(150);
    EXPECT_EQ(reader.shed, 1);
    EXPECT_EQ(budget.used(), 150u);
}

}  // namespace
}  // namespace velmar
