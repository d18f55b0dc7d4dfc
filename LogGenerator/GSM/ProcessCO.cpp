#include "LogGenerator/GSM/ProcessCO.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"
#include "LogGenerator/GSM/MobilityStateNames.h"

namespace velmar {

namespace {

// 0x7131: the common view shows the MM state only.
constexpr RecordField kMmFields[] = {
    u8Field(13, "MM State", asName(kMmStateNames)),
};

constexpr gsm::RecordRule kRules[] = {
    {0x7131, kMobilityRecordMinimumLength, kMmFields},
    {0x7132, kMobilityRecordMinimumLength, kRegistrationStateFields},
};

}  // namespace

void ProcessCO::updateWithData(ByteView data, std::int32_t logCode) {
    // The common view logs the circuit-switched decoder's title, "ProcessCS", as its own.
    if (const gsm::RecordRule* rule = gsm::admitRecord("ProcessCS", kRules, data, logCode)) {
        gsm::writeRuleFields(*rule, data, sectionDictionary().get());
    }
}

std::string_view ProcessCO::getSectionName() const {
    return "Process CO";
}

LogCodeArray ProcessCO::getLogCodeArray() const {
    return gsm::codesOf(kRules);
}

}  // namespace velmar
