#include "LogGenerator/LTE/LTEClassIndex.h"

#include <cstdio>

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

namespace velmar {

LTEClassIndex::LTEClassIndex() {
    objLTEServingCellInfo = Base::initWithDict<LTEServingCellInfo>(classDict, codeDictionary);
    objConnectedModeMeasurementMisc =
        Base::initWithDict<ConnectedModeMeasurementMisc>(classDict, codeDictionary);
    objMeasuredNeighborCells = Base::initWithDict<MeasuredNeighborCells>(classDict, codeDictionary);
    objDetectedCells = Base::initWithDict<DetectedCells>(classDict, codeDictionary);
    objServingCellMeasurement = Base::initWithDict<ServingCellMeasurement>(classDict, codeDictionary);
    objNeighborMeasurementMisc = Base::initWithDict<NeighborMeasurementMisc>(classDict, codeDictionary);
    objNeighborCellsList = Base::initWithDict<NeighborCellsList>(classDict, codeDictionary);
    objReselectionCandidatesMisc = Base::initWithDict<ReselectionCandidatesMisc>(classDict, codeDictionary);
    objReselectionCandidatesList = Base::initWithDict<ReselectionCandidatesList>(classDict, codeDictionary);
    objSimInfo = Base::initWithDict<SimInfo>(classDict, codeDictionary);
    objPDPContextList = Base::initWithDict<PDPContextList>(classDict, codeDictionary);
}

LTEClassIndex::~LTEClassIndex() {
    std::fputs("Deallocing LTEClassIndex\n", stdout);
    objLTEServingCellInfo.reset();
    objConnectedModeMeasurementMisc.reset();
    objMeasuredNeighborCells.reset();
    objDetectedCells.reset();
    objServingCellMeasurement.reset();
    objNeighborMeasurementMisc.reset();
    objNeighborCellsList.reset();
    objReselectionCandidatesMisc.reset();
    objReselectionCandidatesList.reset();
    objSimInfo.reset();
    objPDPContextList.reset();
}

}  // namespace velmar
