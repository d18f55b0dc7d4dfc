// KxServerProtocol: the vocabulary that the monitor and the telephony service (kxserverd) share.
//
// Contract: every constant's string value is its own name, so both sides compare plain strings. This
// header holds the technology names answered to "GetTechnology", the keys and values of the cell-monitor
// dictionaries that the service supplies as extra records, and the port names of the service.
#pragma once

#include <cstdint>
#include <string>
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

// A monitor's receive port: "com.velmar.Velmar.<pid>.BasebandStateReport.LogChannel", one per monitor
// process, so that any number of monitors of one user (a GUI at the desk, a terminal over SSH) each hold a
// channel of the one service.
inline constexpr std::string_view kMonitorReceivePortPrefix = "com.velmar.Velmar.";
inline constexpr std::string_view kMonitorReceivePortSuffix = ".BasebandStateReport.LogChannel";
inline std::string monitorReceivePortName(long pid) {
    return std::string(kMonitorReceivePortPrefix) + std::to_string(pid) +
           std::string(kMonitorReceivePortSuffix);
}

// Control messages (XML property lists, message id 0). A client asks
//   {"Request": "CreateLogChannel", "ReceivePort": <name of the client's local port>}
// and the service answers
//   {"Domain": <integer>, "Error": <integer, 0 on success>, "ChannelPort": <name>, "Reason": <text on
//   failure>}
// after which the service connects to the receive port and streams blobs (message id 0) there, and listens on
// ChannelPort for that channel's commands ("GetTechnology", the start command). Notifications from the
// service arrive on the control connection as {"Notification": <name>, "Data": <any>}.
inline constexpr std::string_view kKxRequestKey = "Request";
inline constexpr std::string_view kKxRequestCreateLogChannel = "CreateLogChannel";
inline constexpr std::string_view kKxReceivePortKey = "ReceivePort";
inline constexpr std::string_view kKxDomainKey = "Domain";
inline constexpr std::string_view kKxErrorKey = "Error";
inline constexpr std::string_view kKxChannelPortKey = "ChannelPort";
inline constexpr std::string_view kKxReasonKey = "Reason";
inline constexpr std::string_view kKxNotificationKey = "Notification";
inline constexpr std::string_view kKxNotificationDataKey = "Data";
// Error domain of the service's own answers, and its error codes.
inline constexpr std::int32_t kKxErrorDomainServer = 1;
inline constexpr std::int32_t kKxErrorBadRequest = 1;
inline constexpr std::int32_t kKxErrorCannotReachReceivePort = 2;
inline constexpr std::int32_t kKxErrorCannotOpenChannelPort = 3;
inline constexpr std::int32_t kKxErrorTooManyChannels = 4;

// Channel commands: {"GetTechnology": "GetTechnology"} answered with {"GetTechnology": <technology
// constant>}; the start command {"SetState": "Streaming", "SetOrvaneLogCodes": [...], "SetKxExtraCodes":
// [...]}.
inline constexpr std::string_view kKxGetTechnologyKey = "GetTechnology";
inline constexpr std::string_view kKxSetStateKey = "SetState";
inline constexpr std::string_view kKxStreamingState = "Streaming";
inline constexpr std::string_view kKxSetLogCodesKey = "SetOrvaneLogCodes";
inline constexpr std::string_view kKxSetExtraCodesKey = "SetKxExtraCodes";

}  // namespace velmar
