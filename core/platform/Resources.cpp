#include "core/platform/Resources.h"

#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>

namespace velmar {

namespace fs = std::filesystem;

namespace {

std::string executableDirectory() {
    std::error_code error;
    const fs::path self = fs::read_symlink("/proc/self/exe", error);
    return error ? std::string() : self.parent_path().string();
}

bool isDirectory(const std::string& path) {
    std::error_code error;
    return !path.empty() && fs::is_directory(path, error);
}

}  // namespace

std::vector<std::string> Resources::searchDirectories() {
    std::vector<std::string> candidates;
    if (const char* overridden = std::getenv("VELMAR_RESOURCE_DIR"); overridden && *overridden) {
        candidates.emplace_back(overridden);
    }
    if (const std::string exeDir = executableDirectory(); !exeDir.empty()) {
        candidates.push_back(exeDir + "/" VELMAR_TEMPLATE_DIR_FROM_BINDIR);
    }
    candidates.emplace_back(VELMAR_INSTALLED_TEMPLATE_DIR);
    candidates.emplace_back(VELMAR_SOURCE_TEMPLATE_DIR);
    std::vector<std::string> existing;
    for (const auto& candidate : candidates) {
        if (isDirectory(candidate) &&
            std::find(existing.begin(), existing.end(), candidate) == existing.end()) {
            existing.push_back(candidate);
        }
    }
    return existing;
}

std::optional<std::string> Resources::pathForResource(const std::string& name, const std::string& type) {
    if (name.empty()) {
        return std::nullopt;
    }
    for (const auto& directory : searchDirectories()) {
        const std::string path = directory + "/" + name + "." + type;
        std::error_code error;
        if (fs::is_regular_file(path, error)) {
            return path;
        }
    }
    return std::nullopt;
}

std::vector<std::string> Resources::pathsForResourcesOfType(const std::string& type) {
    std::vector<std::string> paths;
    const std::string extension = "." + type;
    for (const auto& directory : searchDirectories()) {
        std::vector<std::string> here;
        std::error_code error;
        for (const auto& entry : fs::directory_iterator(directory, error)) {
            if (entry.is_regular_file(error) && entry.path().extension() == extension) {
                here.push_back(entry.path().string());
            }
        }
        std::sort(here.begin(), here.end());
        paths.insert(paths.end(), here.begin(), here.end());
    }
    return paths;
}

}  // namespace velmar
