#include "LogGenerator/LTE/MeasuredNeighborCells.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/ListSection.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "MeasuredNeighborCells");

using namespace lte_layout::intra_frequency;

constexpr RecordRule kRules[] = {{kLogCodeLteIntraFrequency, kMinimumLength}};
constexpr DecoderRules kDecoderRules{"Measured Neighbor Cells", kRules};

// Offsets within a measured-neighbour entry.
constexpr RecordField kEntryFields[] = {
    u16Field(0, "Physical Cell ID"),
    u16Field(2, "Filtered RSRP", lte_formats::kQuarterDbRsrp),
    u16Field(4, "Filtered RSRQ", lte_formats::kEighthDbRsrq),
};

}  // namespace

MeasuredNeighborCells::MeasuredNeighborCells() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void MeasuredNeighborCells::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const RecordReader record(data);
    rebuildListSection(sectionArray(), record.u8(kMeasuredCountOffset), [&](std::size_t index) {
        return PlistValue(rowFromFields(kEntryFields, record, kEntriesOffset + kMeasuredEntryLength * index));
    });
}

}  // namespace velmar
