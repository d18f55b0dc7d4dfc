#include <gtest/gtest.h>

#include <cstdio>
#include <map>

#include "LogGenerator/GSM/NonRankedGSMSet.h"
#include "LogGenerator/GSM/NonRankedUMTSSet.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

// Records and cells are written with designated initializers; the fields left out keep their defaults.
#pragma GCC diagnostic ignored "-Wmissing-field-initializers"

namespace velmar {
namespace {

using testing::LogCapture;

// The class index with its dictionaries opened up for inspection.
class InspectableGsmClassIndex : public ORV_GSMClassIndex {
  public:
    using ClassIndex::classDict;
    using ClassIndex::codeDictionary;
};

// The section names of the twenty-six decoders, in the order of creation.
const std::vector<std::string> kSectionsInCreationOrder = {
    "Active Set",
    "Coding Scheme",
    "GPRS Information",
    "GSM Serving Cell",
    "Mobile Allocation",
    "Neighboring Cells",
    "PDP Context Info",
    "Process PS",
    "UMTS RR Measurement",
    "Cell Change Counters",
    "Detected Set",
    "GSM Set",
    "Non-Ranked GSM Set",
    "Process CO",
    "Serving PLMN",
    "UMTS Set",
    "Equivalent PLMN List",
    "GSM RR Info",
    "Monitored Set",
    "Non-Ranked UMTS Set",
    "Process CS",
    "UMTS RR Info",
    "BLER",
    "Virtual Active Set",
    "SIM Info",
    "HSDPA Info",
};

// The section names that a code's subscribers own, in dispatch order.
std::vector<std::string> subscriberSections(const InspectableGsmClassIndex& index, std::int32_t code) {
    std::vector<std::string> sections;
    if (const DecoderList* subscribers = index.getSubscribers(code)) {
        for (const DecoderRef& decoder : *subscribers) {
            sections.emplace_back(decoder->getSectionName());
        }
    }
    return sections;
}

TEST(GsmClassIndex, CreatesTheTwentySixDecodersInTableOrder) {
    InspectableGsmClassIndex index;
    std::vector<std::string> sections;
    for (const auto& entry : index.classDict) {
        sections.push_back(entry.first);
    }
    EXPECT_EQ(sections, kSectionsInCreationOrder);
    for (const std::string& name : kSectionsInCreationOrder) {
        ASSERT_NE(index.getClass(name), nullptr) << name;
        EXPECT_EQ(index.getClass(name)->getSectionName(), name);
    }
}

TEST(GsmClassIndex, SharedCodesReachTheirSubscribersInCreationOrder) {
    InspectableGsmClassIndex index;
    EXPECT_EQ(
        subscriberSections(index, 0x417A),
        (std::vector<std::string>{"Active Set", "Detected Set", "Monitored Set", "Virtual Active Set"}));
    EXPECT_EQ(subscriberSections(index, 0xFF0001),
              (std::vector<std::string>{"GSM Serving Cell", "Neighboring Cells", "Serving PLMN", "UMTS Set",
                                        "UMTS RR Info"}));
    EXPECT_EQ(subscriberSections(index, 0x4005), (std::vector<std::string>{"GSM Set", "UMTS Set"}));
    EXPECT_EQ(subscriberSections(index, 0x5137),
              (std::vector<std::string>{"GPRS Information", "GSM Serving Cell", "Neighboring Cells",
                                        "GSM RR Info"}));
    EXPECT_EQ(subscriberSections(index, 0x7132),
              (std::vector<std::string>{"Process PS", "Process CO", "Serving PLMN", "Process CS"}));
    EXPECT_EQ(subscriberSections(index, 0x7131), (std::vector<std::string>{"Process CO", "Process CS"}));
    EXPECT_EQ(subscriberSections(index, 0x7135),
              (std::vector<std::string>{"GPRS Information", "Serving PLMN"}));
    EXPECT_EQ(subscriberSections(index, 0x51F6),
              (std::vector<std::string>{"GPRS Information", "GSM RR Info"}));
    EXPECT_EQ(subscriberSections(index, 0xFF0000), (std::vector<std::string>{"SIM Info"}));
    EXPECT_EQ(subscriberSections(index, 0xFF0002), (std::vector<std::string>{"PDP Context Info"}));
    EXPECT_EQ(subscriberSections(index, 0x51F8), (std::vector<std::string>{"Mobile Allocation"}));
    EXPECT_EQ(subscriberSections(index, 0x51FF), (std::vector<std::string>{"Neighboring Cells"}));
    EXPECT_EQ(subscriberSections(index, 0x5134), (std::vector<std::string>{"GSM Serving Cell"}));
    EXPECT_EQ(subscriberSections(index, 0x5076), (std::vector<std::string>{"GSM Serving Cell"}));
}

TEST(GsmClassIndex, EveryOtherCodeHasOneSubscriberAndUnlistedCodesHaveNoEntry) {
    InspectableGsmClassIndex index;
    const std::map<std::string, std::size_t> shared = {
        {"16762", 4}, {"16389", 2}, {"20791", 4}, {"28978", 4},
        {"28977", 2}, {"28981", 2}, {"20982", 2}, {"16711681", 5},
    };
    for (const auto& [code, subscribers] : index.codeDictionary) {
        const auto found = shared.find(code);
        EXPECT_EQ(subscribers.size(), found == shared.end() ? 1u : found->second) << code;
    }
    // 45 subscriptions to 28 codes in all, counted by hand from the decoders' code arrays.
    std::size_t total = 0;
    for (const auto& entry : index.codeDictionary) {
        total += entry.second.size();
    }
    EXPECT_EQ(total, 45u);
    EXPECT_EQ(index.codeDictionary.size(), 28u);
    EXPECT_EQ(index.getSubscribers(0x4128), nullptr);
    EXPECT_FALSE(index.codeDictionary.contains("16680"));
    EXPECT_EQ(index.getSubscribers(0x51F7), nullptr);
}

TEST(GsmClassIndex, DestructionPrintsItsOwnLineBeforeTheBaseLine) {
    auto index = std::make_unique<ORV_GSMClassIndex>();
    ::testing::internal::CaptureStdout();
    index.reset();
    std::fflush(stdout);
    EXPECT_EQ(::testing::internal::GetCapturedStdout(),
              "Deallocing ORV_GSMClassIndex\nDeallocing ClassIndex\n");
}

TEST(GsmClassIndex, PlaceholdersOnlyLogTheirNames) {
    LogCapture capture;
    NonRankedGSMSet gsm;
    NonRankedUMTSSet umts;
    const PlistData packet = RecordBuilder(0x4005).resize(40).build();
    gsm.updateWithData(packet, 0x4005);
    umts.updateWithData(packet, 0x1234);
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "NonRankedGSMSet"},
                                                              {kLogWarning, "NonRankedUMTSSet"}}));
    EXPECT_EQ(gsm.getSectionName(), "Non-Ranked GSM Set");
    EXPECT_EQ(umts.getSectionName(), "Non-Ranked UMTS Set");
    EXPECT_FALSE(gsm.getLogCodeArray().has_value());
    EXPECT_FALSE(umts.getLogCodeArray().has_value());
}

