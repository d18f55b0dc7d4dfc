// GsmLogCodes: the log codes of the GSM/UMTS cell records and of the SIM-file and PDP-context extra records
// (records the telephony service supplies beside the log stream: 0xFF0000 plus their 16-bit code). The
// cell-monitor extra code is gsm::kCellMonitorCode (GsmDecoderSupport.h).
#pragma once

#include <cstdint>

namespace velmar {

inline constexpr std::int32_t kLogCodeUmtsIdleMeasurements = 0x4005;  // GSM and UMTS cells measured on UMTS
inline constexpr std::int32_t kLogCodeUmtsCellSets = 0x417A;          // connected-mode cell sets
inline constexpr std::int32_t kLogCodeGsmDedicatedChannel = 0x5076;
inline constexpr std::int32_t kLogCodeGsmServingIdentity = 0x5134;
inline constexpr std::int32_t kLogCodeGsmMeasurements = 0x5137;  // serving and neighbour measurements
inline constexpr std::int32_t kLogCodeGsmMobileAllocation = 0x51F8;
inline constexpr std::int32_t kLogCodeGsmBsicList = 0x51FF;
inline constexpr std::int32_t kLogCodeSimFiles = 0xFF0000;
inline constexpr std::int32_t kLogCodePdpContexts = 0xFF0002;

}  // namespace velmar
