#include "LogGenerator/LTE/NeighborCellsList.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteFormats.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/ListSection.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "NeighborCellsList");

using namespace lte_layout::neighbor_measurement;

constexpr RecordRule kRules[] = {{kLogCodeLteIdleNeighbourMeasurement, kMinimumLength}};
constexpr DecoderRules kDecoderRules{"Neighbor Cells List", kRules};

// Offsets within a 20-byte neighbour entry. Every level is in half dB, RSRP included; the antenna-1 offsets
// are read from the antenna-0 bits.
constexpr RecordField kEntryFields[] = {
    bitField(0, 2, 0, 8, "Physical Cell ID"),
    bitField(1, 2, 1, 8, "Measured RSSI", lte_formats::kHalfDbLevel),
    bitField(2, 2, 1, 9, "Measured RSRP", lte_formats::kHalfDbLevel),
    bitField(4, 2, 0, 8, "Average RSRP", lte_formats::kHalfDbLevel),
    bitField(5, 1, 1, 7, "Measured RSRQ", lte_formats::kQuarterDbRsrq),
    bitField(6, 1, 0, 6, "Average RSRQ", lte_formats::kQuarterDbRsrq),
    bitField(6, 2, 7, 13, "Srxlev", lte_formats::kMinus30Dbm),
    u16Field(8, "Frequency Offset"),
    bitField(12, 2, 0, 10, "Ant 0 Frame Offset"),
    bitField(13, 3, 3, 21, "Ant 0 Sample Offset"),
    bitField(12, 2, 0, 10, "Ant 1 Frame Offset"),
    bitField(13, 3, 3, 21, "Ant 1 Sample Offset"),
};
// The physical cell identity and the five levels that follow it are traced as they are decoded.
constexpr std::size_t kCellIdField = 0;
constexpr std::size_t kLastTracedLevelField = 5;

// The trace lines of one entry: the identity, then each level with the same "Measured RSSI" text.
void traceEntry(const RecordReader& record, std::size_t base) {
    SystemLog::log(kLogWarning, "Physical Cell ID: %d\n",
                   static_cast<int>(kEntryFields[kCellIdField].read(record, base)));
    for (std::size_t field = kCellIdField + 1; field <= kLastTracedLevelField; ++field) {
        const ValueFormat& format = kEntryFields[field].format;
        const double level =
            static_cast<double>(kEntryFields[field].read(record, base)) * format.scale + format.bias;
        SystemLog::log(kLogWarning, "Measured RSSI: %lf\n", level);
    }
}

}  // namespace

NeighborCellsList::NeighborCellsList() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void NeighborCellsList::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const RecordReader record(data);
    const std::size_t count = record.bits(kCountOffset, 2, kCountLowBit, kCountHighBit) + 1;
    SystemLog::log(kLogWarning, "Number of neighboring cells being reported: %d\n", static_cast<int>(count));
    const bool tracing = SystemLog::isEnabled(kLogWarning);
    rebuildListSection(sectionArray(), count, [&](std::size_t index) {
        const std::size_t base = kEntriesOffset + kEntryLength * index;
        if (tracing) {
            traceEntry(record, base);
        }
        return PlistValue(rowFromFields(kEntryFields, record, base));
    });
}

}  // namespace velmar
