#include "LogGenerator/SubscribedCodes.h"

#include "LogGenerator/ORVLogGenerator2.h"

namespace velmar {

std::optional<SubscribedCodes> SubscribedCodes::of(const LogGenerator& generator) {
    const auto* binary = dynamic_cast<const ORVLogGenerator2*>(&generator);
    if (binary == nullptr || binary->gathersRawBlobs()) {
        return std::nullopt;
    }
    SubscribedCodes codes;
    if (const ClassIndex* index = binary->classIndex()) {
        for (const std::int32_t code : index->subscribedCodes()) {
            if (code >= 0 && code <= 0xFFFF) {
                codes.plain_.set(static_cast<std::size_t>(code));
            } else if (code >= kExtendedCodeBase && code <= kExtendedCodeBase + 0xFFFF) {
                codes.extended_.set(static_cast<std::size_t>(code - kExtendedCodeBase));
            }
        }
    }
    return codes;
}

}  // namespace velmar
