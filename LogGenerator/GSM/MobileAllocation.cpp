#include "LogGenerator/GSM/MobileAllocation.h"

#include "LogGenerator/GSM/CountedList.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "MobileAllocation");

constexpr RecordField kAllocationFields[] = {
    u8Field(13, "HSN"),
};

// Count at 14; 2-byte ARFCNs from 15.
constexpr std::size_t kArfcnCountOffset = 14;
constexpr std::size_t kArfcnListOffset = 15;
constexpr std::size_t kArfcnSize = 2;
constexpr RecordField kArfcn = u16Field(0, "ARFCN");

void writeMobileAllocation(ByteView data, const PlistDictionaryRef& section) {
    const RecordReader record(data);
    const CountedList list{kArfcnListOffset, kArfcnSize, record.u8(kArfcnCountOffset)};
    auto arfcns = PlistArray::create();
    arfcns->reserve(list.count);
    for (std::size_t i = 0; i < list.count; ++i) {
        arfcns->append(kArfcn.format.render(kArfcn.read(record, list.elementOffset(i))));
    }
    if (section) {
        writeFields(kAllocationFields, record, 0, *section);
        section->set("ARFCNs", std::move(arfcns));
    }
}

constexpr RecordRule kRules[] = {
    {kLogCodeGsmMobileAllocation, 15, {}, &writeMobileAllocation},
};
constexpr DecoderRules kDecoderRules{"MobileAllocation", kRules};

}  // namespace

MobileAllocation::MobileAllocation() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
