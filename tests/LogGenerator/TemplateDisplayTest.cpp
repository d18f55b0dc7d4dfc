#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>

#include "LogGenerator/StateKeys.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "tests/LogGenerator/RecordingDecoder.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using namespace state_keys;
using testing::RecordingGenerator;

constexpr const char* kTemplateText = R"(<?xml version="1.0" encoding="UTF-8"?>
<!DOCTYPE plist PUBLIC "-//Brindle//DTD PLIST 1.0//EN" "PropertyList-1.0.dtd">
<plist version="1.0">
<dict>
	<key>Radio</key>
	<dict>
		<key>Label</key>
		<string>Serving cell</string>
		<key>Serving</key>
		<dict/>
	</dict>
	<key>Lists</key>
	<array>
		<string>static</string>
		<dict>
			<key>Neighbours</key>
			<array/>
		</dict>
	</array>
</dict>
</plist>
)";

class TemplateDisplayTest : public ::testing::Test {
  protected:
    void SetUp() override {
        previousResourceDir_ = std::getenv("VELMAR_RESOURCE_DIR") ? std::getenv("VELMAR_RESOURCE_DIR") : "";
        setenv("VELMAR_RESOURCE_DIR", resources_.path().c_str(), 1);
        testing::writeWholeFile(resources_.file("Test.plist"), kTemplateText);
        testing::receivedPackets().clear();
    }
    void TearDown() override { setenv("VELMAR_RESOURCE_DIR", previousResourceDir_.c_str(), 1); }

    static std::vector<std::uint8_t> packet(std::uint16_t code) {
        std::vector<std::uint8_t> bytes(20, 0);
        bytes[0] = 1;
        bytes[1] = 19;
        bytes[3] = static_cast<std::uint8_t>(code);
        bytes[4] = static_cast<std::uint8_t>(code >> 8);
        return bytes;
    }

    testing::TemporaryDirectory resources_;
    std::string previousResourceDir_;
    StateDict state = PlistDictionary::create();
};

TEST_F(TemplateDisplayTest, FirstRefreshReturnsNullAndStoresTheDisplaySecondReturnsIt) {
    RecordingGenerator generator("Test", {{"Serving", std::vector<std::int32_t>{1}}});
    EXPECT_TRUE(generator.generateLogUsingState(state).isNone());
    ASSERT_TRUE(state->contains(kDisplay));
    EXPECT_TRUE(state->contains(kTemplate));
    EXPECT_TRUE(state->get(kExtraInfo).isDictionary());
    EXPECT_TRUE(state->get(kExtraInfo).dictionary()->empty());
    const PlistValue second = generator.generateLogUsingState(state);
    ASSERT_TRUE(second.isDictionary());
    EXPECT_EQ(second.dictionary(), state->get(kDisplay).dictionary());
}

TEST_F(TemplateDisplayTest, DisplayIsAMutableCopyOfTheTemplate) {
    RecordingGenerator generator("Test", {});
    generator.getDisplayFromState(state);
    const PlistValue display = state->get(kDisplay);
    EXPECT_EQ(display, state->get(kTemplate));
    EXPECT_NE(display.dictionary(), state->get(kTemplate).dictionary());
    EXPECT_NE(display.dictionary()->get("Radio").dictionary(),
              state->get(kTemplate).dictionary()->get("Radio").dictionary());
}

TEST_F(TemplateDisplayTest, SectionKeysBindDecodersWhereverTheyStand) {
    RecordingGenerator generator("Test", {{"Serving", std::vector<std::int32_t>{1}},
                                          {"Neighbours", std::vector<std::int32_t>{2}},
                                          {"Absent", std::vector<std::int32_t>{3}}});
    generator.updateState(state, packet(1));
    const PlistDictionaryRef serving =
        state->get(kDisplay).dictionary()->get("Radio").dictionary()->get("Serving").dictionary();
    ASSERT_TRUE(serving);
    EXPECT_EQ(*serving->get("Length").string(), "20");
    // Decoders bound to an array, and decoders without a section, receive packets all the same.
    generator.updateState(state, packet(2));
    generator.updateState(state, packet(3));
    EXPECT_EQ(testing::receivedPackets().size(), 3u);
    EXPECT_TRUE(state->get(kDisplay)
                    .dictionary()
                    ->get("Lists")
                    .array()
                    ->at(1)
                    .dictionary()
                    ->get("Neighbours")
                    .isArray());
}

