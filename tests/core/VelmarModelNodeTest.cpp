#include "core/VelmarModelNode.h"

#include <gtest/gtest.h>

#include "core/ArrayLock.h"

namespace velmar {
namespace {

PlistValue dictionaryOf(std::initializer_list<std::pair<const char*, PlistValue>> entries) {
    auto dictionary = PlistDictionary::create();
    for (const auto& [key, value] : entries) {
        dictionary->set(key, value);
    }
    return dictionary;
}

PlistValue arrayOf(std::initializer_list<PlistValue> elements) {
    return PlistArray::create(elements);
}

std::vector<std::string> childNames(const VelmarModelNode& node) {
    std::vector<std::string> names;
    for (const auto& child : *node.childNodes()) {
        names.push_back(child->displayName());
    }
    return names;
}

class VelmarModelNodeTest : public ::testing::Test {
  protected:
    void TearDown() override { ArrayLock::releaseOutstandingForTesting(); }
    NodePathDictionary paths;
};

TEST_F(VelmarModelNodeTest, EmptyDictionaryGivesInnerNodeWithoutChildren) {
    auto root = VelmarModelNode::makeTreeFromObject(PlistValue::newDictionary(), paths);
    ASSERT_NE(root->childNodes(), nullptr);
    EXPECT_TRUE(root->childNodes()->empty());
    EXPECT_EQ(root->value(), nullptr);
    EXPECT_EQ(root->displayName(), "Velmar");
}

TEST_F(VelmarModelNodeTest, EmptyArrayGivesInnerNodeWithoutChildren) {
    auto root = VelmarModelNode::makeTreeFromObject(PlistValue::newArray(), paths);
    ASSERT_NE(root->childNodes(), nullptr);
    EXPECT_TRUE(root->childNodes()->empty());
}

TEST_F(VelmarModelNodeTest, SortedDictionaryOrdersByWholeKeyAndShowsPartAfterSemicolon) {
    auto root = VelmarModelNode::makeTreeFromObject(
        dictionaryOf({{"_sorted", "yes"}, {"2;Beta", "b"}, {"1;Alpha", "a"}}), paths);
    EXPECT_EQ(childNames(*root), (std::vector<std::string>{"Alpha", "Beta"}));
    ASSERT_TRUE(paths.contains("/Alpha"));
    ASSERT_TRUE(paths.contains("/Beta"));
    EXPECT_FALSE(paths.contains("/_sorted"));
    EXPECT_EQ(*(*paths.find("/Alpha"))->value(), "a");
    EXPECT_EQ(*(*paths.find("/Beta"))->value(), "b");
}

TEST_F(VelmarModelNodeTest, SortedOrderComparesStringsNotNumbers) {
    auto root = VelmarModelNode::makeTreeFromObject(
        dictionaryOf({{"2;y", "2"}, {"10;x", "10"}, {"_sorted", PlistValue::integer(1)}}), paths);
    EXPECT_EQ(childNames(*root), (std::vector<std::string>{"x", "y"}));
}

TEST_F(VelmarModelNodeTest, SortedKeysWithoutOrWithSeveralSemicolonsAreShownWhole) {
    auto root = VelmarModelNode::makeTreeFromObject(
        dictionaryOf({{"_sorted", ""}, {"b;c;d", "1"}, {"plain", "2"}}), paths);
    EXPECT_EQ(childNames(*root), (std::vector<std::string>{"b;c;d", "plain"}));
}

TEST_F(VelmarModelNodeTest, UnsortedDictionaryShowsKeyWholeInItsOwnOrder) {
    auto root = VelmarModelNode::makeTreeFromObject(dictionaryOf({{"z", "1"}, {"1;Alpha", "2"}}), paths);
    EXPECT_EQ(childNames(*root), (std::vector<std::string>{"z", "1;Alpha"}));
    EXPECT_TRUE(paths.contains("/1;Alpha"));
}

TEST_F(VelmarModelNodeTest, ArrayChildrenAreNamedByIndex) {
    auto root =
        VelmarModelNode::makeTreeFromObject(dictionaryOf({{"List", arrayOf({"a", "b", "c"})}}), paths);
    const auto& list = root->childNodes()->at(0);
    EXPECT_EQ(childNames(*list), (std::vector<std::string>{"0", "1", "2"}));
    EXPECT_TRUE(paths.contains("/List/0"));
    EXPECT_TRUE(paths.contains("/List/1"));
    EXPECT_TRUE(paths.contains("/List/2"));
    EXPECT_EQ(*(*paths.find("/List/2"))->value(), "c");
}

TEST_F(VelmarModelNodeTest, NonTextValuesAreShownAsUnknown) {
    auto root = VelmarModelNode::makeTreeFromObject(dictionaryOf({{"Number", PlistValue::integer(7)},
                                                                  {"Flag", PlistValue::boolean(true)},
                                                                  {"Bytes", PlistValue::data({1, 2})},
                                                                  {"When", PlistValue::date({0})}}),
                                                    paths);
    for (const char* path : {"/Number", "/Flag", "/Bytes", "/When"}) {
        const auto* node = paths.find(path);
        ASSERT_NE(node, nullptr) << path;
        ASSERT_NE((*node)->value(), nullptr);
        EXPECT_EQ(*(*node)->value(), "(unknown)");
        EXPECT_EQ((*node)->childNodes(), nullptr);
    }
}

TEST_F(VelmarModelNodeTest, PathDictionaryHoldsEveryNodeIncludingRoot) {
    auto root = VelmarModelNode::makeTreeFromObject(
        dictionaryOf({{"Cell", dictionaryOf({{"Level", "-80 dBm"}})}, {"List", arrayOf({"x"})}}), paths);
    EXPECT_EQ(paths.size(), 5u);
    ASSERT_TRUE(paths.contains("/"));
    EXPECT_EQ(*paths.find("/"), root);
    EXPECT_TRUE(paths.contains("/Cell"));
    EXPECT_TRUE(paths.contains("/Cell/Level"));
    EXPECT_TRUE(paths.contains("/List"));
    EXPECT_TRUE(paths.contains("/List/0"));
}

TEST_F(VelmarModelNodeTest, InnerNodeIsRecognisedByChildNodesAlone) {
    auto root =
        VelmarModelNode::makeTreeFromObject(dictionaryOf({{"Empty", PlistValue::newDictionary()}}), paths);
    const auto& empty = root->childNodes()->at(0);
    EXPECT_NE(empty->childNodes(), nullptr);
    EXPECT_EQ(empty->value(), nullptr);
}

TEST_F(VelmarModelNodeTest, NameWithSlashBecomesFurtherPathComponents) {
    VelmarModelNode::makeTreeFromObject(dictionaryOf({{"a/b", "1"}}), paths);
    EXPECT_TRUE(paths.contains("/a/b"));
}

TEST_F(VelmarModelNodeTest, LaterNodeWithSamePathReplacesEarlier) {
    VelmarModelNode::makeTreeFromObject(
        dictionaryOf({{"a/b", "first"}, {"a", dictionaryOf({{"b", "second"}})}}), paths);
    EXPECT_EQ(*(*paths.find("/a/b"))->value(), "second");
}

TEST(JoinDisplayPath, JoinsWithOneSlash) {
    EXPECT_EQ(joinDisplayPath("/", "Cell"), "/Cell");
    EXPECT_EQ(joinDisplayPath("/Cell", "Level"), "/Cell/Level");
    EXPECT_EQ(joinDisplayPath("/Cell/", "Level"), "/Cell/Level");
    EXPECT_EQ(joinDisplayPath("/Cell", "/Level/"), "/Cell/Level");
    EXPECT_EQ(joinDisplayPath("/", ""), "/");
}

}  // namespace
}  // namespace velmar
