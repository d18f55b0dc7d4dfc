#include "LogGenerator/LTE/DetectedCells.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/ListSection.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "DetectedCells");

using namespace lte_layout::intra_frequency;

constexpr RecordRule kRules[] = {{kLogCodeLteIntraFrequency, kMinimumLength}};
constexpr DecoderRules kDecoderRules{"Detected Cells", kRules};

constexpr RecordField kEntryFields[] = {
    u16Field(0, "Physical Cell ID"),
};

}  // namespace

DetectedCells::DetectedCells() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void DetectedCells::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const RecordReader record(data);
    // The detected cells follow the N measured-neighbour entries directly.
    const std::size_t detectedOffset =
        kEntriesOffset + kMeasuredEntryLength * record.u8(kMeasuredCountOffset);
    rebuildListSection(sectionArray(), record.u8(kDetectedCountOffset), [&](std::size_t index) {
        return PlistValue(rowFromFields(kEntryFields, record, detectedOffset + kDetectedEntryLength * index));
    });
}

}  // namespace velmar
