// Helpers of the GSM/UMTS decoder tests: decoders bound to fresh sections, rows written as literals, and a
// generator fed with packets whose sections are found by name in the display tree.
#pragma once

#include <gtest/gtest.h>

#include <initializer_list>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::gsm_testing {

using Row = std::vector<std::pair<std::string, std::string>>;

// A dictionary of string values, in the given key order.
inline PlistValue rowOf(const Row& keysAndValues) {
    auto row = PlistDictionary::create();
    for (const auto& [key, value] : keysAndValues) {
        row->set(key, value);
    }
    return row;
}

inline PlistValue rowsOf(std::initializer_list<Row> rows) {
    auto array = PlistArray::create();
    for (const Row& row : rows) {
        array->append(rowOf(row));
    }
    return array;
}

// A decoder bound to a new key section.
template <typename Decoder>
struct KeySectionDecoder {
    std::shared_ptr<Decoder> decoder = std::make_shared<Decoder>();
    PlistDictionaryRef section = PlistDictionary::create();
    KeySectionDecoder() { decoder->updateSectionRef(PlistValue(section)); }
    void feed(const PlistData& packet, std::int32_t code) { decoder->updateWithData(packet, code); }
};

// A decoder bound to a new list section.
template <typename Decoder>
struct ListSectionDecoder {
    std::shared_ptr<Decoder> decoder = std::make_shared<Decoder>();
    PlistArrayRef section = PlistArray::create();
    ListSectionDecoder() { decoder->updateSectionRef(PlistValue(section)); }
    void feed(const PlistData& packet, std::int32_t code) { decoder->updateWithData(packet, code); }
    PlistValue rows() const { return PlistValue(section); }
};

// The value under name at any depth of a display tree, or none.
inline PlistValue findSection(const PlistValue& tree, const std::string& name) {
    if (const PlistDictionaryRef& dictionary = tree.dictionary()) {
        for (const auto& [key, value] : *dictionary) {
            if (key == name) {
                return value;
            }
            if (PlistValue found = findSection(value, name); !found.isNone()) {
                return found;
            }
        }
    }
    return PlistValue();
}

// The GSM/UMTS generator with a fresh state; packets go through updateState, as the model hands them over.
struct GsmGeneratorHarness {
    std::unique_ptr<ORV_GSMLogGenerator> generator = std::make_unique<ORV_GSMLogGenerator>();
    StateDict state = PlistDictionary::create();

    void feed(const PlistData& packet) { generator->updateState(state, packet); }
    PlistValue section(const std::string& name) const {
        return findSection(state->get(state_keys::kDisplay), name);
    }
    PlistDictionaryRef keySection(const std::string& name) const { return section(name).dictionary(); }
    PlistArrayRef listSection(const std::string& name) const { return section(name).array(); }
};

// The string under key, "<absent>" or "<not a string>".
inline std::string textAt(const PlistDictionary& dictionary, const std::string& key) {
    const PlistValue* value = dictionary.find(key);
    if (value == nullptr) {
        return "<absent>";
    }
    return value->string() ? *value->string() : "<not a string>";
}

}  // namespace velmar::gsm_testing
