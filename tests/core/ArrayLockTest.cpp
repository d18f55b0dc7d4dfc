#include "core/ArrayLock.h"

#include <gtest/gtest.h>

namespace velmar {
namespace {

class ArrayLockTest : public ::testing::Test {
  protected:
    void SetUp() override { ArrayLock::releaseOutstandingForTesting(); }
    void TearDown() override { ArrayLock::releaseOutstandingForTesting(); }
};

TEST_F(ArrayLockTest, LockThenUnlockLeavesTheLockFree) {
    ArrayLock::lockArray();
    EXPECT_FALSE(ArrayLock::isFreeForOtherThreads());
    EXPECT_EQ(ArrayLock::nestingCounter(), 1);
    ArrayLock::unlockArray();
    EXPECT_EQ(ArrayLock::nestingCounter(), 0);
    EXPECT_EQ(ArrayLock::outstandingAcquisitions(), 0u);
    EXPECT_TRUE(ArrayLock::isFreeForOtherThreads());
}

TEST_F(ArrayLockTest, NestedUseLeavesTheLockHeldOnceByThisThread) {
    ArrayLock::lockArray();
    ArrayLock::lockArray();
    ArrayLock::unlockArray();
    ArrayLock::unlockArray();
    EXPECT_EQ(ArrayLock::nestingCounter(), 0);
    EXPECT_EQ(ArrayLock::outstandingAcquisitions(), 1u);
    EXPECT_FALSE(ArrayLock::isFreeForOtherThreads());
    // The owning thread can always enter again: the lock is recursive.
    ArrayLock::lockArray();
    ArrayLock::unlockArray();
    EXPECT_EQ(ArrayLock::outstandingAcquisitions(), 1u);
}

TEST_F(ArrayLockTest, CounterWrapsModulo256) {
    for (int i = 0; i < 256; ++i) {
        ArrayLock::lockArray();
    }
    EXPECT_EQ(ArrayLock::nestingCounter(), 0);
    ArrayLock::unlockArray();
    EXPECT_EQ(ArrayLock::nestingCounter(), 255);
}

}  // namespace
}  // namespace velmar
