#include "tools/decode/DecodeOptions.h"

#include <string_view>

#include "core/platform/KxServerProtocol.h"

namespace velmar {

const char* const kDecodeUsage =
    "usage: velmar-decode --technology {gsm|lte|utran|cdma|ifx} [--format auto|hex|dlf|qmdl|velmar]\n"
    "                     [--output display|state] [--every-tick] [--save-contents] [--start-command]\n"
    "                     [--log-stderr] FILE...\n"
    "\n"
    "Feeds recorded baseband blobs through a technology's generator, exactly as the monitor does, and prints\n"
    "the resulting display as JSON on standard output.\n"
    "\n"
    "  --technology T   gsm (GSM/UMTS), lte, utran, cdma (CDMA2000) or ifx (object-based GSM)\n"
    "  --format F       input format; auto (default) decides by file extension, then by content:\n"
    "                   hex (one blob per line, 'tick' lines refresh), dlf (DLF records), qmdl (raw\n"
    "                   diagnostic-port capture), velmar (saved snapshot file)\n"
    "  --output O       display (default): the state's \"Display\"; state: the whole state dictionary\n"
    "  --every-tick     one JSON line per display refresh instead of one document at the end\n"
    "  --save-contents  print the snapshot save contents (history entries and DLF file) instead\n"
    "  --start-command  print the generator's start command and exit (no FILE needed)\n"
    "  --log-stderr     mirror system-log lines to standard error as '<priority> <text>'\n"
    "                   (VELMAR_LOG_LEVEL=error|warning|notice|info|debug sets how much; default error)\n"
    "  --help           show this text\n"
    "\n"
    "A refresh runs at every 'tick' line of a hex file, after each entry of a snapshot file, and once after\n"
    "the last blob. Data are shown as {\"$data\": base64}, dates as {\"$date\": ISO 8601 UTC}.\n"
    "Exit status: 0 on success, 2 on a usage error or unreadable input.\n";

std::string technologyConstantFor(const std::string& name) {
    static const struct {
        const char* name;
        std::string_view constant;
    } kTechnologies[] = {
        {"gsm", kKxLogChannelTechnology_Orvane_GSM},   {"lte", kKxLogChannelTechnology_Orvane_LTE},
        {"utran", kKxLogChannelTechnology_Orvane_UTRAN2}, {"cdma", kKxLogChannelTechnology_Orvane_CDMA},
        {"ifx", kKxLogChannelTechnology_IFX},
    };
    for (const auto& entry : kTechnologies) {
        if (name == entry.name) {
            return std::string(entry.constant);
        }
    }
    return std::string();
}

std::optional<DecodeOptions> parseDecodeOptions(int argc, char** argv, std::string& error) {
    DecodeOptions options;
    bool technologyGiven = false;
    for (int i = 1; i < argc; ++i) {
        const std::string_view argument = argv[i];
        // Options take their value as the next argument or after "=".
        std::string_view name = argument;
        std::optional<std::string> inlineValue;
        if (argument.starts_with("--") && argument.find('=') != std::string_view::npos) {
            name = argument.substr(0, argument.find('='));
            inlineValue = std::string(argument.substr(argument.find('=') + 1));
        }
        auto takeValue = [&](std::string& into) {
            if (inlineValue) {
                into = *inlineValue;
                return true;
            }
            if (i + 1 >= argc) {
                error = std::string(name) + " needs a value";
                return false;
            }
            into = argv[++i];
            return true;
        };
        std::string value;
        if (name == "--technology") {
            if (!takeValue(value)) {
                return std::nullopt;
            }
            if (technologyConstantFor(value).empty()) {
                error = "unknown technology '" + value + "' (expected gsm, lte, utran, cdma or ifx)";
                return std::nullopt;
            }
            options.technology = value;
            technologyGiven = true;
        } else if (name == "--format") {
            if (!takeValue(value)) {
                return std::nullopt;
            }
            const auto format = parseLogFormatName(value);
            if (!format) {
                error = "unknown format '" + value + "' (expected auto, hex, dlf, qmdl or velmar)";
                return std::nullopt;
            }
            options.format = *format;
        } else if (name == "--output") {
            if (!takeValue(value)) {
                return std::nullopt;
            }
            if (value == "display") {
                options.output = DecodeOptions::Output::Display;
            } else if (value == "state") {
                options.output = DecodeOptions::Output::State;
            } else {
                error = "unknown output '" + value + "' (expected display or state)";
                return std::nullopt;
            }
        } else if (inlineValue) {
            error = "option " + std::string(name) + " takes no value";
            return std::nullopt;
        } else if (name == "--every-tick") {
            options.everyTick = true;
        } else if (name == "--save-contents") {
            options.saveContents = true;
        } else if (name == "--start-command") {
            options.startCommand = true;
        } else if (name == "--log-stderr") {
            options.logStderr = true;
        } else if (name == "--help" || name == "-h") {
            options.help = true;
            return options;
        } else if (name == "--") {
            for (++i; i < argc; ++i) {
                options.files.emplace_back(argv[i]);
            }
        } else if (name.starts_with("-") && name != "-") {
            error = "unknown option '" + std::string(name) + "'";
            return std::nullopt;
        } else {
            options.files.emplace_back(argument);
        }
    }
    if (!technologyGiven) {
        error = "--technology is required (gsm, lte, utran, cdma or ifx)";
        return std::nullopt;
    }
    if (options.files.empty() && !options.startCommand) {
        error = "no input file given";
        return std::nullopt;
    }
    return options;
}

}  // namespace velmar
