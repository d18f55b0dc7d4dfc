#include "LogGenerator/LTE/ReselectionCandidatesMisc.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordPreamble.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

using namespace lte_layout::reselection;

constexpr RecordPreamble kPreamble{"Reselection Candidates", kLogCodeLteReselectionCandidates,
                                   kMinimumLength};

constexpr RecordField kFields[] = {
    u8Field(13, "Version"),
    u16Field(15, "Serving EARFCN"),
    u16Field(17, "Serving Cell ID"),
};

}  // namespace

ReselectionCandidatesMisc::ReselectionCandidatesMisc()
    : TableDecoder(rowOf<ReselectionCandidatesMisc>(kLteDecoders)) {}

void ReselectionCandidatesMisc::updateWithData(ByteView data, std::int32_t logCode) {
    if (!acceptRecord(kPreamble, data, logCode)) {
        return;
    }
    if (const PlistDictionaryRef section = sectionDictionary()) {
        writeFields(kFields, RecordReader(data), 0, *section);
    }
}

}  // namespace velmar
