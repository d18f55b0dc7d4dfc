#include "LogGenerator/UTRAN/UTRANLogGenerator.h"

#include <algorithm>
#include <cctype>
#include <filesystem>

#include "LogGenerator/UTRAN/UTRANClassIndex.h"
#include "core/platform/Resources.h"
#include "core/platform/SystemLog.h"

namespace velmar {

namespace {

bool containsUtranInAnyCase(const std::string& text) {
    static constexpr std::string_view kWanted = "UTRAN";
    const auto found =
        std::search(text.begin(), text.end(), kWanted.begin(), kWanted.end(),
                    [](char a, char b) { return std::toupper(static_cast<unsigned char>(a)) == b; });
    return found != text.end();
}

}  // namespace

UTRANLogGenerator::UTRANLogGenerator(std::string templateName)
    : ORVLogGenerator2(std::move(templateName), std::make_shared<UTRANClassIndex>()) {
    SystemLog::log(kLogError, "Created UTRANLogGenerator object");
}

std::optional<std::string> UTRANLogGenerator::templateNameFromPaths(
    const std::vector<std::string>& plistPaths) {
    const auto found = std::find_if(plistPaths.begin(), plistPaths.end(), containsUtranInAnyCase);
    if (found == plistPaths.end()) {
        return std::nullopt;
    }
    return std::filesystem::path(*found).stem().string();
}

std::unique_ptr<UTRANLogGenerator> UTRANLogGenerator::withResourcePaths(
    const std::vector<std::string>& plistPaths) {
    // Both uninitialised returns are deliberate: such a generator decodes nothing and shows nothing.
    if (plistPaths.empty()) {
        return std::unique_ptr<UTRANLogGenerator>(new UTRANLogGenerator(Uninitialized{}));
    }
    std::optional<std::string> templateName = templateNameFromPaths(plistPaths);
    if (!templateName) {
        return std::unique_ptr<UTRANLogGenerator>(new UTRANLogGenerator(Uninitialized{}));
    }
    return std::unique_ptr<UTRANLogGenerator>(new UTRANLogGenerator(std::move(*templateName)));
}

std::unique_ptr<LogGenerator> UTRANLogGenerator::generator() {
    return withResourcePaths(Resources::pathsForResourcesOfType("plist"));
}

}  // namespace velmar
