#include "LogGenerator/UTRAN/TRCHBLERMeasurement.h"

#include "LogGenerator/ListSection.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "LogGenerator/UTRAN/UTRANClassIndex.h"
#include "LogGenerator/UTRAN/UtranRecordLayouts.h"
#include "core/platform/logcodes/UtranLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kUtranDecoders, "TRCHBLERMeasurement");

using namespace utran_layout::channel_quality;

constexpr RecordRule kRules[] = {{kLogCodeUtranChannelQuality, kMinimumLength}};
constexpr DecoderRules kDecoderRules{"TRCH BLER Measurement", kRules, DecoderRules::OtherCodes::Ignored,
                                     kLogNotice};

constexpr RecordField kEntryFields[] = {
    u8Field(0, "TRCH ID"),
    u8Field(1, "TRCH BLER Measurement"),
};

}  // namespace

TRCHBLERMeasurement::TRCHBLERMeasurement() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void TRCHBLERMeasurement::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const RecordReader record(data);
    rebuildListSection(sectionArray(), transportChannelCount(record), [&](std::size_t index) {
        return PlistValue(rowFromFields(
            kEntryFields, record, kTransportChannelEntriesOffset + kTransportChannelEntryLength * index));
    });
}

}  // namespace velmar
