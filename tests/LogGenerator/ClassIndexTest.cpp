#include <gtest/gtest.h>

#include "LogGenerator/NotImplementedError.h"
#include "core/ArrayLock.h"
#include "core/platform/SystemLog.h"
#include "tests/LogGenerator/RecordingDecoder.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::RecordingClassIndex;

std::vector<std::string> sectionsOf(const DecoderList* decoders) {
    std::vector<std::string> names;
    if (decoders) {
        for (const auto& decoder : *decoders) {
            names.emplace_back(decoder->getSectionName());
        }
    }
    return names;
}

TEST(ClassIndex, SubscribersAreFoundByDecimalTextOfTheCode) {
    RecordingClassIndex index(
        {{"A", std::vector<std::int32_t>{45433}}, {"B", std::vector<std::int32_t>{0xFF1234}}});
    EXPECT_EQ(sectionsOf(index.getSubscribers(45433)), std::vector<std::string>{"A"});
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xFF0000 + 0x1234)), std::vector<std::string>{"B"});
    EXPECT_EQ(index.getAllLogCodes(), (std::vector<std::string>{"45433", "16716340"}));
    EXPECT_EQ(index.getSubscribers(45434), nullptr);
}

// A class index that takes decoders after it was built, as the tests' and fuzzers' indexes do.
class GrowingClassIndex : public RecordingClassIndex {
  public:
    using RecordingClassIndex::RecordingClassIndex;
    void add(const std::string& section, std::vector<std::int32_t> codes) {
        auto decoder = std::make_shared<testing::RecordingDecoder>(section, std::move(codes));
        classDict.set(decoder->getSectionName(), decoder);
        decoder->updateLogCodeDict(codeDictionary);
    }
};

TEST(ClassIndex, ACodeSubscribedAfterLookupsIsFoundAndOldCodesStayFound) {
    GrowingClassIndex index({{"A", std::vector<std::int32_t>{0xB179}}});
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xB179)), std::vector<std::string>{"A"});
    EXPECT_EQ(index.getSubscribers(0xB17A), nullptr);
    // 0x1B179 shares the low 16 bits of 0xB179: the quick test lets it by, the exact one turns it away.
    EXPECT_EQ(index.getSubscribers(0x1B179), nullptr);
    index.add("B", {0xB17A, 0xFF0001});
    index.add("C", {0xB179});
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xB17A)), std::vector<std::string>{"B"});
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xFF0001)), std::vector<std::string>{"B"});
    EXPECT_EQ(sectionsOf(index.getSubscribers(0xB179)), (std::vector<std::string>{"A", "C"}));
    EXPECT_EQ(index.getSubscribers(0x0001), nullptr);
    EXPECT_EQ(index.subscribedCodes(), (std::vector<std::int32_t>{0xB179, 0xB17A, 0xFF0001}));
}

TEST(ClassIndex, DecodersSharingACodeAreCalledInCreationOrder) {
    RecordingClassIndex index({{"First", std::vector<std::int32_t>{7, 9}},
                               {"Second", std::vector<std::int32_t>{9}},
                               {"Twice", std::vector<std::int32_t>{9, 9}}});
    EXPECT_EQ(sectionsOf(index.getSubscribers(9)),
              (std::vector<std::string>{"First", "Second", "Twice", "Twice"}));
}

TEST(ClassIndex, GetClassFindsDecoderBySectionNameAndLaterNameReplacesEarlier) {
    RecordingClassIndex index(
        {{"Same", std::vector<std::int32_t>{1}}, {"Same", std::vector<std::int32_t>{2}}});
    ASSERT_NE(index.getClass("Same"), nullptr);
    EXPECT_EQ(index.getClass("Same"), index.getSubscribers(2)->at(0).get());
    // The replaced decoder stays subscribed.
    EXPECT_EQ(index.getSubscribers(1)->size(), 1u);
    EXPECT_NE(index.getSubscribers(1)->at(0).get(), index.getClass("Same"));
    EXPECT_EQ(index.getClass("Other"), nullptr);
}

TEST(ClassIndex, RegistrationLogsTheCountAndNullArrayRegistersNothing) {
    testing::LogCapture capture;
    RecordingClassIndex index({{"Three", std::vector<std::int32_t>{1, 2, 3}}, {"None", std::nullopt}});
    EXPECT_EQ(capture.textsAt(kLogWarning), (std::vector<std::string>{"Array Count: 3", "Array Count: 0"}));
    EXPECT_EQ(index.getAllLogCodes().size(), 3u);
    EXPECT_NE(index.getClass("None"), nullptr);
}

TEST(ClassIndex, StatusLogsItsTwoDiagnosticLines) {
    RecordingClassIndex index({});
    testing::LogCapture capture;
    index.status();
    EXPECT_EQ(capture.textsAt(kLogWarning), (std::vector<std::string>{"Dictionary = 1", "String = 0"}));
}

