#include "LogGenerator/GSM/HSDPAInformation.h"

#include "LogGenerator/GSM/CountedList.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "HSDPAInformation");

constexpr ValueName kCarrierRows[] = {
    {0, 0, "Single Carrier"},
    {1, 1, "MIMO"},
    {2, 2, "Dual Carrier"},
    {3, 3, "Reserved"},
};
constexpr ValueNames kCarrierNames{kCarrierRows, "Unknown"};

// The sub-frame count is 10 bits: byte 14 and bits 0..1 of byte 15; bits 2..3 of byte 15 give the carrier.
constexpr RecordField kHeaderFields[] = {
    u8Field(13, "Version", asUnsigned()),
    bitField(14, 2, 0, 9, "Sub Frames", asUnsigned()),
    bitField(15, 1, 2, 3, "Carrier Info", asName(kCarrierNames)),
};

// One HARQ process entry (9 bytes).
constexpr RecordField kHarqProcessFields[] = {
    u8Field(0, "Process ID", asUnsigned()),
    u32Field(1, "No Rx Bits", asUnsigned()),
    u16Field(5, "New Tx", asUnsigned()),
    u16Field(7, "Block Errors", asUnsigned()),
};

constexpr std::size_t kPrimaryCountOffset = 16;
constexpr std::size_t kSecondaryCountOffset = 17;
constexpr std::size_t kFirstEntryOffset = 18;
constexpr std::size_t kEntryLength = 9;
// The secondary list is located 162 bytes per primary entry after the first entry (not 9); the display has
// always read it there, so it keeps doing so.
constexpr std::size_t kSecondaryListStridePerPrimaryEntry = 162;

PlistArrayRef harqProcessRows(const RecordReader& record, const CountedList& list) {
    auto rows = PlistArray::create();
    rows->reserve(list.count);
    for (std::size_t i = 0; i < list.count; ++i) {
        rows->append(rowFromFields(kHarqProcessFields, record, list.elementOffset(i)));
    }
    return rows;
}

void writeHsdpa(ByteView data, const PlistDictionaryRef& section) {
    const RecordReader record(data);
    const std::size_t primaryCount = record.u8(kPrimaryCountOffset);
    const std::size_t secondaryCount = record.u8(kSecondaryCountOffset);
    const CountedList primary{kFirstEntryOffset, kEntryLength, primaryCount};
    const CountedList secondary{kFirstEntryOffset + kSecondaryListStridePerPrimaryEntry * primaryCount,
                                kEntryLength, secondaryCount};
    if (!section) {
        return;
    }
    writeFields(kHeaderFields, record, 0, *section);
    // A list whose count is 0 keeps the rows shown before.
    if (primary.count > 0) {
        section->set("Primary HARQ Process", harqProcessRows(record, primary));
    }
    if (secondary.count > 0) {
        section->set("Secondary HARQ Process", harqProcessRows(record, secondary));
    }
}

constexpr RecordRule kRules[] = {
    {kLogCodeUmtsHsdpa, 18, {}, &writeHsdpa},
};
// Unlike most decoders, an unexpected code is ignored without a message.
constexpr DecoderRules kDecoderRules{"HSDPA Info", kRules, DecoderRules::OtherCodes::Ignored};

}  // namespace

HSDPAInformation::HSDPAInformation() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
