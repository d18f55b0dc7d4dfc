// C2KLogGenerator: the generator for basebands that speak CDMA2000 1x and EV-DO. It has no record decoders:
// it parses its eight log codes itself (C2KLogParsers.h) and writes each value into the display built from
// its template "C2KTemplate", through a lookup from display key to the places that show it.
//
// Contract (template): every dictionary of the template becomes a new display dictionary under the same key;
// the string "_sorted" is copied as it stands; any other string V is a display key: the display holds an
// empty string under the label, and the lookup's array under V gains the place {"key": label, "dict": that
// display dictionary}. Other values are skipped. The display, the lookup and an empty "ExtraInfo" are built
// once, when the state holds no display, and kept in the state ("Display", "Lookup", "ExtraInfo"); a display
// that another technology's generator left in the state is replaced by this one's.
// Contract (intake): a blob under 13 bytes is ignored; a leading 0x81 marks a two-byte prefix that is cut
// off; a log type other than 1 is logged ("Invalid log type: %x. Dropping.") and the packet is processed all
// the same (type 0xFF adds 0xFF0000 to the code, so it matches none of the eight codes). A packet of one of
// the eight codes goes to its parser and is then appended, without its prefix, to _binData; others are
// ignored. generateLogUsingState moves _binData under "DisplayState", appends a history entry and answers the
// display. The start command is {"SetState": "Streaming", "SetOrvaneLogCodes": the eight codes}, with no
// extra codes.
#pragma once

#include <memory>

#include "LogGenerator/ORVLogGenerator.h"

namespace velmar {

class C2KLogGenerator : public ORVLogGenerator {
  public:
    C2KLogGenerator() = default;
    static std::unique_ptr<LogGenerator> generator();

    void updateState(const StateDict& state, ByteView data) override;
    PlistValue generateLogUsingState(const StateDict& state) override;
    PlistValue getStartCommand() override;

    // Frames one blob and hands its packet to the parser of its code. usingLookup may be null (no display).
    void updateFromLog(ByteView data, const PlistDictionaryRef& usingLookup, const StateDict& usingState);

    // Walks one template dictionary into a display dictionary and the lookup of places.
    static void processTemplate(const PlistDictionary& templateDictionary,
                                const PlistDictionaryRef& storeDisplayIntoDict,
                                PlistDictionary& storeLookupIntoDict);
    // The state's display, built (with the lookup) from the template when the state holds none; null when
    // the template cannot be loaded ("Cannot load C2K template for display").
    static PlistDictionaryRef getDisplayFromState(const StateDict& state);

  private:
    // Removes from the state a display (with its template and lookup) that another technology's generator
    // built, the first time this generator sees it, so that getDisplayFromState builds this one's.
    void forgetForeignDisplay(const StateDict& state);

    std::weak_ptr<PlistDictionary> verifiedDisplay_;  // the display found to be this generator's own
};

}  // namespace velmar
