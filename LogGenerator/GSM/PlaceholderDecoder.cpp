#include "LogGenerator/GSM/PlaceholderDecoder.h"

#include "LogGenerator/GSM/GsmDecoderSupport.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"

namespace velmar {

void PlaceholderDecoder::updateWithData(ByteView, std::int32_t) {
    gsm::logDecoderEntry(row().decoder);
}

CodingScheme::CodingScheme() : PlaceholderDecoder(rowOf<CodingScheme>(kGsmDecoders)) {}
UMTSRRMeasurement::UMTSRRMeasurement() : PlaceholderDecoder(rowOf<UMTSRRMeasurement>(kGsmDecoders)) {}
CellChangeCounters::CellChangeCounters() : PlaceholderDecoder(rowOf<CellChangeCounters>(kGsmDecoders)) {}
NonRankedGSMSet::NonRankedGSMSet() : PlaceholderDecoder(rowOf<NonRankedGSMSet>(kGsmDecoders)) {}
NonRankedUMTSSet::NonRankedUMTSSet() : PlaceholderDecoder(rowOf<NonRankedUMTSSet>(kGsmDecoders)) {}

}  // namespace velmar
