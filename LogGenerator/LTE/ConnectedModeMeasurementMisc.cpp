#include "LogGenerator/LTE/ConnectedModeMeasurementMisc.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordPreamble.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

using namespace lte_layout::intra_frequency;

constexpr RecordPreamble kPreamble{"Connected mode LTE Intra-frequency Measurement",
                                   kLogCodeLteIntraFrequency, kMinimumLength};

constexpr RecordField kFields[] = {
    u16Field(17, "E-ARFCN"),
    u16Field(19, "Serving Physical Cell ID"),
    u16Field(21, "Subframe Number"),
    u16Field(23, "Serving Filtered RSRP", lte_formats::kQuarterDbRsrp),
    u16Field(25, "Serving Filtered RSRQ", lte_formats::kEighthDbRsrq),
};

}  // namespace

ConnectedModeMeasurementMisc::ConnectedModeMeasurementMisc()
    : TableDecoder(rowOf<ConnectedModeMeasurementMisc>(kLteDecoders)) {}

void ConnectedModeMeasurementMisc::updateWithData(ByteView data, std::int32_t logCode) {
    if (!acceptRecord(kPreamble, data, logCode)) {
        return;
    }
    if (const PlistDictionaryRef section = sectionDictionary()) {
        writeFields(kFields, RecordReader(data), 0, *section);
    }
}

}  // namespace velmar
