#include "LogGenerator/GSM/GsmDecoderSupport.h"

#include "LogGenerator/CellInfoArray.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar::gsm {

PlistDictionaryRef firstMatchingCell(ByteView record, std::initializer_list<std::string_view> technologies,
                                     std::string_view cellType) {
    const CellInfoArray cellInfo(record);
    if (cellInfo.holdsNothing()) {
        SystemLog::log(kLogError, "%s", "Failed to get Cell Array\n");
        return nullptr;
    }
    for (const PlistValue& entry : *cellInfo.cells()) {
        for (const std::string_view technology : technologies) {
            if (CellInfoArray::cellMatches(entry, technology, cellType)) {
                return entry.dictionary();
            }
        }
    }
    return nullptr;
}

void writeCellNumber(const PlistDictionary& cell, std::string_view cellKey, PlistDictionary* section,
                     std::string_view sectionKey, const char* failureMessage) {
    const std::optional<std::int32_t> number = CellInfoArray::cellNumber(cell, cellKey);
    if (!number) {
        SystemLog::log(kLogError, "%s", failureMessage);
        return;
    }
    if (section != nullptr) {
        section->set(sectionKey, stringWithFormat("%d", *number));
    }
}

}  // namespace velmar::gsm
