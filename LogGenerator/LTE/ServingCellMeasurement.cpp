#include "LogGenerator/LTE/ServingCellMeasurement.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "ServingCellMeasurement");

using namespace lte_layout::serving_measurement;

constexpr const char* kNotPresent = "Not Present";

constexpr ValueName kTrueFalseRows[] = {{0, 0, "False"}, {1, 1, "True"}};
constexpr ValueNames kTrueFalse{kTrueFalseRows, "Unknown"};

constexpr RecordField kFields[] = {
    u8Field(13, "Version"),
    u16Field(17, "E-ARFCN"),
    bitField(19, 2, 0, 8, "Physical Cell ID"),
    bitField(20, 1, 1, 4, "Serving Layer Priority"),
    bitField(21, 2, 0, 8, "Measured RSRP", lte_formats::kQuarterDbRsrp),
    bitField(22, 2, 1, 9, "Average RSRP", lte_formats::kQuarterDbRsrp),
    bitField(23, 2, 2, 8, "Measured RSRQ", lte_formats::kQuarterDbRsrq),
    bitField(24, 1, 1, 7, "Average RSRQ", lte_formats::kQuarterDbRsrq),
    bitField(25, 2, 0, 8, "Measured RSSI", lte_formats::kHalfDbLevel),
    bitField(26, 1, 1, 6, "Qrxlevmin", lte_formats::kQrxlevmin),
    bitField(26, 2, 7, 13, "P_Max", lte_formats::kMinus30Dbm.withSentinel(64, kNotPresent)),
    // A 6-bit field compared with 64: it never shows "Not Present".
    bitField(27, 2, 6, 11, "Max UE Tx Power", lte_formats::kMinus30Dbm.withSentinel(64, kNotPresent)),
    bitField(29, 1, 0, 6, "Srxlev", lte_formats::kMinus30Dbm),
    bitField(29, 2, 7, 12, "Num of Consecutive DRX Cycles of S < 0"),
    bitField(30, 2, 5, 10, "S Intra Search", asInt("%d dB", 2).withSentinel(32, kNotPresent)),
    bitField(31, 2, 3, 8, "S Non Intra Search", asInt("%d dBm", 2).withSentinel(32, kNotPresent)),
    bitField(32, 1, 1, 1, "Measurement Rules Updated", asName(kTrueFalse)),
    bitField(32, 1, 2, 5, "Measurement Rules"),
};

constexpr RecordRule kRules[] = {{kLogCodeLteIdleServingMeasurement, kMinimumLength, kFields}};
constexpr DecoderRules kDecoderRules{"Serving Cell Measurements", kRules};

}  // namespace

ServingCellMeasurement::ServingCellMeasurement() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
