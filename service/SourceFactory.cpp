#include "service/SourceFactory.h"

#include "service/LiveSource.h"
#include "service/ReplaySource.h"
#include "service/sim/SimSource.h"

namespace velmar {

namespace {

sim::Scenario scenarioOf(std::string_view name) {
    if (name == "walk") {
        return sim::Scenario::Walk;
    }
    if (name == "static") {
        return sim::Scenario::Static;
    }
    return sim::Scenario::Drive;
}

}  // namespace

std::unique_ptr<BasebandSource> makeBasebandSource(const ServiceOptions& options, std::string& /*error*/) {
    switch (options.source) {
        case SourceKind::Replay:
            return std::make_unique<ReplaySource>(
                ReplaySource::Settings{options.input, options.speed, options.fast, options.loop});
        case SourceKind::Live:
            return std::make_unique<LiveSource>(options.device);
        case SourceKind::Sim:
            break;
    }
    return std::make_unique<SimSource>(
        SimSource::Settings{std::string(options.technologyName), options.seed.value_or(1),
                            scenarioOf(options.scenario), options.rateMultiplier});
}

}  // namespace velmar
