#include "LogGenerator/UTRAN/UTRANServingCellInfo.h"

#include "LogGenerator/CellInfoArray.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordPreamble.h"
#include "LogGenerator/ServingCellWalk.h"
#include "core/platform/KxServerProtocol.h"

namespace velmar {

namespace {

constexpr const char* kTitle = "Serving Cell Info";
constexpr std::int32_t kServingCellCode = 0xD0E2;
constexpr std::int32_t kCellMonitorCode = 0xFF0001;
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

std::string_view UTRANServingCellInfo::getSectionName() const {
    return "Serving Cell Info";
}

LogCodeArray UTRANServingCellInfo::getLogCodeArray() const {
    return std::vector<std::int32_t>{kServingCellCode, kCellMonitorCode};
}

void UTRANServingCellInfo::updateWithData(ByteView data, std::int32_t logCode) {
    logDecoderTitle(kTitle);
    const PlistDictionaryRef section = sectionDictionary();
    if (logCode == kServingCellCode) {
        if (data.size() >= kServingCellMinimum && section) {
            writeFields(kServingCellFields, RecordReader(data), 0, *section);
        }
    } else if (logCode == kCellMonitorCode) {
        const CellInfoArray cellInfo(data);
        if (!cellInfo.holdsNothing()) {
            writeServingCellFields(*cellInfo.cells(), kKxCellMonitorRadioAccessTechnologyUTRAN2,
                                   ServingCellPick::EveryMatch, kCellMonitorFields, section.get());
        }
    }
}

}  // namespace velmar
