// BuildInfo: what the build knows about itself: the application version and the build's date and time.
#pragma once

#include <optional>
#include <string>

namespace velmar {

class BuildInfo {
public:
    // The application's version string (from the project version).
    static std::optional<std::string> applicationVersion();
    // The date and time of this build, "Mmm dd yyyy hh:mm:ss".
    static std::string buildDateTime();
};

}  // namespace velmar
