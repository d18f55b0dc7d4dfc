#include "LogGenerator/LTE/LTEServingCellInfo.h"

#include "LogGenerator/CellMonitorWalk.h"
#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "LTEServingCellInfo");

constexpr const char* kUarfcnKey = "UARFCN";

constexpr ValueName kBandwidthRows[] = {
    {6, 6, "1.4 MHz"},  {15, 15, "3 MHz"},  {25, 25, "5 MHz"},
    {50, 50, "10 MHz"}, {75, 75, "15 MHz"}, {100, 100, "20 MHz"},
};
constexpr ValueNames kBandwidthNames{kBandwidthRows, "Unknown"};

constexpr RecordField kServingCellChannels[] = {
    u16Field(14, "Physical Cell ID"),
    u16Field(16, "Download Frequency"),
    u16Field(18, "Upload Frequency"),
};
constexpr RecordField kServingCellIdentity[] = {
    u8Field(20, "Download Bandwidth", asName(kBandwidthNames)),
    u8Field(21, "Upload Bandwidth", asName(kBandwidthNames)),
    u32Field(22, "Cell Identity"),
    u16Field(26, "Tracking Area Code"),
    u32Field(28, "Freq Band Indicator"),
};
constexpr RecordField kMasterInformation[] = {
    u8Field(20, "Num Tx Antennas"),
};

constexpr CellMonitorField kCellMonitorFields[] = {
    {kKxCellMonitorTAC, "Tracking Area Code", "Serving Cell Info: Failed to retrieve TAC\n"},
    {kKxCellMonitorCellId, "Cell Identity", "Serving Cell Info: Failed to retrieve Cell ID\n"},
    {kKxCellMonitorPID, "Physical Cell ID", "Serving Cell Info: Failed to retrieve Physical Cell ID\n"},
    {kKxCellMonitorBandInfo, "Freq Band Indicator",
     "Serving Cell Info: Failed to retrieve Freq Band Indicator\n"},
    {kKxCellMonitorUARFCN, kUarfcnKey, "Serving Cell Info: Failed to retrieve UARFCN\n"},
};

constexpr std::string_view kLte[] = {kKxCellMonitorRadioAccessTechnologyLTE};
constexpr ServingCellWalk kServingCellWalk{kLte, kCellMonitorFields};

// 0xB0C2 is written in two runs, with "UARFCN" removed between them.
void writeServingCellInfo(ByteView data, const PlistDictionaryRef& section) {
    if (section) {
        const RecordReader record(data);
        writeFields(kServingCellChannels, record, 0, *section);
        section->remove(kUarfcnKey);
        writeFields(kServingCellIdentity, record, 0, *section);
    }
}

// Every good 0xB0C1 record is also reported as unknown; the line is part of the record's handling.
void writeMasterInformation(ByteView data, const PlistDictionaryRef& section) {
    if (section) {
        writeFields(kMasterInformation, RecordReader(data), 0, *section);
    }
    reportUnknownLogMessage(kLogCodeLteMasterInformation);
}

constexpr RecordRule kRules[] = {
    {kLogCodeLteServingCellInfo, 38, {}, &writeServingCellInfo},
    {kLogCodeLteMasterInformation, 22, {}, &writeMasterInformation},
    {kLogCodeCellMonitor, 0, {}, &writeServingCell<kServingCellWalk>},
};
constexpr DecoderRules kDecoderRules{"LTE Serving Cell Info", kRules};

}  // namespace

LTEServingCellInfo::LTEServingCellInfo() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
