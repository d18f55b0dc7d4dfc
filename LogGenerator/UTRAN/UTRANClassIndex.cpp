#include "LogGenerator/UTRAN/UTRANClassIndex.h"

#include "LogGenerator/GSM/PDPContextList.h"
#include "LogGenerator/GSM/SimInfo.h"
#include "LogGenerator/UTRAN/CCTRCHSIRMeasurement.h"
#include "LogGenerator/UTRAN/GSMNeighbhorMeasurements.h"
#include "LogGenerator/UTRAN/RRC_State.h"
#include "LogGenerator/UTRAN/TRCHBLERMeasurement.h"
#include "LogGenerator/UTRAN/UTRANNeighbhorMeasurements.h"
#include "LogGenerator/UTRAN/UTRANServingCellInfo.h"

namespace velmar {

UTRANClassIndex::UTRANClassIndex() {
    rrc_state = Base::initWithDict<RRC_State>(classDict, codeDictionary);
    servingCellInfo = Base::initWithDict<UTRANServingCellInfo>(classDict, codeDictionary);
    tdMeasurements = Base::initWithDict<UTRANNeighbhorMeasurements>(classDict, codeDictionary);
    gsmMeasurements = Base::initWithDict<GSMNeighbhorMeasurements>(classDict, codeDictionary);
    trchMeasurements = Base::initWithDict<TRCHBLERMeasurement>(classDict, codeDictionary);
    cctrchMeasurements = Base::initWithDict<CCTRCHSIRMeasurement>(classDict, codeDictionary);
    pdpList = Base::initWithDict<PDPContextList>(classDict, codeDictionary);
    simInfo = Base::initWithDict<SimInfo>(classDict, codeDictionary);
}

UTRANClassIndex::~UTRANClassIndex() {
    rrc_state.reset();
    servingCellInfo.reset();
    tdMeasurements.reset();
    gsmMeasurements.reset();
    trchMeasurements.reset();
    cctrchMeasurements.reset();
    pdpList.reset();
    simInfo.reset();
}

}  // namespace velmar
