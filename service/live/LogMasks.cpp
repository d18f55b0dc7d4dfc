#include "service/live/LogMasks.h"

#include <algorithm>
#include <bit>

namespace velmar::live {

namespace {

constexpr unsigned kItemBits = 12;
constexpr std::uint32_t kItemMask = 0xFFF;

EquipmentLogMask emptyMask(std::uint32_t equipment, std::uint32_t itemCount) {
    EquipmentLogMask mask;
    mask.equipment = equipment;
    mask.itemCount = std::min(itemCount, kMaxLogMaskItems);
    mask.bits.assign((mask.itemCount + 7) / 8, 0);
    return mask;
}

}  // namespace

std::vector<EquipmentLogMask> logMasksFor(const LogCodeFilter& demand, const EquipmentRanges& ranges) {
    std::vector<EquipmentLogMask> masks;
    const auto& codes = demand.codes();
    for (std::uint32_t equipment = 0; equipment < kEquipmentIdCount; ++equipment) {
        const std::uint32_t first = equipment << kItemBits;
        std::uint32_t highestWanted = 0;
        bool wanted = false;
        for (std::uint32_t item = 0; item <= kItemMask; ++item) {
            if (codes.test(first + item)) {
                highestWanted = item;
                wanted = true;
            }
        }
        const std::uint32_t reported = ranges[equipment];
        if (demand.takesEverything() && reported != 0) {
            EquipmentLogMask mask = emptyMask(equipment, std::max(reported, wanted ? highestWanted + 1 : 0));
            std::fill(mask.bits.begin(), mask.bits.end(), 0xFF);
            if (mask.itemCount % 8 != 0) {
                mask.bits.back() = static_cast<std::uint8_t>((1U << (mask.itemCount % 8)) - 1);
            }
            masks.push_back(std::move(mask));
            continue;
        }
        if (!wanted) {
            continue;
        }
        EquipmentLogMask mask = emptyMask(equipment, std::max(reported, highestWanted + 1));
        for (std::uint32_t item = 0; item <= highestWanted; ++item) {
            if (codes.test(first + item)) {
                mask.bits[item / 8] = static_cast<std::uint8_t>(mask.bits[item / 8] | 1U << (item % 8));
            }
        }
        masks.push_back(std::move(mask));
    }
    return masks;
}

std::vector<EquipmentLogMask> maskUpdates(const std::vector<EquipmentLogMask>& inForce,
                                          const std::vector<EquipmentLogMask>& wanted) {
    std::vector<EquipmentLogMask> updates;
    for (const EquipmentLogMask& mask : wanted) {
        const auto current = std::find_if(inForce.begin(), inForce.end(), [&](const EquipmentLogMask& old) {
            return old.equipment == mask.equipment;
        });
        if (current == inForce.end() || *current != mask) {
            updates.push_back(mask);
        }
    }
    for (const EquipmentLogMask& old : inForce) {
        const bool stillWanted = std::any_of(wanted.begin(), wanted.end(), [&](const EquipmentLogMask& mask) {
            return mask.equipment == old.equipment;
        });
        if (!stillWanted) {
            updates.push_back(emptyMask(old.equipment, old.itemCount));
        }
    }
    std::sort(updates.begin(), updates.end(),
              [](const EquipmentLogMask& a, const EquipmentLogMask& b) { return a.equipment < b.equipment; });
    return updates;
}

std::size_t codesInMask(const EquipmentLogMask& mask) {
    std::size_t count = 0;
    for (const std::uint8_t byte : mask.bits) {
        count += static_cast<std::size_t>(std::popcount(byte));
    }
    return count;
}

}  // namespace velmar::live
