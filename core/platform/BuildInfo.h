// BuildInfo: what the build knows about itself: the application version and the build's date and time.
//
// Contract: the version is the project's version; the date and time are those of the compilation (the
// compiler takes them from SOURCE_DATE_EPOCH when that is set, so that package builds are reproducible).
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace velmar {

class BuildInfo {
  public:
    // The application's version string (from the project version).
    static std::optional<std::string> applicationVersion();
    // The date and time of this build, "Mmm dd yyyy hh:mm:ss".
    static std::string buildDateTime();
    // What every program prints for --version: "<program> <version> (built Mmm dd yyyy hh:mm:ss)" and a
    // newline.
    static std::string versionText(std::string_view program);
};

}  // namespace velmar
