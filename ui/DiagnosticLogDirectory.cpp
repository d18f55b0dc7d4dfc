#include "ui/DiagnosticLogDirectory.h"

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>

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

bool isDirectory(const std::string& path) {
    struct stat info {};
    return stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

}  // namespace

std::string DiagnosticLogDirectory::path() {
    const char* state = std::getenv("XDG_STATE_HOME");
    // A relative XDG_STATE_HOME is ignored, as the XDG base-directory rules say.
    const std::string base = state && *state == '/' ? std::string(state) : homeDirectory() + "/.local/state";
    return base + "/velmar/diagnostics";
}

std::optional<std::string> DiagnosticLogDirectory::create() {
    const std::string target = path();
    // Every prefix that ends before a "/", then the whole path.
    for (std::size_t slash = target.find('/', 1);; slash = target.find('/', slash + 1)) {
        const std::string prefix = slash == std::string::npos ? target : target.substr(0, slash);
        if (!prefix.empty() && mkdir(prefix.c_str(), 0700) != 0 && errno != EEXIST) {
            return std::nullopt;
        }
        if (slash == std::string::npos) {
            break;
        }
    }
    if (!isDirectory(target)) {
        return std::nullopt;
    }
    return target;
}

}  // namespace velmar
