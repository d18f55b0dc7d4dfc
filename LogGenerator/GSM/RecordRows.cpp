#include "LogGenerator/GSM/RecordRows.h"

#include "LogGenerator/Base.h"
#include "LogGenerator/GSM/CountedList.h"

namespace velmar {

void showRecordRows(const RecordRowList& list, const RecordReader& record, const PlistArrayRef& section) {
    Base::clearElementsInArray(section);
    const CountedList elements{list.first, list.stride, record.u8(list.countOffset)};
    if (elements.count == 0) {
        return;
    }
    auto rows = PlistArray::create();
    rows->reserve(elements.count);
    for (std::size_t i = 0; i < elements.count; ++i) {
        rows->append(rowFromFields(list.fields, record, elements.elementOffset(i)));
    }
    Base::replaceArray(section, rows);
}

}  // namespace velmar
