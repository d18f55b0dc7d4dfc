#include "LogGenerator/LTE/ConnectedModeMeasurementMisc.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "ConnectedModeMeasurementMisc");

using namespace lte_layout::intra_frequency;

constexpr RecordField kFields[] = {
    u16Field(17, "E-ARFCN"),
    u16Field(19, "Serving Physical Cell ID"),
    u16Field(21, "Subframe Number"),
    u16Field(23, "Serving Filtered RSRP", lte_formats::kQuarterDbRsrp),
    u16Field(25, "Serving Filtered RSRQ", lte_formats::kEighthDbRsrq),
};

constexpr RecordRule kRules[] = {{kLogCodeLteIntraFrequency, kMinimumLength, kFields}};
constexpr DecoderRules kDecoderRules{"Connected mode LTE Intra-frequency Measurement", kRules};

}  // namespace

ConnectedModeMeasurementMisc::ConnectedModeMeasurementMisc() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
