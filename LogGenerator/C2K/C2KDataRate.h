// C2KDataRate: the EV-DO data rates, computed from two successive samples of a link's byte total.
//
// Contract: a sample is (sequence number, byte total). When the state holds a previous sample of the link
// and the sequence number advanced by at least 1, the display key shows "%.2f kbps" of
// (total − previous total) ÷ ((sequence − previous sequence) × 1024.0), and the previous sample is copied
// into "ExtraInfo" under the "…2" keys; without a previous sample the display key is set to an empty string
// (a sample whose sequence did not advance leaves the key as it was). The new sample then replaces the
// previous one in the state and is copied into "ExtraInfo" under the "…1" keys.
#pragma once

#include <cstdint>

#include "LogGenerator/C2K/C2KDisplaySetter.h"

namespace velmar::c2k {

struct DataRateKeys {
    const char* displayKey;      // "kFLDataRate"
    const char* sequenceKey;     // state: "FLDataSeqNum"
    const char* sentKey;         // state: "FLDataSent"
    const char* newSequenceKey;  // ExtraInfo: "FLDataSeqNum1"
    const char* newSentKey;      // ExtraInfo: "FLDataSent1"
    const char* oldSequenceKey;  // ExtraInfo: "FLDataSeqNum2"
    const char* oldSentKey;      // ExtraInfo: "FLDataSent2"
};

extern const DataRateKeys kForwardLinkRateKeys;
extern const DataRateKeys kReverseLinkRateKeys;

void recordDataRateSample(const DataRateKeys& keys, std::uint32_t sequence, std::uint64_t bytesSent,
                          const C2KRecordContext& context);

}  // namespace velmar::c2k
