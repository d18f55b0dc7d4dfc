#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "core/platform/InsertionOrderedMap.h"

namespace velmar {
namespace {

std::vector<std::string> keysOf(const InsertionOrderedMap<int>& map) {
    std::vector<std::string> keys;
    for (const auto& [key, value] : map) {
        keys.push_back(key);
    }
    return keys;
}

TEST(InsertionOrderedMap, KeysKeepTheirFirstPlaceAndRemovalClosesTheGap) {
    InsertionOrderedMap<int> map;
    map.set("b", 1);
    map.set("a", 2);
    map.set("b", 3);
    EXPECT_EQ(keysOf(map), (std::vector<std::string>{"b", "a"}));
    EXPECT_EQ(*map.find("b"), 3);
    EXPECT_TRUE(map.remove("b"));
    EXPECT_FALSE(map.remove("b"));
    EXPECT_EQ(keysOf(map), std::vector<std::string>{"a"});
}

TEST(InsertionOrderedMap, LargeMapsAreFoundThroughTheirIndex) {
    InsertionOrderedMap<int> map;
    for (int i = 0; i < 40; ++i) {
        map.set(std::to_string(i), i);
    }
    EXPECT_EQ(*map.find("27"), 27);
    EXPECT_TRUE(map.remove("3"));
    EXPECT_EQ(map.find("3"), nullptr);
    EXPECT_EQ(*map.find("39"), 39);
    EXPECT_EQ(map.size(), 39u);
}

TEST(InsertionOrderedMap, RevisionChangesWhenAKeyComesOrGoesNotWhenAValueChanges) {
    InsertionOrderedMap<int> map;
    std::uint64_t revision = map.revision();
    map.set("a", 1);
    EXPECT_NE(map.revision(), revision);
    revision = map.revision();
    const int* slot = map.find("a");
    map.set("a", 2);
    map.findOrInsert("a") = 3;
    EXPECT_EQ(map.revision(), revision);
    EXPECT_EQ(map.find("a"), slot);  // the pointer kept from before shows the current value
    EXPECT_EQ(*slot, 3);
    map.findOrInsert("b");
    EXPECT_NE(map.revision(), revision);
    revision = map.revision();
    map.remove("missing");
    EXPECT_EQ(map.revision(), revision);
    map.remove("a");
    EXPECT_NE(map.revision(), revision);
    revision = map.revision();
    map.reserve(100);
    EXPECT_NE(map.revision(), revision);
    revision = map.revision();
    map.clear();
    EXPECT_NE(map.revision(), revision);

    // Assignment replaces the entries, so it moves the revision on even when the other map's matches.
    InsertionOrderedMap<int> other;
    while (other.revision() < map.revision()) {
        other.set("x", 1);
        other.remove("x");
    }
    other.set("y", 2);
    revision = map.revision();
    map = other;
    EXPECT_NE(map.revision(), revision);
    revision = map.revision();
    const std::uint64_t otherRevision = other.revision();
    map = std::move(other);
    EXPECT_NE(map.revision(), revision);
    EXPECT_NE(other.revision(), otherRevision);  // NOLINT(bugprone-use-after-move): emptied, and says so
    EXPECT_EQ(*map.find("y"), 2);
}

}  // namespace
}  // namespace velmar
