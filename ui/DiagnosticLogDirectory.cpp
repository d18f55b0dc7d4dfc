#include "ui/DiagnosticLogDirectory.h"

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

namespace velmar {

namespace {

std::string homeDirectory() {
    if (const char* home = std::getenv("HOME"); home && *home) {
        return home;
    }
    if (const passwd* entry = getpwuid(getuid()); entry && entry->pw_dir) {
        return entry->pw_dir;
    }
    return "/";
}

// Makes the directory private when it is this user's and open to others.
void narrow(const std::string& path) {
    struct stat info {};
    if (lstat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode) && info.st_uid == getuid() &&
        (info.st_mode & 0077) != 0) {
        chmod(path.c_str(), info.st_mode & 0700);
    }
}

}  // namespace

std::string DiagnosticLogDirectory::path() {
    const char* state = std::getenv("XDG_STATE_HOME");
    // A relative XDG_STATE_HOME is ignored, as the XDG base-directory rules say.
    const std::string base = state && *state == '/' ? std::string(state) : homeDirectory() + "/.local/state";
    return base + "/velmar/diagnostics";
}

std::optional<std::string> DiagnosticLogDirectory::create(std::string* why) {
    const std::string target = path();
    const auto fail = [why](const std::string& reason) -> std::optional<std::string> {
        if (why != nullptr) {
            *why = reason;
        }
        return std::nullopt;
    };
    // Every prefix that ends before a "/", then the whole path.
    for (std::size_t slash = target.find('/', 1);; slash = target.find('/', slash + 1)) {
        const std::string prefix = slash == std::string::npos ? target : target.substr(0, slash);
        if (!prefix.empty() && mkdir(prefix.c_str(), 0700) != 0 && errno != EEXIST) {
            return fail("cannot create directory " + prefix + ": " + std::strerror(errno));
        }
        if (slash == std::string::npos) {
            break;
        }
    }
    struct stat info {};
    if (stat(target.c_str(), &info) != 0 || !S_ISDIR(info.st_mode)) {
        return fail(target + " is not a directory");
    }
    narrow(target.substr(0, target.rfind('/')));
    narrow(target);
    return target;
}

}  // namespace velmar
