#include "tests/install/InstalledTree.h"

#include <regex>

namespace velmar::testing {

std::string installedPath(const std::string& relative) {
    return std::string(VELMAR_INSTALL_ROOT) + VELMAR_INSTALL_PREFIX + "/" + relative;
}

std::string builtProgram(const std::string& name) {
    if (name == "velmar") {
        return VELMAR_PATH;
    }
    if (name == "kxserverd") {
        return KXSERVERD_PATH;
    }
    return VELMAR_DECODE_PATH;
}

const std::vector<std::string>& programNames() {
    static const std::vector<std::string> names{"velmar", "kxserverd", "velmar-decode"};
    return names;
}

ProcessResult runWithoutResourceDirectory(const std::vector<std::string>& arguments) {
    std::vector<std::string> command{"/usr/bin/env", "-u", "VELMAR_RESOURCE_DIR"};
    command.insert(command.end(), arguments.begin(), arguments.end());
    return runProcess(command);
}

std::set<std::string> optionsNamedIn(const std::string& helpText) {
    static const std::regex kOption("--[a-z][a-z0-9-]*");
    std::set<std::string> options;
    for (auto match = std::sregex_iterator(helpText.begin(), helpText.end(), kOption);
         match != std::sregex_iterator(); ++match) {
        options.insert(match->str());
    }
    return options;
}

}  // namespace velmar::testing
