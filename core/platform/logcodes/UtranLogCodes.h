// UtranLogCodes: every log code that the UTRAN technology decodes, the one place that names them. The
// decoders (LogGenerator/UTRAN/) and the record builders (logfile/records/) both take their codes from here;
// the class index (UTRANClassIndex.h) says which decoder handles which code.
#pragma once

#include <cstdint>

#include "core/platform/logcodes/ExtraLogCodes.h"

namespace velmar {

inline constexpr std::int32_t kLogCodeUtranNeighbourMeasurement = 0xD00A;
inline constexpr std::int32_t kLogCodeUtranChannelQuality = 0xD00C;  // transport-channel BLER and CCTrCH SIR
inline constexpr std::int32_t kLogCodeUtranGsmNeighbourMeasurement = 0xD00E;
inline constexpr std::int32_t kLogCodeUtranRrcState = 0xD0E0;
inline constexpr std::int32_t kLogCodeUtranServingCell = 0xD0E2;

// Extra records: kLogCodeSimFiles, kLogCodeCellMonitor and kLogCodePdpContexts (ExtraLogCodes.h).

}  // namespace velmar
