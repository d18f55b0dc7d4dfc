#include "LogGenerator/GSM/ProcessCS.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"
#include "LogGenerator/GSM/MobilityStateNames.h"

namespace velmar {

namespace {

// 0x7131: MM state, sub-state and location-update status.
constexpr RecordField kMmFields[] = {
    u8Field(13, "MM State", asName(kMmStateNames)),
    u8Field(14, "MM Sub State", asName(kMmSubStateNames)),
    u8Field(15, "LU Reject Cause", asName(kLocationUpdateStatusNames)),
};

constexpr gsm::RecordRule kRules[] = {
    {0x7131, kMobilityRecordMinimumLength, kMmFields},
    {0x7132, kMobilityRecordMinimumLength, kRegistrationStateFields},
};

}  // namespace

void ProcessCS::updateWithData(ByteView data, std::int32_t logCode) {
    if (const gsm::RecordRule* rule = gsm::admitRecord("ProcessCS", kRules, data, logCode)) {
        gsm::writeRuleFields(*rule, data, sectionDictionary().get());
    }
}

std::string_view ProcessCS::getSectionName() const {
    return "Process CS";
}

LogCodeArray ProcessCS::getLogCodeArray() const {
    return gsm::codesOf(kRules);
}

}  // namespace velmar
