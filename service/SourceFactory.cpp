#include "service/SourceFactory.h"

#include "service/LiveSource.h"
#include "service/ReplaySource.h"

namespace velmar {

std::unique_ptr<BasebandSource> makeBasebandSource(const ServiceOptions& options, std::string& error) {
    switch (options.source) {
        case SourceKind::Replay:
            return std::make_unique<ReplaySource>(
                ReplaySource::Settings{options.input, options.speed, options.fast, options.loop});
        case SourceKind::Live:
            return std::make_unique<LiveSource>(options.device);
        case SourceKind::Sim:
            break;
    }
    error =
        "the simulated baseband (--source sim) is not available yet; use --source replay --input FILE or "
        "--source live --device PATH";
    return nullptr;
}

}  // namespace velmar
