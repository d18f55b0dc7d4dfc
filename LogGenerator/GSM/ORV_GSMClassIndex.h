// ORV_GSMClassIndex: the class index of the GSM/UMTS technology of the log-code family: its twenty-six record
// decoders and the log codes they subscribe to.
//
// Contract: kGsmDecoders below is the table from which the index creates its decoders, strictly in its order,
// which is the order in which dispatch calls the subscribers of a shared code (0x417A: ActiveSet,
// DetectedSet, MonitoredSet, VirtualActiveSet; 0xFF0001: GSMServingCell, NeighboringCells, ServingPLMN,
// UMTSSet, UMTSRRInfo). The five placeholders subscribe to no code. Destruction writes "Deallocing
// ORV_GSMClassIndex" to standard output, releases the decoders in creation order, and then the base writes
// "Deallocing ClassIndex".
#pragma once

#include "LogGenerator/ClassIndex.h"
#include "LogGenerator/DecoderTable.h"
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
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

inline constexpr DecoderRow kGsmDecoders[] = {
    VELMAR_DECODER_ROW(ActiveSet, "Active Set", kLogCodeUmtsCellSets),
    VELMAR_DECODER_ROW(CodingScheme, "Coding Scheme"),
    VELMAR_DECODER_ROW(GPRSInformation, "GPRS Information", kLogCodeGprsCellOptions, kLogCodeRegistrationInfo,
                       kLogCodeGprsTbfParameters, kLogCodeGprsPbcchDescription, kLogCodeGprsPacketSystemInfo,
                       kLogCodeGprsSi13Position, kLogCodeGsmMeasurements),
    VELMAR_DECODER_ROW(GSMServingCell, "GSM Serving Cell", kLogCodeGsmServingIdentity,
                       kLogCodeGsmMeasurements, kLogCodeGsmDedicatedChannel, kLogCodeCellMonitor),
    VELMAR_DECODER_ROW(MobileAllocation, "Mobile Allocation", kLogCodeGsmMobileAllocation),
    VELMAR_DECODER_ROW(NeighboringCells, "Neighboring Cells", kLogCodeGsmMeasurements, kLogCodeGsmBsicList,
                       kLogCodeCellMonitor),
    kPDPContextListRow,
    VELMAR_DECODER_ROW(ProcessPS, "Process PS", kLogCodeGmmState, kLogCodeRegistrationState),
    VELMAR_DECODER_ROW(UMTSRRMeasurement, "UMTS RR Measurement"),
    VELMAR_DECODER_ROW(CellChangeCounters, "Cell Change Counters"),
    VELMAR_DECODER_ROW(DetectedSet, "Detected Set", kLogCodeUmtsCellSets),
    VELMAR_DECODER_ROW(GSMSet, "GSM Set", kLogCodeUmtsIdleMeasurements),
    VELMAR_DECODER_ROW(NonRankedGSMSet, "Non-Ranked GSM Set"),
    VELMAR_DECODER_ROW(ProcessCO, "Process CO", kLogCodeMmState, kLogCodeRegistrationState),
    VELMAR_DECODER_ROW(ServingPLMN, "Serving PLMN", kLogCodeRegistrationInfo, kLogCodeRegistrationState,
                       kLogCodeCellMonitor),
    VELMAR_DECODER_ROW(UMTSSet, "UMTS Set", kLogCodeUmtsIdleMeasurements, kLogCodeCellMonitor),
    VELMAR_DECODER_ROW(EquivalentPLMNList, "Equivalent PLMN List", kLogCodeEquivalentPlmns),
    VELMAR_DECODER_ROW(GSMRRInfo, "GSM RR Info", kLogCodeGsmRrState, kLogCodeGsmMeasurements,
                       kLogCodeGsmChannelParameters, kLogCodeGprsTbfParameters),
    VELMAR_DECODER_ROW(MonitoredSet, "Monitored Set", kLogCodeUmtsCellSets),
    VELMAR_DECODER_ROW(NonRankedUMTSSet, "Non-Ranked UMTS Set"),
    VELMAR_DECODER_ROW(ProcessCS, "Process CS", kLogCodeMmState, kLogCodeRegistrationState),
    VELMAR_DECODER_ROW(UMTSRRInfo, "UMTS RR Info", kLogCodeUmtsRrcState, kLogCodeUmtsTransmitPower,
                       kLogCodeUmtsCellIdentity, kLogCodeUmtsCiphering, kLogCodeCellMonitor),
    VELMAR_DECODER_ROW(BLER, "BLER", kLogCodeUmtsBlockErrors),
    VELMAR_DECODER_ROW(VirtualActiveSet, "Virtual Active Set", kLogCodeUmtsCellSets),
    kSimInfoRow,
    VELMAR_DECODER_ROW(HSDPAInformation, "HSDPA Info", kLogCodeUmtsHsdpa),
};

class ORV_GSMClassIndex : public ClassIndex {
  public:
    ORV_GSMClassIndex() : ClassIndex(kGsmDecoders) {}
    ~ORV_GSMClassIndex() override;
};

}  // namespace velmar
