#include "core/platform/BuildInfo.h"

#include "VelmarBuildConfig.h"  // generated: VELMAR_VERSION_STRING

namespace velmar {

std::optional<std::string> BuildInfo::applicationVersion() {
    return std::string(VELMAR_VERSION_STRING);
}

std::string BuildInfo::buildDateTime() {
    return __DATE__ " " __TIME__;
}

std::string BuildInfo::versionText(std::string_view program) {
    std::string text(program);
    text.append(" ").append(VELMAR_VERSION_STRING).append(" (built ").append(buildDateTime()).append(")\n");
    return text;
}

}  // namespace velmar
