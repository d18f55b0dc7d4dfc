// DecodeOptions: the command line of velmar-decode.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "logfile/LogFormat.h"

namespace velmar {

// The monitor's display tick: how often --csv refreshes by recording time unless --every says otherwise.
inline constexpr std::int64_t kDefaultCsvEvery = 2000000;

struct DecodeOptions {
    enum class Output { Display, State };

    std::string technology;               // the short name: gsm, lte, utran, cdma or ifx
    std::string_view technologyConstant;  // the technology constant that the name stands for
    LogFormat format = LogFormat::Auto;
    Output output = Output::Display;
    bool everyTick = false;
    // --every: refresh every this many microseconds of recording time instead of at the input's own
    // refresh points; 0 when not given (--csv then refreshes at kDefaultCsvEvery).
    std::int64_t everyMicroseconds = 0;
    bool csv = false;
    std::vector<std::string> csvPaths;
    bool csvAll = false;  // "--csv all": every numeric leaf
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
