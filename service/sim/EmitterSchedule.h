// EmitterSchedule: the clock of a technology emitter. Simulated seconds are turned into whole baseband ticks
// (1/800 s), so that periods add up exactly (ten reports of 480 ms end at 4.8 s, not a rounding error past
// it), and a tick is turned into the packet timestamp (ticks since 1980-01-06 in the upper 48 bits).
//
// Contract: start() is called with the first snapshot; it anchors tick 0 of the timestamps to that snapshot's
// basebandTimestamp minus its time. A TickTimer (a periodic timer on whole ticks) fires first one period
// after arm() (or at the tick armAt() names), then every period. It is a plain value: emitters keep their
// timers as members and poll them, which keeps the emission order a pure function of the snapshots.
#pragma once

#include <array>
#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

namespace velmar::sim {

using Tick = std::int64_t;

inline constexpr Tick kTicksPerSecond = 800;
inline constexpr Tick kNever = std::numeric_limits<Tick>::max();

inline Tick ticksFromSeconds(double seconds) {
    return std::llround(seconds * kTicksPerSecond);
}
inline constexpr Tick ticksFromMilliseconds(Tick milliseconds) {
    return milliseconds * kTicksPerSecond / 1000;
}

// Writes a timestamp into a built packet's header (bytes 5..12, little-endian), so that a record whose
// content does not change is built once and restamped for every emission.
inline void restampPacket(std::vector<std::uint8_t>& packet, std::uint64_t timestamp) {
    for (std::size_t i = 0; i < 8 && 5 + i < packet.size(); ++i) {
        packet[5 + i] = static_cast<std::uint8_t>(timestamp >> (8 * i));
    }
}

class BasebandClock {
  public:
    void start(double time, std::uint64_t basebandTimestamp) {
        const std::uint64_t elapsed = static_cast<std::uint64_t>(ticksFromSeconds(time)) << 16;
        origin_ = basebandTimestamp >= elapsed ? basebandTimestamp - elapsed : 0;
        started_ = true;
    }
    bool started() const { return started_; }
    std::uint64_t timestamp(Tick tick) const { return origin_ + (static_cast<std::uint64_t>(tick) << 16); }

  private:
    std::uint64_t origin_ = 0;
    bool started_ = false;
};

class TickTimer {
  public:
    explicit TickTimer(Tick period) : period_(period) {}
    void arm(Tick now) { next_ = now + period_; }
    void armAt(Tick first) { next_ = first; }
    void disarm() { next_ = kNever; }
    bool armed() const { return next_ != kNever; }
    Tick next() const { return next_; }
    // The tick it fired at; the timer moves on by one period.
    Tick fire() {
        const Tick at = next_;
        next_ += period_;
        return at;
    }

  private:
    Tick period_;
    Tick next_ = kNever;
};

// Fires, earliest first, every timer of timers that is due by now (a timer falling due several times fires
// each time; on equal ticks the lower index goes first), calling fire(index, tickItWasDueAt).
template <std::size_t Count, typename Fire>
void fireDueTimers(std::array<TickTimer, Count>& timers, Tick now, Fire&& fire) {
    for (;;) {
        std::size_t due = Count;
        Tick dueTick = kNever;
        for (std::size_t i = 0; i < Count; ++i) {
            if (timers[i].next() < dueTick) {
                dueTick = timers[i].next();
                due = i;
            }
        }
        if (due == Count || dueTick > now) {
            return;
        }
        fire(due, timers[due].fire());
    }
}

}  // namespace velmar::sim