TEST(GsmGenerator, CellSetRecordReachesTheFourSetDecodersInOrder) {
    testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
    harness.feed(RecordBuilder(0x1234).build());  // builds the display tree
    LogCapture capture;
    harness.feed(buildUmtsCellSetRecord({}));
    EXPECT_EQ(capture.textsAt(kLogWarning),
              (std::vector<std::string>{"ActiveSet", "DetectedSet", "MonitoredSet", "VirtualActiveSet"}));
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
}

TEST(GsmGenerator, CellMonitorRecordReachesItsFiveDecodersInOrder) {
    testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
    harness.feed(RecordBuilder(0x1234).build());
    LogCapture capture;
    harness.feed(buildCellMonitorEntries({}));
    // ServingPLMN writes "Serving PLMN", with blanks, as its entry line.
    EXPECT_EQ(capture.textsAt(kLogWarning),
              (std::vector<std::string>{"GSMServingCell", "NeighboringCells", "Serving PLMN", "UMTSSet",
                                        "UMTSRRInfo"}));
}

TEST(GsmGenerator, CreationAndDestructionLogLines) {
    LogCapture capture;
    auto generator = std::make_unique<ORV_GSMLogGenerator>();
    ASSERT_FALSE(capture.lines().empty());
    EXPECT_EQ(capture.lines().front(), (LogCapture::Line{kLogError, "Creating ORV_GSMLogGenerator object"}));
    EXPECT_EQ(generator->templateName(), "ORV_GSM");
    const std::string destroyed =
        stringWithFormat("ORV_GSMLogGenerator is destructed %p", static_cast<void*>(generator.get()));
    capture.clear();
    ::testing::internal::CaptureStdout();
    generator.reset();
    EXPECT_EQ(::testing::internal::GetCapturedStdout(),
              "Deallocing ORV_GSMClassIndex\nDeallocing ClassIndex\n");
    EXPECT_EQ(capture.lines(),
              (std::vector<LogCapture::Line>{{kLogWarning, destroyed}, {kLogWarning, destroyed}}));
}

TEST(GsmGenerator, FactoryCreatesItForTheGsmTechnology) {
    auto generator = LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_GSM);
    ASSERT_NE(generator, nullptr);
    EXPECT_NE(dynamic_cast<ORV_GSMLogGenerator*>(generator.get()), nullptr);
}

