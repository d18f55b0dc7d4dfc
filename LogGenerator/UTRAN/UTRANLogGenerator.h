// UTRANLogGenerator: the log-code generator of the UTRAN technology, with a UTRANClassIndex and the template
// found at run time.
//
// Contract: the template is the first property-list resource, in the resources' listing order, whose path
// contains "UTRAN" in any letter case; its name is that path's last component without the extension. When
// there is no property-list resource at all, or none matches, the generator comes back without any base
// initialisation (no class index, no template name, no blob buffer): it decodes nothing and shows nothing.
// Otherwise creation ends with "Created UTRANLogGenerator object" (error priority). Destruction logs only the
// base's line.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "LogGenerator/ORVLogGenerator2.h"

namespace velmar {

class UTRANLogGenerator : public ORVLogGenerator2 {
  public:
    // Searches the installed resources (Resources::pathsForResourcesOfType("plist")).
    static std::unique_ptr<LogGenerator> generator();
    // The same search over a given listing of property-list paths.
    static std::unique_ptr<UTRANLogGenerator> withResourcePaths(const std::vector<std::string>& plistPaths);
    // The template name that the search picks from a listing, or nullopt when no path matches.
    static std::optional<std::string> templateNameFromPaths(const std::vector<std::string>& plistPaths);

  private:
    explicit UTRANLogGenerator(std::string templateName);
    explicit UTRANLogGenerator(Uninitialized tag) : ORVLogGenerator2(tag) {}
};

}  // namespace velmar
