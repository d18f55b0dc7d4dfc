#include "LogGenerator/GSM/ProcessCS.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"
#include "LogGenerator/GSM/MobilityStateNames.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

// 0x7131: MM state, sub-state and location-update status.
constexpr RecordField kMmFields[] = {
    u8Field(13, "MM State", asName(kMmStateNames)),
    u8Field(14, "MM Sub State", asName(kMmSubStateNames)),
    u8Field(15, "LU Reject Cause", asName(kLocationUpdateStatusNames)),
};

constexpr gsm::RecordRule kRules[] = {
    {kLogCodeMmState, kMobilityRecordMinimumLength, kMmFields},
    {kLogCodeRegistrationState, kMobilityRecordMinimumLength, kRegistrationStateFields},
};

}  // namespace

ProcessCS::ProcessCS() : TableDecoder(rowOf<ProcessCS>(kGsmDecoders)) {}

void ProcessCS::updateWithData(ByteView data, std::int32_t logCode) {
    if (const gsm::RecordRule* rule = gsm::admitRecord("ProcessCS", kRules, data, logCode)) {
        gsm::writeRuleFields(*rule, data, sectionDictionary().get());
    }
}

}  // namespace velmar
