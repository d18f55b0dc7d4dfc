#include "LogGenerator/C2K/C2KDataRate.h"

#include <optional>

#include "LogGenerator/StateKeys.h"
#include "core/platform/StringFormat.h"

namespace velmar::c2k {

const DataRateKeys kForwardLinkRateKeys{"kFLDataRate", "FLDataSeqNum",  "FLDataSent", "FLDataSeqNum1",
                                        "FLDataSent1", "FLDataSeqNum2", "FLDataSent2"};
const DataRateKeys kReverseLinkRateKeys{"kRLDataRate", "RLDataSeqNum",  "RLDataSent", "RLDataSeqNum1",
                                        "RLDataSent1", "RLDataSeqNum2", "RLDataSent2"};

namespace {

std::optional<std::int64_t> numberIn(const PlistDictionary& dictionary, std::string_view key) {
    const PlistValue* value = dictionary.find(key);
    if (value == nullptr) {
        return std::nullopt;
    }
    if (const auto integer = value->integerValue()) {
        return *integer;
    }
    if (const auto real = value->realValue()) {
        return static_cast<std::int64_t>(*real);
    }
    return std::nullopt;
}

}  // namespace

void recordDataRateSample(const DataRateKeys& keys, std::uint32_t sequence, std::uint64_t bytesSent,
                          const C2KRecordContext& context) {
    PlistDictionary& state = context.state;
    const PlistDictionaryRef extraInfo = state.get(state_keys::kExtraInfo).dictionary();
    const auto newSequence = static_cast<std::int64_t>(sequence);
    const auto newSent = static_cast<std::int64_t>(bytesSent);

    const std::optional<std::int64_t> oldSequence = numberIn(state, keys.sequenceKey);
    const std::optional<std::int64_t> oldSent = numberIn(state, keys.sentKey);
    if (oldSequence && oldSent) {
        const std::int64_t advance = newSequence - *oldSequence;
        if (advance >= 1) {
            const double rate =
                static_cast<double>(newSent - *oldSent) / (static_cast<double>(advance) * 1024.0);
            context.show(keys.displayKey, PlistValue(stringWithFormat("%.2f kbps", rate)));
            if (extraInfo) {
                extraInfo->set(keys.oldSequenceKey, PlistValue::integer(*oldSequence));
                extraInfo->set(keys.oldSentKey, PlistValue::integer(*oldSent));
            }
        }
    } else {
        context.show(keys.displayKey, PlistValue(""));
    }

    state.set(keys.sequenceKey, PlistValue::integer(newSequence));
    state.set(keys.sentKey, PlistValue::integer(newSent));
    if (extraInfo) {
        extraInfo->set(keys.newSequenceKey, PlistValue::integer(newSequence));
        extraInfo->set(keys.newSentKey, PlistValue::integer(newSent));
    }
}

}  // namespace velmar::c2k
