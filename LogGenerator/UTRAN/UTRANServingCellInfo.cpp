#include "LogGenerator/UTRAN/UTRANServingCellInfo.h"

#include "LogGenerator/CellInfoArray.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordPreamble.h"
#include "LogGenerator/ServingCellWalk.h"
#include "LogGenerator/UTRAN/UTRANClassIndex.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/logcodes/UtranLogCodes.h"

namespace velmar {

namespace {

constexpr const char* kTitle = "Serving Cell Info";
constexpr std::size_t kServingCellMinimum = 26;

constexpr ValueName kAllowedAccessRows[] = {{0, 0, "All Calls"}, {1, 1, "Emergency Calls Only"}};
constexpr ValueNames kAllowedAccess{kAllowedAccessRows, "Unknown"};

constexpr RecordField kServingCellFields[] = {
    u8Field(14, "Cell Access Restrictions"),
    u32Field(21, "Cell ID"),
    u16Field(19, "Downlink UARFCN"),
    u16Field(17, "Uplink UARFCN"),
    u8Field(15, "URA ID"),
    bitField(25, 1, 0, 0, "Allowed Access", asName(kAllowedAccess)),
};

constexpr CellMonitorField kCellMonitorFields[] = {
    {kKxCellMonitorLAC, "Local Area Code", nullptr, "Serving Cell Info: Failed to retrieve LAC\n"},
    {kKxCellMonitorCellId, "Cell ID", nullptr, "Serving Cell Info: Failed to retrieve Cell ID\n"},
    {kKxCellMonitorBandInfo, "Freq Band Indicator", nullptr,
     "Serving Cell Info: Failed to retrieve Freq Band Indicator\n"},
    {kKxCellMonitorSCN, "Cell Scrambling Code", nullptr,
     "Serving Cell Info: Failed to retrieve Cell Scrambling Code\n"},
    {kKxCellMonitorUARFCN, "Uplink UARFCN", "Downlink UARFCN",
     "Serving Cell Info: Failed to retrieve UARFCN\n"},
};

}  // namespace

UTRANServingCellInfo::UTRANServingCellInfo() : TableDecoder(rowOf<UTRANServingCellInfo>(kUtranDecoders)) {}

void UTRANServingCellInfo::updateWithData(ByteView data, std::int32_t logCode) {
    logDecoderTitle(kTitle);
    const PlistDictionaryRef section = sectionDictionary();
    if (logCode == kLogCodeUtranServingCell) {
        if (data.size() >= kServingCellMinimum && section) {
            writeFields(kServingCellFields, RecordReader(data), 0, *section);
        }
    } else if (logCode == kLogCodeCellMonitor) {
        const CellInfoArray cellInfo(data);
        if (!cellInfo.holdsNothing()) {
            writeServingCellFields(*cellInfo.cells(), kKxCellMonitorRadioAccessTechnologyUTRAN2,
                                   ServingCellPick::EveryMatch, kCellMonitorFields, section.get());
        }
    }
}

}  // namespace velmar
