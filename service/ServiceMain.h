// runKxServerd: the whole life of the kxserverd process, from its command line to its exit status.
//
// Contract: --help prints the usage on standard output (status 0); a usage error or a source this build
// does not have prints one line on standard error (status 2); a service that cannot start (control port
// held by another kxserverd, unreadable input, device that cannot be opened) prints one line and answers 1.
// --list-devices probes the candidate diagnostic ports, prints them and answers 0. Otherwise it serves on
// the poll main queue until SIGTERM or SIGINT, lets the source finish (a live modem is told to stop logging;
// at most kFinishSeconds, or until a second signal), ends every channel, removes its socket files and
// answers 0. A source that finds it cannot serve at all (a named device that is not a diagnostic port)
// ends the service the same way, with its reason on standard error and status 1.
#pragma once

namespace velmar {

int runKxServerd(int argc, char** argv);

}  // namespace velmar
