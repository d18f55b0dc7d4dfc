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
#include "core/platform/StandardOutputDiversion.h"
#include "core/platform/SystemLog.h"
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

constexpr const char* kUsage =
    "usage: velmar [--terminal | --headless [--path PATH]] [--fullscreen] [--log-stderr]\n"
    "\n"
    "Cellular radio diagnostics monitor. Connects to the telephony service kxserverd (retrying every 5 s\n"
    "until it answers), decodes what the baseband reports and shows it as a tree of panes.\n"
    "\n"
    "  (default)       the graphical interface where DISPLAY, WAYLAND_DISPLAY or QT_QPA_PLATFORM is set;\n"
    "                  otherwise the terminal interface when standard input and output are a terminal;\n"
    "                  otherwise --headless\n"
    "  --terminal      full-screen terminal interface: arrow keys, PgUp/PgDn, Home/End move; Enter or the\n"
    "                  right arrow opens a row; left arrow, Backspace or Esc go back; s saves a snapshot\n"
    "                  (internal builds); q quits\n"
    "  --headless      no user interface: after launch and after every redraw, one JSON line on standard\n"
    "                  output: {\"time\", \"connected\", \"status\", \"tree\"}\n"
    "  --path PATH     with --headless, follow the pane at PATH (e.g. /LTE/Serving Cell Info) instead of "
    "the\n"
    "                  root; when PATH disappears the pane pops to its parent\n"
    "  --fullscreen    the graphical interface fills the screen (kiosk devices); otherwise its window opens\n"
    "                  at a phone-like size\n"
    "  --log-stderr    mirror system-log lines to standard error as '<priority> <text>'\n"
    "                  (VELMAR_LOG_LEVEL=error|warning|notice|info|debug sets how much; default error)\n"
    "  --help          show this text\n"
    "\n"
    "Snapshots are saved to ${XDG_STATE_HOME:-~/.local/state}/velmar/diagnostics; the save button appears\n"
    "only on internal builds (see README).\n";

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
    enum class FrontEnd { Default, Gui, Terminal, Headless };
    FrontEnd frontEnd = FrontEnd::Default;
    std::string followedPath = "/";
    bool fullscreen = false;
    bool pathGiven = false;
    bool logStderr = false;
    for (int i = 1; i < argc; ++i) {
        const std::string_view argument = argv[i];
        if (argument == "--help" || argument == "-h") {
            std::fputs(kUsage, stdout);
            std::printf("\nThis build has: %s%sthe headless front end.\n",
                        kHaveGui ? "the graphical interface, " : "",
                        kHaveTerminal ? "the terminal interface, " : "");
            return 0;
        } else if (argument == "--headless" || argument == "--terminal") {
            const FrontEnd chosen = argument == "--headless" ? FrontEnd::Headless : FrontEnd::Terminal;
            if (frontEnd != FrontEnd::Default && frontEnd != chosen) {
                std::fputs("velmar: --terminal and --headless exclude each other (see --help)\n", stderr);
                return 2;
            }
            frontEnd = chosen;
        } else if (argument == "--fullscreen") {
            fullscreen = true;
        } else if (argument == "--log-stderr") {
            SystemLog::setMirrorToStderr(true);
            logStderr = true;
        } else if (argument == "--path" && i + 1 < argc) {
            followedPath = argv[++i];
            pathGiven = true;
        } else {
            std::fprintf(stderr, "velmar: unknown argument '%s' (see --help)\n", argv[i]);
            return 2;
        }
    }
    // --path only makes sense when the user asked for the headless front end, not when it was chosen for
    // want of a display or a terminal.
    if (pathGiven && frontEnd != FrontEnd::Headless) {
        std::fputs("velmar: --path goes with --headless (see --help)\n", stderr);
        return 2;
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
    HeadlessFrontEnd headless(generatorFactory(), followedPath, jsonOutput.stream());
    return headless.run();
}
