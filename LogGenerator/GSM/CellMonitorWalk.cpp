#include "LogGenerator/GSM/CellMonitorWalk.h"

#include "LogGenerator/Base.h"
#include "LogGenerator/CellInfoArray.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"

namespace velmar {

void writeNeighbourCellFields(std::span<const NeighbourCellField> fields, const PlistDictionary& cell,
                              PlistDictionary* target) {
    for (const NeighbourCellField& field : fields) {
        const std::optional<std::int32_t> number = CellInfoArray::cellNumber(cell, field.monitorKey);
        if (!number) {
            SystemLog::log(kLogError, "%s", field.failureMessage);
            continue;
        }
        if (target != nullptr) {
            target->set(field.displayKey, field.format.render(*number));
        }
    }
}

void showNeighbourCells(ByteView record, std::string_view technology,
                        std::span<const NeighbourCellField> fields, const PlistArrayRef& section) {
    const CellInfoArray cellArray(record);
    Base::clearElementsInArray(section);
    if (cellArray.holdsNothing()) {
        SystemLog::log(kLogError, "Failed to get Cell Array\n");
        return;
    }
    auto rows = PlistArray::create();
    for (const PlistValue& entry : *cellArray.cells()) {
        if (CellInfoArray::cellMatches(entry, technology, kKxCellMonitorCellTypeNeighbor)) {
            auto row = PlistDictionary::create();
            writeNeighbourCellFields(fields, *entry.dictionary(), row.get());
            rows->append(std::move(row));
        }
    }
    Base::replaceArray(section, rows);
}

}  // namespace velmar
