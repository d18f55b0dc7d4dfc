// SubscriptionSelector: which subscription (SIM) of a multi-SIM modem streams to the channels.
//
// Contract: frames that came without a wrapper always stream. Of the wrapped ones, those of the chosen
// subscription stream (--subscription N), or by default those of the lowest subscription id seen so far (a
// lower id seen later takes over, and says so). Frames of the other subscriptions are counted; the first
// frame of each is logged at notice, once per id, for at most kMaxLoggedIds ids.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

namespace velmar::live {

class SubscriptionSelector {
  public:
    static constexpr std::size_t kMaxLoggedIds = 16;

    explicit SubscriptionSelector(std::optional<std::uint32_t> chosen = std::nullopt)
        : chosen_(chosen), streaming_(chosen) {}

    bool streams(std::optional<std::uint32_t> subscription) {
        if (!subscription || (streaming_ && *subscription == *streaming_)) {
            return true;
        }
        return decide(*subscription);
    }

    std::optional<std::uint32_t> streaming() const { return streaming_; }
    std::uint64_t skipped() const { return skipped_; }

  private:
    bool decide(std::uint32_t subscription);
    void noteSkipped(std::uint32_t subscription);

    std::optional<std::uint32_t> chosen_;
    std::optional<std::uint32_t> streaming_;
    std::vector<std::uint32_t> logged_;
    std::uint64_t skipped_ = 0;
};

}  // namespace velmar::live
