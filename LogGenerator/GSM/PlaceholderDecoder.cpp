#include "LogGenerator/GSM/PlaceholderDecoder.h"

#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordRule.h"

namespace velmar {

void PlaceholderDecoder::updateWithData(ByteView, std::int32_t) {
    logDecoderTitle(row().decoder);
}

CodingScheme::CodingScheme() : PlaceholderDecoder(rowOf(kGsmDecoders, "CodingScheme")) {}
UMTSRRMeasurement::UMTSRRMeasurement() : PlaceholderDecoder(rowOf(kGsmDecoders, "UMTSRRMeasurement")) {}
CellChangeCounters::CellChangeCounters() : PlaceholderDecoder(rowOf(kGsmDecoders, "CellChangeCounters")) {}
NonRankedGSMSet::NonRankedGSMSet() : PlaceholderDecoder(rowOf(kGsmDecoders, "NonRankedGSMSet")) {}
NonRankedUMTSSet::NonRankedUMTSSet() : PlaceholderDecoder(rowOf(kGsmDecoders, "NonRankedUMTSSet")) {}

}  // namespace velmar
