// The object-based GSM generator: deserialising blobs of either encoding, the collapsing rule, the state it
// writes, and its two assertion failures.
#include <gtest/gtest.h>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "LogGenerator/GSM/InternalInconsistencyException.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/Json.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/ObjectBlobRecords.h"

namespace velmar {
namespace {

using namespace state_keys;

std::string json(const PlistValue& value) {
    return plistToJson(value);
}

PlistData xmlBlob(const PlistValue& tree) {
    return buildObjectBlob(tree, ObjectBlobEncoding::Xml);
}
PlistData binaryBlob(const PlistValue& tree) {
    return buildObjectBlob(tree, ObjectBlobEncoding::Binary);
}

// {"Cell": {"ARFCN": "12"}} and friends, written as the baseband writes them.
PlistValue cellTree() {
    return objectTree({objectGroup("Cell", {objectText("ARFCN", "12")})});
}

struct Fixture {
    GSMLogGenerator generator;
    StateDict state = PlistDictionary::create();
    std::string shown() const { return json(state->get(kDisplay)); }
};

TEST(ObjectGenerator, SingleEntryDictionaryCollapsesButNotAtTheTop) {
    Fixture f;
    f.generator.updateState(f.state, xmlBlob(cellTree()));
    EXPECT_EQ(f.shown(), R"({"Cell": "12"})");
}

TEST(ObjectGenerator, ChainOfSingleEntryDictionariesCollapsesToTheInnermostValue) {
    Fixture f;
    const PlistValue tree = objectTree({objectGroup("A", {objectGroup("B", {objectText("C", "x")})})});
    f.generator.updateState(f.state, xmlBlob(tree));
    EXPECT_EQ(f.shown(), R"({"A": "x"})");
}

TEST(ObjectGenerator, ArrayElementsCollapseOneByOne) {
    Fixture f;
    auto top = PlistArray::create();
    top->append("a");
    top->append(objectTree({objectText("k", "v")}));
    top->append(objectTree({objectText("p", "1"), objectText("q", "2")}));
    f.generator.updateState(f.state, binaryBlob(top));
    EXPECT_EQ(f.shown(), R"(["a", "v", {"p": "1", "q": "2"}])");
}

TEST(ObjectGenerator, EmptyDictionariesStayEmpty) {
    Fixture f;
    f.generator.updateState(f.state, xmlBlob(objectTree({objectGroup("E", {}), objectText("F", "1")})));
    EXPECT_EQ(f.shown(), R"({"E": {}, "F": "1"})");
    f.generator.updateState(f.state, xmlBlob(objectTree({})));
    EXPECT_EQ(f.shown(), "{}");
}

TEST(ObjectGenerator, ListsAndGroupsNestedDeeply) {
    Fixture f;
    const PlistValue tree = objectTree({
        objectGroup("Serving", {objectText("ARFCN", "62"), objectGroup("Level", {objectText("dBm", "-71")})}),
        objectList("Neighbours", {objectGroup("", {objectText("ARFCN", "70")}),
                                  objectGroup("", {objectText("ARFCN", "75"), objectText("RSSI", "-90")})}),
    });
    f.generator.updateState(f.state, binaryBlob(tree));
    EXPECT_EQ(
        f.shown(),
        R"({"Serving": {"ARFCN": "62", "Level": "-71"}, "Neighbours": ["70", {"ARFCN": "75", "RSSI": "-90"}]})");
}

TEST(ObjectGenerator, TopLevelStringIsShownAsItStands) {
    Fixture f;
    f.generator.updateState(f.state, xmlBlob(PlistValue("No service")));
    EXPECT_EQ(f.shown(), R"("No service")");
}

TEST(ObjectGenerator, StateHoldsTheDeserialisedObjectAndANewExtraInfoPerBlob) {
    Fixture f;
    f.generator.updateState(f.state, binaryBlob(cellTree()));
    EXPECT_EQ(json(f.state->get(kDisplayState)), R"({"Cell": {"ARFCN": "12"}})");
    const PlistDictionaryRef firstExtra = f.state->get(kExtraInfo).dictionary();
    ASSERT_TRUE(firstExtra);
    EXPECT_TRUE(firstExtra->empty());
    firstExtra->set("scribble", "1");

    f.generator.updateState(f.state, xmlBlob(objectTree({objectText("LAC", "0x1A2B")})));
    const PlistDictionaryRef secondExtra = f.state->get(kExtraInfo).dictionary();
    ASSERT_TRUE(secondExtra);
    EXPECT_NE(secondExtra, firstExtra);
    EXPECT_TRUE(secondExtra->empty());
    EXPECT_EQ(json(f.state->get(kDisplayState)), R"({"LAC": "0x1A2B"})");
    EXPECT_EQ(f.shown(), R"({"LAC": "0x1A2B"})");
}

TEST(ObjectGenerator, RefreshAppendsHistoryAndAnswersTheDisplay) {
    Fixture f;
    EXPECT_TRUE(f.generator.generateLogUsingState(f.state).isNone());
    f.generator.updateState(f.state, xmlBlob(cellTree()));
    const PlistValue display = f.generator.generateLogUsingState(f.state);
    EXPECT_EQ(json(display), R"({"Cell": "12"})");
    const PlistArrayRef history = f.state->get(kHistory).array();
    ASSERT_TRUE(history);
    ASSERT_EQ(history->size(), 2u);
    // Before the first blob the state had no "DisplayState": that entry is empty.
    EXPECT_TRUE(history->at(0).dictionary()->empty());
    EXPECT_EQ(json(history->at(1).dictionary()->get(kDisplay)), R"({"Cell": "12"})");
}

TEST(ObjectGenerator, StartCommandOnlyStartsStreaming) {
    GSMLogGenerator generator;
    EXPECT_EQ(json(generator.getStartCommand()), R"({"SetState": "Streaming"})");
}

TEST(ObjectGenerator, SaveContentsAreTheHistoryWithoutADlf) {
    Fixture f;
    EXPECT_EQ(json(f.generator.getSaveContentsFromState(f.state)), "[]");
    f.generator.updateState(f.state, xmlBlob(cellTree()));
    f.generator.generateLogUsingState(f.state);
    f.generator.generateLogUsingState(f.state);
    const PlistArrayRef contents = f.generator.getSaveContentsFromState(f.state).array();
    ASSERT_TRUE(contents);
    ASSERT_EQ(contents->size(), 2u);
    const PlistArrayRef history = f.state->get(kHistory).array();
    EXPECT_NE(contents, history);
    EXPECT_EQ(contents->at(0).dictionary(), history->at(0).dictionary());
    EXPECT_EQ(contents->at(1).dictionary(), history->at(1).dictionary());
}

TEST(ObjectGenerator, CanCollapse) {
    GSMLogGenerator generator;
    EXPECT_EQ(generator.canCollapse(objectTree({objectText("k", "v")})), PlistValue("v"));
    EXPECT_TRUE(generator.canCollapse(objectTree({})).isNone());
    EXPECT_TRUE(generator.canCollapse(objectTree({objectText("a", "1"), objectText("b", "2")})).isNone());
    EXPECT_TRUE(generator.canCollapse(PlistValue("v")).isNone());
    auto single = PlistArray::create();
    single->append("v");
    EXPECT_TRUE(generator.canCollapse(single).isNone());
}

TEST(ObjectGenerator, FactoryGivesItToTheIfxTechnology) {
    const auto generator = LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_IFX);
    ASSERT_TRUE(generator);
    EXPECT_NE(dynamic_cast<GSMLogGenerator*>(generator.get()), nullptr);
}

// The failure raised by updateState, or a failure with line 0 when none was raised.
InternalInconsistencyException failureOf(Fixture& f, const PlistData& blob) {
    try {
        f.generator.updateState(f.state, blob);
    } catch (const InternalInconsistencyException& failure) {
        return failure;
    }
    return InternalInconsistencyException("", "", "", 0, "");
}

TEST(ObjectGenerator, UndecodableBlobRaisesLine90AndLeavesTheState) {
    Fixture f;
    f.generator.updateState(f.state, xmlBlob(cellTree()));
    const PlistValue displayBefore = f.state->get(kDisplay);
    const PlistValue extraBefore = f.state->get(kExtraInfo);
    const std::string text = "<plist><dict><key>a</key>";
    const InternalInconsistencyException failure = failureOf(f, PlistData(text.begin(), text.end()));
    EXPECT_EQ(failure.file(), "LogGenerator/GSM/GSMLogGenerator");
    EXPECT_EQ(failure.line(), 90);
    EXPECT_EQ(failure.description(), "Could not deserialize the object");
    EXPECT_EQ(failure.method(), "updateState:withData:");
    EXPECT_EQ(std::string(failure.what()),
              "Assertion failure in updateState:withData: (LogGenerator/GSM/GSMLogGenerator:90): Could not "
              "deserialize the object");
    EXPECT_EQ(f.state->get(kDisplay).dictionary(), displayBefore.dictionary());
    EXPECT_EQ(f.state->get(kExtraInfo).dictionary(), extraBefore.dictionary());

    EXPECT_EQ(failureOf(f, PlistData{}).line(), 90);
    EXPECT_EQ(failureOf(f, PlistData{0x01, 0x02, 0x03}).line(), 90);
}

TEST(ObjectGenerator, EveryLeafThatIsNotAStringRaisesLine78WithItsTypeName) {
    const std::vector<std::pair<PlistValue, std::string>> leaves{
        {PlistValue::integer(12), "integer"},   {PlistValue::real(1.5), "real"},
        {PlistValue::boolean(true), "boolean"}, {PlistValue::data({1, 2}), "data"},
        {PlistValue::date({86400.0}), "date"},
    };
    for (const auto& [leaf, typeName] : leaves) {
        for (const ObjectBlobEncoding encoding : {ObjectBlobEncoding::Xml, ObjectBlobEncoding::Binary}) {
            Fixture f;
            f.generator.updateState(f.state, xmlBlob(cellTree()));
            const PlistValue stateBefore = f.state->get(kDisplayState);
            // Deep inside a group, beside a string.
            auto inner = PlistDictionary::create();
            inner->set("ok", "1");
            inner->set("bad", leaf);
            const PlistValue tree = objectTree({objectText("Top", "t")});
            tree.dictionary()->set("Inner", inner);
            const InternalInconsistencyException failure = failureOf(f, buildObjectBlob(tree, encoding));
            EXPECT_EQ(failure.file(), "LogGenerator/GSM/GSMLogGenerator") << typeName;
            EXPECT_EQ(failure.line(), 78) << typeName;
            EXPECT_EQ(failure.method(), "processObject:") << typeName;
            EXPECT_EQ(failure.description(), "Unknown object of type " + typeName + " encountered");
            EXPECT_EQ(f.state->get(kDisplayState).dictionary(), stateBefore.dictionary()) << typeName;
            EXPECT_EQ(f.shown(), R"({"Cell": "12"})") << typeName;
        }
    }
}

TEST(ObjectGenerator, NumberAsTheTopLevelObjectOrInAnArrayRaisesLine78) {
    Fixture f;
    EXPECT_EQ(failureOf(f, xmlBlob(PlistValue::integer(5))).description(),
              "Unknown object of type integer encountered");
    auto list = PlistArray::create();
    list->append("a");
    list->append(PlistValue::real(2.0));
    EXPECT_EQ(failureOf(f, binaryBlob(list)).description(), "Unknown object of type real encountered");
    EXPECT_TRUE(f.state->empty());
}

}  // namespace
}  // namespace velmar
