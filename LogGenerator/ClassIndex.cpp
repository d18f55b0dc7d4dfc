#include "LogGenerator/ClassIndex.h"

#include <algorithm>
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

const DecoderList* ClassIndex::findSubscribers(std::int32_t code) const {
    const Dispatch& table = dispatch();
    if (!table.mayHave.test(static_cast<std::uint32_t>(code) & 0xFFFFU)) {
        return nullptr;
    }
    const auto hit =
        std::lower_bound(table.codes.begin(), table.codes.end(), code,
                         [](const auto& entry, std::int32_t wanted) { return entry.first < wanted; });
    return hit != table.codes.end() && hit->first == code ? hit->second : nullptr;
}

const ClassIndex::Dispatch& ClassIndex::dispatch() const {
    if (dispatch_.revision == codeDictionary.revision()) {
        return dispatch_;
    }
    dispatch_.mayHave.reset();
    dispatch_.codes.clear();
    for (const auto& [key, subscribers] : codeDictionary) {
        std::int32_t code = 0;
        const auto [end, error] = std::from_chars(key.data(), key.data() + key.size(), code);
        if (error != std::errc() || end != key.data() + key.size() || key != LogCodeKey(code).view()) {
            continue;  // not a code's canonical text: no code looks it up
        }
        dispatch_.mayHave.set(static_cast<std::uint32_t>(code) & 0xFFFFU);
        dispatch_.codes.emplace_back(code, &subscribers);
    }
    std::sort(dispatch_.codes.begin(), dispatch_.codes.end());
    dispatch_.revision = codeDictionary.revision();
    return dispatch_;
}

void ClassIndex::status() const {
    // classDict is always a dictionary and never a string; the two lines are kept as diagnostics.
    SystemLog::log(kLogWarning, "Dictionary = %d", 1);
    SystemLog::log(kLogWarning, "String = %d", 0);
}

std::vector<std::int32_t> ClassIndex::subscribedCodes() const {
    std::vector<std::int32_t> codes;
    for (const auto& [code, subscribers] : dispatch().codes) {
        if (!subscribers->empty()) {
            codes.push_back(code);
        }
    }
    return codes;
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
