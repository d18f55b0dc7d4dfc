// KeptDisplay: how a generator tells whether the display it finds in the state is one its own template
// built. The state outlives generators (a channel restart, another technology after the service came back),
// so the display in it may be another generator's.
//
// Contract: builtFromTemplate() holds when the display is a dictionary whose keys are those of the template's
// root, in the same order (a template's root holds labels only, which the build keeps as they are; what
// decoders fill lies below them). loadTemplate() reads a template resource; nullopt when there is none.
#pragma once

#include <optional>
#include <string>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

bool builtFromTemplate(const PlistValue& display, const PlistValue& templateValue);
std::optional<PlistValue> loadTemplate(const std::string& name);

}  // namespace velmar
