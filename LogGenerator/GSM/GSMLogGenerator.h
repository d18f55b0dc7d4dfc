// GSMLogGenerator: the object-based generator of the IFX technology. Each blob is a serialised property list
// that already holds the whole picture (nested dictionaries, arrays and strings); the generator shows it as
// it stands after collapsing single-entry dictionaries. No class index, no template, no DLF.
//
// Contract: updateState deserialises the blob (any encoding the reader knows), processes it and replaces
// "DisplayState" (the deserialised object), "Display" (the processed tree) and "ExtraInfo" (a new empty
// dictionary). processObject keeps strings, rebuilds dictionaries and arrays, and replaces every value inside
// them that is a one-entry dictionary by that entry's value (bottom-up, so chains collapse to the innermost
// value); the top-level object itself is never collapsed. Two assertion failures raise
// InternalInconsistencyException with the file name "LogGenerator/GSM/GSMLogGenerator": line 90 "Could not
// deserialize the object" (updateState:withData:) and line 78 "Unknown object of type %@ encountered" with
// the value's type name (processObject:); in both cases the state is left as it was.
#pragma once

#include <memory>

#include "LogGenerator/LogGenerator.h"

namespace velmar {

class GSMLogGenerator : public LogGenerator {
  public:
    GSMLogGenerator() = default;
    static std::unique_ptr<LogGenerator> generator();

    void updateState(const StateDict& state, ByteView data) override;
    // Appends a history entry and answers the state's "Display" (none before the first blob).
    PlistValue generateLogUsingState(const StateDict& state) override;
    // {"SetState": "Streaming"}
    PlistValue getStartCommand() override;
    // The state's history entries; no DLF file for this technology.
    PlistValue getSaveContentsFromState(const StateDict& state) override;

    // The value of a one-entry dictionary, otherwise none.
    PlistValue canCollapse(const PlistValue& object) const;
    static PlistValue processObject(const PlistValue& object);
};

}  // namespace velmar
