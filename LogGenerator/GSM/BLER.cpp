#include "LogGenerator/GSM/BLER.h"

#include "LogGenerator/GSM/CountedList.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "BLER");

constexpr RecordField kWindowFields[] = {
    u16Field(14, "Window Size"),
};

// One transport channel entry (9 bytes). The CRC counts are shown signed, so 0xFFFFFFFF reads -1.
constexpr RecordField kTransportChannelFields[] = {
    u8Field(0, "Transport Channel ID"),
    u32Field(1, "CRC Received"),
    u32Field(5, "CRC Received in Error"),
};

constexpr std::size_t kChannelCountOffset = 13;
constexpr std::size_t kFirstEntryOffset = 16;
constexpr std::size_t kEntryLength = 9;

void writeBlockErrors(ByteView data, const PlistDictionaryRef& section) {
    const RecordReader record(data);
    const CountedList channels{kFirstEntryOffset, kEntryLength, record.u8(kChannelCountOffset)};
    if (!section) {
        return;
    }
    writeFields(kWindowFields, record, 0, *section);
    // Stored even when empty: a record without channels clears the list shown before.
    auto rows = PlistArray::create();
    rows->reserve(channels.count);
    for (std::size_t i = 0; i < channels.count; ++i) {
        rows->append(rowFromFields(kTransportChannelFields, record, channels.elementOffset(i)));
    }
    section->set("Transport Channels", std::move(rows));
}

constexpr RecordRule kRules[] = {
    {kLogCodeUmtsBlockErrors, 16, {}, &writeBlockErrors},
};
constexpr DecoderRules kDecoderRules{"BLER", kRules};

}  // namespace

BLER::BLER() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
