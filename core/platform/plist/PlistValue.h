// PlistValue: one property-list value (dictionary, array, string, integer, real, boolean, data, date) or
// none.
//
// Contract: dictionaries, arrays and data are held by shared reference, so copying a PlistValue shares the
// container (a shallow copy) exactly as the monitor's state dictionary expects: a history entry made from a
// copy of "Display" sees later in-place changes below its first level. Dictionaries keep insertion order and
// have string keys only. A default-constructed value is "none" (the null of a missing value); it is never a
// valid element of a serialised property list.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "core/platform/InsertionOrderedMap.h"

namespace velmar {

class PlistValue;
class PlistDictionary;
class PlistArray;
using PlistDictionaryRef = std::shared_ptr<PlistDictionary>;
using PlistArrayRef = std::shared_ptr<PlistArray>;
using PlistData = std::vector<std::uint8_t>;
using PlistDataRef = std::shared_ptr<PlistData>;

// An instant, as seconds since 1970-01-01 00:00:00 UTC (fractions allowed).
struct PlistDate {
    double secondsSince1970 = 0;
    bool operator==(const PlistDate&) const = default;
};

class PlistValue {
  public:
    enum class Kind : std::uint8_t { None, Dictionary, Array, String, Integer, Real, Boolean, Data, Date };

    PlistValue() noexcept = default;
    PlistValue(PlistDictionaryRef dictionary);  // NOLINT(google-explicit-constructor): values convert freely
    PlistValue(PlistArrayRef array);            // NOLINT(google-explicit-constructor)
    PlistValue(std::string text);               // NOLINT(google-explicit-constructor)
    PlistValue(std::string_view text);          // NOLINT(google-explicit-constructor)
    PlistValue(const char* text);               // NOLINT(google-explicit-constructor)
    PlistValue(PlistDataRef data);              // NOLINT(google-explicit-constructor)

    static PlistValue integer(std::int64_t number);
    static PlistValue real(double number);
    static PlistValue boolean(bool flag);
    static PlistValue data(PlistData bytes);
    static PlistValue date(PlistDate instant);
    static PlistValue newDictionary();
    static PlistValue newArray();

    Kind kind() const { return static_cast<Kind>(value_.index()); }
    bool isNone() const { return kind() == Kind::None; }
    bool isDictionary() const { return kind() == Kind::Dictionary; }
    bool isArray() const { return kind() == Kind::Array; }
    bool isString() const { return kind() == Kind::String; }
    bool isInteger() const { return kind() == Kind::Integer; }
    bool isReal() const { return kind() == Kind::Real; }
    bool isNumber() const { return isInteger() || isReal(); }
    bool isBoolean() const { return kind() == Kind::Boolean; }
    bool isData() const { return kind() == Kind::Data; }
    bool isDate() const { return kind() == Kind::Date; }

    // Accessors answer null / nullopt when the value is of another kind.
    // Inline: the decoders and the display ask these once per record.
    const PlistDictionaryRef& dictionary() const {
        const auto* held = std::get_if<PlistDictionaryRef>(&value_);
        return held ? *held : kNoDictionary;
    }
    const PlistArrayRef& array() const {
        const auto* held = std::get_if<PlistArrayRef>(&value_);
        return held ? *held : kNoArray;
    }
    const std::string* string() const;
    std::optional<std::int64_t> integerValue() const;
    std::optional<double> realValue() const;
    std::optional<bool> booleanValue() const;
    const PlistDataRef& dataValue() const;
    std::optional<PlistDate> dateValue() const;

    // The kind's name, as shown in messages ("dictionary", "array", "string", "integer", "real", "boolean",
    // "data", "date", "none").
    std::string_view typeName() const;

    // A new top-level container holding the same elements (nested containers shared); other kinds are
    // returned as they are.
    PlistValue shallowCopy() const;
    // A copy in which every container, at every depth, is new; strings, numbers, data and dates are copied.
    PlistValue deepCopy() const;

    // Deep structural equality (containers compared by content, dictionaries in order).
    bool operator==(const PlistValue& other) const;

  private:
    // What dictionary() and array() answer for a value of another kind.
    static inline const PlistDictionaryRef kNoDictionary{};
    static inline const PlistArrayRef kNoArray{};

    std::variant<std::monostate, PlistDictionaryRef, PlistArrayRef, std::string, std::int64_t, double, bool,
                 PlistDataRef, PlistDate>
        value_;
};

// A mutable, insertion-ordered dictionary of string keys.
class PlistDictionary {
  public:
    using Entry = std::pair<std::string, PlistValue>;

    static PlistDictionaryRef create() { return std::make_shared<PlistDictionary>(); }

    std::size_t size() const { return map_.size(); }
    bool empty() const { return map_.empty(); }
    // Changes whenever a key is added or removed (or storage reserved): until it does, a pointer that find()
    // answered stays valid and keeps showing the key's current value.
    std::uint64_t revision() const { return map_.revision(); }
    // The stored value, or null when the key is absent.
    const PlistValue* find(std::string_view key) const { return map_.find(key); }
    // The stored value, or a none value when the key is absent. The reference stays valid until the
    // dictionary changes.
    const PlistValue& get(std::string_view key) const;
    bool contains(std::string_view key) const { return map_.contains(key); }
    void set(std::string_view key, PlistValue value) { map_.set(key, std::move(value)); }
    bool remove(std::string_view key) { return map_.remove(key); }
    void clear() { map_.clear(); }
    void reserve(std::size_t count) { map_.reserve(count); }

    const std::vector<Entry>& entries() const { return map_.entries(); }
    auto begin() const { return map_.begin(); }
    auto end() const { return map_.end(); }

  private:
    InsertionOrderedMap<PlistValue> map_;
};

// A mutable array of values.
class PlistArray {
  public:
    static PlistArrayRef create() { return std::make_shared<PlistArray>(); }
    static PlistArrayRef create(std::vector<PlistValue> items);

    std::size_t size() const { return items_.size(); }
    bool empty() const { return items_.empty(); }
    const PlistValue& at(std::size_t index) const { return items_.at(index); }
    void append(PlistValue value) { items_.push_back(std::move(value)); }
    void clear() { items_.clear(); }
    void reserve(std::size_t count) { items_.reserve(count); }
    // Removes count elements starting at first (clamped to the array's end).
    void removeRange(std::size_t first, std::size_t count);

    std::vector<PlistValue>& items() { return items_; }
    const std::vector<PlistValue>& items() const { return items_; }
    auto begin() const { return items_.begin(); }
    auto end() const { return items_.end(); }

  private:
    std::vector<PlistValue> items_;
};

}  // namespace velmar
