// SimCardFiles: the simulated device's SIM, as the telephony service reports its elementary files (the extra
// record 0xFF0000). The identities are plausible but clearly fake: test PLMN 001-01, IMSI 001010123456789,
// an ICCID of the 89 00101 test range and a +1 555 number.
//
// Contract: the same timestamp gives the same bytes; the record is a property-list dictionary of SIM-file
// keys ("kSimFile_ICCID", ...) to string values.
#pragma once

#include <cstdint>

#include "core/platform/plist/PlistValue.h"

namespace velmar::sim {

inline constexpr const char* kSimImsi = "001010123456789";
inline constexpr const char* kSimIccid = "89001012012345678905";
inline constexpr const char* kSimMsisdn = "+15555550123";

PlistData buildSimCardRecord(std::uint64_t timestamp);

}  // namespace velmar::sim
