#include "core/platform/plist/PlistValue.h"

#include <algorithm>

namespace velmar {

namespace {
const PlistDataRef kNoData;
}  // namespace

PlistValue::PlistValue(PlistDictionaryRef dictionary) {
    if (dictionary) {
        value_ = std::move(dictionary);
    }
}
PlistValue::PlistValue(PlistArrayRef array) {
    if (array) {
        value_ = std::move(array);
    }
}
PlistValue::PlistValue(std::string text) : value_(std::move(text)) {}
PlistValue::PlistValue(std::string_view text) : value_(std::string(text)) {}
PlistValue::PlistValue(const char* text) : value_(std::string(text)) {}
PlistValue::PlistValue(PlistDataRef data) {
    if (data) {
        value_ = std::move(data);
    }
}

PlistValue PlistValue::integer(std::int64_t number) {
    PlistValue v;
    v.value_ = number;
    return v;
}
PlistValue PlistValue::real(double number) {
    PlistValue v;
    v.value_ = number;
    return v;
}
PlistValue PlistValue::boolean(bool flag) {
    PlistValue v;
    v.value_ = flag;
    return v;
}
PlistValue PlistValue::data(PlistData bytes) {
    return PlistValue(std::make_shared<PlistData>(std::move(bytes)));
}
PlistValue PlistValue::date(PlistDate instant) {
    PlistValue v;
    v.value_ = instant;
    return v;
}
PlistValue PlistValue::newDictionary() {
    return PlistValue(PlistDictionary::create());
}
PlistValue PlistValue::newArray() {
    return PlistValue(PlistArray::create());
}

const std::string* PlistValue::string() const {
    return std::get_if<std::string>(&value_);
}
std::optional<std::int64_t> PlistValue::integerValue() const {
    const auto* held = std::get_if<std::int64_t>(&value_);
    return held ? std::optional<std::int64_t>(*held) : std::nullopt;
}
std::optional<double> PlistValue::realValue() const {
    const auto* held = std::get_if<double>(&value_);
    return held ? std::optional<double>(*held) : std::nullopt;
}
std::optional<bool> PlistValue::booleanValue() const {
    const auto* held = std::get_if<bool>(&value_);
    return held ? std::optional<bool>(*held) : std::nullopt;
}
const PlistDataRef& PlistValue::dataValue() const {
    const auto* held = std::get_if<PlistDataRef>(&value_);
    return held ? *held : kNoData;
}
std::optional<PlistDate> PlistValue::dateValue() const {
    const auto* held = std::get_if<PlistDate>(&value_);
    return held ? std::optional<PlistDate>(*held) : std::nullopt;
}

std::string_view PlistValue::typeName() const {
    static constexpr std::string_view kNames[] = {"none", "dictionary", "array", "string", "integer",
                                                  "real", "boolean",    "data",  "date"};
    return kNames[value_.index()];
}

PlistValue PlistValue::shallowCopy() const {
    if (const auto& dict = dictionary()) {
        return PlistValue(std::make_shared<PlistDictionary>(*dict));
    }
    if (const auto& list = array()) {
        return PlistValue(std::make_shared<PlistArray>(*list));
    }
    if (const auto& bytes = dataValue()) {
        return PlistValue(std::make_shared<PlistData>(*bytes));
    }
    return *this;
}

PlistValue PlistValue::deepCopy() const {
    if (const auto& dict = dictionary()) {
        auto copy = PlistDictionary::create();
        copy->reserve(dict->size());
        for (const auto& [key, value] : *dict) {
            copy->set(key, value.deepCopy());
        }
        return PlistValue(std::move(copy));
    }
    if (const auto& list = array()) {
        auto copy = PlistArray::create();
        copy->reserve(list->size());
        for (const auto& value : *list) {
            copy->append(value.deepCopy());
        }
        return PlistValue(std::move(copy));
    }
    return shallowCopy();
}

bool PlistValue::operator==(const PlistValue& other) const {
    if (kind() != other.kind()) {
        return false;
    }
    switch (kind()) {
        case Kind::Dictionary: {
            const auto& a = *dictionary();
            const auto& b = *other.dictionary();
            return a.entries() == b.entries();
        }
        case Kind::Array:
            return array()->items() == other.array()->items();
        case Kind::Data:
            return *dataValue() == *other.dataValue();
        default:
            return value_ == other.value_;
    }
}

const PlistValue& PlistDictionary::get(std::string_view key) const {
    static const PlistValue kNone;
    const PlistValue* found = find(key);
    return found ? *found : kNone;
}

PlistArrayRef PlistArray::create(std::vector<PlistValue> items) {
    auto array = std::make_shared<PlistArray>();
    array->items_ = std::move(items);
    return array;
}

void PlistArray::removeRange(std::size_t first, std::size_t count) {
    if (first >= items_.size()) {
        return;
    }
    const std::size_t last = std::min(items_.size(), first + count);
    items_.erase(items_.begin() + static_cast<std::ptrdiff_t>(first),
                 items_.begin() + static_cast<std::ptrdiff_t>(last));
}

}  // namespace velmar
