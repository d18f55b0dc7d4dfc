#include "service/ServiceMain.h"

#include <sys/signalfd.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <string>
#include <vector>

#include "core/platform/BuildInfo.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/PollMainQueue.h"
#include "core/platform/SystemLog.h"
#include "service/KxServer.h"
#include "service/ServiceOptions.h"
#include "service/SourceFactory.h"
#include "service/VersionAdaptingSink.h"
#include "service/live/PortListing.h"

namespace velmar {

namespace {

constexpr const char* kProgramName = "kxserverd";
constexpr int kExitCannotStart = 1;
constexpr int kExitUsage = 2;
// How long a source may take to finish (a modem's stop sequence) after SIGTERM or SIGINT.
constexpr double kFinishSeconds = 5.0;

int cannotStart(const std::string& message) {
    std::fprintf(stderr, "%s: %s\n", kProgramName, message.c_str());
    SystemLog::log(kLogError, "%s", message.c_str());
    return kExitCannotStart;
}

// SIGTERM and SIGINT (stop) and SIGUSR1 (log the version census) arrive as readable data on a descriptor
// that the main queue watches, so that they are handled by ordinary queue callbacks. Answers -1 when that
// cannot be arranged.
int openServiceSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGINT);
    sigaddset(&signals, SIGUSR1);
    if (sigprocmask(SIG_BLOCK, &signals, nullptr) != 0) {
        return -1;
    }
    return signalfd(-1, &signals, SFD_NONBLOCK | SFD_CLOEXEC);
}

}  // namespace

int runKxServerd(int argc, char** argv) {
    const ParsedServiceOptions parsed = parseServiceOptions(std::vector<std::string>(argv + 1, argv + argc));
    if (parsed.help) {
        std::fputs(std::string(serviceUsage()).c_str(), stdout);
        return 0;
    }
    if (parsed.version) {
        std::fputs(BuildInfo::versionText(kProgramName).c_str(), stdout);
        return 0;
    }
    if (!parsed.error.empty()) {
        std::fprintf(stderr, "%s: %s (see --help)\n", kProgramName, parsed.error.c_str());
        return kExitUsage;
    }
    const ServiceOptions& options = parsed.options;
    SystemLog::configureFromEnvironment(kProgramName);
    SystemLog::setMirrorToStderr(options.logStderr);
    std::signal(SIGPIPE, SIG_IGN);
    // A recording that reaches a file-size limit fails its write (and stops) instead of ending the service.
    std::signal(SIGXFSZ, SIG_IGN);
    if (options.listDevices) {
        const LiveSource::Settings live = liveSettings(options);
        live::listDiagnosticPorts(live.deviceRoot, live.timing, stdout);
        return 0;
    }

    std::string error;
    const std::unique_ptr<BasebandSource> source = makeBasebandSource(options, error);
    if (!source) {
        std::fprintf(stderr, "%s: %s\n", kProgramName, error.c_str());
        return kExitUsage;
    }
    const int signals = openServiceSignals();
    if (signals < 0) {
        return cannotStart("cannot watch for SIGTERM, SIGINT and SIGUSR1");
    }
    PollMainQueue queue;
    MainQueue::setCurrent(&queue);
    KxServer::Limits limits;
    limits.channels = options.maxChannels;
    limits.connections = options.maxConnections;
    limits.queueBytes = options.queueMebibytes * 1024 * 1024;
    KxServer server(queue, options.technology, options.objectBased, limits);
    // Every source's blobs enter the channels through the version adapter.
    VersionAdaptingSink adaptingSink(server);
    std::string listenFailure;
    switch (server.open(&listenFailure)) {
        case KxServer::OpenResult::Serving:
            break;
        case KxServer::OpenResult::AlreadyRunning:
            close(signals);
            return cannotStart("another kxserverd is already running on port " +
                               std::string(kKxServerControlPortName));
        case KxServer::OpenResult::Failed:
            close(signals);
            return cannotStart("cannot listen on port " + std::string(kKxServerControlPortName) + ": " +
                               listenFailure);
    }
    if (!source->prepare(error)) {
        server.shutdown();
        close(signals);
        return cannotStart(error);
    }
    std::string failure;
    source->setFailureHandler([&](const std::string& reason) {
        if (failure.empty()) {
            failure = reason;
            queue.stop();
        }
    });

    int stoppedBy = 0;
    bool finishing = false;
    const MainQueue::Handle signalWatch = queue.watchReadable(signals, [&] {
        signalfd_siginfo info{};
        while (read(signals, &info, sizeof info) == static_cast<ssize_t>(sizeof info)) {
            if (info.ssi_signo == SIGUSR1) {
                adaptingSink.logCensus();
            } else {
                stoppedBy = static_cast<int>(info.ssi_signo);
            }
        }
        if (stoppedBy == 0) {
            return;
        }
        if (finishing) {
            queue.stop();  // a second signal does not wait for the source
            return;
        }
        // The source may have something to tell its device first (a modem: logging off); it gets a bounded
        // time for it, while the channels go on.
        finishing = true;
        SystemLog::log(kLogNotice, "kxserverd: stopping on signal %d", stoppedBy);
        queue.after(kFinishSeconds, [&queue] { queue.stop(); });
        source->finish([&queue] { queue.stop(); });
    });
    SystemLog::log(kLogNotice, "kxserverd: serving %s on port %s; source: %s",
                   std::string(options.technology).c_str(), std::string(kKxServerControlPortName).c_str(),
                   source->description().c_str());
    source->start(queue, adaptingSink);
    queue.run();

    source->stop();
    adaptingSink.logCensus();
    server.shutdown();
    queue.unwatch(signalWatch);
    close(signals);
    MainQueue::setCurrent(nullptr);
    if (!failure.empty()) {
        std::fprintf(stderr, "%s: %s\n", kProgramName, failure.c_str());
        SystemLog::log(kLogError, "%s", failure.c_str());
        return kExitCannotStart;
    }
    return 0;
}

}  // namespace velmar
