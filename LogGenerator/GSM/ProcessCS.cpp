#include "LogGenerator/GSM/ProcessCS.h"

#include "LogGenerator/GSM/MobilityStateNames.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "ProcessCS");

// 0x7131: MM state, sub-state and location-update status.
constexpr RecordField kMmFields[] = {
    u8Field(13, "MM State", asName(kMmStateNames)),
    u8Field(14, "MM Sub State", asName(kMmSubStateNames)),
    u8Field(15, "LU Reject Cause", asName(kLocationUpdateStatusNames)),
};

constexpr RecordRule kRules[] = {
    {kLogCodeMmState, kMobilityRecordMinimumLength, kMmFields},
    {kLogCodeRegistrationState, kMobilityRecordMinimumLength, kRegistrationStateFields},
};
constexpr DecoderRules kDecoderRules{"ProcessCS", kRules};

}  // namespace

ProcessCS::ProcessCS() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
