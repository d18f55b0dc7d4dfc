// LTEClassIndex: the LTE technology's record decoders and the log codes they subscribe to.
//
// Contract: kLteDecoders below is the table from which the index creates its decoders, in its order, which
// is the order in which the decoders sharing a code receive it (0xB179 feeds three sections, 0xB180 and
// 0xB186 two each). Destruction writes "Deallocing LTEClassIndex" to standard output, releases the decoders
// in creation order, and then the base writes its own line.
#pragma once

#include "LogGenerator/ClassIndex.h"
#include "LogGenerator/DecoderTable.h"
#include "LogGenerator/GSM/PDPContextList.h"
#include "LogGenerator/GSM/SimInfo.h"
#include "LogGenerator/LTE/ConnectedModeMeasurementMisc.h"
#include "LogGenerator/LTE/DetectedCells.h"
#include "LogGenerator/LTE/LTEServingCellInfo.h"
#include "LogGenerator/LTE/MeasuredNeighborCells.h"
#include "LogGenerator/LTE/NeighborCellsList.h"
#include "LogGenerator/LTE/NeighborMeasurementMisc.h"
#include "LogGenerator/LTE/ReselectionCandidatesList.h"
#include "LogGenerator/LTE/ReselectionCandidatesMisc.h"
#include "LogGenerator/LTE/ServingCellMeasurement.h"
#include "core/platform/logcodes/LteLogCodes.h"

namespace velmar {

inline constexpr DecoderRow kLteDecoders[] = {
    VELMAR_DECODER_ROW(LTEServingCellInfo, "Serving Cell Info", kLogCodeLteServingCellInfo,
                       kLogCodeLteMasterInformation, kLogCodeCellMonitor),
    VELMAR_DECODER_ROW(ConnectedModeMeasurementMisc, "Connected mode LTE Intra-frequency Measurement",
                       kLogCodeLteIntraFrequency),
    VELMAR_DECODER_ROW(MeasuredNeighborCells, "Measured Neighbor Cells", kLogCodeLteIntraFrequency),
    VELMAR_DECODER_ROW(DetectedCells, "Detected Cells", kLogCodeLteIntraFrequency),
    VELMAR_DECODER_ROW(ServingCellMeasurement, "Serving Cell Measurements",
                       kLogCodeLteIdleServingMeasurement),
    VELMAR_DECODER_ROW(NeighborMeasurementMisc, "Neighbor Measurements", kLogCodeLteIdleNeighbourMeasurement),
    VELMAR_DECODER_ROW(NeighborCellsList, "Neighbor Cells List", kLogCodeLteIdleNeighbourMeasurement),
    VELMAR_DECODER_ROW(ReselectionCandidatesMisc, "Reselection Candidates", kLogCodeLteReselectionCandidates),
    VELMAR_DECODER_ROW(ReselectionCandidatesList, "Reselection Candidates List",
                       kLogCodeLteReselectionCandidates),
    kSimInfoRow,
    kPDPContextListRow,
};

class LTEClassIndex : public ClassIndex {
  public:
    LTEClassIndex() : ClassIndex(kLteDecoders) {}
    ~LTEClassIndex() override;
};

}  // namespace velmar
