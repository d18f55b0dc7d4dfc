// velmar: the monitor. The front end is chosen on the command line or, by default, by what the session
// offers: the graphical interface where a display exists, the terminal interface on a terminal, and the
// headless one (JSON lines for scripts and tests) otherwise.
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <string_view>

#include "LogGenerator/LogGenerator.h"
#include "core/platform/BuildInfo.h"
#include "core/platform/CommandLine.h"
#include "core/platform/StandardOutputDiversion.h"
#include "core/platform/SystemLog.h"
#include "ui/MonitorOptions.h"
#include "ui/headless/HeadlessFrontEnd.h"
#ifdef VELMAR_WITH_QT
#include "ui/qt/QtFrontEnd.h"
#endif
#ifdef VELMAR_WITH_TERMINAL
#include "ui/terminal/TerminalFrontEnd.h"
#endif

namespace {

#ifdef VELMAR_WITH_QT
constexpr bool kHaveGui = true;
#else
constexpr bool kHaveGui = false;
#endif
#ifdef VELMAR_WITH_TERMINAL
constexpr bool kHaveTerminal = true;
#else
constexpr bool kHaveTerminal = false;
#endif

bool environmentSet(const char* name) {
    const char* value = std::getenv(name);
    return value != nullptr && *value != '\0';
}

velmar::GeneratorFactory generatorFactory() {
    return [](std::string_view technology) -> std::unique_ptr<velmar::MonitorGenerator> {
        return velmar::LogGenerator::generatorFromTechnology(technology);
    };
}

}  // namespace

int main(int argc, char** argv) {
    using namespace velmar;
    SystemLog::configureFromEnvironment("velmar");
    using FrontEnd = MonitorOptions::FrontEnd;
    const ParsedMonitorOptions parsed = parseMonitorOptions(commandLineArguments(argc, argv));
    if (parsed.help) {
        std::fputs(monitorUsage(kHaveGui, kHaveTerminal).c_str(), stdout);
        return 0;
    }
    if (parsed.version) {
        std::fputs(BuildInfo::versionText("velmar").c_str(), stdout);
        return 0;
    }
    if (!parsed.error.empty()) {
        std::fprintf(stderr, "velmar: %s (see --help)\n", parsed.error.c_str());
        return 2;
    }
    FrontEnd frontEnd = parsed.options.frontEnd;
    const bool fullscreen = parsed.options.fullscreen;
    const bool logStderr = parsed.options.logStderr;
    if (logStderr) {
        SystemLog::setMirrorToStderr(true);
    }
    if (frontEnd == FrontEnd::Default) {
        const bool display = environmentSet("DISPLAY") || environmentSet("WAYLAND_DISPLAY") ||
                             environmentSet("QT_QPA_PLATFORM");
        if (display && kHaveGui) {
            frontEnd = FrontEnd::Gui;
        } else if (kHaveTerminal && isatty(STDIN_FILENO) && isatty(STDOUT_FILENO)) {
            frontEnd = FrontEnd::Terminal;
        } else {
            frontEnd = FrontEnd::Headless;
        }
    }
    if (fullscreen && frontEnd != FrontEnd::Gui) {
        std::fputs("velmar: --fullscreen needs the graphical interface (a display, and a build with Qt)\n",
                   stderr);
        return 2;
    }

    switch (frontEnd) {
        case FrontEnd::Gui:
#ifdef VELMAR_WITH_QT
            return runQtFrontEnd(argc, argv, generatorFactory(), fullscreen);
#else
            break;
#endif
        case FrontEnd::Terminal:
#ifdef VELMAR_WITH_TERMINAL
        {
            // Declared first so that it outlives the front end and the generators it destroys.
            const StandardOutputDiversion screenOutput(logStderr);
            TerminalFrontEnd terminal(generatorFactory());
            return terminal.run(screenOutput.stream());
        }
#else
            std::fputs("velmar: this build has no terminal interface (see --help)\n", stderr);
            return 2;
#endif
        case FrontEnd::Headless:
        case FrontEnd::Default:
            break;
    }
    const StandardOutputDiversion jsonOutput(logStderr);
    HeadlessFrontEnd headless(generatorFactory(), parsed.options.followedPath, jsonOutput.stream());
    return headless.run();
}
