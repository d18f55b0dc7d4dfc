// ORV_GSMClassIndex: the class index of the GSM/UMTS technology of the log-code family. It creates, once, the
// twenty-six GSM/UMTS record decoders, each of which registers itself in classDict and codeDictionary, and
// releases them again.
//
// Contract: the decoders are created strictly in the order below, which is the order in which dispatch calls
// the subscribers of a shared code (0x417A: ActiveSet, DetectedSet, MonitoredSet, VirtualActiveSet; 0xFF0001:
// GSMServingCell, NeighboringCells, ServingPLMN, UMTSSet, UMTSRRInfo). Destruction writes "Deallocing
// ORV_GSMClassIndex" to standard output, releases the references in declaration order, and then the base
// writes "Deallocing ClassIndex".
#pragma once

#include <memory>

#include "LogGenerator/ClassIndex.h"
#include "LogGenerator/GSM/ActiveSet.h"
#include "LogGenerator/GSM/BLER.h"
#include "LogGenerator/GSM/CellChangeCounters.h"
#include "LogGenerator/GSM/CodingScheme.h"
#include "LogGenerator/GSM/DetectedSet.h"
#include "LogGenerator/GSM/EquivalentPLMNList.h"
#include "LogGenerator/GSM/GPRSInformation.h"
#include "LogGenerator/GSM/GSMRRInfo.h"
#include "LogGenerator/GSM/GSMServingCell.h"
#include "LogGenerator/GSM/GSMSet.h"
#include "LogGenerator/GSM/HSDPAInformation.h"
#include "LogGenerator/GSM/MobileAllocation.h"
#include "LogGenerator/GSM/MonitoredSet.h"
#include "LogGenerator/GSM/NeighboringCells.h"
#include "LogGenerator/GSM/NonRankedGSMSet.h"
#include "LogGenerator/GSM/NonRankedUMTSSet.h"
#include "LogGenerator/GSM/PDPContextList.h"
#include "LogGenerator/GSM/ProcessCO.h"
#include "LogGenerator/GSM/ProcessCS.h"
#include "LogGenerator/GSM/ProcessPS.h"
#include "LogGenerator/GSM/ServingPLMN.h"
#include "LogGenerator/GSM/SimInfo.h"
#include "LogGenerator/GSM/UMTSRRInfo.h"
#include "LogGenerator/GSM/UMTSRRMeasurement.h"
#include "LogGenerator/GSM/UMTSSet.h"
#include "LogGenerator/GSM/VirtualActiveSet.h"

namespace velmar {

class ORV_GSMClassIndex : public ClassIndex {
  public:
    ORV_GSMClassIndex();
    ~ORV_GSMClassIndex() override;

  private:
    std::shared_ptr<ActiveSet> objActiveSet;
    std::shared_ptr<CodingScheme> objCodingScheme;
    std::shared_ptr<GPRSInformation> objGPRSInformation;
    std::shared_ptr<GSMServingCell> objGSMServingCell;
    std::shared_ptr<MobileAllocation> objMobileAllocation;
    std::shared_ptr<NeighboringCells> objNeighboringCells;
    std::shared_ptr<PDPContextList> objPDPContextList;
    std::shared_ptr<ProcessPS> objProcessPS;
    std::shared_ptr<UMTSRRMeasurement> objUMTSRRMeasurement;
    std::shared_ptr<CellChangeCounters> objCellChangeCounter;
    std::shared_ptr<DetectedSet> objDetectedSet;
    std::shared_ptr<GSMSet> objGSMSet;
    std::shared_ptr<NonRankedGSMSet> objNonRankedGSMSet;
    std::shared_ptr<ProcessCO> objProcessCO;
    std::shared_ptr<ServingPLMN> objServingPLMN;
    std::shared_ptr<UMTSSet> objUMTSSet;
    std::shared_ptr<EquivalentPLMNList> objEquivalentPLMNList;
    std::shared_ptr<GSMRRInfo> objGSMRRInfo;
    std::shared_ptr<MonitoredSet> objMonitoredSet;
    std::shared_ptr<NonRankedUMTSSet> objNonRankedUMTSSet;
    std::shared_ptr<ProcessCS> objProcessCS;
    std::shared_ptr<UMTSRRInfo> objUMTSRRInfo;
    std::shared_ptr<BLER> objBLER;
    std::shared_ptr<VirtualActiveSet> objVirtualActiveSet;
    std::shared_ptr<SimInfo> objSimInfo;
    std::shared_ptr<HSDPAInformation> objHSDPAInformation;
};

}  // namespace velmar
