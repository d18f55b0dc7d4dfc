// The CDMA2000 generator's template processing, display setter, display lifetime, start command and factory
// entry, and the shipped "C2KTemplate" resource.
#include <gtest/gtest.h>

#include <set>

#include "LogGenerator/C2K/C2KDisplaySetter.h"
#include "LogGenerator/C2K/C2KLogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/CdmaRecords.h"
#include "tests/LogGenerator/C2K/C2KHarness.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::C2KHarness;
using testing::kC2KDisplayKeys;

const std::string kTemplatePath = std::string(VELMAR_SOURCE_DIR) + "/resources/templates/C2KTemplate.plist";

// The place at index of the lookup's array for key.
PlistDictionaryRef placeOf(const PlistDictionary& lookup, std::string_view key, std::size_t index) {
    const PlistArrayRef places = lookup.get(key).array();
    if (!places || index >= places->size()) {
        return nullptr;
    }
    return places->at(index).dictionary();
}

TEST(C2KTemplate, StringsBecomeEmptyDisplayEntriesAndPlacesInTheLookup) {
    testing::LogCapture capture;
    auto group = PlistDictionary::create();
    group->set("Label X", "k1");
    group->set("_sorted", "_sorted");
    group->set("Number", PlistValue::integer(5));
    group->set("List", PlistValue::newArray());
    auto templateDictionary = PlistDictionary::create();
    templateDictionary->set("Group", group);
    templateDictionary->set("Label Y", "k1");
    templateDictionary->set("Label Z", "k2");

    auto display = PlistDictionary::create();
    PlistDictionary lookup;
    C2KLogGenerator::processTemplate(*templateDictionary, display, lookup);

    // Display: same shape, strings emptied, "_sorted" kept as it stands, other types skipped.
    ASSERT_EQ(display->size(), 3u);
    const PlistDictionaryRef displayGroup = display->get("Group").dictionary();
    ASSERT_TRUE(displayGroup);
    EXPECT_NE(displayGroup, group);
    ASSERT_EQ(displayGroup->size(), 2u);
    EXPECT_EQ(displayGroup->entries()[0].first, "Label X");
    EXPECT_EQ(displayGroup->get("Label X"), PlistValue(""));
    EXPECT_EQ(displayGroup->get("_sorted"), PlistValue("_sorted"));
    EXPECT_EQ(display->get("Label Y"), PlistValue(""));
    EXPECT_EQ(display->get("Label Z"), PlistValue(""));

    // Lookup: k1 has two places in processing order (the group's first), k2 one; "_sorted" none.
    ASSERT_EQ(lookup.size(), 2u);
    EXPECT_EQ(lookup.entries()[0].first, "k1");
    ASSERT_EQ(lookup.get("k1").array()->size(), 2u);
    const PlistDictionaryRef first = placeOf(lookup, "k1", 0);
    const PlistDictionaryRef second = placeOf(lookup, "k1", 1);
    const PlistDictionaryRef third = placeOf(lookup, "k2", 0);
    ASSERT_TRUE(first && second && third);
    EXPECT_EQ(first->size(), 2u);
    EXPECT_EQ(first->get("key"), PlistValue("Label X"));
    EXPECT_EQ(first->get("dict").dictionary(), displayGroup);  // the very display dictionary, not a copy
    EXPECT_EQ(second->get("key"), PlistValue("Label Y"));
    EXPECT_EQ(second->get("dict").dictionary(), display);
    EXPECT_EQ(third->get("key"), PlistValue("Label Z"));
    EXPECT_FALSE(lookup.contains("_sorted"));

    // One line at the end of each dictionary walked: the group's, then the top level's.
    EXPECT_EQ(capture.textsAt(kLogWarning),
              (std::vector<std::string>{"Processing the template", "Processing the template"}));
}

TEST(C2KTemplate, SetterWritesEveryPlaceOfTheKeyAndIgnoresKeysWithoutPlaces) {
    auto templateDictionary = PlistDictionary::create();
    auto group = PlistDictionary::create();
    group->set("Channel", "kChannel");
    templateDictionary->set("EV-DO", group);
    templateDictionary->set("Channel again", "kChannel");
    templateDictionary->set("Other", "kColorCode");
    auto display = PlistDictionary::create();
    PlistDictionary lookup;
    C2KLogGenerator::processTemplate(*templateDictionary, display, lookup);

    c2k::setDisplayValue(&lookup, "kChannel", PlistValue("283"));
    c2k::setDisplayValue(&lookup, "kNoSuchKey", PlistValue("x"));
    c2k::setDisplayValue(nullptr, "kColorCode", PlistValue("y"));
    EXPECT_EQ(group->size(), 1u);
    EXPECT_EQ(display->get("EV-DO").dictionary()->get("Channel"), PlistValue("283"));
    EXPECT_EQ(display->get("Channel again"), PlistValue("283"));
    EXPECT_EQ(display->get("Other"), PlistValue(""));
    EXPECT_EQ(display->size(), 3u);
}

