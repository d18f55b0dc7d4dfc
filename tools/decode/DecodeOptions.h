// DecodeOptions: the command line of velmar-decode.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "logfile/LogFormat.h"

namespace velmar {

struct DecodeOptions {
    enum class Output { Display, State };

    std::string technology;               // the short name: gsm, lte, utran, cdma or ifx
    std::string_view technologyConstant;  // the technology constant that the name stands for
    LogFormat format = LogFormat::Auto;
    Output output = Output::Display;
    bool everyTick = false;
    bool saveContents = false;
    bool startCommand = false;
    bool listDecoders = false;
    bool rawVersions = false;  // hand records on as recorded, without the packet-version adapter
    bool census = false;       // print the packet-version census instead of the display
    bool logStderr = false;
    bool help = false;
    bool version = false;
    std::vector<std::string> files;
};

// Parses the arguments after the program's name with the one command-line parser
// (core/platform/CommandLine.h); on a usage error answers nullopt and sets error to a one-line message.
std::optional<DecodeOptions> parseDecodeOptions(const std::vector<std::string>& arguments,
                                                std::string& error);

std::string decodeUsage();  // the --help text

}  // namespace velmar
