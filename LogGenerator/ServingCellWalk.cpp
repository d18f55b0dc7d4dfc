#include "LogGenerator/ServingCellWalk.h"

#include "LogGenerator/CellInfoArray.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar {

namespace {

void writeCellFields(const PlistDictionary& cell, std::span<const CellMonitorField> fields,
                     PlistDictionary* section) {
    for (const CellMonitorField& field : fields) {
        const auto number = CellInfoArray::cellNumber(cell, field.entryKey);
        if (!number) {
            SystemLog::log(kLogError, "%s", field.missingMessage);
            continue;
        }
        if (section == nullptr) {
            continue;
        }
        const std::string text = stringWithFormat("%d", *number);
        section->set(field.sectionKey, text);
        if (field.secondSectionKey != nullptr) {
            section->set(field.secondSectionKey, text);
        }
    }
}

}  // namespace

void writeServingCellFields(const PlistArray& cells, std::string_view technology, ServingCellPick pick,
                            std::span<const CellMonitorField> fields, PlistDictionary* section) {
    for (const PlistValue& entry : cells) {
        if (!CellInfoArray::cellMatches(entry, technology, kKxCellMonitorCellTypeServing)) {
            continue;
        }
        writeCellFields(*entry.dictionary(), fields, section);
        if (pick == ServingCellPick::FirstMatch) {
            return;
        }
    }
}

}  // namespace velmar
