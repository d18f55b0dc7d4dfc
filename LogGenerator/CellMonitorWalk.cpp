#include "LogGenerator/CellMonitorWalk.h"

#include "LogGenerator/Base.h"
#include "LogGenerator/CellInfoArray.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"

namespace velmar {

namespace {

void reportUnreadableArray() {
    SystemLog::log(kLogError, "Failed to get Cell Array\n");
}

// Writes the fields of one cell into target (when not null), logging the failure of each missing field.
void writeCellFields(std::span<const CellMonitorField> fields, const PlistDictionary& cell,
                     PlistDictionary* target) {
    for (const CellMonitorField& field : fields) {
        const std::optional<std::int32_t> number = CellInfoArray::cellNumber(cell, field.monitorKey);
        if (!number) {
            SystemLog::log(kLogError, "%s", field.failureMessage);
            continue;
        }
        if (target == nullptr) {
            continue;
        }
        const std::string text = field.format.render(*number);
        target->set(field.displayKey, text);
        if (field.secondDisplayKey != nullptr) {
            target->set(field.secondDisplayKey, text);
        }
    }
}

bool isServingCellOf(const PlistValue& entry, std::span<const std::string_view> technologies) {
    for (const std::string_view technology : technologies) {
        if (CellInfoArray::cellMatches(entry, technology, kKxCellMonitorCellTypeServing)) {
            return true;
        }
    }
    return false;
}

}  // namespace

void showServingCell(ByteView record, const ServingCellWalk& walk, PlistDictionary* section) {
    const CellInfoArray cellArray(record);
    if (cellArray.holdsNothing()) {
        if (walk.unreadableArray == ServingCellWalk::UnreadableArray::Reported) {
            reportUnreadableArray();
        }
        return;
    }
    for (const PlistValue& entry : *cellArray.cells()) {
        if (!isServingCellOf(entry, walk.technologies)) {
            continue;
        }
        writeCellFields(walk.fields, *entry.dictionary(), section);
        if (walk.pick == ServingCellWalk::Pick::FirstMatch) {
            return;
        }
    }
}

void showNeighbourCells(ByteView record, std::string_view technology,
                        std::span<const CellMonitorField> fields, const PlistArrayRef& section) {
    const CellInfoArray cellArray(record);
    Base::clearElementsInArray(section);
    if (cellArray.holdsNothing()) {
        reportUnreadableArray();
        return;
    }
    auto rows = PlistArray::create();
    for (const PlistValue& entry : *cellArray.cells()) {
        if (CellInfoArray::cellMatches(entry, technology, kKxCellMonitorCellTypeNeighbor)) {
            auto row = PlistDictionary::create();
            writeCellFields(fields, *entry.dictionary(), row.get());
            rows->append(std::move(row));
        }
    }
    Base::replaceArray(section, rows);
}

}  // namespace velmar
