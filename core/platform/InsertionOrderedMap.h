// InsertionOrderedMap: a string-keyed map that remembers the order in which keys were first inserted.
//
// Contract: iteration yields entries in first-insertion order; assigning to an existing key keeps its place;
// removing a key closes the gap. Lookups accept any string_view without building a std::string. Small maps
// are searched linearly; from kIndexThreshold entries on a hash index is kept beside the entries, so lookups
// stay constant-time for large dictionaries (templates, path dictionaries, subscriber tables). revision()
// changes whenever a key is added or removed, so a caller that keeps pointers to values knows when to drop
// them.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

namespace velmar {

template <typename Value>
class InsertionOrderedMap {
  public:
    using Entry = std::pair<std::string, Value>;
    static constexpr std::size_t kIndexThreshold = 12;

    InsertionOrderedMap() = default;
    InsertionOrderedMap(const InsertionOrderedMap&) = default;
    InsertionOrderedMap(InsertionOrderedMap&&) noexcept = default;
    // Assigning replaces every entry: the revision moves on, whatever the other map's says.
    InsertionOrderedMap& operator=(const InsertionOrderedMap& other) {
        if (this != &other) {
            entries_ = other.entries_;
            index_ = other.index_;
            ++revision_;
        }
        return *this;
    }
    InsertionOrderedMap& operator=(InsertionOrderedMap&& other) noexcept {
        if (this != &other) {
            entries_ = std::move(other.entries_);
            index_ = std::move(other.index_);
            ++revision_;
            ++other.revision_;
        }
        return *this;
    }

    std::size_t size() const { return entries_.size(); }
    bool empty() const { return entries_.empty(); }
    std::uint64_t revision() const { return revision_; }

    const Value* find(std::string_view key) const {
        const std::size_t at = indexOf(key);
        return at == npos ? nullptr : &entries_[at].second;
    }
    Value* find(std::string_view key) {
        const std::size_t at = indexOf(key);
        return at == npos ? nullptr : &entries_[at].second;
    }
    bool contains(std::string_view key) const { return indexOf(key) != npos; }

    // Sets key to value; an existing key keeps its position. Returns a reference to the stored value.
    Value& set(std::string_view key, Value value) {
        const std::size_t at = indexOf(key);
        if (at != npos) {
            entries_[at].second = std::move(value);
            return entries_[at].second;
        }
        entries_.emplace_back(std::string(key), std::move(value));
        ++revision_;
        if (!index_.empty()) {
            index_.emplace(entries_.back().first, entries_.size() - 1);
        } else if (entries_.size() >= kIndexThreshold) {
            rebuildIndex();
        }
        return entries_.back().second;
    }

    // Returns the value under key, inserting a default-constructed one at the end when absent.
    Value& findOrInsert(std::string_view key) {
        if (Value* existing = find(key)) {
            return *existing;
        }
        return set(key, Value{});
    }

    bool remove(std::string_view key) {
        const std::size_t at = indexOf(key);
        if (at == npos) {
            return false;
        }
        entries_.erase(entries_.begin() + static_cast<std::ptrdiff_t>(at));
        ++revision_;
        if (!index_.empty()) {
            rebuildIndex();
        }
        return true;
    }

    void clear() {
        entries_.clear();
        index_.clear();
        ++revision_;
    }

    void reserve(std::size_t count) {
        entries_.reserve(count);
        ++revision_;  // the values may have moved
    }

    const std::vector<Entry>& entries() const { return entries_; }
    auto begin() const { return entries_.begin(); }
    auto end() const { return entries_.end(); }

  private:
    static constexpr std::size_t npos = static_cast<std::size_t>(-1);

    struct TransparentHash {
        using is_transparent = void;
        std::size_t operator()(std::string_view text) const { return std::hash<std::string_view>{}(text); }
    };

    std::size_t indexOf(std::string_view key) const {
        if (!index_.empty()) {
            const auto hit = index_.find(key);
            return hit == index_.end() ? npos : hit->second;
        }
        for (std::size_t i = 0; i < entries_.size(); ++i) {
            if (entries_[i].first == key) {
                return i;
            }
        }
        return npos;
    }

    void rebuildIndex() {
        index_.clear();
        if (entries_.size() < kIndexThreshold) {
            return;
        }
        index_.reserve(entries_.size() * 2);
        for (std::size_t i = 0; i < entries_.size(); ++i) {
            index_.emplace(entries_[i].first, i);
        }
    }

    std::vector<Entry> entries_;
    std::uint64_t revision_ = 0;
    std::unordered_map<std::string, std::size_t, TransparentHash, std::equal_to<>> index_;
};

}  // namespace velmar
