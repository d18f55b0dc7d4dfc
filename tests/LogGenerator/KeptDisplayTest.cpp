// A state outlives its generator: after a channel restart the monitor hands the same state to a new
// generator, of the same technology or (the service came back as another baseband) of another one. Whatever
// came before, the new generator's display must end up exactly as an unbroken session would show it.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "LogGenerator/KeptDisplay.h"
#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "logfile/LogFormat.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

struct Technology {
    const char* name;
    const char* constant;
    const char* blobs;  // a recording under tests/data
};

const Technology kTechnologies[] = {
    {"lte", "kKxLogChannelTechnology_Orvane_LTE", "lte/all-codes.hex"},
    {"gsm", "kKxLogChannelTechnology_Orvane_GSM", "gsm/gsm-cells.hex"},
    {"utran", "kKxLogChannelTechnology_Orvane_UTRAN2", "utran/all-codes.hex"},
    {"cdma", "kKxLogChannelTechnology_Orvane_CDMA", "cdma/evdo-1x.hex"},
    {"ifx", "kKxLogChannelTechnology_IFX", "ifx/cells.hex"},
};

// Feeds the technology's recording `times` times to a new generator on state, refreshing as the monitor
// would.
void run(const Technology& technology, const StateDict& state, int times = 1) {
    const std::unique_ptr<LogGenerator> generator =
        LogGenerator::generatorFromTechnology(technology.constant);
    ASSERT_TRUE(generator) << technology.name;
    const std::vector<LogItem> items = readLogFile(testing::testDataPath(technology.blobs)).items;
    for (int time = 0; time < times; ++time) {
        for (const LogItem& item : items) {
            if (item.isBlob()) {
                generator->updateState(state, item.bytes);
            } else {
                generator->generateLogUsingState(state);
            }
        }
        generator->generateLogUsingState(state);
    }
}

TEST(KeptDisplay, AfterAnyTechnologyTheNextShowsWhatAnUnbrokenSessionShows) {
    for (const Technology& first : kTechnologies) {
        for (const Technology& next : kTechnologies) {
            // What an unbroken session would show: after the same technology its running figures (a
            // frame error rate) go on counting; after another one the display starts afresh.
            const bool same = std::string(first.name) == next.name;
            StateDict fresh = PlistDictionary::create();
            run(next, fresh, same ? 2 : 1);
            StateDict kept = PlistDictionary::create();
            run(first, kept);
            const PlistDictionaryRef firstDisplay = kept->get(state_keys::kDisplay).dictionary();
            run(next, kept);
            ASSERT_TRUE(fresh->get(state_keys::kDisplay).isDictionary()) << next.name;
            EXPECT_EQ(kept->get(state_keys::kDisplay), fresh->get(state_keys::kDisplay))
                << first.name << " then " << next.name;
            if (same && std::string(first.name) != "ifx") {
                // The same technology writes into the display it finds: the panes keep their nodes' data.
                EXPECT_EQ(kept->get(state_keys::kDisplay).dictionary(), firstDisplay) << first.name;
            }
        }
    }
}

TEST(KeptDisplay, ADisplayIsTheTemplatesWhenItsKeysAreTheTemplatesRootKeysInOrder) {
    auto laidOut = PlistDictionary::create();
    laidOut->set("A", PlistDictionary::create());
    laidOut->set("B", "text");
    auto shown = PlistDictionary::create();
    shown->set("A", PlistDictionary::create());
    shown->set("B", "text");
    EXPECT_TRUE(builtFromTemplate(PlistValue(shown), PlistValue(laidOut)));
    auto reordered = PlistDictionary::create();
    reordered->set("B", "text");
    reordered->set("A", PlistDictionary::create());
    EXPECT_FALSE(builtFromTemplate(PlistValue(reordered), PlistValue(laidOut)));
    shown->set("C", "more");
    EXPECT_FALSE(builtFromTemplate(PlistValue(shown), PlistValue(laidOut)));
    EXPECT_FALSE(builtFromTemplate(PlistValue("text"), PlistValue(laidOut)));
}

}  // namespace
}  // namespace velmar
