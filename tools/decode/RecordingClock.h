// RecordingClock: when a decode of a recording refreshes the display, by the packets' own timestamps.
//
// Contract: refreshes fall on the multiples of the period since 1970 (UTC), so that every period of the
// recording that holds packets ends with one refresh stamped with that period's end: with a 2-s period, a
// packet recorded at 12:00:03.4 belongs to the refresh of 12:00:04. refreshBefore() is asked before each
// timed packet is handed on and answers the time of the refresh due first, if the packet lies past the end
// of the current period; periods without packets have no refresh. The clock never goes back: a packet
// stamped before the current period's end (out of order between subscriptions, or badly stamped, as real
// captures hold a few at 1980) is counted in the current period, so the refresh times only ever rise; a
// second recording older than the first refreshes again only once its time passes the first one's end.
// Times are microseconds since 1970.
#pragma once

#include <cstdint>
#include <optional>

namespace velmar {

class RecordingClock {
  public:
    explicit RecordingClock(std::int64_t periodMicroseconds);

    std::optional<std::int64_t> refreshBefore(std::int64_t packetTime);
    // The end of the period holding the last timed packet: the time of the refresh after the last packet;
    // none when no packet was timed.
    std::optional<std::int64_t> currentPeriodEnd() const { return periodEnd_; }

  private:
    std::int64_t endOfPeriodHolding(std::int64_t time) const;

    std::int64_t period_;
    std::optional<std::int64_t> periodEnd_;
};

}  // namespace velmar
