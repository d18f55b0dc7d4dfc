// DiagnosticLogDirectory: where the monitor writes snapshot files: ${XDG_STATE_HOME:-~/.local/state}/velmar/
// diagnostics.
//
// Contract: path() only computes the location (HOME, else the password database, gives "~"). create() makes
// every missing directory of that path with mode 0700 (snapshots hold phone numbers and SIM identities) and
// answers the path, or nullopt when it cannot be made; a directory that already exists is left as it is.
#pragma once

#include <optional>
#include <string>

namespace velmar {

class DiagnosticLogDirectory {
  public:
    static std::string path();
    static std::optional<std::string> create();
};

}  // namespace velmar
