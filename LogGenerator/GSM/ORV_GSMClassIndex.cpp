#include "LogGenerator/GSM/ORV_GSMClassIndex.h"

#include <cstdio>

namespace velmar {

// The base constructor has created the two dictionaries; the members are then initialised in declaration
// order, which is the order of creation and therefore of dispatch.
ORV_GSMClassIndex::ORV_GSMClassIndex()
    : ClassIndex(),
      objActiveSet(Base::initWithDict<ActiveSet>(classDict, codeDictionary)),
      objCodingScheme(Base::initWithDict<CodingScheme>(classDict, codeDictionary)),
      objGPRSInformation(Base::initWithDict<GPRSInformation>(classDict, codeDictionary)),
      objGSMServingCell(Base::initWithDict<GSMServingCell>(classDict, codeDictionary)),
      objMobileAllocation(Base::initWithDict<MobileAllocation>(classDict, codeDictionary)),
      objNeighboringCells(Base::initWithDict<NeighboringCells>(classDict, codeDictionary)),
      objPDPContextList(Base::initWithDict<PDPContextList>(classDict, codeDictionary)),
      objProcessPS(Base::initWithDict<ProcessPS>(classDict, codeDictionary)),
      objUMTSRRMeasurement(Base::initWithDict<UMTSRRMeasurement>(classDict, codeDictionary)),
      objCellChangeCounter(Base::initWithDict<CellChangeCounters>(classDict, codeDictionary)),
      objDetectedSet(Base::initWithDict<DetectedSet>(classDict, codeDictionary)),
      objGSMSet(Base::initWithDict<GSMSet>(classDict, codeDictionary)),
      objNonRankedGSMSet(Base::initWithDict<NonRankedGSMSet>(classDict, codeDictionary)),
      objProcessCO(Base::initWithDict<ProcessCO>(classDict, codeDictionary)),
      objServingPLMN(Base::initWithDict<ServingPLMN>(classDict, codeDictionary)),
      objUMTSSet(Base::initWithDict<UMTSSet>(classDict, codeDictionary)),
      objEquivalentPLMNList(Base::initWithDict<EquivalentPLMNList>(classDict, codeDictionary)),
      objGSMRRInfo(Base::initWithDict<GSMRRInfo>(classDict, codeDictionary)),
      objMonitoredSet(Base::initWithDict<MonitoredSet>(classDict, codeDictionary)),
      objNonRankedUMTSSet(Base::initWithDict<NonRankedUMTSSet>(classDict, codeDictionary)),
      objProcessCS(Base::initWithDict<ProcessCS>(classDict, codeDictionary)),
      objUMTSRRInfo(Base::initWithDict<UMTSRRInfo>(classDict, codeDictionary)),
      objBLER(Base::initWithDict<BLER>(classDict, codeDictionary)),
      objVirtualActiveSet(Base::initWithDict<VirtualActiveSet>(classDict, codeDictionary)),
      objSimInfo(Base::initWithDict<SimInfo>(classDict, codeDictionary)),
      objHSDPAInformation(Base::initWithDict<HSDPAInformation>(classDict, codeDictionary)) {}

ORV_GSMClassIndex::~ORV_GSMClassIndex() {
    std::fputs("Deallocing ORV_GSMClassIndex\n", stdout);
    objActiveSet.reset();
    objCodingScheme.reset();
    objGPRSInformation.reset();
    objGSMServingCell.reset();
    objMobileAllocation.reset();
    objNeighboringCells.reset();
    objPDPContextList.reset();
    objProcessPS.reset();
    objUMTSRRMeasurement.reset();
    objCellChangeCounter.reset();
    objDetectedSet.reset();
    objGSMSet.reset();
    objNonRankedGSMSet.reset();
    objProcessCO.reset();
    objServingPLMN.reset();
    objUMTSSet.reset();
    objEquivalentPLMNList.reset();
    objGSMRRInfo.reset();
    objMonitoredSet.reset();
    objNonRankedUMTSSet.reset();
    objProcessCS.reset();
    objUMTSRRInfo.reset();
    objBLER.reset();
    objVirtualActiveSet.reset();
    objSimInfo.reset();
    objHSDPAInformation.reset();
}

}  // namespace velmar
