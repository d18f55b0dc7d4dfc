#include "LogGenerator/LTE/ConnectedModeMeasurementMisc.h"

#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordPreamble.h"

namespace velmar {

namespace {

using namespace lte_layout::intra_frequency;

constexpr RecordPreamble kPreamble{"Connected mode LTE Intra-frequency Measurement", kLogCode,
                                   kMinimumLength};

constexpr RecordField kFields[] = {
    u16Field(17, "E-ARFCN"),
    u16Field(19, "Serving Physical Cell ID"),
    u16Field(21, "Subframe Number"),
    u16Field(23, "Serving Filtered RSRP", lte_formats::kQuarterDbRsrp),
    u16Field(25, "Serving Filtered RSRQ", lte_formats::kEighthDbRsrq),
};

}  // namespace

std::string_view ConnectedModeMeasurementMisc::getSectionName() const {
    return "Connected mode LTE Intra-frequency Measurement";
}

LogCodeArray ConnectedModeMeasurementMisc::getLogCodeArray() const {
    return std::vector<std::int32_t>{kLogCode};
}

void ConnectedModeMeasurementMisc::updateWithData(ByteView data, std::int32_t logCode) {
    if (!acceptRecord(kPreamble, data, logCode)) {
        return;
    }
    if (const PlistDictionaryRef section = sectionDictionary()) {
        writeFields(kFields, RecordReader(data), 0, *section);
    }
}

}  // namespace velmar
