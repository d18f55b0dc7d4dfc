// KxServerProtocol: the vocabulary that the monitor and the telephony service (kxserverd) share.
//
// Contract: every constant's string value is its own name, so both sides compare plain strings. This
// header holds the technology names answered to "GetTechnology", the keys and values of the cell-monitor
// dictionaries that the service supplies as extra records, and the port names of the service.
#pragma once

#include <string_view>

namespace velmar {

#define VELMAR_KX_CONSTANT(name) inline constexpr std::string_view name = #name

// Technology families, the answer to "GetTechnology".
VELMAR_KX_CONSTANT(kKxLogChannelTechnology_IFX);
VELMAR_KX_CONSTANT(kKxLogChannelTechnology_Orvane_GSM);
VELMAR_KX_CONSTANT(kKxLogChannelTechnology_Orvane_CDMA);
VELMAR_KX_CONSTANT(kKxLogChannelTechnology_Orvane_LTE);
VELMAR_KX_CONSTANT(kKxLogChannelTechnology_Orvane_UTRAN2);

// Cell-monitor dictionary keys.
VELMAR_KX_CONSTANT(kKxCellMonitorCellRadioAccessTechnology);
VELMAR_KX_CONSTANT(kKxCellMonitorCellType);
VELMAR_KX_CONSTANT(kKxCellMonitorCellId);
VELMAR_KX_CONSTANT(kKxCellMonitorARFCN);
VELMAR_KX_CONSTANT(kKxCellMonitorRSSI);
VELMAR_KX_CONSTANT(kKxCellMonitorUARFCN);
VELMAR_KX_CONSTANT(kKxCellMonitorPSC);
VELMAR_KX_CONSTANT(kKxCellMonitorRSCP);
VELMAR_KX_CONSTANT(kKxCellMonitorEcN0);
VELMAR_KX_CONSTANT(kKxCellMonitorMCC);
VELMAR_KX_CONSTANT(kKxCellMonitorMNC);
VELMAR_KX_CONSTANT(kKxCellMonitorLAC);
VELMAR_KX_CONSTANT(kKxCellMonitorTAC);
VELMAR_KX_CONSTANT(kKxCellMonitorPID);
VELMAR_KX_CONSTANT(kKxCellMonitorBandInfo);
VELMAR_KX_CONSTANT(kKxCellMonitorSCN);

// Cell-monitor values of kKxCellMonitorCellRadioAccessTechnology.
VELMAR_KX_CONSTANT(kKxCellMonitorRadioAccessTechnologyGSM);
VELMAR_KX_CONSTANT(kKxCellMonitorRadioAccessTechnologyUMTS);
VELMAR_KX_CONSTANT(kKxCellMonitorRadioAccessTechnologyUTRAN2);
VELMAR_KX_CONSTANT(kKxCellMonitorRadioAccessTechnologyLTE);

// Cell-monitor values of kKxCellMonitorCellType.
VELMAR_KX_CONSTANT(kKxCellMonitorCellTypeServing);
VELMAR_KX_CONSTANT(kKxCellMonitorCellTypeNeighbor);

#undef VELMAR_KX_CONSTANT

// The service's control port.
inline constexpr std::string_view kKxServerControlPortName = "com.velmar.kxserver";

}  // namespace velmar
