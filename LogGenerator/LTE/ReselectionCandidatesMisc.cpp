#include "LogGenerator/LTE/ReselectionCandidatesMisc.h"

#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordPreamble.h"

namespace velmar {

namespace {

using namespace lte_layout::reselection;

constexpr RecordPreamble kPreamble{"Reselection Candidates", kLogCode, kMinimumLength};

constexpr RecordField kFields[] = {
    u8Field(13, "Version"),
    u16Field(15, "Serving EARFCN"),
    u16Field(17, "Serving Cell ID"),
};

}  // namespace

std::string_view ReselectionCandidatesMisc::getSectionName() const {
    return "Reselection Candidates";
}

LogCodeArray ReselectionCandidatesMisc::getLogCodeArray() const {
    return std::vector<std::int32_t>{kLogCode};
}

void ReselectionCandidatesMisc::updateWithData(ByteView data, std::int32_t logCode) {
    if (!acceptRecord(kPreamble, data, logCode)) {
        return;
    }
    if (const PlistDictionaryRef section = sectionDictionary()) {
        writeFields(kFields, RecordReader(data), 0, *section);
    }
}

}  // namespace velmar
