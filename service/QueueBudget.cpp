#include "service/QueueBudget.h"

#include <algorithm>

namespace velmar {

void QueueBudget::join(Member& member) {
    if (std::find(members_.begin(), members_.end(), &member) == members_.end()) {
        members_.push_back(&member);
    }
}

void QueueBudget::leave(Member& member) {
    std::erase(members_, &member);
}

void QueueBudget::enforce() {
    while (used_ > limit_) {
        Member* furthestBehind = nullptr;
        bool furthestStalled = false;
        for (Member* member : members_) {
            if (member->queuedBytes() == 0) {
                continue;
            }
            const bool stalled = member->clientStalled();
            if (furthestBehind == nullptr || (stalled && !furthestStalled) ||
                (stalled == furthestStalled && member->queuedBytes() > furthestBehind->queuedBytes())) {
                furthestBehind = member;
                furthestStalled = stalled;
            }
        }
        if (furthestBehind == nullptr || !furthestBehind->shedOldest()) {
            return;
        }
    }
}

}  // namespace velmar
