#include "LogGenerator/LTE/NeighborMeasurementMisc.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "NeighborMeasurementMisc");

using namespace lte_layout::neighbor_measurement;

constexpr RecordField kFields[] = {
    u8Field(13, "Version"),
    u16Field(17, "E-ARFCN"),
    bitField(19, 1, 0, 5, "Qrxlevmin", lte_formats::kQrxlevmin),
};

constexpr RecordRule kRules[] = {{kLogCodeLteIdleNeighbourMeasurement, kMinimumLength, kFields}};
constexpr DecoderRules kDecoderRules{"Neighbor Measurements", kRules};

}  // namespace

NeighborMeasurementMisc::NeighborMeasurementMisc() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
