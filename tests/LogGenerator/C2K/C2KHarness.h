// C2KHarness: a CDMA2000 generator with a fresh state whose template shows every display key in one group,
// "Values", under the key's own name, so that a test reads what a parser wrote as Values[key]. The display is
// built at once, so that the template's lines are logged before a test starts capturing.
#pragma once

#include <string>
#include <string_view>

#include "LogGenerator/C2K/C2KLogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/Json.h"

namespace velmar::testing {

inline constexpr const char* kC2KDisplayKeys[] = {
    "kChannel",         "k1xEVDODeviceState",
    "kBandClass",       "kRxAGC0",
    "kRxAGC1",          "kTxAGC",
    "kServingPNOffset", "kSessionState",
    "kUATI24",          "kColorCode",
    "kActiveSetPilots", "kFingerC2I",
    "k1xDeviceState",   "k1xRx0BandClass",
    "k1xRx0ChanNum",    "k1xRxAGC0",
    "k1xRx1BandClass",  "k1xRx1ChanNum",
    "k1xRxAGC1",        "k1xTxAGC",
    "k1xActiveSetInfo", "k1xTrafficFER",
    "k1xRoamingHome",   "kSystemId",
    "kNetworkId",       "kPacketZoneId",
    "kBaseId",          "kProtocolRevision",
    "kFLDataRate",      "kRLDataRate",
};

class C2KHarness {
  public:
    C2KHarness() {
        auto values = PlistDictionary::create();
        for (const char* key : kC2KDisplayKeys) {
            values->set(key, key);
        }
        auto templateDictionary = PlistDictionary::create();
        templateDictionary->set("Values", values);
        state->set(state_keys::kTemplate, templateDictionary);
        C2KLogGenerator::getDisplayFromState(state);
    }

    void feed(const PlistData& blob) { generator.updateState(state, blob); }

    PlistDictionaryRef values() const {
        const PlistDictionaryRef display = state->get(state_keys::kDisplay).dictionary();
        return display ? display->get("Values").dictionary() : nullptr;
    }
    // The text shown under key, or "<not text>" when the key shows something else (or nothing).
    std::string shown(std::string_view key) const {
        const PlistDictionaryRef shownValues = values();
        const std::string* text = shownValues ? shownValues->get(key).string() : nullptr;
        return text ? *text : std::string("<not text>");
    }
    PlistDictionaryRef shownDictionary(std::string_view key) const {
        const PlistDictionaryRef shownValues = values();
        return shownValues ? shownValues->get(key).dictionary() : nullptr;
    }
    PlistDictionaryRef extraInfo() const { return state->get(state_keys::kExtraInfo).dictionary(); }

    C2KLogGenerator generator;
    StateDict state = PlistDictionary::create();
};

// A dictionary of string values, in order.
inline PlistDictionaryRef textDictionary(std::initializer_list<std::pair<const char*, const char*>> entries) {
    auto dictionary = PlistDictionary::create();
    for (const auto& [key, value] : entries) {
        dictionary->set(key, value);
    }
    return dictionary;
}

// One-line JSON of a value, for comparisons whose failures read well; null for a missing dictionary.
inline std::string asJson(const PlistDictionaryRef& dictionary) {
    return dictionary ? plistToJson(PlistValue(dictionary)) : std::string("null");
}

}  // namespace velmar::testing
