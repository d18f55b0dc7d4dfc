#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <map>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "LogGenerator/UTRAN/UTRANClassIndex.h"
#include "LogGenerator/UTRAN/UTRANLogGenerator.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/Resources.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/UtranRecords.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

class InspectedUtranIndex : public UTRANClassIndex {
  public:
    using ClassIndex::classDict;
};

std::vector<std::string> sectionsOf(const DecoderList* decoders) {
    std::vector<std::string> names;
    if (decoders != nullptr) {
        for (const auto& decoder : *decoders) {
            names.emplace_back(decoder->getSectionName());
        }
    }
    return names;
}

const std::map<std::string, bool> kIsListSection{
    {"RRC Info", false},          {"Serving Cell Info", false},
    {"Neighbor Cell List", true}, {"GSM Neighbor Cell List", true},
    {"TRCH BLER", true},          {"CCTRCH SIR", true},
    {"PDP Context Info", true},   {"SIM Info", false},
};

TEST(UtranClassIndex, HoldsTheEightSectionsInCreationOrder) {
    InspectedUtranIndex index;
    std::vector<std::string> names;
    for (const auto& entry : index.classDict) {
        names.push_back(entry.first);
    }
    EXPECT_EQ(names, (std::vector<std::string>{"RRC Info", "Serving Cell Info", "Neighbor Cell List",
                                               "GSM Neighbor Cell List", "TRCH BLER", "CCTRCH SIR",
                                               "PDP Context Info", "SIM Info"}));
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xD00C)),
              (std::vector<std::string>{"TRCH BLER", "CCTRCH SIR"}));
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xFF0001)), std::vector<std::string>{"Serving Cell Info"});
    // 0xD0E0 53472, 0xD0E2 53474, 0xFF0001, 0xD00A 53258, 0xD00E 53262, 0xD00C 53260, 0xFF0002, 0xFF0000.
    EXPECT_EQ(index.getAllLogCodes(), (std::vector<std::string>{"53472", "53474", "16711681", "53258",
                                                                "53262", "53260", "16711682", "16711680"}));
}

TEST(UtranClassIndex, DestructionWritesOnlyTheBaseLine) {
    auto index = std::make_unique<UTRANClassIndex>();
    std::fflush(stdout);
    ::testing::internal::CaptureStdout();
    index.reset();
    std::fflush(stdout);
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "Deallocing ClassIndex\n");
}

TEST(UtranTemplate, EverySectionStandsOnceWithItsContainerType) {
    const auto templateValue =
        readDictionaryFile(std::string(VELMAR_SOURCE_DIR) + "/resources/templates/TD_UTRAN.plist");
    ASSERT_TRUE(templateValue.has_value());
    std::map<std::string, std::pair<int, int>> counts;  // dictionaries, arrays
    std::function<bool(const PlistValue&)> walk = [&](const PlistValue& value) {
        if (value.isString()) {
            return true;
        }
        if (const auto& dictionary = value.dictionary()) {
            for (const auto& [key, child] : *dictionary) {
                if (child.isDictionary()) {
                    ++counts[key].first;
                } else if (child.isArray()) {
                    ++counts[key].second;
                }
                if (!walk(child)) {
                    return false;
                }
            }
            return true;
        }
        if (const auto& array = value.array()) {
            for (const auto& element : *array) {
                if (!walk(element)) {
                    return false;
                }
            }
            return true;
        }
        return false;
    };
    ASSERT_TRUE(walk(*templateValue));
    InspectedUtranIndex index;
    ASSERT_EQ(index.classDict.size(), kIsListSection.size());
    for (const auto& entry : index.classDict) {
        ASSERT_TRUE(kIsListSection.count(entry.first)) << entry.first;
        const auto found = counts[entry.first];
        if (kIsListSection.at(entry.first)) {
            EXPECT_EQ(found, std::make_pair(0, 1)) << entry.first;
        } else {
            EXPECT_EQ(found, std::make_pair(1, 0)) << entry.first;
        }
    }
}

TEST(UtranLogGenerator, TemplateNameIsTheFirstPathContainingUtranInAnyCase) {
    EXPECT_EQ(
        UTRANLogGenerator::templateNameFromPaths({"/r/LTE.plist", "/r/td_Utran.plist", "/s/TD_UTRAN.plist"}),
        std::optional<std::string>("td_Utran"));
    EXPECT_EQ(UTRANLogGenerator::templateNameFromPaths({"/r/LTE.plist", "/r/ORV_GSM.plist"}), std::nullopt);
    EXPECT_EQ(UTRANLogGenerator::templateNameFromPaths({}), std::nullopt);
}

