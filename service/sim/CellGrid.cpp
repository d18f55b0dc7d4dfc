#include "service/sim/CellGrid.h"

#include <array>
#include <cmath>
#include <cstdint>

#include "core/platform/TechnologyNames.h"

namespace velmar::sim {

namespace {

struct SitePosition {
    double x;
    double y;
};

// Axial coordinates of the hexagonal grid within two rings of the centre, converted to metres.
std::vector<SitePosition> sitePositions() {
    std::vector<SitePosition> sites;
    constexpr int kRings = 2;
    for (int q = -kRings; q <= kRings; ++q) {
        for (int r = -kRings; r <= kRings; ++r) {
            const int s = -q - r;
            if (std::abs(s) > kRings) {
                continue;
            }
            const double x = kInterSiteDistance * (q + r / 2.0);
            const double y = kInterSiteDistance * (std::sqrt(3.0) / 2.0) * r;
            sites.push_back({x, y});
        }
    }
    return sites;
}

// The GSM 900 channels of the plan: a 12-channel reuse over the grid.
constexpr std::array<std::uint32_t, 12> kGsmChannels = {2, 5, 8, 11, 14, 17, 20, 23, 26, 29, 32, 35};

// The radio access technology of the cells that a technology's device camps on.
CellRat mainRatOf(Technology technology) {
    switch (technology) {
        case Technology::Cdma:
            return CellRat::Cdma;
        case Technology::Utran:
            return CellRat::Umts;
        case Technology::Gsm:
        case Technology::ObjectBased:
            return CellRat::Gsm;
        case Technology::Lte:
            break;
    }
    return CellRat::Lte;
}

}  // namespace

double sectorAzimuthDegrees(int sector) {
    return 30.0 + 120.0 * sector;
}

std::vector<SimCell> buildCellGrid(std::string_view technology, SimRandom& random,
                                   std::vector<int>& sectorOf) {
    const std::vector<SitePosition> sites = sitePositions();
    std::vector<SimCell> cells;
    sectorOf.clear();
    // A per-world offset makes seeds differ in their identities as well as in their levels.
    const std::uint32_t plan = static_cast<std::uint32_t>(random.integer(0, 15));
    const TechnologyName* named = technologyNamed(technology);
    const Technology kind = named != nullptr ? named->technology : Technology::Lte;
    const bool dualLayer = kind == Technology::Gsm;
    const CellRat mainRat = mainRatOf(kind);
    auto add = [&](CellRat rat, std::size_t site, int sector) {
        SimCell cell;
        cell.index = static_cast<int>(cells.size());
        cell.rat = rat;
        cell.x = sites[site].x;
        cell.y = sites[site].y;
        const std::uint32_t siteNumber = static_cast<std::uint32_t>(site);
        const std::uint32_t sectorNumber = static_cast<std::uint32_t>(sector);
        const std::uint32_t cellNumber = siteNumber * kSectorsPerSite + sectorNumber;
        switch (rat) {
            case CellRat::Lte:
                // eNodeB id in the upper 20 bits, sector in the lower 8: a 28-bit E-UTRAN cell id.
                cell.cellId = ((0x1A2B0U + siteNumber + plan * 32U) << 8) | (sectorNumber + 1);
                cell.areaCode = 0x2A10 + siteNumber / 7;  // TAC
                cell.channel = 1300;                      // EARFCN, band 3
                cell.physicalId = ((plan * 3 + siteNumber) * 3 + sectorNumber) % 504;
                cell.band = 3;
                cell.bandwidthMHz = 20;
                break;
            case CellRat::Umts:
                // RNC id in the upper 12 bits, cell in the lower 16: a 28-bit UTRAN cell id.
                cell.cellId = (0x123U << 16) | ((siteNumber + plan * 32U) * 10 + sectorNumber + 1);
                cell.areaCode = 0x1F40 + siteNumber / 7;  // LAC
                cell.routingArea = 0x11 + siteNumber / 7;
                cell.channel = 10713;  // UARFCN, band I
                cell.physicalId = ((plan + cellNumber) * 8) % 512;
                cell.band = 1;
                cell.bandwidthMHz = 5;
                break;
            case CellRat::Gsm:
                cell.cellId = (0x4E20U + siteNumber * 10 + sectorNumber + plan * 256U) & 0xFFFF;
                cell.areaCode = 0x1F40 + siteNumber / 7;  // LAC
                cell.routingArea = 0x11 + siteNumber / 7;
                cell.channel = kGsmChannels[(cellNumber + plan) % kGsmChannels.size()];
                cell.physicalId = ((siteNumber % 8) << 3) | ((sectorNumber + plan) % 8);  // NCC, BCC
                cell.band = 0;                                                            // GSM 900
                break;
            case CellRat::Cdma:
                cell.cellId = (0x0F00 + siteNumber * 16 + sectorNumber + plan * 512U) & 0xFFFF;  // base id
                cell.areaCode = 1 + siteNumber / 7;  // packet zone
                cell.channel = 25;                   // band class 1 (PCS)
                // PN offsets with a pilot increment of 4, in units of 64 chips.
                cell.physicalId = ((plan * 3 + siteNumber) * 12 + sectorNumber * 4) % 512;
                cell.band = 1;
                cell.systemId = 4145 + plan;
                cell.networkId = 1;
                break;
        }
        cells.push_back(cell);
        sectorOf.push_back(sector);
    };
    for (std::size_t site = 0; site < sites.size(); ++site) {
        for (int sector = 0; sector < kSectorsPerSite; ++sector) {
            add(mainRat, site, sector);
        }
    }
    if (dualLayer) {
        // UMTS on every other site of the grid.
        for (std::size_t site = 0; site < sites.size(); ++site) {
            if (site % 2 == 1) {
                continue;
            }
            for (int sector = 0; sector < kSectorsPerSite; ++sector) {
                add(CellRat::Umts, site, sector);
            }
        }
    }
    return cells;
}

}  // namespace velmar::sim
