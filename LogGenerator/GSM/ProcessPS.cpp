#include "LogGenerator/GSM/ProcessPS.h"

#include "LogGenerator/GSM/MobilityStateNames.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "ProcessPS");

// 0x7130: GMM state, sub-state and update status.
constexpr RecordField kGmmFields[] = {
    u8Field(13, "MM State", asName(kGmmStateNames)),
    u8Field(14, "MM Sub State", asName(kGmmSubStateNames)),
    u8Field(15, "Attach Reject Cause", asName(kGmmUpdateStatusNames)),
};

constexpr RecordRule kRules[] = {
    {kLogCodeGmmState, kMobilityRecordMinimumLength, kGmmFields},
    {kLogCodeRegistrationState, kMobilityRecordMinimumLength, kRegistrationStateFields},
};
constexpr DecoderRules kDecoderRules{"ProcessPS", kRules};

}  // namespace

ProcessPS::ProcessPS() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