TEST(GsmGenerator, StartCommandSplitsPlainAndExtraCodes) {
    ORV_GSMLogGenerator generator;
    const PlistValue command = generator.getStartCommand();
    const PlistArrayRef extra = command.dictionary()->get("SetKxExtraCodes").array();
    ASSERT_NE(extra, nullptr);
    std::vector<std::int64_t> extraCodes;
    for (const PlistValue& code : *extra) {
        extraCodes.push_back(*code.integerValue());
    }
    // In the order the codes were first registered: 0xFF0001 (GSMServingCell), 0xFF0002, 0xFF0000.
    EXPECT_EQ(extraCodes, (std::vector<std::int64_t>{1, 2, 0}));
    const PlistArrayRef plain = command.dictionary()->get("SetOrvaneLogCodes").array();
    ASSERT_NE(plain, nullptr);
    EXPECT_EQ(plain->at(0), PlistValue::integer(0x417A));
    EXPECT_EQ(plain->size(), 25u);
}

// The container type each section's decoder fills: list sections are arrays, key sections dictionaries.
const std::map<std::string, PlistValue::Kind> kSectionContainers = {
    {"Active Set", PlistValue::Kind::Array},
    {"Coding Scheme", PlistValue::Kind::Dictionary},
    {"GPRS Information", PlistValue::Kind::Dictionary},
    {"GSM Serving Cell", PlistValue::Kind::Dictionary},
    {"Mobile Allocation", PlistValue::Kind::Dictionary},
    {"Neighboring Cells", PlistValue::Kind::Array},
    {"PDP Context Info", PlistValue::Kind::Array},
    {"Process PS", PlistValue::Kind::Dictionary},
    {"UMTS RR Measurement", PlistValue::Kind::Dictionary},
    {"Cell Change Counters", PlistValue::Kind::Dictionary},
    {"Detected Set", PlistValue::Kind::Array},
    {"GSM Set", PlistValue::Kind::Array},
    {"Non-Ranked GSM Set", PlistValue::Kind::Array},
    {"Process CO", PlistValue::Kind::Dictionary},
    {"Serving PLMN", PlistValue::Kind::Dictionary},
    {"UMTS Set", PlistValue::Kind::Array},
    {"Equivalent PLMN List", PlistValue::Kind::Array},
    {"GSM RR Info", PlistValue::Kind::Dictionary},
    {"Monitored Set", PlistValue::Kind::Array},
    {"Non-Ranked UMTS Set", PlistValue::Kind::Array},
    {"Process CS", PlistValue::Kind::Dictionary},
    {"UMTS RR Info", PlistValue::Kind::Dictionary},
    {"BLER", PlistValue::Kind::Dictionary},
    {"Virtual Active Set", PlistValue::Kind::Array},
    {"SIM Info", PlistValue::Kind::Dictionary},
    {"HSDPA Info", PlistValue::Kind::Dictionary},
};

// Counts every dictionary key of the template, at any depth, with the kind of its value; fails on any value
// that is not a dictionary, an array or a string.
void collectKeys(const PlistValue& value, std::map<std::string, std::vector<PlistValue::Kind>>& keys) {
    if (const PlistDictionaryRef& dictionary = value.dictionary()) {
        for (const auto& [key, child] : *dictionary) {
            keys[key].push_back(child.kind());
            collectKeys(child, keys);
        }
    } else if (const PlistArrayRef& array = value.array()) {
        for (const PlistValue& element : *array) {
            collectKeys(element, keys);
        }
    } else {
        EXPECT_TRUE(value.isString()) << "template value of kind " << value.typeName();
    }
}

TEST(GsmTemplate, EverySectionOccursOnceWithItsContainerType) {
    const std::optional<PlistValue> templateValue =
        readDictionaryFile(std::string(VELMAR_SOURCE_DIR) + "/resources/templates/ORV_GSM.plist");
    ASSERT_TRUE(templateValue.has_value());
    std::map<std::string, std::vector<PlistValue::Kind>> keys;
    collectKeys(*templateValue, keys);

    InspectableGsmClassIndex index;
    ASSERT_EQ(index.classDict.size(), kSectionContainers.size());
    for (const auto& entry : index.classDict) {
        const std::string& section = entry.first;
        const auto expected = kSectionContainers.find(section);
        ASSERT_NE(expected, kSectionContainers.end()) << section;
        EXPECT_EQ(keys[section], std::vector<PlistValue::Kind>{expected->second}) << section;
    }
}

TEST(GsmTemplate, GeneratorBindsEveryDecoderToItsSection) {
    testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
    harness.feed(RecordBuilder(0x1234).build());
    const PlistValue display = harness.state->get(state_keys::kDisplay);
    ASSERT_TRUE(display.isDictionary());
    std::vector<std::string> groups;
    for (const auto& entry : *display.dictionary()) {
        groups.push_back(entry.first);
    }
    EXPECT_EQ(groups, (std::vector<std::string>{"GSM", "UMTS", "Mobility", "Network", "SIM Info",
                                                "PDP Context Info"}));
    for (const auto& [section, kind] : kSectionContainers) {
        EXPECT_EQ(harness.section(section).kind(), kind) << section;
    }
}

}  // namespace
}  // namespace velmar
