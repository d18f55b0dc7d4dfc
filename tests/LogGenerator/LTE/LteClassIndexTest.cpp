#include <gtest/gtest.h>

#include <cstdio>
#include <map>

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "LogGenerator/LTE/LTELogGenerator.h"
#include "LogGenerator/LogGenerator.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/LteRecords.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

// Exposes the two lookups of the index for inspection.
class InspectedLteIndex : public LTEClassIndex {
  public:
    using ClassIndex::classDict;
    using ClassIndex::codeDictionary;
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

TEST(LteClassIndex, HoldsTheElevenSectionsInCreationOrder) {
    InspectedLteIndex index;
    std::vector<std::string> names;
    for (const auto& entry : index.classDict) {
        names.push_back(entry.first);
    }
    EXPECT_EQ(names, (std::vector<std::string>{
                         "Serving Cell Info", "Connected mode LTE Intra-frequency Measurement",
                         "Measured Neighbor Cells", "Detected Cells", "Serving Cell Measurements",
                         "Neighbor Measurements", "Neighbor Cells List", "Reselection Candidates",
                         "Reselection Candidates List", "SIM Info", "PDP Context Info"}));
    for (const auto& name : names) {
        ASSERT_NE(index.getClass(name), nullptr) << name;
        EXPECT_EQ(index.getClass(name)->getSectionName(), name);
    }
}

TEST(LteClassIndex, SharedCodesReachTheirDecodersInTableOrder) {
    InspectedLteIndex index;
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xB179)),
              (std::vector<std::string>{"Connected mode LTE Intra-frequency Measurement",
                                        "Measured Neighbor Cells", "Detected Cells"}));
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xB180)),
              (std::vector<std::string>{"Neighbor Measurements", "Neighbor Cells List"}));
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xB186)),
              (std::vector<std::string>{"Reselection Candidates", "Reselection Candidates List"}));
    for (const std::int32_t code : {0xB0C2, 0xB0C1, 0xFF0001}) {
        EXPECT_EQ(sectionsOf(index.getSubscribers(code)), std::vector<std::string>{"Serving Cell Info"})
            << code;
    }
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xB17F)),
              std::vector<std::string>{"Serving Cell Measurements"});
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xFF0000)), std::vector<std::string>{"SIM Info"});
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xFF0002)), std::vector<std::string>{"PDP Context Info"});
    // 0xB0C2 45250, 0xB0C1 45249, 0xFF0001 16711681, 0xB179 45433, 0xB17F 45439, 0xB180 45440, 0xB186 45446,
    // 0xFF0000 16711680, 0xFF0002 16711682: in order of first registration.
    EXPECT_EQ(index.getAllLogCodes(),
              (std::vector<std::string>{"45250", "45249", "16711681", "45433", "45439", "45440", "45446",
                                        "16711680", "16711682"}));
}

TEST(LteClassIndex, DestructionPrintsItsLineBeforeTheBaseLine) {
    auto index = std::make_unique<LTEClassIndex>();
    std::fflush(stdout);
    ::testing::internal::CaptureStdout();
    index.reset();
    std::fflush(stdout);
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "Deallocing LTEClassIndex\nDeallocing ClassIndex\n");
}

TEST(LteLogGenerator, CreationAnnouncesItselfFirstAndDestructionLogsBothLines) {
    testing::LogCapture capture;
    auto generator = std::make_unique<LTELogGenerator>();
    ASSERT_FALSE(capture.lines().empty());
    EXPECT_EQ(capture.lines().front(),
              (testing::LogCapture::Line{kLogError, "Creating LTELogGenerator object"}));
    const auto errors = capture.textsAt(kLogError);
    ASSERT_EQ(errors.size(), 3u);
    EXPECT_EQ(errors[1], stringWithFormat("Creating ORVLogGenerator2 object with %p",
                                          static_cast<const void*>(generator->classIndex())));
    EXPECT_EQ(errors[2], "Class Index: 1");
    EXPECT_EQ(generator->templateName(), "LTE");

    const std::string pointer = stringWithFormat("%p", static_cast<void*>(generator.get()));
    capture.clear();
    std::fflush(stdout);
    ::testing::internal::CaptureStdout();
    generator.reset();
    std::fflush(stdout);
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "Deallocing LTEClassIndex\nDeallocing ClassIndex\n");
    EXPECT_EQ(capture.textsAt(kLogWarning),
              (std::vector<std::string>{"LTELogGenerator is destructed " + pointer,
                                        "ORV_GSMLogGenerator is destructed " + pointer}));
}

TEST(LteLogGenerator, FactoryCreatesItForTheLteTechnology) {
    auto generator = LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_LTE);
    ASSERT_NE(generator, nullptr);
    EXPECT_NE(dynamic_cast<LTELogGenerator*>(generator.get()), nullptr);
}

