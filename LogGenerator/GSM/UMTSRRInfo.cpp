#include "LogGenerator/GSM/UMTSRRInfo.h"

#include "LogGenerator/CellMonitorWalk.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/StringFormat.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "UMTSRRInfo");

constexpr ValueName kRrcStateRows[] = {
    {0, 0, "Disconnected"}, {1, 1, "Connecting"}, {2, 2, "CELL_FACH"},
    {3, 3, "CELL_DCH"},     {4, 4, "CELL_PCH"},   {5, 5, "URA_PCH"},
};
constexpr ValueNames kRrcStateNames{kRrcStateRows, "Unknown"};

constexpr ValueName kCipheringRows[] = {{0, 0, "Disabled"}};
constexpr ValueNames kCipheringNames{kCipheringRows, "Enabled"};

constexpr RecordField kRrcStateFields[] = {
    u8Field(13, "RRC State", asName(kRrcStateNames)),
};

// 0x4127 up to the frequencies; "UARFCN" is removed after them and "URA ID" follows.
constexpr RecordField kCellIdentityFields[] = {
    s32Field(21, "Cell ID"),
    s32Field(17, "Downlink Frequency"),
    s32Field(13, "Uplink Frequency"),
};
constexpr RecordField kUraFields[] = {
    u16Field(25, "URA ID"),
};

constexpr RecordField kCipheringFields[] = {
    u8Field(13, "Ciphering", asName(kCipheringNames)),
};

// 0x4031: the mean of the non-zero uplink power readings. With no such reading the mean is 0 / 0 and shows
// as not-a-number; the display has always shown it so.
void writeTransmitPower(ByteView data, const PlistDictionaryRef& section) {
    constexpr std::size_t kCountOffset = 14;
    constexpr std::size_t kFirstEntryOffset = 16;
    constexpr std::size_t kEntryLength = 14;
    constexpr std::size_t kReadingOffset = 4;
    const RecordReader record(data);
    const std::size_t entries = record.u8(kCountOffset);
    double sum = 0;
    int counted = 0;
    for (std::size_t entry = 0; entry < entries; ++entry) {
        const int reading = record.s16(kFirstEntryOffset + kEntryLength * entry + kReadingOffset);
        if (reading != 0) {
            sum += (reading + 512) / 10 - 70;  // integer division, toward zero
            ++counted;
        }
    }
    if (section != nullptr) {
        section->set("Transmit Power", stringWithFormat("%4.2lf dBm", sum / counted));
    }
}

void writeCellIdentity(ByteView data, const PlistDictionaryRef& section) {
    if (section == nullptr) {
        return;
    }
    const RecordReader record(data);
    writeFields(kCellIdentityFields, record, 0, *section);
    // This record's frequencies replace the UARFCN that cell information wrote.
    section->remove("UARFCN");
    writeFields(kUraFields, record, 0, *section);
}

constexpr CellMonitorField kCellMonitorFields[] = {
    {kKxCellMonitorCellId, "Cell ID", "UMTSRRInfo: Failed to retrieve Cell ID\n"},
    {kKxCellMonitorUARFCN, "UARFCN", "UMTSRRInfo: Failed to retrieve UARFCN\n"},
    {kKxCellMonitorPSC, "Scrambling Code", "UMTSRRInfo: Failed to retrieve Scrambling Code\n"},
};
constexpr std::string_view kUmts[] = {kKxCellMonitorRadioAccessTechnologyUMTS};
constexpr ServingCellWalk kServingCellWalk{kUmts, kCellMonitorFields};

constexpr RecordRule kRules[] = {
    {kLogCodeUmtsRrcState, 14, kRrcStateFields},
    {kLogCodeUmtsTransmitPower, 16, {}, &writeTransmitPower},
    {kLogCodeUmtsCellIdentity, 29, {}, &writeCellIdentity},
    {kLogCodeUmtsCiphering, 19, kCipheringFields},
    {kLogCodeCellMonitor, 0, {}, &writeServingCell<kServingCellWalk>},
};
constexpr DecoderRules kDecoderRules{"UMTSRRInfo", kRules};

}  // namespace

UMTSRRInfo::UMTSRRInfo() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
