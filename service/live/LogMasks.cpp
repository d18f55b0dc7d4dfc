#include "service/live/LogMasks.h"

#include <algorithm>
#include <array>
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

// The wanted items of each equipment id, ascending.
std::array<std::vector<std::uint32_t>, kEquipmentIdCount> wantedItems(const LogCodeFilter& demand) {
    std::array<std::vector<std::uint32_t>, kEquipmentIdCount> items;
    const auto& codes = demand.codes();
    const auto add = [&items](std::size_t code) {
        items[code >> kItemBits].push_back(static_cast<std::uint32_t>(code & kItemMask));
    };
#if defined(__GLIBCXX__)
    // A word at a time: a demand is recomputed on every channel change, and most of the 65,536 bits are
    // clear.
    for (std::size_t code = codes._Find_first(); code < codes.size(); code = codes._Find_next(code)) {
        add(code);
    }
#else
    for (std::size_t code = 0; code < codes.size(); ++code) {
        if (codes.test(code)) {
            add(code);
        }
    }
#endif
    return items;
}

}  // namespace

std::vector<EquipmentLogMask> logMasksFor(const LogCodeFilter& demand, const EquipmentRanges& ranges) {
    std::vector<EquipmentLogMask> masks;
    const std::array<std::vector<std::uint32_t>, kEquipmentIdCount> items = wantedItems(demand);
    for (std::uint32_t equipment = 0; equipment < kEquipmentIdCount; ++equipment) {
        const std::vector<std::uint32_t>& wanted = items[equipment];
        const std::uint32_t reported = ranges[equipment];
        const std::uint32_t highestWanted = wanted.empty() ? 0 : wanted.back();
        if (demand.takesEverything() && reported != 0) {
            EquipmentLogMask mask =
                emptyMask(equipment, std::max(reported, wanted.empty() ? 0 : highestWanted + 1));
            std::fill(mask.bits.begin(), mask.bits.end(), 0xFF);
            if (mask.itemCount % 8 != 0) {
                mask.bits.back() = static_cast<std::uint8_t>((1U << (mask.itemCount % 8)) - 1);
            }
            masks.push_back(std::move(mask));
            continue;
        }
        if (wanted.empty()) {
            continue;
        }
        EquipmentLogMask mask = emptyMask(equipment, std::max(reported, highestWanted + 1));
        for (const std::uint32_t item : wanted) {
            mask.bits[item / 8] = static_cast<std::uint8_t>(mask.bits[item / 8] | 1U << (item % 8));
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