TEST(LteLogGenerator, DecodesIntoTheTemplateDisplay) {
    LTELogGenerator generator;
    const StateDict state = PlistDictionary::create();
    LteServingCellInfoRecord serving;
    serving.physicalCellId = 88;
    serving.downlinkBandwidth = 75;
    generator.updateState(state, buildLteServingCellInfoRecord(serving));
    LteIntraFrequencyRecord connected;
    connected.measured = {{5, 6, 7}};
    generator.updateState(state, buildLteIntraFrequencyRecord(connected));
    // The first blob built the display, so the first refresh already returns it.
    const PlistValue display = generator.generateLogUsingState(state);
    ASSERT_TRUE(display.isDictionary());
    const auto& servingGroup = *display.dictionary()->get("Serving Cell").dictionary();
    EXPECT_EQ(*servingGroup.get("Serving Cell Info").dictionary()->get("Physical Cell ID").string(), "88");
    EXPECT_EQ(*servingGroup.get("Serving Cell Info").dictionary()->get("Download Bandwidth").string(),
              "15 MHz");
    const auto& neighbours = *display.dictionary()->get("Neighbor Cells").dictionary();
    ASSERT_EQ(neighbours.get("Measured Neighbor Cells").array()->size(), 1u);
    EXPECT_TRUE(neighbours.get("Detected Cells").array()->empty());
    EXPECT_TRUE(display.dictionary()->get("PDP Context Info").array()->empty());
}

TEST(LteLogGenerator, StartCommandSplitsPlainAndExtraCodes) {
    LTELogGenerator generator;
    const PlistValue command = generator.getStartCommand();
    ASSERT_TRUE(command.isDictionary());
    const auto& dictionary = *command.dictionary();
    EXPECT_EQ(*dictionary.get("SetState").string(), "Streaming");
    std::vector<std::int64_t> plain;
    for (const auto& code : *dictionary.get("SetOrvaneLogCodes").array()) {
        plain.push_back(*code.integerValue());
    }
    std::vector<std::int64_t> extra;
    for (const auto& code : *dictionary.get("SetKxExtraCodes").array()) {
        extra.push_back(*code.integerValue());
    }
    EXPECT_EQ(plain, (std::vector<std::int64_t>{0xB0C2, 0xB0C1, 0xB179, 0xB17F, 0xB180, 0xB186}));
    EXPECT_EQ(extra, (std::vector<std::int64_t>{1, 0, 2}));
}

// Every section of the class index stands exactly once in the template, under a container of the type its
// decoder fills; the template holds nothing but dictionaries, arrays and strings.
struct SectionCount {
    int dictionaries = 0;
    int arrays = 0;
};

bool countSections(const PlistValue& value, std::map<std::string, SectionCount>& counts) {
    if (value.isString()) {
        return true;
    }
    if (const auto& dictionary = value.dictionary()) {
        for (const auto& [key, child] : *dictionary) {
            if (child.isDictionary()) {
                ++counts[key].dictionaries;
            } else if (child.isArray()) {
                ++counts[key].arrays;
            }
            if (!countSections(child, counts)) {
                return false;
            }
        }
        return true;
    }
    if (const auto& array = value.array()) {
        for (const auto& element : *array) {
            if (!countSections(element, counts)) {
                return false;
            }
        }
        return true;
    }
    return false;
}

TEST(LteTemplate, EverySectionStandsOnceWithItsContainerType) {
    const auto templateValue =
        readDictionaryFile(std::string(VELMAR_SOURCE_DIR) + "/resources/templates/LTE.plist");
    ASSERT_TRUE(templateValue.has_value());
    std::map<std::string, SectionCount> counts;
    ASSERT_TRUE(countSections(*templateValue, counts));

    const std::map<std::string, bool> isList{
        {"Serving Cell Info", false},
        {"Connected mode LTE Intra-frequency Measurement", false},
        {"Measured Neighbor Cells", true},
        {"Detected Cells", true},
        {"Serving Cell Measurements", false},
        {"Neighbor Measurements", false},
        {"Neighbor Cells List", true},
        {"Reselection Candidates", false},
        {"Reselection Candidates List", true},
        {"SIM Info", false},
        {"PDP Context Info", true},
    };
    InspectedLteIndex index;
    ASSERT_EQ(index.classDict.size(), isList.size());
    for (const auto& entry : index.classDict) {
        const std::string& name = entry.first;
        ASSERT_TRUE(isList.count(name)) << name;
        const SectionCount found = counts[name];
        if (isList.at(name)) {
            EXPECT_EQ(found.arrays, 1) << name;
            EXPECT_EQ(found.dictionaries, 0) << name;
        } else {
            EXPECT_EQ(found.dictionaries, 1) << name;
            EXPECT_EQ(found.arrays, 0) << name;
        }
    }
}

}  // namespace
}  // namespace velmar
