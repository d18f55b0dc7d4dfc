// UTRANClassIndex: the UTRAN technology's record decoders and the log codes they subscribe to.
//
// Contract: kUtranDecoders below is the table from which the index creates its decoders, in its order, which
// is the order in which the decoders sharing a code receive it (0xD00C: transport-channel BLER, then
// composite-channel SIR). Destruction releases the decoders in creation order and writes no line of its own
// before the base's.
#pragma once

#include "LogGenerator/ClassIndex.h"
#include "LogGenerator/DecoderTable.h"
#include "LogGenerator/GSM/PDPContextList.h"
#include "LogGenerator/GSM/SimInfo.h"
#include "LogGenerator/UTRAN/CCTRCHSIRMeasurement.h"
#include "LogGenerator/UTRAN/GSMNeighbhorMeasurements.h"
#include "LogGenerator/UTRAN/RRC_State.h"
#include "LogGenerator/UTRAN/TRCHBLERMeasurement.h"
#include "LogGenerator/UTRAN/UTRANNeighbhorMeasurements.h"
#include "LogGenerator/UTRAN/UTRANServingCellInfo.h"
#include "core/platform/logcodes/UtranLogCodes.h"

namespace velmar {

inline constexpr DecoderRow kUtranDecoders[] = {
    VELMAR_DECODER_ROW(RRC_State, "RRC Info", kLogCodeUtranRrcState),
    VELMAR_DECODER_ROW(UTRANServingCellInfo, "Serving Cell Info", kLogCodeUtranServingCell,
                       kLogCodeCellMonitor),
    VELMAR_DECODER_ROW(UTRANNeighbhorMeasurements, "Neighbor Cell List", kLogCodeUtranNeighbourMeasurement),
    VELMAR_DECODER_ROW(GSMNeighbhorMeasurements, "GSM Neighbor Cell List",
                       kLogCodeUtranGsmNeighbourMeasurement),
    VELMAR_DECODER_ROW(TRCHBLERMeasurement, "TRCH BLER", kLogCodeUtranChannelQuality),
    VELMAR_DECODER_ROW(CCTRCHSIRMeasurement, "CCTRCH SIR", kLogCodeUtranChannelQuality),
    kPDPContextListRow,
    kSimInfoRow,
};

class UTRANClassIndex : public ClassIndex {
  public:
    UTRANClassIndex() : ClassIndex(kUtranDecoders) {}
    ~UTRANClassIndex() override;
};

}  // namespace velmar
