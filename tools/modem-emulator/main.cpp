// velmar-modem-emulator: a modem's diagnostic port on a pseudo-terminal, for trying kxserverd --source live
// without a modem. It streams the log packets of a raw capture for the codes that kxserverd enables, until
// SIGTERM or SIGINT.
//
//   velmar-modem-emulator --capture FILE [--link PATH] [--rate N] [--trim]
#include <signal.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "tools/modem-emulator/ModemEmulator.h"

namespace {

constexpr const char* kUsage =
    "Usage: velmar-modem-emulator --capture FILE [--link PATH] [--rate N] [--trim]\n"
    "\n"
    "A modem's diagnostic port on a pseudo-terminal: answers kxserverd's requests and streams the log\n"
    "packets of FILE (a raw capture, looped) whose codes kxserverd's log masks enable.\n"
    "\n"
    "  --capture FILE  the raw capture to stream (samples/captures/*.qmdl)\n"
    "  --link PATH     also make PATH a symbolic link to the pseudo-terminal (as /dev/serial/by-id links)\n"
    "  --rate N        log packets per second (default 200)\n"
    "  --trim          keep at most the reported log range of items per equipment id, as some modems do\n"
    "  --help          show this help and exit\n"
    "\n"
    "Prints the pseudo-terminal's path, then runs until SIGTERM or SIGINT. Try it with:\n"
    "  kxserverd --source live --device PATH\n";

int usageError(const std::string& message) {
    std::fprintf(stderr, "velmar-modem-emulator: %s (see --help)\n", message.c_str());
    return 2;
}

}  // namespace

int main(int argc, char** argv) {
    velmar::testing::ModemEmulator::Settings settings;
    for (int index = 1; index < argc; ++index) {
        const std::string argument = argv[index];
        const bool hasValue = index + 1 < argc;
        if (argument == "--help" || argument == "-h") {
            std::fputs(kUsage, stdout);
            return 0;
        }
        if (argument == "--trim") {
            settings.trimToRanges = true;
        } else if (argument == "--capture" && hasValue) {
            settings.capturePath = argv[++index];
        } else if (argument == "--link" && hasValue) {
            settings.linkPath = argv[++index];
        } else if (argument == "--rate" && hasValue) {
            char* end = nullptr;
            settings.packetsPerSecond = std::strtod(argv[++index], &end);
            if (*end != '\0' || settings.packetsPerSecond <= 0 || settings.packetsPerSecond > 1e6) {
                return usageError("--rate needs a positive number");
            }
        } else {
            return usageError("unexpected argument \"" + argument + "\"");
        }
    }
    if (settings.capturePath.empty()) {
        return usageError("--capture FILE is missing");
    }
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGINT);
    sigprocmask(SIG_BLOCK, &signals, nullptr);

    velmar::testing::ModemEmulator emulator(settings);
    std::string error;
    if (!emulator.start(error)) {
        std::fprintf(stderr, "velmar-modem-emulator: %s\n", error.c_str());
        return 1;
    }
    std::printf("%s\n", emulator.slavePath().c_str());
    std::fflush(stdout);
    int signal = 0;
    sigwait(&signals, &signal);
    return 0;
}
