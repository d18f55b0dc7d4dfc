#include "LogGenerator/LTE/ReselectionCandidatesMisc.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LteRecordLayouts.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kLteDecoders, "ReselectionCandidatesMisc");

using namespace lte_layout::reselection;

constexpr RecordField kFields[] = {
    u8Field(13, "Version"),
    u16Field(15, "Serving EARFCN"),
    u16Field(17, "Serving Cell ID"),
};

constexpr RecordRule kRules[] = {{kLogCodeLteReselectionCandidates, kMinimumLength, kFields}};
constexpr DecoderRules kDecoderRules{"Reselection Candidates", kRules};

}  // namespace

ReselectionCandidatesMisc::ReselectionCandidatesMisc() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
