#include "LogGenerator/ORVLogGenerator2.h"

#include <charconv>

#include "LogGenerator/KeptDisplay.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/BasebandPacket.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/Resources.h"
#include "core/platform/SystemLog.h"

namespace velmar {

ORVLogGenerator2::Announcement ORVLogGenerator2::announce(const char* creationLine) {
    SystemLog::log(kLogError, "%s", creationLine);
    return {};
}

ORVLogGenerator2::CreationNoted ORVLogGenerator2::noteCreation(const ClassIndex* classIndex) {
    SystemLog::log(kLogError, "Creating ORVLogGenerator2 object with %p",
                   static_cast<const void*>(classIndex));
    return {};
}

ORVLogGenerator2::ORVLogGenerator2(CreationNoted, std::string templateName,
                                   std::shared_ptr<ClassIndex> classIndex)
    : pListName(std::move(templateName)), cIndex(std::move(classIndex)) {
    SystemLog::log(kLogError, "Class Index: %ld", static_cast<long>(cIndex.use_count()));
}

ORVLogGenerator2::ORVLogGenerator2(std::string templateName, std::shared_ptr<ClassIndex> classIndex)
    : ORVLogGenerator2{noteCreation(classIndex.get()), std::move(templateName), std::move(classIndex)} {}

ORVLogGenerator2::ORVLogGenerator2(Announcement, std::string templateName,
                                   std::shared_ptr<ClassIndex> classIndex)
    : ORVLogGenerator2(std::move(templateName), std::move(classIndex)) {}

ORVLogGenerator2::~ORVLogGenerator2() {
    // The text names the GSM generator whatever the concrete class; it is fixed on purpose.
    SystemLog::log(kLogWarning, "ORV_GSMLogGenerator is destructed %p", static_cast<void*>(this));
}

void ORVLogGenerator2::updateState(const StateDict& state, ByteView data) {
    if (!displayIsBound(state)) {
        getDisplayFromState(state);
    }
    updateWithData(data);
    if (_binData) {
        _binData->insert(_binData->end(), data.begin(), data.end());
    }
}

bool ORVLogGenerator2::adoptKeptDisplay(const StateDict& state, const PlistValue& display) {
    // A display that another technology's generator built has none of this generator's sections: it gives
    // way to this technology's own, which the caller builds (from this generator's template, not the one
    // the other generator left in the state).
    if (const std::optional<PlistValue> own = loadTemplate(pListName);
        own && !builtFromTemplate(display, *own)) {
        SystemLog::log(kLogNotice, "The kept display was built from another template; building %s",
                       pListName.c_str());
        state->remove(state_keys::kDisplay);
        state->remove(state_keys::kTemplate);
        return false;
    }
    bindSections(display);
    bind(display.dictionary());
    return true;
}

void ORVLogGenerator2::bindSections(const PlistValue& displayValue) {
    // The same walk and order as processTemplate, so that a section named twice binds to the same place.
    if (const PlistDictionaryRef& dictionary = displayValue.dictionary()) {
        for (const auto& [key, value] : *dictionary) {
            bindSections(value);
            if (Base* decoder = cIndex ? cIndex->getClass(key) : nullptr) {
                decoder->updateSectionRef(value);
            }
        }
    } else if (const PlistArrayRef& array = displayValue.array()) {
        for (const PlistValue& element : *array) {
            bindSections(element);
        }
    }
}

void ORVLogGenerator2::bind(const PlistDictionaryRef& display) {
    boundDisplay_ = display;
    boundRoot_ = display.get();
}

PlistValue ORVLogGenerator2::getDisplayFromState(const StateDict& state) {
    if (const PlistValue* display = state->find(state_keys::kDisplay); display && !display->isNone()) {
        // A display kept from an earlier generator (the state outlives channel restarts) gets this
        // generator's decoders bound to its sections the first time this generator sees it.
        const PlistDictionaryRef& root = display->dictionary();
        if (!root || boundDisplay_.lock() == root) {
            return *display;
        }
        const PlistValue kept = *display;
        if (adoptKeptDisplay(state, kept)) {
            return kept;
        }
    }
    PlistValue templateValue = state->get(state_keys::kTemplate);
    if (templateValue.isNone()) {
        std::optional<PlistValue> loaded = loadTemplate(pListName);
        if (!loaded) {
            SystemLog::log(kLogError, "Cannot load template for display");
            return PlistValue();
        }
        templateValue = *loaded;
        state->set(state_keys::kTemplate, templateValue);
    }
    SystemLog::log(kLogWarning, "Initialized class index: %p, Self: %p",
                   static_cast<const void*>(cIndex.get()), static_cast<void*>(this));
    if (cIndex) {
        cIndex->status();
    }
    PlistValue tree = processTemplate(templateValue);
    printDict(tree);
    if (!tree.isNone()) {
        bind(tree.dictionary());
        state->set(state_keys::kDisplay, tree);
        state->set(state_keys::kExtraInfo, PlistValue::newDictionary());
    }
    // The call that builds the tree answers null, as the value found at the start was null.
    return PlistValue();
}

PlistValue ORVLogGenerator2::processTemplate(const PlistValue& templateValue) {
    if (const std::string* text = templateValue.string()) {
        return PlistValue(*text);
    }
    if (const PlistDictionaryRef& dictionary = templateValue.dictionary()) {
        auto processed = PlistDictionary::create();
        processed->reserve(dictionary->size());
        for (const auto& [key, value] : *dictionary) {
            PlistValue child = processTemplate(value);
            if (child.isNone()) {
                return PlistValue();  // a value of an unsupported type: the tree cannot be built
            }
            if (Base* decoder = cIndex ? cIndex->getClass(key) : nullptr) {
                decoder->updateSectionRef(child);
            }
            processed->set(key, std::move(child));
        }
        return PlistValue(std::move(processed));
    }
    if (const PlistArrayRef& array = templateValue.array()) {
        auto processed = PlistArray::create();
        processed->reserve(array->size());
        for (const PlistValue& element : *array) {
            PlistValue child = processTemplate(element);
            if (child.isNone()) {
                return PlistValue();
            }
            processed->append(std::move(child));
        }
        return PlistValue(std::move(processed));
    }
    SystemLog::log(kLogError, "Received an object of unknown type");
    SystemLog::log(kLogWarning, "Processing the template");
    return PlistValue();
}

void ORVLogGenerator2::printDict(const PlistValue& displayValue) {
    if (displayValue.isString()) {
        return;
    }
    if (const PlistDictionaryRef& dictionary = displayValue.dictionary()) {
        for (const auto& entry : *dictionary) {
            printDict(entry.second);
        }
        return;
    }
    if (const PlistArrayRef& array = displayValue.array()) {
        for (const PlistValue& element : *array) {
            printDict(element);
        }
        return;
    }
    SystemLog::log(kLogError, "Received an object of unknown type");
}

PlistValue ORVLogGenerator2::generateLogUsingState(const StateDict& state) {
    PlistValue display = getDisplayFromState(state);
    if (_binData) {
        state->set(state_keys::kDisplayState, PlistValue(takeBinData()));
    }
    LogGenerator::updateHistoryInState(state);
    return display;
}

PlistValue ORVLogGenerator2::getStartCommand() {
    const std::vector<std::string> codes = cIndex ? cIndex->getAllLogCodes() : std::vector<std::string>();
    auto plainCodes = PlistArray::create();
    auto extraCodes = PlistArray::create();
    plainCodes->reserve(codes.size());
    extraCodes->reserve(codes.size());
    for (const std::string& text : codes) {
        std::int64_t code = 0;
        std::from_chars(text.data(), text.data() + text.size(), code);
        if (code >= kExtendedCodeBase) {
            extraCodes->append(PlistValue::integer(code - kExtendedCodeBase));
        } else {
            plainCodes->append(PlistValue::integer(code));
        }
    }
    auto command = PlistDictionary::create();
    command->set(kKxSetStateKey, kKxStreamingState);
    command->set(kKxSetLogCodesKey, std::move(plainCodes));
    command->set(kKxSetExtraCodesKey, std::move(extraCodes));
    return command;
}

}  // namespace velmar
