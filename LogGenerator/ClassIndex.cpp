#include "LogGenerator/ClassIndex.h"

#include <charconv>
#include <cstdio>

#include "LogGenerator/LogCodeKey.h"
#include "core/platform/SystemLog.h"

namespace velmar {

ClassIndex::ClassIndex(std::span<const DecoderRow> rows) {
    decoders_.reserve(rows.size());
    for (const DecoderRow& row : rows) {
        decoders_.push_back({&row, row.create(classDict, codeDictionary)});
    }
}

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

std::vector<ClassIndex::Subscription> ClassIndex::subscriptions() const {
    const auto rowOfDecoder = [this](const Base* decoder) -> const DecoderRow* {
        for (const CreatedDecoder& created : decoders_) {
            if (created.decoder.get() == decoder) {
                return created.row;
            }
        }
        return nullptr;
    };
    std::vector<Subscription> map;
    for (const auto& [key, subscribers] : codeDictionary) {
        std::int32_t code = 0;
        std::from_chars(key.data(), key.data() + key.size(), code);
        for (const DecoderRef& decoder : subscribers) {
            if (const DecoderRow* row = rowOfDecoder(decoder.get())) {
                map.push_back({code, row});
            }
        }
    }
    for (const CreatedDecoder& created : decoders_) {
        if (created.row->codes.codes().empty()) {
            map.push_back({std::nullopt, created.row});
        }
    }
    return map;
}

void ClassIndex::releaseDecoders() {
    for (CreatedDecoder& created : decoders_) {
        created.decoder.reset();
    }
}

}  // namespace velmar
