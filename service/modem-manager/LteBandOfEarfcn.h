// LteBandOfEarfcn: the E-UTRA operating band that a downlink EARFCN lies in.
//
// ModemManager's cell list names an LTE cell's EARFCN but not its band; the band follows from the channel
// number, because each band owns a fixed range of downlink EARFCNs. The ranges are a table (band, first,
// last) in LteBandOfEarfcn.cpp.
//
// Contract: returns the band whose downlink range holds earfcn, or nothing for a number outside every
// range (uplink-only numbers, gaps between bands, numbers past the table).
#pragma once

#include <cstdint>
#include <optional>

namespace velmar::modem {

std::optional<std::int64_t> lteBandOfEarfcn(std::int64_t earfcn);

}  // namespace velmar::modem
