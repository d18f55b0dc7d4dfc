// GsmLogCodes: every log code that the GSM/UMTS technology decodes, the one place that names them. The
// decoders (LogGenerator/GSM/) and the record builders (logfile/records/) both take their codes from here;
// the class index (ORV_GSMClassIndex.h) says which decoder handles which code.
#pragma once

#include <cstdint>

#include "core/platform/logcodes/ExtraLogCodes.h"

namespace velmar {

// UMTS.
inline constexpr std::int32_t kLogCodeUmtsIdleMeasurements = 0x4005;  // GSM and UMTS cells measured on UMTS
inline constexpr std::int32_t kLogCodeUmtsTransmitPower = 0x4031;     // uplink transmit power
inline constexpr std::int32_t kLogCodeUmtsBlockErrors = 0x4116;  // block error counts per transport channel
inline constexpr std::int32_t kLogCodeUmtsRrcState = 0x4125;
inline constexpr std::int32_t kLogCodeUmtsCellIdentity = 0x4127;
inline constexpr std::int32_t kLogCodeUmtsCiphering = 0x4157;
inline constexpr std::int32_t kLogCodeUmtsCellSets = 0x417A;  // connected-mode cell sets
inline constexpr std::int32_t kLogCodeUmtsHsdpa = 0x4221;     // HSDPA statistics

// GSM and GPRS.
inline constexpr std::int32_t kLogCodeGsmChannelParameters = 0x5072;
inline constexpr std::int32_t kLogCodeGsmDedicatedChannel = 0x5076;
inline constexpr std::int32_t kLogCodeGsmRrState = 0x512C;
inline constexpr std::int32_t kLogCodeGsmServingIdentity = 0x5134;
inline constexpr std::int32_t kLogCodeGsmMeasurements = 0x5137;  // serving and neighbour measurements
inline constexpr std::int32_t kLogCodeGprsSi13Position = 0x51F4;
inline constexpr std::int32_t kLogCodeGprsCellOptions = 0x51F5;
inline constexpr std::int32_t kLogCodeGprsTbfParameters = 0x51F6;  // TBF and DRX parameters
inline constexpr std::int32_t kLogCodeGsmMobileAllocation = 0x51F8;
inline constexpr std::int32_t kLogCodeGprsPbcchDescription = 0x51FB;
inline constexpr std::int32_t kLogCodeGprsPacketSystemInfo = 0x51FD;
inline constexpr std::int32_t kLogCodeGsmBsicList = 0x51FF;

// Mobility management and registration.
inline constexpr std::int32_t kLogCodeGmmState = 0x7130;
inline constexpr std::int32_t kLogCodeMmState = 0x7131;
inline constexpr std::int32_t kLogCodeRegistrationState = 0x7132;
inline constexpr std::int32_t kLogCodeRegistrationInfo = 0x7135;
inline constexpr std::int32_t kLogCodeEquivalentPlmns = 0x7150;

// Extra records: kLogCodeSimFiles, kLogCodeCellMonitor and kLogCodePdpContexts (ExtraLogCodes.h).

}  // namespace velmar
