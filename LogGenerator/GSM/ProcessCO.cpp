#include "LogGenerator/GSM/ProcessCO.h"

#include "LogGenerator/GSM/MobilityStateNames.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "ProcessCO");

// 0x7131: the common view shows the MM state only.
constexpr RecordField kMmFields[] = {
    u8Field(13, "MM State", asName(kMmStateNames)),
};

constexpr RecordRule kRules[] = {
    {kLogCodeMmState, kMobilityRecordMinimumLength, kMmFields},
    {kLogCodeRegistrationState, kMobilityRecordMinimumLength, kRegistrationStateFields},
};
// The common view logs the circuit-switched decoder's title, "ProcessCS", as its own.
constexpr DecoderRules kDecoderRules{"ProcessCS", kRules};

}  // namespace

ProcessCO::ProcessCO() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
