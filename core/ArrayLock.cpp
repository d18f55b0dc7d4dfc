#include "core/ArrayLock.h"

#include <mutex>
#include <thread>

namespace velmar {

namespace {

struct ArrayLockState {
    std::recursive_mutex lock;
    std::uint8_t counter = 0;
    std::uint64_t outstanding = 0;  // acquisitions minus releases; touched only by the lock's holder
};

ArrayLockState& state() {
    static ArrayLockState instance;  // created once, before first use
    return instance;
}

}  // namespace

void ArrayLock::lockArray() {
    ArrayLockState& s = state();
    s.lock.lock();
    ++s.outstanding;
    s.counter = static_cast<std::uint8_t>(s.counter + 1);
}

void ArrayLock::unlockArray() {
    ArrayLockState& s = state();
    s.counter = static_cast<std::uint8_t>(s.counter - 1);
    if (s.counter == 0) {
        --s.outstanding;
        s.lock.unlock();
    }
}

std::uint8_t ArrayLock::nestingCounter() {
    return state().counter;
}

bool ArrayLock::isFreeForOtherThreads() {
    bool free = false;
    std::thread probe([&free] {
        if (state().lock.try_lock()) {
            free = true;
            state().lock.unlock();
        }
    });
    probe.join();
    return free;
}

std::uint64_t ArrayLock::outstandingAcquisitions() {
    return state().outstanding;
}

void ArrayLock::releaseOutstandingForTesting() {
    ArrayLockState& s = state();
    while (s.outstanding > 0) {
        --s.outstanding;
        s.lock.unlock();
    }
    s.counter = 0;
}

}  // namespace velmar
