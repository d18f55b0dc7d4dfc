#include "LogGenerator/GSM/ProcessCO.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"
#include "LogGenerator/GSM/MobilityStateNames.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

// 0x7131: the common view shows the MM state only.
constexpr RecordField kMmFields[] = {
    u8Field(13, "MM State", asName(kMmStateNames)),
};

constexpr gsm::RecordRule kRules[] = {
    {kLogCodeMmState, kMobilityRecordMinimumLength, kMmFields},
    {kLogCodeRegistrationState, kMobilityRecordMinimumLength, kRegistrationStateFields},
};

}  // namespace

ProcessCO::ProcessCO() : TableDecoder(rowOf<ProcessCO>(kGsmDecoders)) {}

void ProcessCO::updateWithData(ByteView data, std::int32_t logCode) {
    // The common view logs the circuit-switched decoder's title, "ProcessCS", as its own.
    if (const gsm::RecordRule* rule = gsm::admitRecord("ProcessCS", kRules, data, logCode)) {
        gsm::writeRuleFields(*rule, data, sectionDictionary().get());
    }
}

}  // namespace velmar
