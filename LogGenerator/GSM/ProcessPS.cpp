#include "LogGenerator/GSM/ProcessPS.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"
#include "LogGenerator/GSM/MobilityStateNames.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

// 0x7130: GMM state, sub-state and update status.
constexpr RecordField kGmmFields[] = {
    u8Field(13, "MM State", asName(kGmmStateNames)),
    u8Field(14, "MM Sub State", asName(kGmmSubStateNames)),
    u8Field(15, "Attach Reject Cause", asName(kGmmUpdateStatusNames)),
};

constexpr gsm::RecordRule kRules[] = {
    {kLogCodeGmmState, kMobilityRecordMinimumLength, kGmmFields},
    {kLogCodeRegistrationState, kMobilityRecordMinimumLength, kRegistrationStateFields},
};

}  // namespace

ProcessPS::ProcessPS() : TableDecoder(rowOf<ProcessPS>(kGsmDecoders)) {}

void ProcessPS::updateWithData(ByteView data, std::int32_t logCode) {
    if (const gsm::RecordRule* rule = gsm::admitRecord("ProcessPS", kRules, data, logCode)) {
        gsm::writeRuleFields(*rule, data, sectionDictionary().get());
    }
}

}  // namespace velmar
