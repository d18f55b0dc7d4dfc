#include "service/BlobQueue.h"

#include <gtest/gtest.h>

#include <vector>

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

Bytes frontOf(const BlobQueue& queue) {
    return Bytes(queue.front().begin(), queue.front().end());
}

TEST(BlobQueue, IsFirstInFirstOutAndDropsTheOldestWhenFull) {
    BlobQueue queue(3, 1000);
    EXPECT_TRUE(queue.empty());
    EXPECT_EQ(queue.push(Bytes{1}), 0U);
    EXPECT_EQ(queue.push(Bytes{2, 2}), 0U);
    EXPECT_EQ(queue.push(Bytes{3, 3, 3}), 0U);
    EXPECT_EQ(queue.size(), 3U);
    EXPECT_EQ(queue.bytes(), 6U);
    EXPECT_EQ(queue.push(Bytes{4}), 1U);
    EXPECT_EQ(queue.size(), 3U);
    EXPECT_EQ(queue.bytes(), 6U);
    EXPECT_EQ(frontOf(queue), (Bytes{2, 2}));
    queue.pop();
    EXPECT_EQ(frontOf(queue), (Bytes{3, 3, 3}));
    queue.pop();
    EXPECT_EQ(frontOf(queue), (Bytes{4}));
    queue.pop();
    EXPECT_TRUE(queue.empty());
    EXPECT_EQ(queue.bytes(), 0U);
}

TEST(BlobQueue, KeepsToItsByteLimit) {
    BlobQueue queue(100, 10);
    EXPECT_EQ(queue.push(Bytes(4, 1)), 0U);
    EXPECT_EQ(queue.push(Bytes(4, 2)), 0U);
    EXPECT_EQ(queue.push(Bytes(4, 3)), 1U);
    EXPECT_EQ(queue.bytes(), 8U);
    EXPECT_EQ(frontOf(queue), Bytes(4, 2));
    // A blob larger than the limit on its own pushes everything out and stays alone.
    EXPECT_EQ(queue.push(Bytes(20, 9)), 2U);
    EXPECT_EQ(queue.size(), 1U);
    EXPECT_EQ(frontOf(queue), Bytes(20, 9));
}

TEST(BlobQueue, ReusedBuffersHoldOnlyTheirNewBlob) {
    BlobQueue queue(2, 1000);
    queue.push(Bytes(50, 7));
    queue.pop();
    queue.push(Bytes{1, 2, 3});
    EXPECT_EQ(frontOf(queue), (Bytes{1, 2, 3}));
    EXPECT_EQ(queue.bytes(), 3U);
    queue.push(Bytes{4});
    queue.clear();
    EXPECT_TRUE(queue.empty());
    EXPECT_EQ(queue.bytes(), 0U);
}

}  // namespace
}  // namespace velmar
