// ArrayLock: the one process-wide lock under which list sections of the display are rewritten and walked.
//
// Contract: lockArray acquires a recursive lock and then adds 1 to an 8-bit nesting counter; unlockArray
// subtracts 1 (modulo 256) and releases the recursive lock once only when the counter is back at 0. Nested
// use on one thread therefore leaves the lock held by that thread after the outermost unlockArray. This
// asymmetry is intended: the main thread, which does all the work, can always enter again because the lock is
// recursive, while no other thread can enter once nesting has happened.
#pragma once

#include <cstdint>

namespace velmar {

class ArrayLock {
  public:
    ArrayLock() = delete;

    static void lockArray();
    static void unlockArray();

    // The current value of the nesting counter.
    static std::uint8_t nestingCounter();
    // Whether a thread other than the caller could take the lock now (tries and releases at once).
    static bool isFreeForOtherThreads();
    // Diagnostics for tests: how many acquisitions of the recursive lock are outstanding, and a way for the
    // owning thread to give all of them back so that one test's nesting does not leak into the next.
    static std::uint64_t outstandingAcquisitions();
    static void releaseOutstandingForTesting();
};

}  // namespace velmar
