// PdpSession: the packet-data context of the simulated phone as the telephony service reports it (extra
// record 0xFF0002): one IPv4 context on a test APN while a data session is up, an empty list otherwise.
#pragma once

#include <cstdint>
#include <vector>

#include "logfile/records/GsmRecords.h"

namespace velmar::sim {

inline constexpr const char* kPdpApn = "internet.test";
inline constexpr const char* kPdpAddress = "10.45.0.23";

inline PlistData buildPdpSessionRecord(bool sessionUp, std::uint64_t timestamp) {
    std::vector<PdpContext> contexts;
    if (sessionUp) {
        contexts.push_back(PdpContext{1, kPdpApn, "IP", kPdpAddress});
    }
    return buildPdpContextsRecord(contexts, timestamp);
}

}  // namespace velmar::sim
