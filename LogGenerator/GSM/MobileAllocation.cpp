#include "LogGenerator/GSM/MobileAllocation.h"

#include "LogGenerator/GSM/CountedList.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr RecordRule kRules[] = {
    {kLogCodeGsmMobileAllocation, 15},
};
constexpr DecoderRules kDecoderRules{"MobileAllocation", kRules};

constexpr RecordField kAllocationFields[] = {
    u8Field(13, "HSN"),
};

// Count at 14; 2-byte ARFCNs from 15.
constexpr std::size_t kArfcnCountOffset = 14;
constexpr std::size_t kArfcnListOffset = 15;
constexpr std::size_t kArfcnSize = 2;
constexpr RecordField kArfcn = u16Field(0, "ARFCN");

}  // namespace

MobileAllocation::MobileAllocation() : TableDecoder(rowOf<MobileAllocation>(kGsmDecoders)) {}
static_assert(rulesMatch(kRules, rowOf<MobileAllocation>(kGsmDecoders)));

void MobileAllocation::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const RecordReader record(data);
    const CountedList list{kArfcnListOffset, kArfcnSize, record.u8(kArfcnCountOffset)};
    auto arfcns = PlistArray::create();
    arfcns->reserve(list.count);
    for (std::size_t i = 0; i < list.count; ++i) {
        arfcns->append(kArfcn.format.render(kArfcn.read(record, list.elementOffset(i))));
    }
    if (const PlistDictionaryRef section = sectionDictionary()) {
        writeFields(kAllocationFields, record, 0, *section);
        section->set("ARFCNs", std::move(arfcns));
    }
}

}  // namespace velmar