TEST_F(TemplateDisplayTest, ANewGeneratorWritesIntoTheDisplayKeptInTheState) {
    // The state outlives the generator: after a channel restart a new generator of the same technology finds
    // the display in it and its decoders must write there, or the screen freezes.
    PlistDictionaryRef serving;
    {
        RecordingGenerator first("Test", {{"Serving", std::vector<std::int32_t>{1}}});
        first.updateState(state, packet(1));
        serving = state->get(kDisplay).dictionary()->get("Radio").dictionary()->get("Serving").dictionary();
        ASSERT_TRUE(serving);
        EXPECT_EQ(*serving->get("Length").string(), "20");
    }
    const PlistDictionaryRef keptDisplay = state->get(kDisplay).dictionary();
    RecordingGenerator second("Test", {{"Serving", std::vector<std::int32_t>{1}}});
    std::vector<std::uint8_t> longer = packet(1);
    longer.resize(33);
    second.updateState(state, longer);
    EXPECT_EQ(state->get(kDisplay).dictionary(), keptDisplay);
    EXPECT_EQ(*serving->get("Length").string(), "33");
    // The kept display is returned as it stands, not rebuilt.
    EXPECT_EQ(second.generateLogUsingState(state).dictionary(), keptDisplay);
}

TEST_F(TemplateDisplayTest, ADisplayPutInPlaceOfTheBoundOneBetweenPacketsIsWrittenTo) {
    // The generator remembers where the state keeps its display; a new tree stored under the same key (the
    // state gains no key) must still be noticed, and the decoders bound to it.
    RecordingGenerator generator("Test", {{"Serving", std::vector<std::int32_t>{1}}});
    generator.updateState(state, packet(1));
    const PlistDictionaryRef first = state->get(kDisplay).dictionary();
    ASSERT_TRUE(first);
    StateDict other = PlistDictionary::create();
    {
        RecordingGenerator builder("Test", {{"Serving", std::vector<std::int32_t>{1}}});
        builder.generateLogUsingState(other);
    }
    const PlistDictionaryRef replacement = other->get(kDisplay).dictionary();
    ASSERT_TRUE(replacement);
    state->set(kDisplay, replacement);
    std::vector<std::uint8_t> longer = packet(1);
    longer.resize(41);
    generator.updateState(state, longer);
    const auto servingOf = [](const PlistDictionaryRef& display) {
        return display->get("Radio").dictionary()->get("Serving").dictionary();
    };
    EXPECT_EQ(*servingOf(replacement)->get("Length").string(), "41");
    EXPECT_EQ(*servingOf(first)->get("Length").string(), "20");

    // A display removed from the state is built again at the next packet.
    state->remove(kDisplay);
    generator.updateState(state, packet(1));
    const PlistDictionaryRef rebuilt = state->get(kDisplay).dictionary();
    ASSERT_TRUE(rebuilt);
    EXPECT_NE(rebuilt, replacement);
    EXPECT_EQ(*servingOf(rebuilt)->get("Length").string(), "20");
}

TEST_F(TemplateDisplayTest, ADisplayBuiltFromAnotherTemplateGivesWayToTheNewGeneratorsOwn) {
    testing::writeWholeFile(resources_.file("Other.plist"), R"(<?xml version="1.0" encoding="UTF-8"?>
<plist version="1.0"><dict><key>Other</key><dict><key>Serving</key><dict/></dict></dict></plist>
)");
    {
        RecordingGenerator first("Test", {{"Serving", std::vector<std::int32_t>{1}}});
        first.updateState(state, packet(1));
    }
    RecordingGenerator second("Other", {{"Serving", std::vector<std::int32_t>{1}}});
    testing::LogCapture capture;
    second.updateState(state, packet(1));
    ASSERT_FALSE(capture.texts().empty());
    EXPECT_EQ(capture.texts().front(), "The kept display was built from another template; building Other");
    const PlistDictionaryRef display = state->get(kDisplay).dictionary();
    ASSERT_TRUE(display);
    EXPECT_FALSE(display->contains("Radio"));
    const PlistDictionaryRef serving = display->get("Other").dictionary()->get("Serving").dictionary();
    ASSERT_TRUE(serving);
    EXPECT_EQ(*serving->get("Length").string(), "20");
}

