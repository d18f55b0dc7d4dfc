#include "LogGenerator/GSM/EquivalentPLMNList.h"

#include <optional>
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"

#include "LogGenerator/RecordRule.h"
#include "core/platform/StringFormat.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "EquivalentPLMNList");

constexpr RecordRule kRules[] = {
    {kLogCodeEquivalentPlmns, 17},
};
constexpr DecoderRules kDecoderRules{"Equivalent PLMN List", kRules};

constexpr std::size_t kCountOffset = 16;
constexpr std::size_t kFirstEntryOffset = 17;
// Entries stand 3 bytes apart although each is read as six digit bytes, so every reading overlaps the next
// entry. The baseband's list is read this way and the display must keep showing what it always showed.
constexpr std::size_t kEntryStride = 3;

// The record offset of entry i, or nothing when i is not below the record's count (never an exception).
std::optional<std::size_t> entryOffset(std::size_t count, std::size_t entry) {
    if (entry >= count) {
        return std::nullopt;
    }
    return kFirstEntryOffset + kEntryStride * entry;
}

// One row: the six digit bytes of an entry alternate between the two codes.
PlistDictionaryRef plmnRow(const RecordReader& record, std::size_t at) {
    const auto digit = [&](std::size_t index) { return static_cast<int>(record.u8(at + index)); };
    const int mcc = 100 * digit(0) + 10 * digit(2) + digit(4);
    const int mnc = 100 * digit(1) + 10 * digit(3) + digit(5);
    auto row = PlistDictionary::create();
    row->reserve(2);
    row->set("Mobile Country Code", stringWithFormat("%d", mcc));
    row->set("Mobile Network Code", stringWithFormat("%d", mnc));
    return row;
}

}  // namespace

EquivalentPLMNList::EquivalentPLMNList() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void EquivalentPLMNList::updateWithData(ByteView data, std::int32_t logCode) {
    if (admitRecord(kDecoderRules, data, logCode) == nullptr) {
        return;
    }
    const PlistArrayRef section = sectionArray();
    clearElementsInArray(section);
    const RecordReader record(data);
    const std::size_t count = record.u8(kCountOffset);
    if (count == 0) {
        return;
    }
    auto rows = PlistArray::create();
    rows->reserve(count);
    for (std::size_t entry = 0; const std::optional<std::size_t> at = entryOffset(count, entry); ++entry) {
        rows->append(plmnRow(record, *at));
    }
    replaceArray(section, rows);
}

}  // namespace velmar
