// LogGenerator: the root of the generator family, which turns the blobs of the baseband log channel into the
// state dictionary and, on each display refresh, into the display tree.
//
// Contract: the four operations updateState, generateLogUsingState, getStartCommand and
// getSaveContentsFromState are abstract here and raise NotImplementedError. The class operations keep the
// history of refreshed states (at most 5 entries, newest last, shallow copies) and pick the generator class
// for a technology name. Every generator is created through its class's generator() and owned by its caller.
#pragma once

#include <memory>
#include <string_view>

#include "core/MonitorGenerator.h"
#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

// The state dictionary: owned by the model, filled by the generator.
using StateDict = PlistDictionaryRef;

class LogGenerator : public MonitorGenerator {
  public:
    ~LogGenerator() override = default;
    LogGenerator(const LogGenerator&) = delete;
    LogGenerator& operator=(const LogGenerator&) = delete;

    void updateState(const StateDict& state, ByteView data) override;
    // The display tree, or none.
    PlistValue generateLogUsingState(const StateDict& state) override;
    PlistValue getStartCommand() override;
    PlistValue getSaveContentsFromState(const StateDict& state) override;

    // Appends one history entry to the state's "History", keeping at most 5 entries.
    static void updateHistoryInState(const StateDict& state);
    // A new generator for the technology name, or null when no generator serves it.
    static std::unique_ptr<LogGenerator> generatorFromTechnology(std::string_view technology);

  protected:
    // Plain initialisation: logs "Creating Log object: %p".
    LogGenerator();
    // For a subclass that hands back an object without running any initialisation of its bases.
    struct Uninitialized {};
    explicit LogGenerator(Uninitialized) {}
};

}  // namespace velmar
