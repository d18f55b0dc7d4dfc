// MonitorGenerator: what the monitor model needs of a log generator, so that the model does not depend on the
// generator family. The generator family implements it; the application hands the model a factory that picks
// a generator by technology name.
#pragma once

#include <functional>
#include <memory>
#include <string_view>

#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

class MonitorGenerator {
  public:
    virtual ~MonitorGenerator() = default;
    // Consumes one received blob into the state dictionary.
    virtual void updateState(const PlistDictionaryRef& state, ByteView data) = 0;
    // The display tree for a refresh, or none.
    virtual PlistValue generateLogUsingState(const PlistDictionaryRef& state) = 0;
    virtual PlistValue getStartCommand() = 0;
    virtual PlistValue getSaveContentsFromState(const PlistDictionaryRef& state) = 0;
};

// A new generator for a technology name, or null when none serves it.
using GeneratorFactory = std::function<std::unique_ptr<MonitorGenerator>(std::string_view technology)>;

}  // namespace velmar
