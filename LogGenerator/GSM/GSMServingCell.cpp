#include "LogGenerator/GSM/GSMServingCell.h"

#include "LogGenerator/CellMonitorWalk.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "GSMServingCell");

constexpr RecordField kIdentityFields[] = {
    u16Field(17, "Cell ID"),
    u16Field(13, "ARFCN"),
    u16Field(15, "BSIC"),
};

// The raw RSSI byte is shown with its unit but without sign change or scaling; C1 and C2 are 32-bit fields of
// which only the low 16 bits are shown.
constexpr RecordField kMeasurementFields[] = {
    u8Field(15, "RSSI", asInt("%d dBm")),
    bitField(16, 4, 0, 15, "C1 Value"),
    bitField(20, 4, 0, 15, "C2 Value"),
};

// Only the low byte of the 2-byte ARFCN is shown (0..255).
constexpr RecordField kDedicatedChannelFields[] = {
    bitField(13, 2, 0, 7, "MA Dedicated ARFCN"),
};

constexpr CellMonitorField kCellMonitorFields[] = {
    {kKxCellMonitorCellId, "Cell ID", "GSMServingCell: Failed to retrieve Cell ID\n"},
    {kKxCellMonitorARFCN, "ARFCN", "GSMServingCell: Failed to retrieve ARFCN\n"},
};
constexpr std::string_view kGsm[] = {kKxCellMonitorRadioAccessTechnologyGSM};
constexpr ServingCellWalk kServingCellWalk{kGsm, kCellMonitorFields};

constexpr RecordRule kRules[] = {
    {kLogCodeGsmServingIdentity, 26, kIdentityFields},
    {kLogCodeGsmMeasurements, 29, kMeasurementFields},
    {kLogCodeGsmDedicatedChannel, 17, kDedicatedChannelFields},
    {kLogCodeCellMonitor, 0, {}, &writeServingCell<kServingCellWalk>},
};
constexpr DecoderRules kDecoderRules{"GSMServingCell", kRules};

}  // namespace

GSMServingCell::GSMServingCell() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
