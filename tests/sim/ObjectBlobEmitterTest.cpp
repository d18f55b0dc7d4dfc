#include "service/sim/ObjectBlobEmitter.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <functional>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/plist/PlistCodec.h"
#include "tests/sim/EmitterTestSupport.h"
#include "tests/sim/SimDecoding.h"

namespace velmar::sim {
namespace {

using testing::BlobRecorder;
using testing::makeCell;
using testing::run;

// Two GSM cells; RSSI = 43 dBm + path gain.
RadioSnapshot objectWorld() {
    RadioSnapshot snapshot;
    snapshot.cells = {
        makeCell(0, CellRat::Gsm, 20003, 8000, 17, 17, 35),
        makeCell(1, CellRat::Gsm, 20011, 8000, 17, 20, 12),
    };
    snapshot.heard = {{0, -130.0, 0.0}, {1, -139.0, 0.0}};
    snapshot.servingCell = 0;
    snapshot.phase = ActivityPhase::Idle;
    return snapshot;
}

std::string textAt(const PlistValue& tree, std::string_view group, std::string_view key) {
    const PlistValue* groupValue = tree.dictionary()->find(group);
    if (groupValue == nullptr || !groupValue->isDictionary()) {
        return "<no group>";
    }
    const PlistValue* value = groupValue->dictionary()->find(key);
    return value != nullptr && value->isString() ? *value->string() : "<missing>";
}

TEST(ObjectBlobEmitter, OneBlobPerSecondFromTheFirstSnapshot) {
    SimRandom random(1);
    ObjectBlobEmitter emitter(random);
    RadioSnapshot snapshot = objectWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 4.98, recorder);
    EXPECT_EQ(recorder.blobs.size(), 5u);  // at 0, 1, 2, 3 and 4 s
}

TEST(ObjectBlobEmitter, BlobHoldsNestedGroupsOfStrings) {
    SimRandom random(1);
    ObjectBlobEmitter emitter(random);
    RadioSnapshot snapshot = objectWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 0.0, recorder);
    ASSERT_EQ(recorder.blobs.size(), 1u);
    const std::optional<PlistValue> tree = parsePropertyList(recorder.blobs[0]);
    ASSERT_TRUE(tree && tree->isDictionary());
    EXPECT_EQ(textAt(*tree, "Serving Cell", "ARFCN"), "17");
    EXPECT_EQ(textAt(*tree, "Serving Cell", "BSIC"), "35");
    EXPECT_EQ(textAt(*tree, "Serving Cell", "Cell ID"), "20003");
    EXPECT_EQ(textAt(*tree, "Serving Cell", "LAC"), "8000");
    EXPECT_EQ(textAt(*tree, "Serving Cell", "RxLev"), "-87 dBm");  // 43 - 130
    EXPECT_EQ(textAt(*tree, "Serving Cell", "C1"), "17");          // RxLev 23 - 6
    EXPECT_EQ(textAt(*tree, "States", "RR State"), "Idle");
    EXPECT_EQ(textAt(*tree, "States", "MM State"), "Idle, Normal Service");
    EXPECT_EQ(textAt(*tree, "States", "GMM State"), "Registered");
    EXPECT_EQ(textAt(*tree, "PLMN", "MCC"), "001");
    EXPECT_EQ(textAt(*tree, "PLMN", "MNC"), "01");
    const PlistValue* neighbours = tree->dictionary()->find("Neighbour Cells");
    ASSERT_TRUE(neighbours != nullptr && neighbours->isArray());
    ASSERT_EQ(neighbours->array()->size(), 1u);
    const PlistDictionaryRef& neighbour = neighbours->array()->at(0).dictionary();
    ASSERT_NE(neighbour, nullptr);
    EXPECT_EQ(*neighbour->get("ARFCN").string(), "20");
    EXPECT_EQ(*neighbour->get("RxLev").string(), "-96 dBm");
}

