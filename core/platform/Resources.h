// Resources: where the display templates are found.
//
// Contract: directories are searched in this order: $VELMAR_RESOURCE_DIR, the installed
// share/velmar/templates (next to the executable's prefix, then the configured install prefix), then the
// source tree's resources/templates. A resource is a file "<name>.<type>" in one of them; the first
// directory that holds it wins.
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace velmar {

class Resources {
  public:
    static std::vector<std::string> searchDirectories();
    static std::optional<std::string> pathForResource(const std::string& name, const std::string& type);
    // Every file of that type, directory by directory in search order, each directory's files by name.
    static std::vector<std::string> pathsForResourcesOfType(const std::string& type);
};

}  // namespace velmar
