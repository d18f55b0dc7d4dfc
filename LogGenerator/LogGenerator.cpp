#include "LogGenerator/LogGenerator.h"

#include "LogGenerator/NotImplementedError.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/Clock.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar {

namespace {
constexpr std::size_t kHistoryLimit = 5;
}

LogGenerator::LogGenerator() {
    SystemLog::log(kLogWarning, "Creating Log object: %p", static_cast<void*>(this));
}

void LogGenerator::updateState(const StateDict&, ByteView) {
    throw NotImplementedError("updateState:withData:");
}
PlistValue LogGenerator::generateLogUsingState(const StateDict&) {
    throw NotImplementedError("generateLogUsingState:");
}
PlistValue LogGenerator::getStartCommand() {
    throw NotImplementedError("getStartCommand");
}
PlistValue LogGenerator::getSaveContentsFromState(const StateDict&) {
    throw NotImplementedError("getSaveContentsFromState:");
}

void LogGenerator::updateHistoryInState(const StateDict& state) {
    using namespace state_keys;
    PlistArrayRef history = state->get(kHistory).array();
    if (!history) {
        history = PlistArray::create();
        state->set(kHistory, history);
    } else if (history->size() >= kHistoryLimit) {
        history->removeRange(0, history->size() - (kHistoryLimit - 1));
    }

    // The entry is built in key order and stops at the first absent value.
    auto entry = PlistDictionary::create();
    bool complete = true;
    for (const std::string_view key : {kDisplayState, kDisplay, kExtraInfo}) {
        const PlistValue* value = state->find(key);
        if (value == nullptr || value->isNone()) {
            complete = false;
            break;
        }
        entry->set(key, value->shallowCopy());
    }
    if (complete) {
        const std::string date = Clock::utcDescription(Clock::now());
        entry->set(kDate, date);
        entry->set(kDescription, stringWithFormat("Snapshot (%s)", date.c_str()));
    }
    history->append(std::move(entry));
}

}  // namespace velmar