TEST(ClassIndex, DestructionWritesToStandardOutput) {
    ::testing::internal::CaptureStdout();
    { RecordingClassIndex index({{"A", std::vector<std::int32_t>{1}}}); }
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "Deallocing ClassIndex\n");
}

TEST(Base, UpdateSectionRefLogsTheSectionName) {
    RecordingClassIndex index({{"GSM Serving Cell", std::vector<std::int32_t>{1}}});
    testing::LogCapture capture;
    index.getClass("GSM Serving Cell")->updateSectionRef(PlistValue::newDictionary());
    EXPECT_EQ(capture.lines(), (std::vector<testing::LogCapture::Line>{{kLogWarning, "GSM Serving Cell"}}));
}

TEST(Base, AbstractOperationsRaiseNotImplemented) {
    struct Bare : Base {};
    Bare bare;
    EXPECT_THROW(bare.getSectionName(), NotImplementedError);
    EXPECT_THROW(bare.getLogCodeArray(), NotImplementedError);
    EXPECT_THROW(bare.updateWithData(ByteView(), 1), NotImplementedError);
}

TEST(Base, ReplaceArrayWithEmptyLeavesSectionEmpty) {
    auto section = PlistArray::create({PlistValue("old")});
    Base::replaceArray(section, PlistArray::create());
    EXPECT_TRUE(section->empty());
    EXPECT_EQ(ArrayLock::nestingCounter(), 0);
    EXPECT_TRUE(ArrayLock::isFreeForOtherThreads());
}

TEST(Base, ReplaceArrayCopiesElementsInOrderAndClearEmpties) {
    auto section = PlistArray::create({PlistValue("old")});
    Base::replaceArray(section, PlistArray::create({PlistValue("a"), PlistValue("b")}));
    ASSERT_EQ(section->size(), 2u);
    EXPECT_EQ(*section->at(0).string(), "a");
    EXPECT_EQ(*section->at(1).string(), "b");
    Base::clearElementsInArray(section);
    EXPECT_TRUE(section->empty());
    EXPECT_TRUE(ArrayLock::isFreeForOtherThreads());
}

TEST(Base, LookUpECNOThresholds) {
    EXPECT_EQ(Base::lookUpECNO(524288), 0);
    EXPECT_EQ(Base::lookUpECNO(0xFFFFFFFFu), 0);
    EXPECT_EQ(Base::lookUpECNO(0), 0);
    EXPECT_EQ(Base::lookUpECNO(417648), -1);
    EXPECT_EQ(Base::lookUpECNO(417647), -2);
    EXPECT_EQ(Base::lookUpECNO(16904), -15);
    EXPECT_EQ(Base::lookUpECNO(16903), -16);
    EXPECT_EQ(Base::lookUpECNO(10772), -17);
    EXPECT_EQ(Base::lookUpECNO(10771), -18);
    EXPECT_EQ(Base::lookUpECNO(8616), -18);
    EXPECT_EQ(Base::lookUpECNO(4462), -21);
    EXPECT_EQ(Base::lookUpECNO(814), -30);
    EXPECT_EQ(Base::lookUpECNO(813), -31);
    EXPECT_EQ(Base::lookUpECNO(757), -31);
    EXPECT_EQ(Base::lookUpECNO(706), -31);
    EXPECT_EQ(Base::lookUpECNO(705), 0);
}

TEST(Base, LookUpECNOEveryRowFromItsLowestValue) {
    // The lowest value of each row, with that row's result; one less falls into the next row down.
    struct Row {
        std::uint32_t lowest;
        std::int16_t decibels;
    };
    const Row rows[] = {
        {524288, 0},  {417648, -1}, {331809, -2}, {263625, -3}, {209464, -4}, {166442, -5}, {132269, -6},
        {105124, -7}, {83563, -8},  {66436, -9},  {52831, -10}, {42024, -11}, {33441, -12}, {26622, -13},
        {21206, -14}, {16904, -15}, {13487, -16}, {10772, -17}, {8616, -18},  {6903, -19},  {5543, -20},
        {4462, -21},  {3604, -22},  {2922, -23},  {2241, -24},  {1950, -25},  {1608, -26},  {1337, -27},
        {1121, -28},  {950, -29},   {814, -30},   {757, -31},   {706, -31},
    };
    const std::size_t count = sizeof(rows) / sizeof(rows[0]);
    for (std::size_t i = 0; i < count; ++i) {
        EXPECT_EQ(Base::lookUpECNO(rows[i].lowest), rows[i].decibels) << rows[i].lowest;
        const std::int16_t below = i + 1 < count ? rows[i + 1].decibels : 0;
        EXPECT_EQ(Base::lookUpECNO(rows[i].lowest - 1), below) << rows[i].lowest - 1;
    }
    EXPECT_EQ(Base::lookUpECNO(1), 0);
}

}  // namespace
}  // namespace velmar
