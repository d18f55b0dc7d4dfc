#include "ui/MonitorOptions.h"

#include "core/platform/CommandLine.h"

namespace velmar {

namespace {

// velmar's command line, its rows writing into options; pathGiven tells whether --path was given.
CommandLine monitorCommandLine(MonitorOptions& options, bool& pathGiven) {
    const auto chooseFrontEnd = [&options](MonitorOptions::FrontEnd chosen) -> std::string {
        if (options.frontEnd != MonitorOptions::FrontEnd::Default && options.frontEnd != chosen) {
            return "--terminal and --headless exclude each other";
        }
        options.frontEnd = chosen;
        return "";
    };
    CommandLine commandLine{
        .usage = "usage: velmar",
        .description =
            "Cellular radio diagnostics monitor. Connects to the telephony service kxserverd (retrying every "
            "5 s until it answers), decodes what the baseband reports and shows it as a tree of panes.\n\n"
            "Without --terminal or --headless, velmar opens the graphical interface where DISPLAY, "
            "WAYLAND_DISPLAY or QT_QPA_PLATFORM is set; otherwise the terminal interface when standard input "
            "and output are a terminal; otherwise the headless one.",
        .options = {},
        .epilogue =
            "Snapshots are saved to ${XDG_STATE_HOME:-~/.local/state}/velmar/diagnostics; the save "
            "button appears only on internal builds (see README).",
        .wording = {.unknownOption = "unknown argument '{}'", .unexpectedArgument = "unknown argument '{}'"},
    };
    commandLine.options = {
        {.name = "--terminal",
         .value = "",
         .help = "full-screen terminal interface: arrow keys, PgUp/PgDn, Home/End move; Enter or the right "
                 "arrow opens a row; c charts a number over time; left arrow, Backspace or Esc go back; s "
                 "saves a snapshot (internal builds); q quits",
         .apply = [chooseFrontEnd](
                      std::string_view) { return chooseFrontEnd(MonitorOptions::FrontEnd::Terminal); },
         .synopsis = "[--terminal | --headless [--path PATH]]"},
        {.name = "--headless",
         .value = "",
         .help = "no user interface: after launch and after every redraw, one JSON line on standard output: "
                 "{\"time\", \"connected\", \"status\", \"tree\"}",
         .apply = [chooseFrontEnd](
                      std::string_view) { return chooseFrontEnd(MonitorOptions::FrontEnd::Headless); },
         .inSynopsis = false},
        {.name = "--path",
         .value = "PATH",
         .help =
             "with --headless, follow the pane at PATH (e.g. /LTE/Serving Cell Info) instead of the root; "
             "when PATH disappears the pane pops to its parent",
         .apply = [&options, &pathGiven](std::string_view value) -> std::string {
             options.followedPath = value;
             pathGiven = true;
             return "";
         },
         .inSynopsis = false},
        {.name = "--fullscreen",
         .value = "",
         .help = "the graphical interface fills the screen (kiosk devices); otherwise its window opens at a "
                 "phone-like size",
         .apply = setsFlag(options.fullscreen)},
        logStderrOption(options.logStderr),
    };
    return commandLine;
}

}  // namespace

ParsedMonitorOptions parseMonitorOptions(const std::vector<std::string>& arguments) {
    ParsedMonitorOptions parsed;
    bool pathGiven = false;
    const CommandLineResult line = parseCommandLine(monitorCommandLine(parsed.options, pathGiven), arguments);
    parsed.help = line.help;
    parsed.version = line.version;
    parsed.error = line.error;
    // --path only makes sense when the user asked for the headless front end, not when it is chosen for want
    // of a display or a terminal.
    if (!parsed.help && !parsed.version && parsed.error.empty() && pathGiven &&
        parsed.options.frontEnd != MonitorOptions::FrontEnd::Headless) {
        parsed.error = "--path goes with --headless";
    }
    return parsed;
}

std::string monitorUsage(bool haveGui, bool haveTerminal) {
    MonitorOptions unused;
    bool pathGiven = false;
    CommandLine commandLine = monitorCommandLine(unused, pathGiven);
    commandLine.epilogue += "\n\nThis build has: ";
    if (haveGui) {
        commandLine.epilogue += "the graphical interface, ";
    }
    if (haveTerminal) {
        commandLine.epilogue += "the terminal interface, ";
    }
    commandLine.epilogue += "the headless front end.";
    return commandLineHelp(commandLine);
}

}  // namespace velmar
