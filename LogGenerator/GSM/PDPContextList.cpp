#include "LogGenerator/GSM/PDPContextList.h"

#include "LogGenerator/RecordRule.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

namespace {

constexpr std::size_t kRecordHeaderLength = 13;

// The record's contexts when its property list is an array; null for any other root or unparsable data.
PlistArrayRef parseContexts(ByteView record) {
    const ByteView body =
        record.size() > kRecordHeaderLength ? record.subspan(kRecordHeaderLength) : ByteView();
    const std::optional<PlistValue> parsed = parsePropertyList(body);
    return parsed ? parsed->array() : nullptr;
}

}  // namespace

PDPContextList::PDPContextList() : TableDecoder(kPDPContextListRow) {}

void PDPContextList::updateWithData(ByteView data, std::int32_t) {
    logDecoderTitle("PDPContextList");
    if (const PlistArrayRef contexts = parseContexts(data)) {
        replaceArray(sectionArray(), contexts);
    }
}

}  // namespace velmar
