// C2KValueNames: the value-name tables of the CDMA2000 display. A value outside a table is shown with the
// table's fallback format ("[Reserved %d]", "[Bad Value %d]", "ERI - %d").
#pragma once

#include "LogGenerator/RecordFields.h"

namespace velmar::c2k {

extern const ValueNames kEvdoDeviceStateNames;
extern const ValueNames kEvdoSessionStateNames;
extern const ValueNames k1xDeviceStateNames;
extern const ValueNames kBandClassNames;
extern const ValueNames kRoamingIndicatorNames;

// The 1x device state in which the second receive chain and the transmitter are reported.
inline constexpr std::int64_t k1xTrafficState = 8;

}  // namespace velmar::c2k
