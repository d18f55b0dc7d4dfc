#include "LogGenerator/UTRAN/GSMNeighbhorMeasurements.h"

#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "LogGenerator/UTRAN/UTRANClassIndex.h"
#include "core/platform/logcodes/UtranLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kUtranDecoders, "GSMNeighbhorMeasurements");

constexpr RecordRule kRules[] = {{kLogCodeUtranGsmNeighbourMeasurement, 17}};
constexpr DecoderRules kDecoderRules{"GSM Neighbor Cell List", kRules, DecoderRules::OtherCodes::Ignored};

constexpr std::size_t kCountOffset = 16;
constexpr std::size_t kEntriesOffset = 17;
constexpr std::size_t kEntryLength = 8;

constexpr RecordField kEntryFields[] = {
    bitField(0, 2, 0, 13, "Cell ID"),
    bitField(1, 1, 6, 6, "Band Indicator"),
    bitField(1, 1, 7, 7, "BSIC Valid"),
    u8Field(2, "NCC"),
    u8Field(3, "BCC"),
    u16Field(4, "ARFCN"),
    s16Field(6, "RSSI"),
};

}  // namespace

GSMNeighbhorMeasurements::GSMNeighbhorMeasurements() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void GSMNeighbhorMeasurements::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    clearElementsInArray(sectionArray());
    const RecordReader record(data);
    const std::size_t count = record.u8(kCountOffset);
    auto rows = PlistArray::create();
    rows->reserve(count);
    for (std::size_t index = 0; index < count; ++index) {
        rows->append(rowFromFields(kEntryFields, record, kEntriesOffset + kEntryLength * index));
    }
    // The rows are decoded but, as this record has always been shown, never installed: the list stays empty.
}

}  // namespace velmar