TEST_F(TemplateDisplayTest, BuildingTheTreeLogsItsDiagnostics) {
    RecordingGenerator generator("Test", {{"Serving", std::vector<std::int32_t>{1}}});
    testing::LogCapture capture;
    generator.getDisplayFromState(state);
    const std::string initialized =
        stringWithFormat("Initialized class index: %p, Self: %p",
                         static_cast<const void*>(generator.classIndex()), static_cast<void*>(&generator));
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{initialized, "Dictionary = 1", "String = 0", "Serving"}));
    capture.clear();
    generator.getDisplayFromState(state);
    EXPECT_TRUE(capture.lines().empty());
}

TEST_F(TemplateDisplayTest, MissingTemplateIsLoggedAndRetried) {
    RecordingGenerator generator("Missing", {});
    testing::LogCapture capture;
    EXPECT_TRUE(generator.getDisplayFromState(state).isNone());
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{{kLogError, "Cannot load template for display"}}));
    EXPECT_FALSE(state->contains(kDisplay));
    generator.getDisplayFromState(state);
    EXPECT_EQ(capture.lines().size(), 2u);
}

TEST_F(TemplateDisplayTest, TemplateWithANumberCannotBeProcessed) {
    auto badTemplate = PlistDictionary::create();
    badTemplate->set("Count", PlistValue::integer(3));
    state->set(kTemplate, badTemplate);
    RecordingGenerator generator("Test", {});
    testing::LogCapture capture;
    generator.getDisplayFromState(state);
    EXPECT_TRUE(capture.contains("Received an object of unknown type"));
    EXPECT_TRUE(capture.contains("Processing the template"));
    EXPECT_EQ(capture.textsAt(kLogWarning).back(), "Processing the template");
    EXPECT_FALSE(state->contains(kDisplay));
}

TEST_F(TemplateDisplayTest, PrintDictReportsValuesOfUnknownType) {
    RecordingGenerator generator("Test", {});
    testing::LogCapture capture;
    auto tree = PlistDictionary::create();
    tree->set("ok", "text");
    tree->set("list", PlistArray::create({PlistValue::boolean(true)}));
    generator.printDict(tree);
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{{kLogError, "Received an object of unknown type"}}));
}

TEST_F(TemplateDisplayTest, RefreshMovesTheBlobsOfTheIntervalIntoDisplayState) {
    RecordingGenerator generator("Test", {});
    const auto blob = packet(9);
    generator.updateState(state, blob);
    generator.generateLogUsingState(state);
    EXPECT_EQ(*state->get(kDisplayState).dataValue(), PlistData(blob.begin(), blob.end()));
    EXPECT_TRUE(generator.binData()->empty());
    generator.generateLogUsingState(state);
    EXPECT_TRUE(state->get(kDisplayState).dataValue()->empty());
    EXPECT_EQ(state->get(kHistory).array()->size(), 2u);
}

TEST_F(TemplateDisplayTest, StartCommandSplitsPlainAndExtraCodes) {
    RecordingGenerator generator("Test", {{"A", std::vector<std::int32_t>{45433, 16716340}}});
    const PlistValue command = generator.getStartCommand();
    auto expected = PlistDictionary::create();
    expected->set("SetState", "Streaming");
    expected->set("SetOrvaneLogCodes", PlistArray::create({PlistValue::integer(45433)}));
    expected->set("SetKxExtraCodes", PlistArray::create({PlistValue::integer(4660)}));
    EXPECT_EQ(command, PlistValue(expected));
}

TEST_F(TemplateDisplayTest, StartCommandWithoutCodesHasEmptyArrays) {
    RecordingGenerator generator("Test", {});
    const PlistDictionaryRef command = generator.getStartCommand().dictionary();
    ASSERT_TRUE(command);
    EXPECT_EQ(*command->get("SetState").string(), "Streaming");
    EXPECT_TRUE(command->get("SetOrvaneLogCodes").array()->empty());
    EXPECT_TRUE(command->get("SetKxExtraCodes").array()->empty());
}

TEST_F(TemplateDisplayTest, CreationAndDestructionLogLines) {
    testing::LogCapture capture;
    std::string address;
    std::string index;
    {
        RecordingGenerator generator("Test", {});
        address = stringWithFormat("%p", static_cast<void*>(&generator));
        index = stringWithFormat("%p", static_cast<const void*>(generator.classIndex()));
    }
    const std::vector<testing::LogCapture::Line> expected{
        {kLogError, "Creating ORVLogGenerator2 object with " + index},
        {kLogWarning, "Creating Log object: " + address},
        {kLogError, "Class Index: 1"},
        {kLogWarning, "ORV_GSMLogGenerator is destructed " + address},
    };
    EXPECT_EQ(capture.lines(), expected);
}

}  // namespace
}  // namespace velmar
