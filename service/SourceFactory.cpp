#include "service/SourceFactory.h"

#include <cstdlib>

#include "service/ReplaySource.h"
#include "service/live/DeviceDiscovery.h"
#include "service/live/LiveSource.h"
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

// A positive number of seconds from the environment, or fallback. The live source's timing can be
// shortened this way so that tests of silent and vanishing devices run quickly.
double secondsFromEnvironment(const char* name, double fallback) {
    const char* text = std::getenv(name);
    if (text == nullptr || *text == '\0') {
        return fallback;
    }
    char* end = nullptr;
    const double value = std::strtod(text, &end);
    return (*end == '\0' && value > 0 && value <= 3600) ? value : fallback;
}

}  // namespace

LiveSource::Settings liveSettings(const ServiceOptions& options) {
    LiveSource::Settings settings;
    settings.device = options.device;
    settings.subscription = options.subscription;
    settings.recordPath = options.record;
    settings.timing.responseSeconds =
        secondsFromEnvironment("VELMAR_DIAG_RESPONSE_SECONDS", settings.timing.responseSeconds);
    settings.timing.keepAliveSeconds =
        secondsFromEnvironment("VELMAR_DIAG_KEEPALIVE_SECONDS", settings.timing.keepAliveSeconds);
    settings.retrySeconds = secondsFromEnvironment("VELMAR_DIAG_RETRY_SECONDS", settings.retrySeconds);
    settings.deviceRoot = live::deviceRoot();
    if (options.modemManager) {
        modem::ModemManagerLink::Settings link;
        link.busAddress = options.busAddress;
        link.modem = options.modem;
        link.retrySeconds = secondsFromEnvironment("VELMAR_MODEM_MANAGER_RETRY_SECONDS", link.retrySeconds);
        link.cellInfoSeconds =
            secondsFromEnvironment("VELMAR_MODEM_MANAGER_CELL_SECONDS", link.cellInfoSeconds);
        settings.modemManager = link;
    }
    return settings;
}

std::unique_ptr<BasebandSource> makeBasebandSource(const ServiceOptions& options, std::string& /*error*/) {
    switch (options.source) {
        case SourceKind::Replay:
            return std::make_unique<ReplaySource>(
                ReplaySource::Settings{options.input, options.speed, options.fast, options.loop});
        case SourceKind::Live:
            return std::make_unique<LiveSource>(liveSettings(options));
        case SourceKind::Sim:
            break;
    }
    return std::make_unique<SimSource>(
        SimSource::Settings{std::string(options.technologyName), options.seed.value_or(1),
                            scenarioOf(options.scenario), options.rateMultiplier});
}

}  // namespace velmar