TEST(ObjectBlobEmitter, ObjectGeneratorShowsTheBlob) {
    SimRandom random(1);
    ObjectBlobEmitter emitter(random);
    RadioSnapshot snapshot = objectWorld();
    snapshot.phase = ActivityPhase::Connected;
    snapshot.dataSession = true;
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 2.0, recorder);
    std::unique_ptr<LogGenerator> generator =
        LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_IFX);
    ASSERT_NE(generator, nullptr);
    const StateDict state = PlistDictionary::create();
    for (const PlistData& blob : recorder.blobs) {
        generator->updateState(state, blob);
    }
    const PlistValue display = generator->generateLogUsingState(state);
    ASSERT_TRUE(display.isDictionary());
    EXPECT_EQ(textAt(display, "States", "RR State"), "Packet Transfer");
    EXPECT_EQ(textAt(display, "States", "GMM State"), "Registered, PDP Active");
    EXPECT_EQ(textAt(display, "Serving Cell", "RxLev"), "-87 dBm");
}

TEST(ObjectBlobEmitter, SearchingBeforeTheFirstCamp) {
    SimRandom random(1);
    ObjectBlobEmitter emitter(random);
    RadioSnapshot snapshot = objectWorld();
    snapshot.servingCell = -1;
    snapshot.phase = ActivityPhase::PowerOn;
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 0.0, recorder);
    const std::optional<PlistValue> tree = parsePropertyList(recorder.blobs.at(0));
    ASSERT_TRUE(tree && tree->isDictionary());
    EXPECT_EQ(textAt(*tree, "Serving Cell", "Status"), "Searching");
    EXPECT_EQ(textAt(*tree, "States", "RR State"), "Cell Selection");
    EXPECT_EQ(textAt(*tree, "States", "GMM State"), "Deregistered");
}

}  // namespace
}  // namespace velmar::sim

namespace velmar::testing {
namespace {

TEST(ObjectBlobSimulation, ThirtySecondsShowTheWholePicture) {
    SimDecodingSettings settings;
    settings.technology = "ifx";
    const SimDecodingResult result = runSimDecoding(settings);
    EXPECT_EQ(result.blobs.size(), 31u);  // one a second, from 0 s to 30 s
    const PlistValue display = result.display();
    ASSERT_TRUE(display.isDictionary());
    const PlistValue serving = findInDisplay(display, "Serving Cell");
    ASSERT_TRUE(serving.isDictionary());
    for (const char* key : {"ARFCN", "BSIC", "Cell ID", "LAC", "RAC", "RxLev", "C1"}) {
        EXPECT_TRUE(serving.dictionary()->contains(key)) << key;
    }
    const int rxlev = std::atoi(serving.dictionary()->get("RxLev").string()->c_str());
    EXPECT_GE(rxlev, -110);
    EXPECT_LE(rxlev, -47);
    const PlistValue neighbours = findInDisplay(display, "Neighbour Cells");
    ASSERT_TRUE(neighbours.isArray());
    EXPECT_FALSE(neighbours.array()->empty());
    const PlistValue states = findInDisplay(display, "States");
    ASSERT_TRUE(states.isDictionary());
    EXPECT_EQ(states.dictionary()->size(), 3u);
    const PlistValue plmn = findInDisplay(display, "PLMN");
    ASSERT_TRUE(plmn.isDictionary());
    EXPECT_EQ(plmn.dictionary()->get("MCC"), PlistValue("001"));
}

TEST(ObjectBlobSimulation, SameSeedSameBytesOtherSeedOtherBytes) {
    SimDecodingSettings settings;
    settings.technology = "ifx";
    settings.decode = false;
    const std::vector<PlistData> first = runSimDecoding(settings).blobs;
    EXPECT_EQ(first, runSimDecoding(settings).blobs);
    settings.seed = 2;
    EXPECT_NE(first, runSimDecoding(settings).blobs);
}

}  // namespace
}  // namespace velmar::testing
