// LTEClassIndex: the LTE technology's record decoders and their subscriptions.
//
// Contract: creates, in this order, the decoders of the serving cell (0xB0C2, 0xB0C1, 0xFF0001), the three of
// the connected-mode record 0xB179, the idle-mode serving measurements (0xB17F), the two of the neighbour
// record 0xB180, the two of the reselection record 0xB186, and the shared SIM-file (0xFF0000) and PDP-context
// (0xFF0002) decoders; the order of creation is the order in which a shared code reaches them. Destruction
// writes "Deallocing LTEClassIndex" to standard output, releases the decoders in creation order, and then the
// base writes its own line.
#pragma once

#include <memory>

#include "LogGenerator/ClassIndex.h"

namespace velmar {

class LTEServingCellInfo;
class ConnectedModeMeasurementMisc;
class MeasuredNeighborCells;
class DetectedCells;
class ServingCellMeasurement;
class NeighborMeasurementMisc;
class NeighborCellsList;
class ReselectionCandidatesMisc;
class ReselectionCandidatesList;
class SimInfo;
class PDPContextList;

class LTEClassIndex : public ClassIndex {
  public:
    LTEClassIndex();
    ~LTEClassIndex() override;

  private:
    std::shared_ptr<LTEServingCellInfo> objLTEServingCellInfo;
    std::shared_ptr<ConnectedModeMeasurementMisc> objConnectedModeMeasurementMisc;
    std::shared_ptr<MeasuredNeighborCells> objMeasuredNeighborCells;
    std::shared_ptr<DetectedCells> objDetectedCells;
    std::shared_ptr<ServingCellMeasurement> objServingCellMeasurement;
    std::shared_ptr<NeighborMeasurementMisc> objNeighborMeasurementMisc;
    std::shared_ptr<NeighborCellsList> objNeighborCellsList;
    std::shared_ptr<ReselectionCandidatesMisc> objReselectionCandidatesMisc;
    std::shared_ptr<ReselectionCandidatesList> objReselectionCandidatesList;
    std::shared_ptr<SimInfo> objSimInfo;
    std::shared_ptr<PDPContextList> objPDPContextList;
};

}  // namespace velmar
