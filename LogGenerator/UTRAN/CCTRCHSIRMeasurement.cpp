#include "LogGenerator/UTRAN/CCTRCHSIRMeasurement.h"

#include "LogGenerator/ListSection.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "LogGenerator/UTRAN/UTRANClassIndex.h"
#include "LogGenerator/UTRAN/UtranRecordLayouts.h"
#include "core/platform/StringFormat.h"
#include "core/platform/logcodes/UtranLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kUtranDecoders, "CCTRCHSIRMeasurement");

using namespace utran_layout::channel_quality;

constexpr RecordRule kRules[] = {{kLogCodeUtranChannelQuality, kMinimumLength}};
constexpr DecoderRules kDecoderRules{"CCTRCH SIR Measurement", kRules, DecoderRules::OtherCodes::Ignored};

constexpr RecordField kEntryFields[] = {
    u8Field(0, "CCTRCH ID"),
    u8Field(1, "TSNUM"),
};
constexpr std::size_t kSirOffset = 2;
constexpr std::size_t kSirCount = 6;

PlistValue compositeChannelRow(const RecordReader& record, std::size_t base) {
    PlistDictionaryRef row = rowFromFields(kEntryFields, record, base);
    auto sir = PlistArray::create();
    sir->reserve(kSirCount);
    for (std::size_t index = 0; index < kSirCount; ++index) {
        sir->append(stringWithFormat("%d", static_cast<int>(record.u8(base + kSirOffset + index))));
    }
    row->set("SIR", std::move(sir));
    return row;
}

}  // namespace

CCTRCHSIRMeasurement::CCTRCHSIRMeasurement() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void CCTRCHSIRMeasurement::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const RecordReader record(data);
    const std::size_t entriesOffset =
        kCompositeChannelEntriesOffset + kPerTransportChannelRegion * transportChannelCount(record);
    rebuildListSection(sectionArray(), compositeChannelCount(record), [&](std::size_t index) {
        return compositeChannelRow(record, entriesOffset + kCompositeChannelEntryLength * index);
    });
}

}  // namespace velmar
