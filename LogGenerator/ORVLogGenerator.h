// ORVLogGenerator: the base of the generators that receive binary baseband log packets.
//
// Contract: _binData collects the raw blobs received since the last display refresh. The save contents are
// the state's history entries followed, when a DLF file could be built, by {"Description": "DLF binary (%d
// bytes)", "DLF": file}. The DLF file is the 161-byte version report followed by each history entry's
// "DisplayState" bytes without their first byte.
#pragma once

#include <optional>
#include <string>

#include "LogGenerator/LogGenerator.h"

namespace velmar {

class ORVLogGenerator : public LogGenerator {
  public:
    PlistValue getSaveContentsFromState(const StateDict& state) override;
    // The DLF file of the state's history, or null (logged with priority 16) when it cannot be built.
    PlistDataRef generateDlfFromState(const StateDict& state);

    // Whether the raw blobs of each interval are gathered (the default). A reader that shows only the display
    // turns this off, so that an interval of any length (a whole recording decoded in one refresh) holds no
    // copy of its blobs; the display does not depend on them, the history entries' "DisplayState" and the
    // save contents do (they then hold no blobs).
    void setGathersRawBlobs(bool gathers);
    bool gathersRawBlobs() const { return _gathersRawBlobs; }

    // "Velmar <version>" when the application has a version string, else "(none)".
    static std::string dlfVersionText(const std::optional<std::string>& applicationVersion);

  protected:
    ORVLogGenerator();
    explicit ORVLogGenerator(Uninitialized tag) : LogGenerator(tag) {}

    // The application's version string; a seam so that both forms of the version text can be exercised.
    virtual std::optional<std::string> applicationVersion() const;

    // Hands the blobs of the interval over: returns the current buffer and starts a new empty one.
    PlistDataRef takeBinData();

    PlistDataRef _binData;

  private:
    bool _gathersRawBlobs = true;
};

}  // namespace velmar
