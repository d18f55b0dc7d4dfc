#include "LogGenerator/GSM/PlaceholderDecoder.h"

#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"

namespace velmar {

void PlaceholderDecoder::updateWithData(ByteView, std::int32_t) {
    logDecoderTitle(row().decoder);
}

CodingScheme::CodingScheme() : PlaceholderDecoder(rowOf<CodingScheme>(kGsmDecoders)) {}
UMTSRRMeasurement::UMTSRRMeasurement() : PlaceholderDecoder(rowOf<UMTSRRMeasurement>(kGsmDecoders)) {}
CellChangeCounters::CellChangeCounters() : PlaceholderDecoder(rowOf<CellChangeCounters>(kGsmDecoders)) {}
NonRankedGSMSet::NonRankedGSMSet() : PlaceholderDecoder(rowOf<NonRankedGSMSet>(kGsmDecoders)) {}
NonRankedUMTSSet::NonRankedUMTSSet() : PlaceholderDecoder(rowOf<NonRankedUMTSSet>(kGsmDecoders)) {}

}  // namespace velmar
