#include "service/LogCodeFilter.h"

#include "core/platform/KxServerProtocol.h"

namespace velmar {

namespace {

// Adds the codes of list (absent: none) through add; false when list is present but not an array.
template <typename Add>
bool addCodes(const PlistValue* list, std::size_t& ignored, Add&& add) {
    if (list == nullptr) {
        return true;
    }
    const PlistArrayRef& codes = list->array();
    if (!codes) {
        return false;
    }
    for (const PlistValue& element : codes->items()) {
        const std::optional<std::int64_t> code = element.integerValue();
        if (code && *code >= 0 && *code < static_cast<std::int64_t>(LogCodeFilter::kCodeCount)) {
            add(static_cast<std::uint16_t>(*code));
        } else {
            ++ignored;
        }
    }
    return true;
}

}  // namespace

LogCodeFilter LogCodeFilter::everything() {
    LogCodeFilter filter;
    filter.all_ = true;
    return filter;
}

std::optional<LogCodeFilter> LogCodeFilter::fromStartCommand(const PlistDictionary& command,
                                                             std::size_t& ignored, std::string& reason) {
    ignored = 0;
    LogCodeFilter filter;
    if (!addCodes(command.find(kKxSetLogCodesKey), ignored,
                  [&filter](std::uint16_t code) { filter.addCode(code); })) {
        reason = std::string(kKxSetLogCodesKey) + " is not an array";
        return std::nullopt;
    }
    if (!addCodes(command.find(kKxSetExtraCodesKey), ignored,
                  [&filter](std::uint16_t code) { filter.addExtraCode(code); })) {
        reason = std::string(kKxSetExtraCodesKey) + " is not an array";
        return std::nullopt;
    }
    return filter;
}

}  // namespace velmar
