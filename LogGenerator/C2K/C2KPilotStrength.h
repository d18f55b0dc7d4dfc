// C2KPilotStrength: the energy formulas of the CDMA2000 pilot lists, in dB.
//
// evdoPilotStrengthDb: 10 × log10(raw × 0.001953125), the strength of an EV-DO active-set pilot and the C/I
// of a finger, both reported in units of 1/512. A raw 0 gives minus infinity, shown as such.
// activeSetPilotEnergyDb: 10 × log10(max(2^(2Q − 3) × E ÷ (9 × L² × M) − 1 ÷ L, 0.00001)) of a 1x active-set
// pilot with energy E, where L, M and Q are the accumulation parameters of the active-set subpacket. The
// floor 0.00001 (−50 dB) also stands in for a result that is not a number (L or M zero).
#pragma once

#include <cstdint>

namespace velmar::c2k {

double evdoPilotStrengthDb(std::uint32_t raw);
double activeSetPilotEnergyDb(std::uint32_t energy, std::uint32_t l, std::uint32_t m, std::uint32_t q);

}  // namespace velmar::c2k
