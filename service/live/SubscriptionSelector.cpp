#include "service/live/SubscriptionSelector.h"

#include <algorithm>
#include <cinttypes>

#include "core/platform/SystemLog.h"

namespace velmar::live {

bool SubscriptionSelector::decide(std::uint32_t subscription) {
    if (!chosen_ && (!streaming_ || subscription < *streaming_)) {
        const std::optional<std::uint32_t> before = streaming_;
        streaming_ = subscription;
        SystemLog::log(kLogNotice,
                       "live: streaming subscription %" PRIu32
                       " (the lowest seen; --subscription picks another)",
                       subscription);
        if (before) {
            // The one streamed until now is one of the others from here on.
            std::erase(logged_, *before);
        }
        return true;
    }
    noteSkipped(subscription);
    return false;
}

void SubscriptionSelector::noteSkipped(std::uint32_t subscription) {
    ++skipped_;
    if (logged_.size() >= kMaxLoggedIds ||
        std::find(logged_.begin(), logged_.end(), subscription) != logged_.end()) {
        return;
    }
    logged_.push_back(subscription);
    SystemLog::log(kLogNotice,
                   "live: subscription %" PRIu32 ": not streamed (streaming subscription %" PRIu32 ")",
                   subscription, *streaming_);
}

}  // namespace velmar::live
