#include "LogGenerator/GSM/ServingPLMN.h"

#include "LogGenerator/CellMonitorWalk.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/StringFormat.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "ServingPLMN");

constexpr ValueName kServiceTypeRows[] = {
    {0, 0, "NO_SERVICE"},    {1, 1, "CS_ONLY"},         {2, 2, "PS_ONLY"},
    {3, 3, "CS_PS_SERVICE"}, {4, 4, "LIMITED_SERVICE"},
};
constexpr ValueNames kServiceTypeNames{kServiceTypeRows, "Unknown"};

constexpr ValueName kSelectionModeRows[] = {
    {0, 0, "Automatic"},          {1, 1, "Manual"}, {2, 2, "Limited"}, {3, 3, "LIMITED_ROUTINE_ACQ"},
    {4, 4, "LIMITED_MANUAL_ACQ"},
};
constexpr ValueNames kSelectionModeNames{kSelectionModeRows, "Unknown"};

// 0x7135 after the two PLMN codes, which are decoded digit by digit.
constexpr RecordField kRegistrationFields[] = {
    intField(18, 2, FieldEncoding::BigUnsigned, "Location Area Code"),
    u8Field(20, "Routing Area Code"),
    u8Field(14, "Service Type", asName(kServiceTypeNames)),
};

// 0x7132: byte 14 is the PLMN selection mode (byte 13 belongs to the mobility-state decoders).
constexpr RecordField kSelectionModeFields[] = {
    u8Field(14, "PLMN Sel Mod", asName(kSelectionModeNames)),
};

// A BCD digit as a character: 0..9 as the digit, 10..15 (the filler 0xF among them) as a blank.
char bcdDigit(std::uint32_t nibble) {
    return nibble < 10 ? static_cast<char>('0' + nibble) : ' ';
}

void writeRegistration(ByteView data, const PlistDictionaryRef& section) {
    if (section == nullptr) {
        return;
    }
    // PLMN identity as in 3GPP TS 24.008: MCC2|MCC1, MNC3|MCC3, MNC2|MNC1 (high|low nibble).
    const RecordReader record(data);
    const std::uint32_t mcc2mcc1 = record.u8(15);
    const std::uint32_t mnc3mcc3 = record.u8(16);
    const std::uint32_t mnc2mnc1 = record.u8(17);
    section->set("Mobile Country Code", stringWithFormat("%c%c%c", bcdDigit(mcc2mcc1 & 0xF),
                                                         bcdDigit(mcc2mcc1 >> 4), bcdDigit(mnc3mcc3 & 0xF)));
    section->set("Mobile Network Code", stringWithFormat("%c%c%c", bcdDigit(mnc2mnc1 & 0xF),
                                                         bcdDigit(mnc2mnc1 >> 4), bcdDigit(mnc3mcc3 >> 4)));
    writeFields(kRegistrationFields, record, 0, *section);
}

// The cell-monitor path writes the codes as plain numbers ("1" for MCC 001), unlike the digits of 0x7135.
// The first serving cell of either technology counts.
constexpr CellMonitorField kCellMonitorFields[] = {
    {kKxCellMonitorMCC, "Mobile Country Code", "ServingPLMN: Failed to retrieve MCC\n"},
    {kKxCellMonitorMNC, "Mobile Network Code", "ServingPLMN: Failed to retrieve MNC\n"},
    {kKxCellMonitorLAC, "Location Area Code", "ServingPLMN: Failed to retrieve LAC\n"},
};
constexpr std::string_view kUmtsOrGsm[] = {kKxCellMonitorRadioAccessTechnologyUMTS,
                                           kKxCellMonitorRadioAccessTechnologyGSM};
constexpr ServingCellWalk kServingCellWalk{kUmtsOrGsm, kCellMonitorFields};

constexpr RecordRule kRules[] = {
    {kLogCodeRegistrationInfo, 32, {}, &writeRegistration},
    {kLogCodeRegistrationState, 16, kSelectionModeFields},
    {kLogCodeCellMonitor, 0, {}, &writeServingCell<kServingCellWalk>},
};
constexpr DecoderRules kDecoderRules{"Serving PLMN", kRules};

}  // namespace

ServingPLMN::ServingPLMN() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
