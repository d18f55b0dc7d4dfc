// ORVLogGenerator2: the log-code generator. It frames each blob, dispatches the packet by log code to the
// record decoders of its class index, and shows a display tree built from its technology's template.
//
// Contract (intake): a blob under 13 bytes is ignored; a leading 0x81 marks a two-byte channel prefix that
// is cut off; the log type (1 plain, 255 extended) and the 16-bit code pick the 32-bit dispatch code (the
// extended one with 0xFF0000 added); every subscriber receives the same read-only packet, in registration
// order. Every blob, whatever happened to it, is appended to _binData.
// Contract (display): the first getDisplayFromState loads the template, builds a mutable copy of it under
// "Display", binds each decoder to the container under its section name, and returns null; later calls
// return that tree. A display already in the state that this generator did not build (the state outlives
// the generator across channel restarts) gets this generator's decoders bound to its sections, as the build
// would bind them, the first time the generator sees it; one that another technology's generator built (see
// KeptDisplay.h) is replaced by this technology's own, built as above. generateLogUsingState moves the blobs
// of the interval under "DisplayState" and appends a history entry. The start command lists the plain and the
// extra codes of the class index.
#pragma once

#include <memory>
#include <string>

#include "LogGenerator/ClassIndex.h"
#include "LogGenerator/ORVLogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/BasebandPacket.h"
#include "core/platform/SystemLog.h"

namespace velmar {

class ORVLogGenerator2 : public ORVLogGenerator {
  public:
    ~ORVLogGenerator2() override;

    void updateState(const StateDict& state, ByteView data) override;
    // Inline, with displayIsBound, because it runs once per packet and most packets have no subscriber.
    void updateWithData(ByteView data) {
        // The length test is made before the prefix is cut, so a prefixed blob of 13 or 14 bytes passes.
        if (data.size() < kPacketHeaderLength) {
            return;
        }
        const BasebandPacket framed = frameBasebandPacket(data);
        if (!framed.isPlain() && !framed.isExtended()) {
            SystemLog::log(kLogError, "Invalid log type: %x. Dropping.", framed.logType);
            return;
        }
        const std::int32_t code = framed.logCode();
        if (!cIndex) {
            return;
        }
        if (const DecoderList* subscribers = cIndex->getSubscribers(code)) {
            for (const DecoderRef& decoder : *subscribers) {
                decoder->updateWithData(framed.packet, code);
            }
        }
    }
    PlistValue getDisplayFromState(const StateDict& state);
    PlistValue processTemplate(const PlistValue& templateValue);
    void printDict(const PlistValue& displayValue);
    PlistValue generateLogUsingState(const StateDict& state) override;
    PlistValue getStartCommand() override;

    const ClassIndex* classIndex() const { return cIndex.get(); }
    const std::string& templateName() const { return pListName; }

  protected:
    // The result of a subclass's creation line, logged before any base initialisation runs.
    struct Announcement {};
    static Announcement announce(const char* creationLine);

    // initWithPListName:cIndexObj: takes ownership of the template name and the class index.
    ORVLogGenerator2(std::string templateName, std::shared_ptr<ClassIndex> classIndex);
    ORVLogGenerator2(Announcement, std::string templateName, std::shared_ptr<ClassIndex> classIndex);
    // An object on which no base initialisation ran: no class index, no template name, no _binData.
    explicit ORVLogGenerator2(Uninitialized tag) : ORVLogGenerator(tag) {}

    std::string pListName;
    std::shared_ptr<ClassIndex> cIndex;

  private:
    struct CreationNoted {};
    // Binds the decoders to the kept display; false (display and template removed) when another template
    // built it.
    bool adoptKeptDisplay(const StateDict& state, const PlistValue& display);
    void bindSections(const PlistValue& displayValue);
    static CreationNoted noteCreation(const ClassIndex* classIndex);
    ORVLogGenerator2(CreationNoted, std::string templateName, std::shared_ptr<ClassIndex> classIndex);

    void bind(const PlistDictionaryRef& display);
    // Whether the state's display is the tree the decoders are bound to, as getDisplayFromState would find
    // it. A live weak reference and the same address mean the same object, so the check needs no reference
    // counting; the display's slot in the state is looked up again only when the state gained or lost a key.
    bool displayIsBound(const StateDict& state) {
        if (state.get() != displaySlot_.state || state->revision() != displaySlot_.revision ||
            displaySlot_.stateRef.expired()) {
            displaySlot_ = {state, state.get(), state->revision(), state->find(state_keys::kDisplay)};
        }
        const PlistValue* display = displaySlot_.display;
        return display != nullptr && boundRoot_ != nullptr && display->dictionary().get() == boundRoot_ &&
               !boundDisplay_.expired();
    }

    // The display tree the decoders are bound to (not owned: the state owns it), and its address.
    std::weak_ptr<PlistDictionary> boundDisplay_;
    const PlistDictionary* boundRoot_ = nullptr;
    // Where the last state seen keeps its display, as of the state's revision.
    struct DisplaySlot {
        std::weak_ptr<PlistDictionary> stateRef;
        const PlistDictionary* state = nullptr;
        std::uint64_t revision = 0;
        const PlistValue* display = nullptr;
    };
    DisplaySlot displaySlot_;
};

}  // namespace velmar
