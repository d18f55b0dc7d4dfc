// ReplayPacer: when each blob of a replayed recording is due, in seconds from the start of the replay.
//
// Contract: blobs are paced by their baseband timestamps (packet offset 5, 8 bytes little-endian; the upper
// 48 bits count 1/800 s) wherever the blob and the one before it both carry one: the gap between them is
// replayed, divided by the speed. A jump backwards counts as no gap and a jump forwards of more than
// kMaxGapSeconds as kMaxGapSeconds, so a recording with gaps or clock changes does not stall. A blob
// without a timestamp (too short, not a log packet, or zero) follows the one before it after one step of the
// default rate. The first blob is due at once; after newRound() (a looped replay starting over) the next
// blob comes one default step after the last.
#pragma once

#include <cstdint>
#include <optional>

#include "core/platform/ByteView.h"

namespace velmar {

class ReplayPacer {
  public:
    static constexpr double kDefaultRate = 50.0;  // blobs per second of recording without timestamps
    static constexpr double kMaxGapSeconds = 3.0;
    static constexpr double kTicksPerSecond = 800.0;

    explicit ReplayPacer(double speed = 1.0);

    // The due time of the next blob, called once per blob in replay order.
    double next(ByteView blob);
    void newRound();

    // The blob's baseband timestamp in 1/800 s ticks (the upper 48 bits); nullopt when it carries none.
    static std::optional<std::uint64_t> timestampTicks(ByteView blob);

  private:
    double speed_;
    double recordingSeconds_ = 0;
    std::optional<std::uint64_t> previousTicks_;
    bool first_ = true;
};

}  // namespace velmar
