// LteFormats: the conversions that the LTE measurement records share, from unsigned raw values to the texts
// shown (double precision where the result has fractions).
#pragma once

#include "LogGenerator/RecordFields.h"

namespace velmar::lte_formats {

// RSRP in quarter dB: r × 0.25 − 140.0.
inline constexpr ValueFormat kQuarterDbRsrp = asDouble("%4.2f dBm", 0.25, -140.0);
// RSRQ in eighth dB (connected-mode record): r × 0.125 − 20.0.
inline constexpr ValueFormat kEighthDbRsrq = asDouble("%4.2f dB", 0.125, -20.0);
// RSRQ in quarter dB (idle-mode records): r × 0.25 − 30.0.
inline constexpr ValueFormat kQuarterDbRsrq = asDouble("%4.2f dB", 0.25, -30.0);
// RSSI, and the neighbour list's RSRP, in half dB: r × 0.5 − 140.0.
inline constexpr ValueFormat kHalfDbLevel = asDouble("%4.2f dBm", 0.5, -140.0);
// Qrxlevmin: r × 2 − 140.
inline constexpr ValueFormat kQrxlevmin = asInt("%d dBm", 2, -140);
// Srxlev, P_Max and Max UE Tx Power: r − 30.
inline constexpr ValueFormat kMinus30Dbm = asInt("%d dBm", 1, -30);

}  // namespace velmar::lte_formats
