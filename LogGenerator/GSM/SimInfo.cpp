#include "LogGenerator/GSM/SimInfo.h"

#include "LogGenerator/GSM/LogCode_0xFF0000.h"
#include "LogGenerator/RecordRule.h"

namespace velmar {

namespace {

struct SimFileKey {
    const char* recordKey;
    const char* displayKey;
};

constexpr SimFileKey kSimFiles[] = {
    {"kSimFile_ICCID", "EF-ICCID"},
    {"kSimFile_MSISDN", "EF-MSISDN"},
    {"kSimFile_MBDN", "EF-3GPP MAIL BOX DIALING NUMBER"},
    {"kSimFile_HPPLMN", "EF-HPPLMN SEARCH PERIOD"},
    {"kSimFile_LOCI", "EF-LOCI"},
    {"kSimFile_PSLOCI", "EF-GPRS/PS-LOCI"},
    {"kSimFile_ACC", "EF-ACCESS CONTROL CLASS"},
    {"kSimFile_AD", "EF-ADMINISTRATIVE DATA"},
    {"kSimFile_FPLMN", "EF-FPLMN"},
    {"kSimFile_AHPLMN", "EF-ACTING HPLMN"},
    {"kSimFile_RATMODE", "EF-RAT MODE"},
    {"kSimFile_PNN", "EF-PLMN NETWORK NAME"},
    {"kSimFile_OPL", "EF-OPERATOR PLMN LIST"},
    {"kSimFile_OPLMNAcT", "EF-OPLMNAcT"},
};

void writeSimFiles(ByteView data, const PlistDictionaryRef& section) {
    // Throws, before any key changes, when the record cannot be parsed.
    const LogCode_0xFF0000::SimFileDictionary simFiles(data);
    if (!section) {
        return;
    }
    for (const SimFileKey& file : kSimFiles) {
        if (const PlistValue* value = simFiles.files().find(file.recordKey)) {
            section->set(file.displayKey, *value);
        }
    }
}

constexpr RecordRule kRules[] = {
    {kLogCodeSimFiles, 0, {}, &writeSimFiles},
};
constexpr DecoderRules kDecoderRules{"SimInfo", kRules, DecoderRules::OtherCodes::Ignored};

}  // namespace

SimInfo::SimInfo() : KeySectionDecoder(kSimInfoRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kSimInfoRow));

}  // namespace velmar
