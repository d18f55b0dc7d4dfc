// Fuzz target: the object-based GSM generator, fed the input as one blob.
//
// The generator's two assertion failures are expected outcomes and checked exactly: line 90 exactly when the
// blob is not a property list, line 78 exactly when the tree holds a leaf that is not a string; both with the
// file "LogGenerator/GSM/GSMLogGenerator" and with the state left untouched. Anything else thrown, any crash,
// leak or read outside a buffer, is a finding. On success the display must be the collapsed tree: only
// strings, dictionaries and arrays, no one-entry dictionary below the top level, and a refresh and the save
// contents must work on the state.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "LogGenerator/GSM/InternalInconsistencyException.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/plist/PlistCodec.h"
#include "fuzz/QuietStart.h"

namespace velmar {
namespace {

// Whether the tree holds a value other than a string, dictionary or array at any depth.
bool holdsOtherLeaf(const PlistValue& value, int depth = 0) {
    if (depth > kMaxPlistDepth + 1) {
        std::abort();
    }
    if (const PlistDictionaryRef& dictionary = value.dictionary()) {
        for (const auto& entry : *dictionary) {
            if (holdsOtherLeaf(entry.second, depth + 1)) {
                return true;
            }
        }
        return false;
    }
    if (const PlistArrayRef& array = value.array()) {
        for (const PlistValue& element : *array) {
            if (holdsOtherLeaf(element, depth + 1)) {
                return true;
            }
        }
        return false;
    }
    return !value.isString();
}

// The display holds strings, dictionaries and arrays only, and no one-entry dictionary below the top.
void checkCollapsed(const PlistValue& value, bool top) {
    if (const PlistDictionaryRef& dictionary = value.dictionary()) {
        if (!top && dictionary->size() == 1) {
            std::abort();
        }
        for (const auto& entry : *dictionary) {
            checkCollapsed(entry.second, false);
        }
        return;
    }
    if (const PlistArrayRef& array = value.array()) {
        for (const PlistValue& element : *array) {
            checkCollapsed(element, false);
        }
        return;
    }
    if (!value.isString()) {
        std::abort();
    }
}

}  // namespace
}  // namespace velmar

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    velmar::fuzzing::quietStart();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace velmar;

    const ByteView blob(data, size);
    const std::optional<PlistValue> parsed = parsePropertyList(blob);
    GSMLogGenerator generator;
    const StateDict state = PlistDictionary::create();
    try {
        generator.updateState(state, blob);
    } catch (const InternalInconsistencyException& failure) {
        if (failure.file() != "LogGenerator/GSM/GSMLogGenerator" || !state->empty()) {
            std::abort();
        }
        if (failure.line() == 90) {
            if (parsed || failure.description() != "Could not deserialize the object") {
                std::abort();
            }
        } else if (failure.line() == 78) {
            if (!parsed || !holdsOtherLeaf(*parsed) ||
                failure.description().rfind("Unknown object of type ", 0) != 0) {
                std::abort();
            }
        } else {
            std::abort();
        }
        return 0;
    }
    if (!parsed || holdsOtherLeaf(*parsed)) {
        std::abort();
    }
    checkCollapsed(state->get(state_keys::kDisplay), true);
    if (!(state->get(state_keys::kDisplayState) == *parsed)) {
        std::abort();
    }
    generator.generateLogUsingState(state);
    if (!generator.getSaveContentsFromState(state).isArray()) {
        std::abort();
    }
    return 0;
}
