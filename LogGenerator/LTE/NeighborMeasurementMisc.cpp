#include "LogGenerator/LTE/NeighborMeasurementMisc.h"

#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordPreamble.h"

namespace velmar {

namespace {

using namespace lte_layout::neighbor_measurement;

constexpr RecordPreamble kPreamble{"Neighbor Measurements", kLogCode, kMinimumLength};

constexpr RecordField kFields[] = {
    u8Field(13, "Version"),
    u16Field(17, "E-ARFCN"),
    bitField(19, 1, 0, 5, "Qrxlevmin", lte_formats::kQrxlevmin),
};

}  // namespace

std::string_view NeighborMeasurementMisc::getSectionName() const {
    return "Neighbor Measurements";
}

LogCodeArray NeighborMeasurementMisc::getLogCodeArray() const {
    return std::vector<std::int32_t>{kLogCode};
}

void NeighborMeasurementMisc::updateWithData(ByteView data, std::int32_t logCode) {
    if (!acceptRecord(kPreamble, data, logCode)) {
        return;
    }
    if (const PlistDictionaryRef section = sectionDictionary()) {
        writeFields(kFields, RecordReader(data), 0, *section);
    }
}

}  // namespace velmar
