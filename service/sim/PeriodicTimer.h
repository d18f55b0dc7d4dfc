// PeriodicTimer: a period on the simulated clock, for emitters that log records at fixed rates.
//
// Contract: due(t) answers true at most once per period: the first time it is asked at or after its next
// instant, which then moves on by whole periods past t (a period missed while the record was not wanted is
// skipped, not made up). restart(t) makes it due at t.
#pragma once

namespace velmar::sim {

class PeriodicTimer {
  public:
    explicit PeriodicTimer(double period, double first = 0) : period_(period), next_(first) {}

    bool due(double time) {
        if (time + 1e-9 < next_) {
            return false;
        }
        while (next_ <= time + 1e-9) {
            next_ += period_;
        }
        return true;
    }
    void restart(double time) { next_ = time; }

  private:
    double period_;
    double next_;
};

}  // namespace velmar::sim
