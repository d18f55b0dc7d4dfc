// MonitorOptions: the command line of velmar, the monitor.
//
//   velmar [--terminal | --headless [--path PATH]] [--fullscreen] [--log-stderr]
//
// Contract: parseMonitorOptions reads the arguments after the program name with the one command-line parser
// (core/platform/CommandLine.h). It answers the options, or help, or the version, or a one-line usage error:
// an unknown argument, a missing value, both front ends, or --path without --headless. Whether --fullscreen
// can be honoured depends on the front end that the session offers, so main() checks that after choosing it.
#pragma once

#include <string>
#include <vector>

namespace velmar {

struct MonitorOptions {
    enum class FrontEnd { Default, Gui, Terminal, Headless };

    FrontEnd frontEnd = FrontEnd::Default;  // Default: chosen by what the session offers
    std::string followedPath = "/";         // the headless front end's followed pane
    bool fullscreen = false;
    bool logStderr = false;
};

struct ParsedMonitorOptions {
    MonitorOptions options;
    bool help = false;
    bool version = false;
    std::string error;  // a usage error when not empty
};

ParsedMonitorOptions parseMonitorOptions(const std::vector<std::string>& arguments);

// The --help text, ending with the front ends that this build has.
std::string monitorUsage(bool haveGui, bool haveTerminal);

}  // namespace velmar
