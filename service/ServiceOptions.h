// ServiceOptions: kxserverd's command line.
//
//   kxserverd [--source sim|replay|live] [--technology gsm|lte|utran|cdma|ifx] [--input FILE]
//             [--speed X | --fast] [--loop] [--seed N] [--device PATH] [--log-stderr]
//             [--scenario drive|walk|static] [--rate-multiplier X] [--max-channels N]
//             [--max-connections N] [--queue-memory MIB] [--subscription N] [--record FILE]
//             [--modem-manager on|off] [--modem OBJECT-PATH|INDEX] [--bus-address ADDRESS] | --list-devices
//
// Contract: parseServiceOptions reads the arguments after the program name with the one command-line parser
// (core/platform/CommandLine.h: "--name value" or "--name=value", --help anywhere wins, then --version).
// It answers the options, or help, or the version, or a one-line usage error: an unknown option or value, a
// missing value, a bad number,
// --speed with --fast, a source without its input, or an option that does not apply to the chosen source.
// --list-devices asks for the listing of diagnostic ports instead of a service: it needs no source.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace velmar {

enum class SourceKind { Sim, Replay, Live };

struct ServiceOptions {
    SourceKind source = SourceKind::Sim;
    std::string_view technologyName = "lte";
    std::string_view technology;  // the "GetTechnology" answer
    bool objectBased = false;     // the technology's start command names no codes
    std::string input;
    std::string device;                         // live: a path, or "auto"
    std::optional<std::uint32_t> subscription;  // live: the streaming subscription; none: the lowest seen
    std::string record;                         // live: the raw capture to write; empty: none
    bool modemManager = true;                   // live: the extra records from ModemManager
    std::string modem;                          // live: ModemManager's modem (path or index); empty: default
    std::string busAddress;                     // live: where ModemManager is looked for; empty: system bus
    bool listDevices = false;
    double speed = 1.0;
    bool fast = false;
    bool loop = false;
    std::optional<std::uint64_t> seed;    // the simulated baseband's; 1 when not given
    std::string_view scenario = "drive";  // the simulated device's route: drive, walk or static
    double rateMultiplier = 1.0;          // simulated seconds per wall-clock second
    bool logStderr = false;
    std::size_t maxChannels = 32;     // log channels open at once
    std::size_t maxConnections = 64;  // connections to the control port at once
    std::size_t queueMebibytes = 64;  // memory for blobs that clients have not taken yet, all channels
};

// The bounds of the numeric options.
struct ServiceOptionBounds {
    static constexpr double kMaxRateMultiplier = 1000.0;
    static constexpr std::size_t kMaxChannels = 1024;
    static constexpr std::size_t kMaxConnections = 4096;
    static constexpr std::size_t kMaxQueueMebibytes = 4096;
};

struct ParsedServiceOptions {
    ServiceOptions options;
    bool help = false;
    bool version = false;
    std::string error;  // a usage error when not empty
};

ParsedServiceOptions parseServiceOptions(const std::vector<std::string>& arguments);
std::string serviceUsage();  // the --help text

}  // namespace velmar
