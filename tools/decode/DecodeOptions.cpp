#include "tools/decode/DecodeOptions.h"

#include <charconv>
#include <cmath>
#include <string_view>

#include "core/platform/CommandLine.h"
#include "core/platform/TechnologyNames.h"

namespace velmar {

namespace {

// Seconds as a decimal number ("2", "0.5") in microseconds, within 1 ms and one day.
std::optional<std::int64_t> parseSeconds(std::string_view text) {
    double seconds = 0;
    const auto [end, status] = std::from_chars(text.data(), text.data() + text.size(), seconds);
    if (status != std::errc() || end != text.data() + text.size() || !(seconds >= 0.001) ||
        !(seconds <= 86400)) {
        return std::nullopt;
    }
    return static_cast<std::int64_t>(std::llround(seconds * 1e6));
}

// velmar-decode's command line, its rows writing into options.
CommandLine decodeCommandLine(DecodeOptions& options) {
    CommandLine commandLine{
        .usage = "usage: velmar-decode",
        .description =
            "Feeds recorded baseband blobs through a technology's generator, exactly as the monitor "
            "does, and prints the resulting display as JSON on standard output.",
        .options = {},
        .operands = "FILE...",
        .takeOperand = [&options](std::string_view file) -> std::string {
            options.files.emplace_back(file);
            return "";
        },
        .epilogue =
            "A refresh runs at every 'tick' line of a hex file and after each entry of a snapshot file (with "
            "--every or --csv: at the end of each period of recording time that holds packets instead), and "
            "once after the last blob. Data are shown as {\"$data\": base64}, dates as {\"$date\": "
            "ISO 8601 UTC}. CSV fields are quoted as RFC 4180 says; lines end with LF; with --csv all the "
            "rows are written at the end, when every column is known.\n"
            "Files are read through a window of 1 MiB, so memory does not grow with their size: a capture "
            "frame longer than 262144 bytes, a hex line longer than the window or a snapshot file larger "
            "than 32 MiB ends the reading with an error. When standard error is a terminal and a file is "
            "larger than "
            "50 MB, a progress line there tells the bytes and packets done, the rate and the time left.\n"
            "Exit status: 0 on success, 2 on a usage error or unreadable input.",
        .wording = {.unknownOption = "unknown option '{}'", .takesNoValue = "option {} takes no value"},
    };
    commandLine.options = {
        {.name = "--technology",
         .value = "T",
         .help = "gsm (GSM/UMTS), lte, utran, cdma (CDMA2000) or ifx (object-based GSM)",
         .apply = [&options](std::string_view value) -> std::string {
             const TechnologyName* found = technologyNamed(value);
             if (found == nullptr) {
                 return "unknown technology '" + std::string(value) + "' (expected " +
                        technologyNameList(", ", " or ") + ")";
             }
             options.technology = value;
             options.technologyConstant = found->constant;
             return "";
         },
         .synopsis = "--technology {" + technologyNameList("|", "|") + "}"},
        {.name = "--format",
         .value = "F",
         .help = "input format; auto (default) decides by file extension, then by content: hex (one blob per "
                 "line, 'tick' lines refresh), dlf (DLF records), qmdl (raw diagnostic-port capture), velmar "
                 "(saved snapshot file)",
         .apply = [&options](std::string_view value) -> std::string {
             const auto format = parseLogFormatName(value);
             if (!format) {
                 return "unknown format '" + std::string(value) +
                        "' (expected auto, hex, dlf, qmdl or velmar)";
             }
             options.format = *format;
             return "";
         },
         .synopsis = "[--format auto|hex|dlf|qmdl|velmar]"},
        {.name = "--output",
         .value = "O",
         .help = "display (default): the state's \"Display\"; state: the whole state dictionary",
         .apply = [&options](std::string_view value) -> std::string {
             if (value == "display") {
                 options.output = DecodeOptions::Output::Display;
             } else if (value == "state") {
                 options.output = DecodeOptions::Output::State;
             } else {
                 return "unknown output '" + std::string(value) + "' (expected display or state)";
             }
             return "";
         },
         .synopsis = "[--output display|state]"},
        {.name = "--every-tick",
         .value = "",
         .help = "one JSON line per display refresh instead of one document at the end",
         .apply = setsFlag(options.everyTick)},
        {.name = "--every",
         .value = "SECONDS",
         .help = "refresh the display every SECONDS of recording time (the packets' own timestamps), at the "
                 "multiples of SECONDS since 1970 UTC, instead of at 'tick' lines and snapshot entries; "
                 "periods without packets have no refresh",
         .apply = [&options](std::string_view value) -> std::string {
             const std::optional<std::int64_t> micro = parseSeconds(value);
             if (!micro) {
                 return "--every needs a number of seconds from 0.001 to 86400, not '" + std::string(value) +
                        "'";
             }
             options.everyMicroseconds = *micro;
             return "";
         }},
        {.name = "--csv",
         .value = "PATH",
         .help =
             "print CSV instead of JSON: a 'time' column (ISO 8601 UTC recording time of the refresh) and "
             "one column per display PATH as the panes show it (e.g. 'Serving Cell/Serving Cell "
             "Info/Physical Cell ID'), numbers without units, one row per refresh, empty cells where a "
             "value is absent; repeat for more columns, or 'all' for every numeric leaf. Without --every, "
             "refreshes every 2 seconds of recording time, the monitor's tick",
         .apply = [&options](std::string_view value) -> std::string {
             options.csv = true;
             if (value != "all") {
                 options.csvPaths.emplace_back(value);
             } else {
                 options.csvAll = true;
             }
             return "";
         }},
        {.name = "--save-contents",
         .value = "",
         .help = "print the snapshot save contents (history entries and DLF file) instead",
         .apply = setsFlag(options.saveContents)},
        {.name = "--raw-versions",
         .value = "",
         .help = "decode records as recorded: without this, records of newer firmware versions are first "
                 "rewritten into the layouts the decoders read",
         .apply = setsFlag(options.rawVersions)},
        {.name = "--census",
         .value = "",
         .help = "print, instead of the display, one line per log code and record version with how many "
                 "records were decoded as is, adapted, dropped, of an unknown version or not decoded by the "
                 "technology (its codes first), e.g. '0xB179 v4 237 adapted'",
         .apply = setsFlag(options.census)},
        {.name = "--start-command",
         .value = "",
         .help = "print the generator's start command and exit (no FILE needed)",
         .apply = setsFlag(options.startCommand)},
        {.name = "--list-decoders",
         .value = "",
         .help =
             "print which decoder handles which log code, taken from the technology's class index, and exit "
             "(no FILE needed)",
         .apply = setsFlag(options.listDecoders)},
        logStderrOption(options.logStderr),
    };
    return commandLine;
}

}  // namespace

std::string decodeUsage() {
    DecodeOptions unused;
    return commandLineHelp(decodeCommandLine(unused));
}

std::optional<DecodeOptions> parseDecodeOptions(const std::vector<std::string>& arguments,
                                                std::string& error) {
    DecodeOptions options;
    const CommandLineResult line = parseCommandLine(decodeCommandLine(options), arguments);
    if (line.help || line.version) {
        options.help = line.help;
        options.version = line.version;
        return options;
    }
    if (!line.error.empty()) {
        error = line.error;
        return std::nullopt;
    }
    if (options.technology.empty()) {
        error = "--technology is required (" + technologyNameList(", ", " or ") + ")";
        return std::nullopt;
    }
    if (options.csv) {
        if (options.csvAll && !options.csvPaths.empty()) {
            error = "--csv all takes no other paths";
            return std::nullopt;
        }
        for (const auto& [set, name] :
             {std::pair{options.everyTick, "--every-tick"},
              std::pair{options.saveContents, "--save-contents"}, std::pair{options.census, "--census"}}) {
            if (set) {
                error = std::string("--csv does not combine with ") + name;
                return std::nullopt;
            }
        }
        if (options.everyMicroseconds == 0) {
            options.everyMicroseconds = kDefaultCsvEvery;
        }
    }
    if (options.files.empty() && !options.startCommand && !options.listDecoders) {
        error = "no input file given";
        return std::nullopt;
    }
    return options;
}

}  // namespace velmar
