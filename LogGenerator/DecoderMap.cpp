#include "LogGenerator/DecoderMap.h"

#include "LogGenerator/C2K/C2KLogGenerator.h"
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "LogGenerator/ORVLogGenerator2.h"

namespace velmar {

std::optional<std::vector<DecoderMapEntry>> decoderMapOf(const LogGenerator& generator) {
    if (const auto* logCodeGenerator = dynamic_cast<const ORVLogGenerator2*>(&generator)) {
        const ClassIndex* classIndex = logCodeGenerator->classIndex();
        if (classIndex == nullptr) {
            return std::nullopt;
        }
        std::vector<DecoderMapEntry> map;
        for (const ClassIndex::Subscription& subscription : classIndex->subscriptions()) {
            map.push_back(
                {subscription.code, subscription.row->decoder, std::string(subscription.row->section)});
        }
        return map;
    }
    if (dynamic_cast<const C2KLogGenerator*>(&generator) != nullptr) {
        std::vector<DecoderMapEntry> map;
        for (const c2k::C2KParserRow& row : c2k::kParsers) {
            map.push_back({row.code, row.name, std::string()});
        }
        return map;
    }
    return std::nullopt;
}

}  // namespace velmar
