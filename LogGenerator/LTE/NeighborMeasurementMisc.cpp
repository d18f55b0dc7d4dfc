#include "LogGenerator/LTE/NeighborMeasurementMisc.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordPreamble.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

using namespace lte_layout::neighbor_measurement;

constexpr RecordPreamble kPreamble{"Neighbor Measurements", kLogCodeLteIdleNeighbourMeasurement,
                                   kMinimumLength};

constexpr RecordField kFields[] = {
    u8Field(13, "Version"),
    u16Field(17, "E-ARFCN"),
    bitField(19, 1, 0, 5, "Qrxlevmin", lte_formats::kQrxlevmin),
};

}  // namespace

NeighborMeasurementMisc::NeighborMeasurementMisc()
    : TableDecoder(rowOf<NeighborMeasurementMisc>(kLteDecoders)) {}

void NeighborMeasurementMisc::updateWithData(ByteView data, std::int32_t logCode) {
    if (!acceptRecord(kPreamble, data, logCode)) {
        return;
    }
    if (const PlistDictionaryRef section = sectionDictionary()) {
        writeFields(kFields, RecordReader(data), 0, *section);
    }
}

}  // namespace velmar
