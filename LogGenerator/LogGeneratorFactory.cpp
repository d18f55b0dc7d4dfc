// The technology factory: the technology name that the telephony service answers picks the generator class.
// The names are compared for equality in the order of the table; the first match decides.
#include <array>

#include "LogGenerator/LogGenerator.h"
#include "core/platform/KxServerProtocol.h"

namespace velmar {

namespace {

using GeneratorCreator = std::unique_ptr<LogGenerator> (*)();

struct TechnologyEntry {
    std::string_view technology;
    GeneratorCreator create;  // null while the technology has no generator in this build
};

constexpr std::array<TechnologyEntry, 5> kTechnologies{{
    {kKxLogChannelTechnology_IFX, nullptr},
    {kKxLogChannelTechnology_Orvane_GSM, nullptr},
    {kKxLogChannelTechnology_Orvane_CDMA, nullptr},
    {kKxLogChannelTechnology_Orvane_LTE, nullptr},
    {kKxLogChannelTechnology_Orvane_UTRAN2, nullptr},
}};

}  // namespace

std::unique_ptr<LogGenerator> LogGenerator::generatorFromTechnology(std::string_view technology) {
    for (const auto& entry : kTechnologies) {
        if (entry.technology == technology) {
            return entry.create ? entry.create() : nullptr;
        }
    }
    return nullptr;
}

}  // namespace velmar
