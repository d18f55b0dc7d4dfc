#include "LogGenerator/C2K/C2KLogGenerator.h"

#include <iterator>
#include <unordered_set>

#include "LogGenerator/C2K/C2KDisplaySetter.h"
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "LogGenerator/C2K/C2KSortedPilots.h"
#include "LogGenerator/C2K/C2KStateKeys.h"
#include "LogGenerator/KeptDisplay.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/BasebandPacket.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/Resources.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

namespace {

constexpr const char* kTemplateName = "C2KTemplate";

}  // namespace

std::unique_ptr<LogGenerator> C2KLogGenerator::generator() {
    return std::make_unique<C2KLogGenerator>();
}

void C2KLogGenerator::processTemplate(const PlistDictionary& templateDictionary,
                                      const PlistDictionaryRef& storeDisplayIntoDict,
                                      PlistDictionary& storeLookupIntoDict) {
    for (const auto& [label, value] : templateDictionary) {
        if (const PlistDictionaryRef& group = value.dictionary()) {
            auto displayGroup = PlistDictionary::create();
            processTemplate(*group, displayGroup, storeLookupIntoDict);
            storeDisplayIntoDict->set(label, std::move(displayGroup));
        } else if (const std::string* displayKey = value.string()) {
            if (*displayKey == c2k::kSortedMarker) {
                storeDisplayIntoDict->set(label, value);
                continue;
            }
            storeDisplayIntoDict->set(label, PlistValue(""));
            PlistArrayRef places = storeLookupIntoDict.get(*displayKey).array();
            if (!places) {
                places = PlistArray::create();
                storeLookupIntoDict.set(*displayKey, places);
            }
            // The place shares the display dictionary that holds the label: values written through it show.
            auto place = PlistDictionary::create();
            place->set(c2k::kPlaceLabelKey, label);
            place->set(c2k::kPlaceDictionaryKey, storeDisplayIntoDict);
            places->append(std::move(place));
        }
    }
    SystemLog::log(kLogWarning, "Processing the template");
}

PlistDictionaryRef C2KLogGenerator::getDisplayFromState(const StateDict& state) {
    using namespace state_keys;
    if (const PlistDictionaryRef display = state->get(kDisplay).dictionary()) {
        if (state->get(c2k::kLookupKey).isDictionary()) {
            return display;
        }
    }
    PlistDictionaryRef templateDictionary = state->get(kTemplate).dictionary();
    if (!templateDictionary) {
        const std::optional<PlistValue> loaded = loadTemplate(kTemplateName);
        if (!loaded || !loaded->isDictionary()) {
            SystemLog::log(kLogError, "Cannot load C2K template for display");
            return nullptr;
        }
        templateDictionary = loaded->dictionary();
        state->set(kTemplate, *loaded);
    }
    auto display = PlistDictionary::create();
    auto lookup = PlistDictionary::create();
    processTemplate(*templateDictionary, display, *lookup);
    state->set(kDisplay, display);
    state->set(c2k::kLookupKey, std::move(lookup));
    state->set(kExtraInfo, PlistValue::newDictionary());
    return display;
}

namespace {

void collectDictionaries(const PlistValue& value, std::unordered_set<const PlistDictionary*>& into) {
    if (const PlistDictionaryRef& dictionary = value.dictionary()) {
        into.insert(dictionary.get());
        for (const auto& entry : *dictionary) {
            collectDictionaries(entry.second, into);
        }
    } else if (const PlistArrayRef& array = value.array()) {
        for (const PlistValue& element : *array) {
            collectDictionaries(element, into);
        }
    }
}

// Whether the lookup's places lie in display, as they do when both were built together.
bool lookupShowsIn(const PlistDictionary& lookup, const PlistDictionaryRef& display) {
    std::unordered_set<const PlistDictionary*> shown;
    collectDictionaries(PlistValue(display), shown);
    for (const auto& [displayKey, places] : lookup) {
        if (const PlistArrayRef& list = places.array(); list && !list->empty()) {
            const PlistDictionaryRef& place = list->at(0).dictionary();
            return place && shown.count(place->get(c2k::kPlaceDictionaryKey).dictionary().get()) != 0;
        }
    }
    return true;
}

}  // namespace

void C2KLogGenerator::forgetForeignDisplay(const StateDict& state) {
    using namespace state_keys;
    const PlistDictionaryRef display = state->get(kDisplay).dictionary();
    if (!display || verifiedDisplay_.lock() == display) {
        return;
    }
    // The state outlives generators: a display that came without this generator's lookup into it was built
    // by another technology's generator, and the template and lookup beside it are not this display's.
    const PlistDictionaryRef lookup = state->get(c2k::kLookupKey).dictionary();
    if (!lookup || !lookupShowsIn(*lookup, display)) {
        SystemLog::log(kLogNotice, "The kept display was built from another template; building %s",
                       kTemplateName);
        state->remove(kDisplay);
        state->remove(kTemplate);
        state->remove(c2k::kLookupKey);
        return;
    }
    verifiedDisplay_ = display;
}

void C2KLogGenerator::updateState(const StateDict& state, ByteView data) {
    forgetForeignDisplay(state);
    getDisplayFromState(state);
    // Held here: parsers add entries to the state, which may move the entry that holds the lookup.
    const PlistDictionaryRef lookup = state->get(c2k::kLookupKey).dictionary();
    updateFromLog(data, lookup, state);
}

void C2KLogGenerator::updateFromLog(ByteView data, const PlistDictionaryRef& usingLookup,
                                    const StateDict& usingState) {
    // The length test is made before the prefix is cut, as the other generators make it.
    if (data.size() < kPacketHeaderLength) {
        return;
    }
    const BasebandPacket framed = frameBasebandPacket(data);
    const ByteView packet = framed.packet;
    if (!framed.isPlain()) {
        // Logged only: the packet is processed all the same.
        SystemLog::log(kLogError, "Invalid log type: %x. Dropping.", framed.logType);
    }
    const RecordReader reader(packet);
    const std::int32_t code = framed.logCode();
    const c2k::C2KLogParser parse = c2k::parserForCode(code);
    if (parse == nullptr) {
        return;
    }
    parse(reader, c2k::C2KRecordContext{usingLookup.get(), *usingState});
    if (_binData) {
        _binData->insert(_binData->end(), packet.begin(), packet.end());
    }
}

PlistValue C2KLogGenerator::generateLogUsingState(const StateDict& state) {
    state->set(state_keys::kDisplayState, PlistValue(takeBinData()));
    LogGenerator::updateHistoryInState(state);
    return state->get(state_keys::kDisplay);
}

PlistValue C2KLogGenerator::getStartCommand() {
    auto codes = PlistArray::create();
    codes->reserve(std::size(c2k::kParsers));
    for (const c2k::C2KParserRow& row : c2k::kParsers) {
        codes->append(PlistValue::integer(row.code));
    }
    auto command = PlistDictionary::create();
    command->set(kKxSetStateKey, kKxStreamingState);
    command->set(kKxSetLogCodesKey, std::move(codes));
    return command;
}

}  // namespace velmar
