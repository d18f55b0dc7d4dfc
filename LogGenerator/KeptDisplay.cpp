#include "LogGenerator/KeptDisplay.h"

#include <algorithm>

#include "core/platform/Resources.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

bool builtFromTemplate(const PlistValue& display, const PlistValue& templateValue) {
    const PlistDictionaryRef& shown = display.dictionary();
    const PlistDictionaryRef& laidOut = templateValue.dictionary();
    if (!shown || !laidOut || shown->size() != laidOut->size()) {
        return false;
    }
    return std::equal(shown->begin(), shown->end(), laidOut->begin(),
                      [](const auto& left, const auto& right) { return left.first == right.first; });
}

std::optional<PlistValue> loadTemplate(const std::string& name) {
    const auto path = Resources::pathForResource(name, "plist");
    return path ? readDictionaryFile(*path) : std::nullopt;
}

}  // namespace velmar
