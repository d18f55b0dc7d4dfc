// The state decoders inside the real GSM/UMTS generator: subscription order of the shared codes and the
// sections they fill in the display built from the "ORV_GSM" template.
#include <gtest/gtest.h>

#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/GsmStateRecords.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::LogCapture;
using Strings = std::vector<std::string>;

Strings subscribers(const ORV_GSMLogGenerator& generator, std::int32_t code) {
    Strings names;
    if (const DecoderList* decoders = generator.classIndex()->getSubscribers(code)) {
        for (const DecoderRef& decoder : *decoders) {
            names.emplace_back(decoder->getSectionName());
        }
    }
    return names;
}

// The key section at Display → group → section.
PlistDictionaryRef sectionOf(const StateDict& state, std::string_view group, std::string_view section) {
    const PlistValue display = state->get(state_keys::kDisplay);
    if (!display.isDictionary()) {
        return nullptr;
    }
    const PlistValue groupValue = display.dictionary()->get(group);
    if (!groupValue.isDictionary()) {
        return nullptr;
    }
    return groupValue.dictionary()->get(section).dictionary();
}

class StatesGenerator : public ::testing::Test {
  protected:
    void SetUp() override {
        LogCapture quiet;
        generator = std::make_unique<ORV_GSMLogGenerator>();
        state = PlistDictionary::create();
    }
    void TearDown() override {
        LogCapture quiet;
        ::testing::internal::CaptureStdout();
        generator.reset();
        ::testing::internal::GetCapturedStdout();
    }
    void feed(const PlistData& packet) { generator->updateState(state, packet); }

    std::unique_ptr<ORV_GSMLogGenerator> generator;
    StateDict state;
};

TEST_F(StatesGenerator, SharedCodesReachTheirDecodersInCreationOrder) {
    EXPECT_EQ(subscribers(*generator, 0x7132),
              (Strings{"Process PS", "Process CO", "Serving PLMN", "Process CS"}));
    EXPECT_EQ(subscribers(*generator, 0x7131), (Strings{"Process CO", "Process CS"}));
    EXPECT_EQ(subscribers(*generator, 0x7130), (Strings{"Process PS"}));
    EXPECT_EQ(subscribers(*generator, 0x7135), (Strings{"GPRS Information", "Serving PLMN"}));
    EXPECT_EQ(subscribers(*generator, 0x51F6), (Strings{"GPRS Information", "GSM RR Info"}));
    EXPECT_EQ(subscribers(*generator, 0x5137),
              (Strings{"GPRS Information", "GSM Serving Cell", "Neighboring Cells", "GSM RR Info"}));
    EXPECT_EQ(subscribers(*generator, 0x7150), (Strings{"Equivalent PLMN List"}));
    EXPECT_EQ(subscribers(*generator, 0x4221), (Strings{"HSDPA Info"}));
    EXPECT_EQ(subscribers(*generator, 0x4116), (Strings{"BLER"}));
    EXPECT_EQ(subscribers(*generator, 0x4127), (Strings{"UMTS RR Info"}));
    EXPECT_EQ(subscribers(*generator, 0x4128), Strings{});
}

TEST_F(StatesGenerator, RegistrationStateIsDispatchedToFourDecodersInOrder) {
    // The first packet builds the display and binds the sections.
    feed(buildGmmStateRecord({.state = 3, .subState = 0, .updateStatus = 0}));
    LogCapture capture;
    feed(buildRegistrationStateRecord({.registrationState = 6, .plmnSelectionMode = 1}));
    EXPECT_EQ(capture.textsAt(kLogWarning), (Strings{"ProcessPS", "ProcessCS", "Serving PLMN", "ProcessCS"}));
    EXPECT_TRUE(capture.textsAt(kLogError).empty());

    const PlistDictionaryRef ps = sectionOf(state, "Mobility", "Process PS");
    const PlistDictionaryRef co = sectionOf(state, "Mobility", "Process CO");
    const PlistDictionaryRef cs = sectionOf(state, "Mobility", "Process CS");
    const PlistDictionaryRef plmn = sectionOf(state, "Network", "Serving PLMN");
    ASSERT_TRUE(ps && co && cs && plmn);
    EXPECT_EQ(testing::textOf(*ps, "MM State"), "GMM_REGISTERED");
    EXPECT_EQ(testing::textOf(*ps, "MM Service State"), "REG_STATE_OFFLINE");
    EXPECT_EQ(testing::textOf(*co, "MM Service State"), "REG_STATE_OFFLINE");
    EXPECT_EQ(testing::textOf(*cs, "MM Service State"), "REG_STATE_OFFLINE");
    EXPECT_EQ(testing::keysOf(*plmn), (Strings{"PLMN Sel Mod"}));
    EXPECT_EQ(testing::textOf(*plmn, "PLMN Sel Mod"), "Manual");
}

TEST_F(StatesGenerator, SharedRecordsFillEverySubscribedSection) {
    feed(buildRegistrationInfoRecord({.networkOperatingMode = 1,
                                      .serviceType = 2,
                                      .plmnIdentity = plmnIdentityBytes("262", "01"),
                                      .locationAreaCode = 0xABCD,
                                      .routingAreaCode = 3}));
    feed(buildGprsTbfParametersRecord({.t3192 = 5, .drxTimerMax = 6, .accessBurstType = 0}));
    const PlistDictionaryRef gprs = sectionOf(state, "GSM", "GPRS Information");
    const PlistDictionaryRef rr = sectionOf(state, "GSM", "GSM RR Info");
    const PlistDictionaryRef plmn = sectionOf(state, "Network", "Serving PLMN");
    ASSERT_TRUE(gprs && rr && plmn);
    EXPECT_EQ(testing::textOf(*gprs, "Network Operating Mode"), "Class 2");
    EXPECT_EQ(testing::textOf(*gprs, "T3192"), "120 ms");
    EXPECT_EQ(testing::textOf(*gprs, "DRX Timer Max"), "6");
    EXPECT_EQ(testing::textOf(*rr, "DRX Used"), "6 sec");
    EXPECT_EQ(testing::textOf(*plmn, "Mobile Country Code"), "262");
    EXPECT_EQ(testing::textOf(*plmn, "Mobile Network Code"), "01 ");
    EXPECT_EQ(testing::textOf(*plmn, "Location Area Code"), "43981");  // 0xABCD
    EXPECT_EQ(testing::textOf(*plmn, "Service Type"), "PS_ONLY");
}

}  // namespace
}  // namespace velmar
