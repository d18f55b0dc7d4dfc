// LteLogCodes: every log code that the LTE technology decodes, the one place that names them. The decoders
// (LogGenerator/LTE/) and the record builders (logfile/records/) both take their codes from here; the class
// index (LTEClassIndex.h) says which decoder handles which code.
#pragma once

#include <cstdint>

#include "core/platform/logcodes/ExtraLogCodes.h"

namespace velmar {

inline constexpr std::int32_t kLogCodeLteMasterInformation = 0xB0C1;
inline constexpr std::int32_t kLogCodeLteServingCellInfo = 0xB0C2;
inline constexpr std::int32_t kLogCodeLteIntraFrequency =
    0xB179;  // connected-mode intra-frequency measurements
inline constexpr std::int32_t kLogCodeLteIdleServingMeasurement = 0xB17F;
inline constexpr std::int32_t kLogCodeLteIdleNeighbourMeasurement = 0xB180;
inline constexpr std::int32_t kLogCodeLteReselectionCandidates = 0xB186;

// Extra records: kLogCodeSimFiles, kLogCodeCellMonitor and kLogCodePdpContexts (ExtraLogCodes.h).

}  // namespace velmar
