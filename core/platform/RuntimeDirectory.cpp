#include "core/platform/RuntimeDirectory.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

#include "core/platform/SystemLog.h"

namespace velmar {

namespace {

bool makePrivateDirectory(const std::string& path) {
    if (mkdir(path.c_str(), 0700) != 0 && errno != EEXIST) {
        SystemLog::log(kLogError, "Cannot create runtime directory %s: %s", path.c_str(), std::strerror(errno));
        return false;
    }
    struct stat info {};
    if (lstat(path.c_str(), &info) != 0 || !S_ISDIR(info.st_mode) || info.st_uid != getuid()) {
        SystemLog::log(kLogError, "Runtime directory %s is not a directory of this user", path.c_str());
        return false;
    }
    if ((info.st_mode & 0077) != 0 && chmod(path.c_str(), 0700) != 0) {
        SystemLog::log(kLogError, "Cannot make runtime directory %s private", path.c_str());
        return false;
    }
    return true;
}

}  // namespace

std::optional<std::string> RuntimeDirectory::path() {
    std::string directory;
    if (const char* explicitDir = std::getenv("VELMAR_RUNTIME_DIR"); explicitDir && *explicitDir) {
        directory = explicitDir;
    } else if (const char* xdg = std::getenv("XDG_RUNTIME_DIR"); xdg && *xdg) {
        directory = std::string(xdg) + "/velmar";
    } else {
        directory = "/tmp/velmar-" + std::to_string(getuid());
    }
    if (!makePrivateDirectory(directory)) {
        return std::nullopt;
    }
    return directory;
}

std::optional<std::string> RuntimeDirectory::socketPathFor(const std::string& name) {
    if (name.empty() || name.find('/') != std::string::npos || name == "." || name == "..") {
        return std::nullopt;
    }
    auto directory = path();
    if (!directory) {
        return std::nullopt;
    }
    return *directory + "/" + name;
}

}  // namespace velmar
