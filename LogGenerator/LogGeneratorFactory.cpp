// The technology factory: the technology name that the telephony service answers picks the generator class.
// The names are compared for equality in the order of the table; the first match decides.
#include <array>

#include "LogGenerator/C2K/C2KLogGenerator.h"
#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"
#include "LogGenerator/LTE/LTELogGenerator.h"
#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/UTRAN/UTRANLogGenerator.h"
#include "core/platform/KxServerProtocol.h"

namespace velmar {

namespace {

using GeneratorCreator = std::unique_ptr<LogGenerator> (*)();

struct TechnologyEntry {
    std::string_view technology;
    GeneratorCreator create;  // null while the technology has no generator in this build
};

constexpr std::array<TechnologyEntry, 5> kTechnologies{{
    {kKxLogChannelTechnology_IFX, &GSMLogGenerator::generator},
    {kKxLogChannelTechnology_Orvane_GSM, &ORV_GSMLogGenerator::generator},
    {kKxLogChannelTechnology_Orvane_CDMA, &C2KLogGenerator::generator},
    {kKxLogChannelTechnology_Orvane_LTE, &LTELogGenerator::generator},
    {kKxLogChannelTechnology_Orvane_UTRAN2, &UTRANLogGenerator::generator},
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
