// C2KLogCodes: the eight baseband log codes that the CDMA2000 generator decodes itself, in the order in which
// its start command asks for them.
#pragma once

#include <array>
#include <cstdint>

namespace velmar::c2k {

inline constexpr std::int32_t kFingerC2ICode = 0x108A;         // finger C/I
inline constexpr std::int32_t kEvdoStatusCode = 0x1183;        // EV-DO status
inline constexpr std::int32_t kForwardLinkRateCode = 0x1192;   // EV-DO forward-link packet counters
inline constexpr std::int32_t kEvdoActiveSetCode = 0x12B6;     // EV-DO active set
inline constexpr std::int32_t k1xStatusCode = 0x119C;          // 1x status (subpackets)
inline constexpr std::int32_t k1xTrafficCode = 0x119D;         // 1x traffic frame errors (subpackets)
inline constexpr std::int32_t kReverseLinkRateCode = 0x127E;   // EV-DO reverse-link packet counters
inline constexpr std::int32_t k1xSystemIdentityCode = 0x134F;  // 1x system identity

inline constexpr std::array<std::int32_t, 8> kStartCommandCodes{
    kFingerC2ICode, kEvdoStatusCode, kForwardLinkRateCode, kEvdoActiveSetCode,
    k1xStatusCode,  k1xTrafficCode,  kReverseLinkRateCode, k1xSystemIdentityCode,
};

}  // namespace velmar::c2k