TEST(UtranLogGenerator, CreationAndDestructionLines) {
    testing::LogCapture capture;
    auto generator = UTRANLogGenerator::withResourcePaths({"/r/LTE.plist", "/r/TD_UTRAN.plist"});
    ASSERT_NE(generator->classIndex(), nullptr);
    EXPECT_EQ(generator->templateName(), "TD_UTRAN");
    const auto errors = capture.textsAt(kLogError);
    ASSERT_EQ(errors.size(), 3u);
    EXPECT_EQ(errors[0], stringWithFormat("Creating ORVLogGenerator2 object with %p",
                                          static_cast<const void*>(generator->classIndex())));
    EXPECT_EQ(errors[1], "Class Index: 1");
    EXPECT_EQ(errors[2], "Created UTRANLogGenerator object");
    EXPECT_EQ(capture.lines().back(),
              (testing::LogCapture::Line{kLogError, "Created UTRANLogGenerator object"}));

    const std::string pointer = stringWithFormat("%p", static_cast<void*>(generator.get()));
    capture.clear();
    std::fflush(stdout);
    ::testing::internal::CaptureStdout();
    generator.reset();
    std::fflush(stdout);
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "Deallocing ClassIndex\n");
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"ORV_GSMLogGenerator is destructed " + pointer});
}

TEST(UtranLogGenerator, NoPropertyListResourcesGiveAnUninitialisedGenerator) {
    testing::LogCapture capture;
    auto generator = UTRANLogGenerator::withResourcePaths({});
    EXPECT_EQ(generator->classIndex(), nullptr);
    EXPECT_TRUE(generator->templateName().empty());
    EXPECT_TRUE(capture.lines().empty());
}

TEST(UtranLogGenerator, ResourcesWithoutUtranGiveAnUninitialisedGeneratorThatShowsNothing) {
    // A resource directory holding only other templates. The installed search also looks in the source tree,
    // whose TD_UTRAN template would always be found; the search is therefore run over this directory's own
    // listing, taken from Resources like the installed search.
    testing::TemporaryDirectory resources;
    testing::writeWholeFile(resources.file("LTE.plist"), "<plist version=\"1.0\"><dict/></plist>");
    testing::writeWholeFile(resources.file("C2KTemplate.plist"), "<plist version=\"1.0\"><dict/></plist>");
    const std::string previous = std::getenv("VELMAR_RESOURCE_DIR") ? std::getenv("VELMAR_RESOURCE_DIR") : "";
    setenv("VELMAR_RESOURCE_DIR", resources.path().c_str(), 1);
    std::vector<std::string> ownListing;
    for (const auto& path : Resources::pathsForResourcesOfType("plist")) {
        if (path.rfind(resources.path() + "/", 0) == 0) {
            ownListing.push_back(path);
        }
    }
    // The full listing does reach the source tree's template, so the installed search finds it.
    auto installed = LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_UTRAN2);
    setenv("VELMAR_RESOURCE_DIR", previous.c_str(), 1);
    ASSERT_EQ(ownListing.size(), 2u);
    ASSERT_NE(installed, nullptr);
    EXPECT_EQ(static_cast<UTRANLogGenerator*>(installed.get())->templateName(), "TD_UTRAN");

    testing::LogCapture capture;
    auto generator = UTRANLogGenerator::withResourcePaths(ownListing);
    EXPECT_EQ(generator->classIndex(), nullptr);
    EXPECT_TRUE(capture.lines().empty());

    UtranRrcStateRecord record;
    record.modeValid = 1;
    record.mode = 3;
    const StateDict state = PlistDictionary::create();
    generator->updateState(state, buildUtranRrcStateRecord(record));
    EXPECT_TRUE(generator->generateLogUsingState(state).isNone());
    EXPECT_FALSE(state->contains(state_keys::kDisplay));
    EXPECT_EQ(capture.textsAt(kLogError), (std::vector<std::string>{"Cannot load template for display",
                                                                    "Cannot load template for display"}));
}

TEST(UtranLogGenerator, DecodesIntoTheTemplateDisplay) {
    auto generator = LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_UTRAN2);
    ASSERT_NE(generator, nullptr);
    const StateDict state = PlistDictionary::create();
    UtranRrcStateRecord rrc;
    rrc.modeValid = 1;
    rrc.mode = 2;
    generator->updateState(state, buildUtranRrcStateRecord(rrc));
    UtranChannelQualityRecord quality;
    quality.transportChannels = {{4, 9}};
    quality.compositeChannels = {{7, 1, {1, 2, 3, 4, 5, 6}}};
    generator->updateState(state, buildUtranChannelQualityRecord(quality));
    generator->generateLogUsingState(state);
    const PlistValue display = generator->generateLogUsingState(state);
    ASSERT_TRUE(display.isDictionary());
    const auto& root = *display.dictionary();
    EXPECT_EQ(testing::textOf(*root.get("RRC Info").dictionary(), "State"), "Cell Fach");
    const auto& quality_group = *root.get("Channel Quality").dictionary();
    ASSERT_EQ(quality_group.get("TRCH BLER").array()->size(), 1u);
    EXPECT_EQ(
        testing::textOf(testing::rowAt(*quality_group.get("TRCH BLER").array(), 0), "TRCH BLER Measurement"),
        "9");
    ASSERT_EQ(quality_group.get("CCTRCH SIR").array()->size(), 1u);
    EXPECT_EQ(testing::textOf(testing::rowAt(*quality_group.get("CCTRCH SIR").array(), 0), "CCTRCH ID"), "7");
    EXPECT_TRUE(root.get("Neighbor Cells").dictionary()->get("GSM Neighbor Cell List").array()->empty());
}

}  // namespace
}  // namespace velmar
