// CellGrid: the cells of the simulated radio world. Sites stand on a hexagonal grid (a centre site and two
// rings around it), each with three sectors facing 30, 150 and 270 degrees; every sector is one cell with
// the identities of the technology being simulated.
//
// Contract: the same technology and seed give the same cells in the same order. Identities are unique where
// the network plans them so (cell ids; physical ids among the cells of one channel within the grid) and stay
// inside their fields' ranges. For "gsm" the world is a dual layer: a GSM cell on every sector and a UMTS
// cell on the sectors of the sites that carry UMTS (not all do, so the device falls back to GSM in places).
#pragma once

#include <string_view>
#include <vector>

#include "service/sim/RadioSnapshot.h"
#include "service/sim/SimRandom.h"

namespace velmar::sim {

// Distance between neighbouring sites, metres.
inline constexpr double kInterSiteDistance = 600.0;
inline constexpr int kSectorsPerSite = 3;

// The boresight of a sector, degrees counter-clockwise from east.
double sectorAzimuthDegrees(int sector);

// Builds the world's cells; `sectorOf` receives each cell's sector (0..2), index for index.
std::vector<SimCell> buildCellGrid(std::string_view technology, SimRandom& random,
                                   std::vector<int>& sectorOf);

}  // namespace velmar::sim
