// UTRANClassIndex: the UTRAN technology's record decoders and their subscriptions.
//
// Contract: creates, in this order, the RRC state (0xD0E0), serving cell (0xD0E2, 0xFF0001), UTRAN and GSM
// neighbour (0xD00A, 0xD00E), transport-channel BLER and composite-channel SIR (both 0xD00C, in that order)
// decoders, then the shared PDP-context (0xFF0002) and SIM-file (0xFF0000) decoders. Destruction releases
// them in that order and writes no line of its own before the base's.
#pragma once

#include <memory>

#include "LogGenerator/ClassIndex.h"

namespace velmar {

class RRC_State;
class UTRANServingCellInfo;
class UTRANNeighbhorMeasurements;
class GSMNeighbhorMeasurements;
class TRCHBLERMeasurement;
class CCTRCHSIRMeasurement;
class PDPContextList;
class SimInfo;

class UTRANClassIndex : public ClassIndex {
  public:
    UTRANClassIndex();
    ~UTRANClassIndex() override;

  private:
    std::shared_ptr<RRC_State> rrc_state;
    std::shared_ptr<UTRANServingCellInfo> servingCellInfo;
    std::shared_ptr<UTRANNeighbhorMeasurements> tdMeasurements;
    std::shared_ptr<GSMNeighbhorMeasurements> gsmMeasurements;
    std::shared_ptr<TRCHBLERMeasurement> trchMeasurements;
    std::shared_ptr<CCTRCHSIRMeasurement> cctrchMeasurements;
    std::shared_ptr<PDPContextList> pdpList;
    std::shared_ptr<SimInfo> simInfo;
};

}  // namespace velmar
