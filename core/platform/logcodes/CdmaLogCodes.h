// CdmaLogCodes: every log code that the CDMA2000 generator decodes, the one place that names them. The
// generator's parsers (LogGenerator/C2K/) and the record builders (logfile/records/) both take their codes
// from here; the parser table (C2KLogParsers.h) says which parser handles which code.
#pragma once

#include <cstdint>

namespace velmar {

inline constexpr std::int32_t kLogCodeCdmaFingerC2I = 0x108A;
inline constexpr std::int32_t kLogCodeCdmaEvdoStatus = 0x1183;
inline constexpr std::int32_t kLogCodeCdmaForwardLinkRate = 0x1192;  // EV-DO forward-link packet counters
inline constexpr std::int32_t kLogCodeCdma1xStatus = 0x119C;         // subpackets
inline constexpr std::int32_t kLogCodeCdma1xTraffic = 0x119D;        // traffic frame errors (subpackets)
inline constexpr std::int32_t kLogCodeCdmaReverseLinkRate = 0x127E;  // EV-DO reverse-link packet counters
inline constexpr std::int32_t kLogCodeCdmaEvdoActiveSet = 0x12B6;
inline constexpr std::int32_t kLogCodeCdma1xSystemIdentity = 0x134F;

}  // namespace velmar
