#include "core/platform/RuntimeDirectory.h"

#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

#include "core/platform/SystemLog.h"

namespace velmar {

namespace {

// Fills why (when asked) and the system log with the reason; answers false.
bool refuse(std::string* why, const std::string& reason) {
    SystemLog::log(kLogError, "%s", reason.c_str());
    if (why != nullptr) {
        *why = reason;
    }
    return false;
}

bool makePrivateDirectory(const std::string& path, std::string* why) {
    if (mkdir(path.c_str(), 0700) != 0 && errno != EEXIST) {
        return refuse(why, "cannot create runtime directory " + path + ": " + std::strerror(errno));
    }
    struct stat info {};
    if (lstat(path.c_str(), &info) != 0) {
        return refuse(why, "cannot examine runtime directory " + path + ": " + std::strerror(errno));
    }
    if (S_ISLNK(info.st_mode)) {
        return refuse(why, "runtime directory " + path + " is a symbolic link, not a directory");
    }
    if (!S_ISDIR(info.st_mode)) {
        return refuse(why, "runtime directory " + path + " exists and is not a directory");
    }
    if (info.st_uid != getuid()) {
        return refuse(why, "runtime directory " + path + " is owned by uid " + std::to_string(info.st_uid) +
                               ", not by this user (uid " + std::to_string(getuid()) + ")");
    }
    if ((info.st_mode & 0077) != 0 && chmod(path.c_str(), 0700) != 0) {
        return refuse(why, "cannot make runtime directory " + path + " private: " + std::strerror(errno));
    }
    return true;
}

}  // namespace

std::optional<std::string> RuntimeDirectory::path(std::string* why) {
    std::string directory;
    if (const char* explicitDir = std::getenv("VELMAR_RUNTIME_DIR"); explicitDir && *explicitDir) {
        if (*explicitDir != '/') {
            refuse(why,
                   std::string("VELMAR_RUNTIME_DIR must be an absolute path, not \"") + explicitDir + "\"");
            return std::nullopt;
        }
        directory = explicitDir;
    } else if (const char* xdg = std::getenv("XDG_RUNTIME_DIR"); xdg && *xdg == '/') {
        directory = std::string(xdg) + "/velmar";
    } else {
        directory = "/tmp/velmar-" + std::to_string(getuid());
    }
    if (!makePrivateDirectory(directory, why)) {
        return std::nullopt;
    }
    return directory;
}

std::optional<std::string> RuntimeDirectory::socketPathFor(const std::string& name, std::string* why) {
    if (name.empty() || name.find('/') != std::string::npos || name == "." || name == "..") {
        refuse(why, "\"" + name + "\" is not a port name");
        return std::nullopt;
    }
    auto directory = path(why);
    if (!directory) {
        return std::nullopt;
    }
    std::string socketPath = *directory + "/" + name;
    constexpr std::size_t kLongest = sizeof(sockaddr_un::sun_path) - 1;
    if (socketPath.size() > kLongest) {
        refuse(why, "socket path " + socketPath + " is " + std::to_string(socketPath.size()) +
                        " bytes long; a Unix socket path holds at most " + std::to_string(kLongest));
        return std::nullopt;
    }
    return socketPath;
}

}  // namespace velmar
