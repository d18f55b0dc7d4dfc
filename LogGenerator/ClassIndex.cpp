#include "LogGenerator/ClassIndex.h"

#include <cstdio>

#include "LogGenerator/LogCodeKey.h"
#include "core/platform/SystemLog.h"

namespace velmar {

ClassIndex::~ClassIndex() {
    std::fputs("Deallocing ClassIndex\n", stdout);
    classDict.clear();
    codeDictionary.clear();
}

Base* ClassIndex::getClass(std::string_view sectionName) const {
    const DecoderRef* decoder = classDict.find(sectionName);
    return decoder ? decoder->get() : nullptr;
}

const DecoderList* ClassIndex::getSubscribers(std::int32_t code) const {
    return codeDictionary.find(LogCodeKey(code).view());
}

void ClassIndex::status() const {
    // classDict is always a dictionary and never a string; the two lines are kept as diagnostics.
    SystemLog::log(kLogWarning, "Dictionary = %d", 1);
    SystemLog::log(kLogWarning, "String = %d", 0);
}

std::vector<std::string> ClassIndex::getAllLogCodes() const {
    std::vector<std::string> codes;
    codes.reserve(codeDictionary.size());
    for (const auto& entry : codeDictionary) {
        codes.push_back(entry.first);
    }
    return codes;
}

}  // namespace velmar
