#include "LogGenerator/UTRAN/UTRANNeighbhorMeasurements.h"

#include "LogGenerator/ListSection.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "LogGenerator/UTRAN/UTRANClassIndex.h"
#include "core/platform/logcodes/UtranLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kUtranDecoders, "UTRANNeighbhorMeasurements");

constexpr RecordRule kRules[] = {{kLogCodeUtranNeighbourMeasurement, 21}};
constexpr DecoderRules kDecoderRules{"NeighbhorMeasurements List", kRules, DecoderRules::OtherCodes::Ignored};

constexpr std::size_t kCountOffset = 16;
constexpr std::size_t kEntriesOffset = 168;
constexpr std::size_t kEntryLength = 16;

constexpr ValueName kStatusRows[] = {{0, 0, "ASET"}, {1, 1, "MSET"}, {2, 2, "DSET"}};
constexpr ValueNames kStatusNames{kStatusRows, "Unknown"};
constexpr ValueName kTrueFalseRows[] = {{0, 0, "FALSE"}, {1, 1, "TRUE"}};
constexpr ValueNames kTrueFalse{kTrueFalseRows, "Unknown"};

// Offsets within a 16-byte entry; "Status" stands between the two runs and is left out for status 3.
constexpr RecordField kLeadingFields[] = {
    bitField(0, 2, 0, 13, "UARFCN"),
    bitField(1, 2, 6, 12, "Cell ID"),
    bitField(2, 2, 5, 12, "Filter RSCP", asDouble("%f", 1.0 / 256.0)),
};
constexpr RecordField kStatusField = bitField(3, 1, 5, 6, "Status");
constexpr RecordField kTrailingFields[] = {
    bitField(3, 1, 7, 7, "inJDCS", asName(kTrueFalse)),
};

PlistValue neighborRow(const RecordReader& record, std::size_t base) {
    PlistDictionaryRef row = rowFromFields(kLeadingFields, record, base);
    if (const char* status = kStatusNames.find(kStatusField.read(record, base))) {
        row->set(kStatusField.key, status);
    }
    writeFields(kTrailingFields, record, base, *row);
    return row;
}

}  // namespace

UTRANNeighbhorMeasurements::UTRANNeighbhorMeasurements() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void UTRANNeighbhorMeasurements::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const RecordReader record(data);
    rebuildListSection(sectionArray(), record.bits(kCountOffset, 1, 1, 7), [&](std::size_t index) {
        return neighborRow(record, kEntriesOffset + kEntryLength * index);
    });
}

}  // namespace velmar
