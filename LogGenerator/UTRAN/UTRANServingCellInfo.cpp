#include "LogGenerator/UTRAN/UTRANServingCellInfo.h"

#include "LogGenerator/CellMonitorWalk.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "LogGenerator/UTRAN/UTRANClassIndex.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/logcodes/UtranLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kUtranDecoders, "UTRANServingCellInfo");

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
    {kKxCellMonitorLAC, "Local Area Code", "Serving Cell Info: Failed to retrieve LAC\n"},
    {kKxCellMonitorCellId, "Cell ID", "Serving Cell Info: Failed to retrieve Cell ID\n"},
    {kKxCellMonitorBandInfo, "Freq Band Indicator",
     "Serving Cell Info: Failed to retrieve Freq Band Indicator\n"},
    {kKxCellMonitorSCN, "Cell Scrambling Code",
     "Serving Cell Info: Failed to retrieve Cell Scrambling Code\n"},
    {kKxCellMonitorUARFCN, "Uplink UARFCN", "Serving Cell Info: Failed to retrieve UARFCN\n", asInt(),
     "Downlink UARFCN"},
};

// Every serving UTRAN cell is visited, so the last one's values remain; an unreadable array is not reported.
constexpr std::string_view kUtran[] = {kKxCellMonitorRadioAccessTechnologyUTRAN2};
constexpr ServingCellWalk kServingCellWalk{kUtran, kCellMonitorFields, ServingCellWalk::Pick::EveryMatch,
                                           ServingCellWalk::UnreadableArray::Silent};

constexpr RecordRule kRules[] = {
    {kLogCodeUtranServingCell, 26, kServingCellFields},
    {kLogCodeCellMonitor, 0, {}, &writeServingCell<kServingCellWalk>},
};
constexpr DecoderRules kDecoderRules{"Serving Cell Info", kRules, DecoderRules::OtherCodes::Ignored};

}  // namespace

UTRANServingCellInfo::UTRANServingCellInfo() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
