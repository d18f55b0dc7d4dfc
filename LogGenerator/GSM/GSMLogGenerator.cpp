#include "LogGenerator/GSM/GSMLogGenerator.h"

#include "LogGenerator/GSM/InternalInconsistencyException.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/StringFormat.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

namespace {

constexpr const char* kSourceFile = "LogGenerator/GSM/GSMLogGenerator";
constexpr int kUnknownObjectLine = 78;
constexpr int kUndecodableBlobLine = 90;

// The collapsing rule, shared by the instance operation and the class operation that applies it.
const PlistValue* singleEntryValue(const PlistValue& object) {
    const PlistDictionaryRef& dictionary = object.dictionary();
    if (!dictionary || dictionary->size() != 1) {
        return nullptr;
    }
    return &dictionary->entries().front().second;
}

PlistValue collapsed(PlistValue processed) {
    if (const PlistValue* single = singleEntryValue(processed)) {
        return *single;
    }
    return processed;
}

}  // namespace

std::unique_ptr<LogGenerator> GSMLogGenerator::generator() {
    return std::make_unique<GSMLogGenerator>();
}

PlistValue GSMLogGenerator::canCollapse(const PlistValue& object) const {
    const PlistValue* single = singleEntryValue(object);
    return single ? *single : PlistValue();
}

PlistValue GSMLogGenerator::processObject(const PlistValue& object) {
    if (object.isString()) {
        return object;
    }
    if (const PlistDictionaryRef& dictionary = object.dictionary()) {
        auto processed = PlistDictionary::create();
        processed->reserve(dictionary->size());
        for (const auto& [key, value] : *dictionary) {
            processed->set(key, collapsed(processObject(value)));
        }
        return processed;
    }
    if (const PlistArrayRef& array = object.array()) {
        auto processed = PlistArray::create();
        processed->reserve(array->size());
        for (const PlistValue& element : *array) {
            processed->append(collapsed(processObject(element)));
        }
        return processed;
    }
    const std::string typeName(object.typeName());
    throw InternalInconsistencyException(
        "processObject:", "GSMLogGenerator", kSourceFile, kUnknownObjectLine,
        stringWithFormat("Unknown object of type %s encountered", typeName.c_str()));
}

void GSMLogGenerator::updateState(const StateDict& state, ByteView data) {
    const std::optional<PlistValue> object = parsePropertyList(data);
    if (!object) {
        throw InternalInconsistencyException(
            "updateState:withData:", stringWithFormat("GSMLogGenerator %p", static_cast<void*>(this)),
            kSourceFile, kUndecodableBlobLine, "Could not deserialize the object");
    }
    PlistValue display = processObject(*object);
    state->set(state_keys::kDisplayState, *object);
    state->set(state_keys::kDisplay, std::move(display));
    state->set(state_keys::kExtraInfo, PlistValue::newDictionary());
}

PlistValue GSMLogGenerator::generateLogUsingState(const StateDict& state) {
    LogGenerator::updateHistoryInState(state);
    return state->get(state_keys::kDisplay);
}

PlistValue GSMLogGenerator::getStartCommand() {
    auto command = PlistDictionary::create();
    command->set(kKxSetStateKey, kKxStreamingState);
    return command;
}

PlistValue GSMLogGenerator::getSaveContentsFromState(const StateDict& state) {
    auto contents = PlistArray::create();
    if (const PlistArrayRef history = state->get(state_keys::kHistory).array()) {
        contents->items() = history->items();
    }
    return contents;
}

}  // namespace velmar
