#include "core/platform/BuildInfo.h"

#include "VelmarBuildConfig.h"  // generated: VELMAR_VERSION_STRING

namespace velmar {

std::optional<std::string> BuildInfo::applicationVersion() { return std::string(VELMAR_VERSION_STRING); }

std::string BuildInfo::buildDateTime() { return __DATE__ " " __TIME__; }

}  // namespace velmar
