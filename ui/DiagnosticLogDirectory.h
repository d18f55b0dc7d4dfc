// DiagnosticLogDirectory: where the monitor writes snapshot files: ${XDG_STATE_HOME:-~/.local/state}/velmar/
// diagnostics.
//
// Contract: path() only computes the location (HOME, else the password database, gives "~"). create() makes
// every missing directory of that path with mode 0700 (snapshots hold phone numbers and SIM identities),
// narrows the monitor's own directories (velmar and velmar/diagnostics) to 0700 where they already exist
// wider, and answers the path, or nullopt with the reason in why when it cannot be made.
#pragma once

#include <optional>
#include <string>

namespace velmar {

class DiagnosticLogDirectory {
  public:
    static std::string path();
    static std::optional<std::string> create(std::string* why = nullptr);
};

}  // namespace velmar
