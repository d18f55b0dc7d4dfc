#include "LogGenerator/GSM/ProcessPS.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"
#include "LogGenerator/GSM/MobilityStateNames.h"

namespace velmar {

namespace {

// 0x7130: GMM state, sub-state and update status.
constexpr RecordField kGmmFields[] = {
    u8Field(13, "MM State", asName(kGmmStateNames)),
    u8Field(14, "MM Sub State", asName(kGmmSubStateNames)),
    u8Field(15, "Attach Reject Cause", asName(kGmmUpdateStatusNames)),
};

constexpr gsm::RecordRule kRules[] = {
    {0x7130, kMobilityRecordMinimumLength, kGmmFields},
    {0x7132, kMobilityRecordMinimumLength, kRegistrationStateFields},
};

}  // namespace

void ProcessPS::updateWithData(ByteView data, std::int32_t logCode) {
    if (const gsm::RecordRule* rule = gsm::admitRecord("ProcessPS", kRules, data, logCode)) {
        gsm::writeRuleFields(*rule, data, sectionDictionary().get());
    }
}

std::string_view ProcessPS::getSectionName() const {
    return "Process PS";
}

LogCodeArray ProcessPS::getLogCodeArray() const {
    return gsm::codesOf(kRules);
}

}  // namespace velmar
