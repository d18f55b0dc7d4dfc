#include "service/ServiceOptions.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cmath>
#include <cstdlib>

#include "core/platform/CommandLine.h"
#include "core/platform/TechnologyNames.h"

namespace velmar {

namespace {

struct SourceName {
    std::string_view name;
    SourceKind kind;
};

constexpr std::array<SourceName, 3> kSources = {{
    {"sim", SourceKind::Sim},
    {"replay", SourceKind::Replay},
    {"live", SourceKind::Live},
}};

// Which sources each source-specific option applies to.
struct OptionScope {
    std::string_view option;
    bool sim;
    bool replay;
    bool live;
};

constexpr std::array<OptionScope, 13> kScopes = {{
    {"--input", false, true, false},
    {"--modem-manager", false, false, true},
    {"--modem", false, false, true},
    {"--bus-address", false, false, true},
    {"--device", false, false, true},
    {"--subscription", false, false, true},
    {"--record", false, false, true},
    {"--speed", false, true, false},
    {"--fast", false, true, false},
    {"--loop", false, true, false},
    {"--seed", true, false, false},
    {"--scenario", true, false, false},
    {"--rate-multiplier", true, false, false},
}};

constexpr std::array<std::string_view, 3> kScenarios = {"drive", "walk", "static"};

bool appliesTo(const OptionScope& scope, SourceKind source) {
    switch (source) {
        case SourceKind::Sim:
            return scope.sim;
        case SourceKind::Replay:
            return scope.replay;
        case SourceKind::Live:
            return scope.live;
    }
    return false;
}

std::string_view sourceName(SourceKind kind) {
    for (const SourceName& source : kSources) {
        if (source.kind == kind) {
            return source.name;
        }
    }
    return "";
}

std::string quoted(std::string_view text) {
    std::string out;
    out.reserve(text.size() + 2);
    out.append(1, '"').append(text).append(1, '"');
    return out;
}

std::optional<double> parsePositiveNumber(std::string_view given) {
    const std::string text(given);
    if (text.empty()) {
        return std::nullopt;
    }
    errno = 0;
    char* end = nullptr;
    const double value = std::strtod(text.c_str(), &end);
    if (errno != 0 || end != text.c_str() + text.size() || !std::isfinite(value) || value <= 0) {
        return std::nullopt;
    }
    return value;
}

std::optional<std::size_t> parseCount(std::string_view text, std::size_t most) {
    if (text.empty() || text.size() > 9 || text.find_first_not_of("0123456789") != std::string_view::npos) {
        return std::nullopt;
    }
    const std::size_t value = std::stoul(std::string(text));
    if (value == 0 || value > most) {
        return std::nullopt;
    }
    return value;
}

// A row for a whole-number option from 1 to most.
CommandLineOption countOption(std::string_view name, std::string_view value, std::string help,
                              std::size_t& target, std::size_t most) {
    return {.name = name,
            .value = value,
            .help = std::move(help),
            .apply = [name, most, &target](std::string_view given) -> std::string {
                const std::optional<std::size_t> count = parseCount(given, most);
                if (!count) {
                    return std::string(name) + " needs a whole number from 1 to " + std::to_string(most) +
                           ", not " + quoted(given);
                }
                target = *count;
                return "";
            }};
}

std::optional<std::uint64_t> parseUnsigned(std::string_view given) {
    const std::string text(given);
    if (text.empty() || text.find_first_not_of("0123456789") != std::string::npos) {
        return std::nullopt;
    }
    errno = 0;
    char* end = nullptr;
    const unsigned long long value = std::strtoull(text.c_str(), &end, 10);
    if (errno != 0 || end != text.c_str() + text.size()) {
        return std::nullopt;
    }
    return static_cast<std::uint64_t>(value);
}

// kxserverd's command line, its rows writing into options.
CommandLine serviceCommandLine(ServiceOptions& options) {
    CommandLine commandLine{
        .usage = "Usage: kxserverd",
        .description =
            "The telephony service: owns one baseband source and serves log channels to monitor clients on "
            "the control port com.velmar.kxserver (a socket in $VELMAR_RUNTIME_DIR, else "
            "$XDG_RUNTIME_DIR/velmar, else /tmp/velmar-<uid>). Each client's start command names the log "
            "codes and extra codes it receives.",
        .options = {},
        .epilogue =
            "Records of newer firmware versions are rewritten into the layouts the monitor decodes before "
            "the channels' log-code filters; SIGUSR1 logs the census of record versions seen (notice "
            "priority), as does the exit. "
            "SIGTERM or SIGINT closes every channel and the control port and exits with status 0. Exit "
            "status 1: the service could not start (another kxserverd is already running in the runtime "
            "directory, a runtime directory or control port that cannot be used, unreadable input, device "
            "that cannot be opened or does not answer a version request); 2: usage error.",
    };
    commandLine.options = {
        {.name = "--source",
         .value = "sim|replay|live",
         .help = "where the blobs come from (default: sim, the simulated baseband: a device in a small radio "
                 "world of cells, logging every record of the technology)",
         .apply = [&options](std::string_view value) -> std::string {
             const auto found =
                 std::find_if(kSources.begin(), kSources.end(),
                              [&value](const SourceName& source) { return source.name == value; });
             if (found == kSources.end()) {
                 return "unknown source " + quoted(value) + " (sim, replay or live)";
             }
             options.source = found->kind;
             return "";
         }},
        {.name = "--technology",
         .value = "NAME",
         .help = "the technology answered to GetTechnology: gsm, lte (default), utran, cdma, or ifx (the "
                 "object-based technology: every blob to every streaming channel)",
         .apply = [&options](std::string_view value) -> std::string {
             const TechnologyName* found = technologyNamed(value);
             if (found == nullptr) {
                 return "unknown technology " + quoted(value) + " (" + technologyNameList(", ", " or ") + ")";
             }
             options.technologyName = found->name;
             return "";
         },
         .synopsis = "[--technology " + technologyNameList("|", "|") + "]"},
        {.name = "--input",
         .value = "FILE",
         .help =
             "replay: the recorded log (hex blob file, DLF, raw diagnostic-port capture or snapshot; told "
             "apart by extension, else by content) of at most 256 MiB; a pipe or FIFO is read as it comes, "
             "and replayed once its writer has finished",
         .apply = storesValue(options.input)},
        {.name = "--speed",
         .value = "X",
         .help = "replay: X times the recorded pace (default 1). Blobs are paced by their baseband "
                 "timestamps, gaps of more than 3 seconds shortened to 3; a blob without a timestamp follows "
                 "1/50 s after the one before it",
         .apply = [&options](std::string_view value) -> std::string {
             const std::optional<double> speed = parsePositiveNumber(value);
             if (!speed) {
                 return "--speed needs a positive number, not " + quoted(value);
             }
             options.speed = *speed;
             return "";
         },
         .synopsis = "[--speed X | --fast]"},
        {.name = "--fast",
         .value = "",
         .help =
             "replay: as fast as the streaming channels take the blobs, from the first start command on; a "
             "client that stops reading loses only its own oldest blobs",
         .apply = setsFlag(options.fast),
         .inSynopsis = false},
        {.name = "--loop",
         .value = "",
         .help = "replay: start again at the end (otherwise the service stays up, idle)",
         .apply = setsFlag(options.loop)},
        {.name = "--seed",
         .value = "N",
         .help = "sim: seed of the simulated baseband (default 1); the same seed gives the same cells, route "
                 "and events",
         .apply = [&options](std::string_view value) -> std::string {
             const std::optional<std::uint64_t> seed = parseUnsigned(value);
             if (!seed) {
                 return "--seed needs a non-negative integer, not " + quoted(value);
             }
             options.seed = seed;
             return "";
         }},
        {.name = "--device",
         .value = "PATH|auto",
         .help =
             "live: the modem's diagnostic port: a tty (/dev/ttyUSB0), a /dev/serial/by-id link, or a FIFO "
             "fed with a raw capture (only read). The service probes the port, makes the modem log "
             "exactly the codes that the streaming channels ask for, and turns logging off when it ends. "
             "auto: the first USB serial port that answers, vendor-specific interfaces only. A port that "
             "goes away (unplug, reset) or stops answering is looked for again every second, then probed "
             "and set up again; the channels stay connected meanwhile",
         .apply = storesValue(options.device),
         .synopsis = "[--device PATH]"},
        logStderrOption(options.logStderr),
        {.name = "--scenario",
         .value = "NAME",
         .help = "sim: the device's route: drive (50 km/h, default), walk (5 km/h) or static",
         .apply = [&options](std::string_view value) -> std::string {
             const auto found = std::find(kScenarios.begin(), kScenarios.end(), value);
             if (found == kScenarios.end()) {
                 return "unknown scenario " + quoted(value) + " (drive, walk or static)";
             }
             options.scenario = *found;
             return "";
         },
         .synopsis = "[--scenario drive|walk|static]"},
        {.name = "--rate-multiplier",
         .value = "X",
         .help = "sim: simulated time runs X times faster than the wall clock (default 1, at most 1000), and "
                 "every logging rate with it; where the machine cannot keep up, simulated time runs as fast "
                 "as it can while the service keeps answering",
         .apply = [&options](std::string_view value) -> std::string {
             const std::optional<double> rate = parsePositiveNumber(value);
             if (!rate || *rate > ServiceOptionBounds::kMaxRateMultiplier) {
                 return "--rate-multiplier needs a positive number of at most 1000, not " + quoted(value);
             }
             options.rateMultiplier = *rate;
             return "";
         }},
        countOption("--max-channels", "N",
                    "log channels open at once (default 32, at most 1024); more are refused with the reason",
                    options.maxChannels, ServiceOptionBounds::kMaxChannels),
        countOption("--max-connections", "N",
                    "connections to the control port at once (default 64, at most 4096); more are closed and "
                    "logged",
                    options.maxConnections, ServiceOptionBounds::kMaxConnections),
        countOption(
            "--queue-memory", "MIB",
            "memory for the blobs that slow clients have not taken yet, all channels together (default "
            "64, at most 4096); past it the client furthest behind loses its oldest blobs",
            options.queueMebibytes, ServiceOptionBounds::kMaxQueueMebibytes),
        {.name = "--subscription",
         .value = "N",
         .help = "live: on a multi-SIM modem, the subscription (SIM) whose log packets stream (default: the "
                 "lowest subscription id seen); the others are counted",
         .apply = [&options](std::string_view value) -> std::string {
             const std::optional<std::uint64_t> id = parseUnsigned(value);
             if (!id || *id > 0xFFFFFFFFULL) {
                 return "--subscription needs an integer from 0 to 4294967295, not " + quoted(value);
             }
             options.subscription = static_cast<std::uint32_t>(*id);
             return "";
         }},
        {.name = "--record",
         .value = "FILE",
         .help =
             "live: also write every frame from the port, as received, to FILE (a raw capture, mode 0600, "
             "that --source replay and velmar-decode read)",
         .apply = storesValue(options.record)},
        {.name = "--modem-manager",
         .value = "on|off",
         .help = "live: read the SIM's identities, the cells the modem sees and its connected bearers from "
                 "ModemManager on the system bus and stream them as the SIM files, cell-monitor and "
                 "packet-data context records (default on). Without a bus, ModemManager or a modem the "
                 "service says so once and goes on without them; they are picked up when they appear",
         .apply = [&options](std::string_view value) -> std::string {
             if (value != "on" && value != "off") {
                 return "--modem-manager needs on or off, not " + quoted(value);
             }
             options.modemManager = value == "on";
             return "";
         }},
        {.name = "--modem",
         .value = "OBJECT-PATH|INDEX",
         .help = "live: the ModemManager modem to read, by object path or by the number that ends it "
                 "(default: the modem that owns the diagnostic port, else the only one)",
         .apply = [&options](std::string_view value) -> std::string {
             const bool path = value.starts_with('/');
             if (!path && !parseUnsigned(value)) {
                 return "--modem needs an object path or an index, not " + quoted(value);
             }
             options.modem = std::string(value);
             return "";
         }},
        {.name = "--bus-address",
         .value = "ADDRESS",
         .help = "live: a test and debugging aid: the D-Bus address (\"unix:path=/run/example.sock\") where "
                 "ModemManager is looked for instead of the system bus (DBUS_SYSTEM_BUS_ADDRESS when set)",
         .apply = storesValue(options.busAddress)},
        {.name = "--list-devices",
         .value = "",
         .help = "probe the USB serial ports that may be a diagnostic port, print one line each (tty, by-id "
                 "link, vendor:product, interface, \"answers\" or \"silent\") and exit; stop a running "
                 "kxserverd first: one program per port",
         .apply = setsFlag(options.listDevices),
         .synopsis = "| --list-devices"},
    };
    return commandLine;
}

}  // namespace

std::string serviceUsage() {
    ServiceOptions unused;
    return commandLineHelp(serviceCommandLine(unused));
}

ParsedServiceOptions parseServiceOptions(const std::vector<std::string>& arguments) {
    ParsedServiceOptions parsed;
    ServiceOptions& options = parsed.options;
    const auto fail = [&parsed](std::string message) {
        parsed.error = std::move(message);
        return parsed;
    };
    const CommandLineResult line = parseCommandLine(serviceCommandLine(options), arguments);
    if (line.help || line.version) {
        parsed.help = line.help;
        parsed.version = line.version;
        return parsed;
    }
    if (!line.error.empty()) {
        return fail(line.error);
    }

    if (const TechnologyName* technology = technologyNamed(options.technologyName)) {
        options.technology = technology->constant;
        options.objectBased = technology->objectBased;
    }
    const bool speedGiven = std::find(line.given.begin(), line.given.end(), "--speed") != line.given.end();
    if (speedGiven && options.fast) {
        return fail("--speed and --fast exclude each other");
    }
    for (const std::string_view option : line.given) {
        for (const OptionScope& scope : kScopes) {
            if (scope.option == option && !appliesTo(scope, options.source)) {
                return fail(std::string(option) + " does not apply to --source " +
                            std::string(sourceName(options.source)));
            }
        }
    }
    if (options.listDevices) {
        return parsed;
    }
    if (options.source == SourceKind::Replay && options.input.empty()) {
        return fail("--source replay needs --input FILE");
    }
    if (options.source == SourceKind::Live && options.device.empty()) {
        return fail("--source live needs --device PATH");
    }
    return parsed;
}

}  // namespace velmar
