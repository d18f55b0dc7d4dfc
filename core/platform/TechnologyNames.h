// TechnologyNames: the short names by which command lines choose a technology ("gsm", "lte", ...), and what
// each stands for: the technology constant that the service answers to "GetTechnology", and whether its
// generator is the object-based one. The one table of them; adding a technology is one row.
#pragma once

#include <array>
#include <string>
#include <string_view>

#include "core/platform/KxServerProtocol.h"

namespace velmar {

enum class Technology { Gsm, Lte, Utran, Cdma, ObjectBased };

struct TechnologyName {
    Technology technology;
    std::string_view name;      // as command lines give it
    std::string_view constant;  // the "GetTechnology" answer
    bool objectBased;           // the start command names no codes; every blob goes to every channel
};

inline constexpr std::array<TechnologyName, 5> kTechnologyNames = {{
    {Technology::Gsm, "gsm", kKxLogChannelTechnology_Orvane_GSM, false},
    {Technology::Lte, "lte", kKxLogChannelTechnology_Orvane_LTE, false},
    {Technology::Utran, "utran", kKxLogChannelTechnology_Orvane_UTRAN2, false},
    {Technology::Cdma, "cdma", kKxLogChannelTechnology_Orvane_CDMA, false},
    {Technology::ObjectBased, "ifx", kKxLogChannelTechnology_IFX, true},
}};

// The row of a short name; null for a name that is not in the table.
constexpr const TechnologyName* technologyNamed(std::string_view name) {
    for (const TechnologyName& row : kTechnologyNames) {
        if (row.name == name) {
            return &row;
        }
    }
    return nullptr;
}

// The short names in table order, joined by separator except the last two, which are joined by last:
// technologyNameList(", ", " or ") is "gsm, lte, utran, cdma or ifx".
inline std::string technologyNameList(std::string_view separator, std::string_view last) {
    std::string list;
    for (std::size_t index = 0; index < kTechnologyNames.size(); ++index) {
        if (index > 0) {
            list += index + 1 == kTechnologyNames.size() ? last : separator;
        }
        list += kTechnologyNames[index].name;
    }
    return list;
}

}  // namespace velmar