TEST(C2KTemplate, DisplayLookupAndExtraInfoAreBuiltOnceAndKept) {
    C2KHarness harness;
    for (const char* key : {"Display", "Lookup", "ExtraInfo"}) {
        harness.state->remove(key);
    }
    testing::LogCapture capture;
    const PlistDictionaryRef display = C2KLogGenerator::getDisplayFromState(harness.state);
    ASSERT_TRUE(display);
    EXPECT_EQ(harness.state->get(state_keys::kDisplay).dictionary(), display);
    const PlistDictionaryRef lookup = harness.state->get("Lookup").dictionary();
    ASSERT_TRUE(lookup);
    EXPECT_EQ(lookup->size(), std::size(kC2KDisplayKeys));
    const PlistDictionaryRef extraInfo = harness.extraInfo();
    ASSERT_TRUE(extraInfo);
    EXPECT_TRUE(extraInfo->empty());
    EXPECT_EQ(capture.textsAt(kLogWarning).size(), 2u);

    // A later call (and every blob) finds them in the state.
    capture.clear();
    EXPECT_EQ(C2KLogGenerator::getDisplayFromState(harness.state), display);
    EXPECT_EQ(harness.state->get("Lookup").dictionary(), lookup);
    EXPECT_EQ(harness.extraInfo(), extraInfo);
    EXPECT_TRUE(capture.textsAt(kLogWarning).empty());
}

TEST(C2KTemplate, ValuesOfDifferentPacketsStayShownSideBySide) {
    C2KHarness harness;
    EvdoStatusRecord status;
    status.channel = 283;
    harness.feed(buildEvdoStatusRecord(status));
    Cdma1xSystemIdentityRecord identity;
    identity.systemId = 4139;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(harness.shown("kChannel"), "283");
    EXPECT_EQ(harness.shown("kSystemId"), "4139");
}

TEST(C2KTemplate, StateTemplateIsUsedAndTheResourceIsLoadedWhenItIsAbsent) {
    const StateDict state = PlistDictionary::create();
    const PlistDictionaryRef display = C2KLogGenerator::getDisplayFromState(state);
    ASSERT_TRUE(display);
    const auto shipped = readDictionaryFile(kTemplatePath);
    ASSERT_TRUE(shipped);
    EXPECT_EQ(state->get(state_keys::kTemplate), *shipped);
    ASSERT_TRUE(display->get("EV-DO").dictionary());
    ASSERT_TRUE(display->get("1x").dictionary());
}

TEST(C2KTemplate, ShippedTemplateGivesEveryDisplayKeyAPlace) {
    const auto shipped = readDictionaryFile(kTemplatePath);
    ASSERT_TRUE(shipped);
    auto display = PlistDictionary::create();
    PlistDictionary lookup;
    C2KLogGenerator::processTemplate(*shipped->dictionary(), display, lookup);
    for (const char* key : kC2KDisplayKeys) {
        const PlistArrayRef places = lookup.get(key).array();
        ASSERT_TRUE(places) << key;
        EXPECT_GE(places->size(), 1u) << key;
    }
    // Nothing else: every display key of the template is one a parser writes.
    EXPECT_EQ(lookup.size(), std::size(kC2KDisplayKeys));
}

TEST(C2KTemplate, ShippedTemplateIsTabIndentedWithReadableLabels) {
    const std::string text = testing::readWholeFile(kTemplatePath);
    ASSERT_FALSE(text.empty());
    EXPECT_EQ(text.find("\n "), std::string::npos);
    EXPECT_NE(text.find("\n\t<key>EV-DO</key>"), std::string::npos);
    EXPECT_NE(text.find("\n\t<key>1x</key>"), std::string::npos);

    // A value written by a parser shows under its label.
    const StateDict state = PlistDictionary::create();
    C2KLogGenerator generator;
    EvdoStatusRecord status;
    status.channel = 283;
    status.pnOffset = 0xFFFF;
    generator.updateState(state, buildEvdoStatusRecord(status));
    const PlistDictionaryRef radio =
        state->get(state_keys::kDisplay).dictionary()->get("EV-DO").dictionary()->get("Radio").dictionary();
    ASSERT_TRUE(radio);
    EXPECT_EQ(radio->get("Channel"), PlistValue("283"));
    EXPECT_EQ(radio->get("Serving PN Offset"), PlistValue("Invalid Value"));
}

TEST(C2KStartCommand, ExactlyStateAndTheEightCodesInOrder) {
    C2KLogGenerator generator;
    const PlistValue command = generator.getStartCommand();
    const PlistDictionaryRef fields = command.dictionary();
    ASSERT_TRUE(fields);
    ASSERT_EQ(fields->size(), 2u);
    EXPECT_EQ(fields->get("SetState"), PlistValue("Streaming"));
    EXPECT_FALSE(fields->contains("SetKxExtraCodes"));
    const PlistArrayRef codes = fields->get("SetOrvaneLogCodes").array();
    ASSERT_TRUE(codes);
    const std::vector<std::int64_t> expected{4234, 4483, 4498, 4790, 4508, 4509, 4734, 4943};
    ASSERT_EQ(codes->size(), expected.size());
    for (std::size_t i = 0; i < expected.size(); ++i) {
        EXPECT_EQ(codes->at(i), PlistValue::integer(expected[i])) << i;
    }
}

TEST(C2KFactory, TheCdmaTechnologyGetsTheC2KGenerator) {
    const std::unique_ptr<LogGenerator> generator =
        LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_CDMA);
    ASSERT_TRUE(generator);
    EXPECT_NE(dynamic_cast<C2KLogGenerator*>(generator.get()), nullptr);
}

}  // namespace
}  // namespace velmar
