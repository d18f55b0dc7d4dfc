// The simulated radio world: the route's speed, reselection and handover with hysteresis, levels that stay
// in range and move smoothly, the procedures' phase sequence, timestamps and determinism.
#include <gtest/gtest.h>

#include <cmath>
#include <map>
#include <set>
#include <vector>

#include "service/sim/CellGrid.h"
#include "service/sim/MobilityController.h"
#include "service/sim/SimulatedBaseband.h"
#include "tests/sim/SimDecoding.h"

namespace velmar::sim {
namespace {

constexpr double kStep = 0.02;

// Runs the world alone (no emitter output kept) and calls observe after every step.
template <typename Observe>
void runWorld(const SimSettings& settings, double seconds, Observe observe) {
    SimulatedBaseband baseband(settings);
    const auto ignore = [](ByteView) {};
    const int steps = static_cast<int>(std::lround(seconds / kStep));
    baseband.runUntil(0, ignore);
    observe(baseband.snapshot());
    for (int step = 1; step <= steps; ++step) {
        baseband.runUntil(step * kStep, ignore);
        observe(baseband.snapshot());
    }
}

SimSettings settingsFor(Scenario scenario, std::uint64_t seed = 1) {
    SimSettings settings;
    settings.technology = "lte";
    settings.seed = seed;
    settings.scenario = scenario;
    return settings;
}

double distanceBetween(const RadioSnapshot& a, const RadioSnapshot& b) {
    return std::hypot(a.x - b.x, a.y - b.y);
}

TEST(SimWorld, TheDeviceMovesAtTheScenarioSpeed) {
    const struct {
        Scenario scenario;
        double metresPerSecond;
    } cases[] = {{Scenario::Drive, 50.0 / 3.6}, {Scenario::Walk, 5.0 / 3.6}, {Scenario::Static, 0.0}};
    for (const auto& testCase : cases) {
        std::vector<RadioSnapshot> seconds;
        int step = 0;
        runWorld(settingsFor(testCase.scenario), 10, [&](const RadioSnapshot& snapshot) {
            if (step++ % 50 == 0) {
                seconds.push_back(snapshot);
            }
        });
        ASSERT_EQ(seconds.size(), 11U);
        for (std::size_t index = 1; index < seconds.size(); ++index) {
            EXPECT_DOUBLE_EQ(seconds[index].speedMetresPerSecond, testCase.metresPerSecond);
            // The loop bends gently: a second's chord is within 2 % of the arc driven (and never longer,
            // but for the integration's rounding).
            const double moved = distanceBetween(seconds[index - 1], seconds[index]);
            EXPECT_LE(moved, testCase.metresPerSecond * (1.0 + 1e-4));
            EXPECT_GE(moved, testCase.metresPerSecond * 0.98);
        }
    }
}

TEST(SimWorld, CellsCarryPlannedIdentitiesWithinTheirFields) {
    const struct {
        const char* technology;
        CellRat rat;
        std::uint32_t maxPhysicalId;
        std::uint32_t maxCellId;
    } cases[] = {{"lte", CellRat::Lte, 503, (1U << 28) - 1},
                 {"utran", CellRat::Umts, 511, (1U << 28) - 1},
                 {"cdma", CellRat::Cdma, 511, 0xFFFF},
                 {"ifx", CellRat::Gsm, 63, 0xFFFF}};
    for (const auto& testCase : cases) {
        SimRandom random(1);
        std::vector<int> sectors;
        const std::vector<SimCell> cells = buildCellGrid(testCase.technology, random, sectors);
        ASSERT_EQ(cells.size(), 57U) << testCase.technology;  // 19 sites of 3 sectors
        ASSERT_EQ(sectors.size(), cells.size());
        std::set<std::uint32_t> cellIds;
        std::set<std::uint32_t> physicalIds;
        for (std::size_t index = 0; index < cells.size(); ++index) {
            const SimCell& cell = cells[index];
            EXPECT_EQ(cell.index, static_cast<int>(index));
            EXPECT_EQ(cell.rat, testCase.rat);
            EXPECT_LE(cell.physicalId, testCase.maxPhysicalId);
            EXPECT_LE(cell.cellId, testCase.maxCellId);
            EXPECT_EQ(sectors[index], static_cast<int>(index % 3));
            cellIds.insert(cell.cellId);
            physicalIds.insert(cell.physicalId);
        }
        EXPECT_EQ(cellIds.size(), cells.size()) << testCase.technology;
        if (testCase.rat != CellRat::Gsm) {  // GSM reuses its BSICs; the others plan theirs apart
            EXPECT_EQ(physicalIds.size(), cells.size()) << testCase.technology;
        }
    }
    // The dual-layer world: GSM on every sector, UMTS on every other site.
    SimRandom random(1);
    std::vector<int> sectors;
    const std::vector<SimCell> dual = buildCellGrid("gsm", random, sectors);
    std::size_t umts = 0;
    for (const SimCell& cell : dual) {
        umts += cell.rat == CellRat::Umts ? 1 : 0;
        if (cell.rat == CellRat::Gsm) {
            EXPECT_GE(cell.channel, 1U);
            EXPECT_LE(cell.channel, 124U);  // GSM 900
        }
    }
    EXPECT_EQ(dual.size(), 57U + 30U);
    EXPECT_EQ(umts, 30U);
}

TEST(SimWorld, ReselectionNeedsTheHysteresisForTheWholeTimer) {
    std::vector<SimCell> cells(2);
    cells[0].index = 0;
    cells[1].index = 1;
    MobilityController mobility(cells);
    std::vector<double> gains = {-100.0, -110.0};
    mobility.camp(gains);
    ASSERT_EQ(mobility.serving(), 0);

    // 3.9 dB better for a minute: within the hysteresis, no reselection.
    gains = {-100.0, -96.1};
    for (int step = 0; step < 3000; ++step) {
        ASSERT_FALSE(mobility.evaluate(gains, false, kStep));
    }
    // 4.5 dB better, but only for 1.98 s, then back: the timer starts over.
    gains = {-100.0, -95.5};
    for (int step = 0; step < 99; ++step) {
        ASSERT_FALSE(mobility.evaluate(gains, false, kStep));
    }
    gains = {-100.0, -97.0};
    ASSERT_FALSE(mobility.evaluate(gains, false, kStep));
    gains = {-100.0, -95.5};
    for (int step = 0; step < 99; ++step) {
        ASSERT_FALSE(mobility.evaluate(gains, false, kStep));
    }
    // The hundredth step completes 2 s: reselection.
    EXPECT_TRUE(mobility.evaluate(gains, false, kStep));
    EXPECT_EQ(mobility.serving(), 1);
    // The old cell, now 4.5 dB weaker, does not win it back.
    for (int step = 0; step < 500; ++step) {
        ASSERT_FALSE(mobility.evaluate(gains, false, kStep));
    }
}

TEST(SimWorld, HandoverFollowsTheOffsetAndTimeToTrigger) {
    std::vector<SimCell> cells(2);
    cells[0].index = 0;
    cells[1].index = 1;
    MobilityController mobility(cells);
    std::vector<double> gains = {-90.0, -100.0};
    mobility.camp(gains);
    gains = {-90.0, -87.1};  // 2.9 dB: below the offset
    for (int step = 0; step < 500; ++step) {
        ASSERT_FALSE(mobility.evaluate(gains, true, kStep));
    }
    gains = {-90.0, -86.5};
    for (int step = 0; step < 31; ++step) {  // 0.62 s
        ASSERT_FALSE(mobility.evaluate(gains, true, kStep));
    }
    EXPECT_TRUE(mobility.evaluate(gains, true, kStep));  // 0.64 s
    EXPECT_EQ(mobility.serving(), 1);
}

TEST(SimWorld, ADualLayerWorldPrefersUmtsWhereItIsGoodEnough) {
    std::vector<SimCell> cells(3);
    for (int index = 0; index < 3; ++index) {
        cells[static_cast<std::size_t>(index)].index = index;
    }
    cells[0].rat = CellRat::Gsm;
    cells[1].rat = CellRat::Gsm;
    cells[2].rat = CellRat::Umts;
    MobilityController mobility(cells);
    std::vector<double> gains = {-80.0, -90.0, -120.0};
    mobility.camp(gains);
    EXPECT_EQ(mobility.serving(), 2);
    gains = {-80.0, -90.0, -130.0};  // UMTS fades below its usable level less the hysteresis
    int changedAt = -1;
    for (int step = 0; step < 200 && changedAt < 0; ++step) {
        if (mobility.evaluate(gains, false, kStep)) {
            changedAt = step;
        }
    }
    EXPECT_EQ(changedAt, 99);
    EXPECT_EQ(mobility.serving(), 0);
}

TEST(SimWorld, ServingChangesRespectTheMarginsAndNeverPingPong) {
    int previous = -1;
    std::uint32_t changes = 0;
    std::map<int, double> lastLeft;  // cell -> time the device left it
    double lastChange = -100;
    int quickReturns = 0;
    std::vector<double> gains;
    runWorld(settingsFor(Scenario::Drive), 240, [&](const RadioSnapshot& snapshot) {
        if (snapshot.servingCell < 0) {
            return;
        }
        if (previous >= 0 && snapshot.servingCell != previous) {
            ++changes;
            EXPECT_EQ(snapshot.previousServingCell, previous);
            double newGain = -999;
            double oldGain = -999;
            for (const HeardCell& heard : snapshot.heard) {
                if (heard.cell == snapshot.servingCell) {
                    newGain = heard.pathGainDb;
                }
                if (heard.cell == previous) {
                    oldGain = heard.pathGainDb;
                }
            }
            const double margin = snapshot.handoverJustHappened ? MobilityController::kHandoverOffsetDb
                                                                : MobilityController::kIdleHysteresisDb;
            EXPECT_GT(newGain, oldGain + margin) << "at " << snapshot.time;
            // Back to a cell left less than 2 s ago would be a ping-pong.
            if (lastLeft.count(snapshot.servingCell) != 0 &&
                snapshot.time - lastLeft[snapshot.servingCell] < 2.0) {
                ++quickReturns;
            }
            EXPECT_GT(snapshot.time - lastChange, 0.3);
            lastLeft[previous] = snapshot.time;
            lastChange = snapshot.time;
        }
        previous = snapshot.servingCell;
        EXPECT_EQ(snapshot.servingChanges, changes);
    });
    EXPECT_GE(changes, 3U);
    EXPECT_LE(changes, 40U);
    EXPECT_EQ(quickReturns, 0);
}

TEST(SimWorld, LevelsStayInRangeAndMoveSmoothly) {
    for (const Scenario scenario : {Scenario::Drive, Scenario::Walk, Scenario::Static}) {
        std::map<int, double> last;
        double sumOfSteps = 0;
        int stepsCompared = 0;
        double largestStep = 0;
        runWorld(settingsFor(scenario), 60, [&](const RadioSnapshot& snapshot) {
            std::map<int, double> now;
            for (std::size_t index = 0; index < snapshot.heard.size(); ++index) {
                const HeardCell& heard = snapshot.heard[index];
                ASSERT_GE(heard.pathGainDb, -175.0);
                ASSERT_LE(heard.pathGainDb, -40.0);
                ASSERT_GE(heard.fastFadingDb, -15.0);
                ASSERT_LE(heard.fastFadingDb, 6.0);
                if (index > 0) {
                    ASSERT_LE(heard.pathGainDb, snapshot.heard[index - 1].pathGainDb);  // strongest first
                }
                now[heard.cell] = heard.pathGainDb;
                if (const auto found = last.find(heard.cell); found != last.end()) {
                    const double change = std::fabs(heard.pathGainDb - found->second);
                    sumOfSteps += change;
                    largestStep = std::max(largestStep, change);
                    ++stepsCompared;
                }
            }
            last = std::move(now);
        });
        ASSERT_GT(stepsCompared, 1000);
        EXPECT_LT(largestStep, 6.0) << static_cast<int>(scenario);
        EXPECT_LT(sumOfSteps / stepsCompared, 0.6) << static_cast<int>(scenario);
    }
}

TEST(SimWorld, PhasesFollowTheProceduresWithPlausibleDwellTimes) {
    const std::map<ActivityPhase, ActivityPhase> next = {
        {ActivityPhase::PowerOn, ActivityPhase::Registering},
        {ActivityPhase::Registering, ActivityPhase::Idle},
        {ActivityPhase::Idle, ActivityPhase::Connecting},
        {ActivityPhase::Connecting, ActivityPhase::Connected},
        {ActivityPhase::Connected, ActivityPhase::Releasing},
        {ActivityPhase::Releasing, ActivityPhase::Idle},
    };
    std::vector<std::pair<ActivityPhase, double>> periods;  // phase, length
    ActivityPhase phase = ActivityPhase::PowerOn;
    double since = 0;
    bool first = true;
    int stepsWithData = 0;
    runWorld(settingsFor(Scenario::Drive, 3), 400, [&](const RadioSnapshot& snapshot) {
        if (first) {
            EXPECT_EQ(snapshot.phase, ActivityPhase::PowerOn);
            first = false;
        }
        EXPECT_EQ(snapshot.servingCell < 0, snapshot.phase == ActivityPhase::PowerOn) << snapshot.time;
        // Data flows only in connected mode, and only with a packet-data context up.
        if (snapshot.throughputKbps > 0) {
            EXPECT_EQ(snapshot.phase, ActivityPhase::Connected);
            EXPECT_TRUE(snapshot.dataSession);
            EXPECT_LE(snapshot.throughputKbps, 60000.0);
            ++stepsWithData;
        }
        if (snapshot.phase != phase) {
            EXPECT_EQ(snapshot.phase, next.at(phase)) << snapshot.time;
            periods.emplace_back(phase, snapshot.time - since);
            phase = snapshot.phase;
            since = snapshot.time;
        }
    });
    ASSERT_GE(periods.size(), 8U);
    EXPECT_GE(stepsWithData, 15 * 50);  // the first connection carries data, for 15 s at least
    int idlePeriods = 0;
    for (const auto& [period, length] : periods) {
        switch (period) {
            case ActivityPhase::PowerOn:
                EXPECT_GE(length, 2.0 - 1e-9);
                EXPECT_LE(length, 3.02);
                break;
            case ActivityPhase::Registering:
                EXPECT_GE(length, 3.0 - 1e-9);
                EXPECT_LE(length, 5.02);
                break;
            case ActivityPhase::Idle:
                EXPECT_GE(length, idlePeriods == 0 ? 6.0 - 1e-9 : 10.0 - 1e-9);
                EXPECT_LE(length, idlePeriods == 0 ? 10.02 : 40.02);
                ++idlePeriods;
                break;
            case ActivityPhase::Connecting:
                EXPECT_GE(length, 0.2 - 1e-9);
                EXPECT_LE(length, 0.52);
                break;
            case ActivityPhase::Connected:
                EXPECT_GE(length, 15.0 - 1e-9);
                EXPECT_LE(length, 60.02);
                break;
            case ActivityPhase::Releasing:
                EXPECT_GE(length, 0.3 - 1e-9);
                EXPECT_LE(length, 0.82);
                break;
        }
    }
}

TEST(SimWorld, SnapshotTimestampsCountEightHundredthsFromTheStart) {
    SimSettings settings = settingsFor(Scenario::Walk);
    settings.startTimestamp = 0x123456ULL << 16;
    SimulatedBaseband baseband(settings);
    baseband.runUntil(1.0, [](ByteView) {});
    EXPECT_DOUBLE_EQ(baseband.snapshot().time, 1.0);
    EXPECT_EQ(baseband.snapshot().basebandTimestamp, (0x123456ULL + 800ULL) << 16);
    baseband.runUntil(2.5, [](ByteView) {});
    EXPECT_EQ(baseband.snapshot().basebandTimestamp, (0x123456ULL + 2000ULL) << 16);
    // Time never runs backwards.
    baseband.runUntil(1.0, [](ByteView) {});
    EXPECT_DOUBLE_EQ(baseband.snapshot().time, 2.5);
}

TEST(SimWorld, TheSameSeedGivesTheSameBytesHoweverTimeIsCut) {
    for (const char* technology : {"lte", "cdma"}) {
        SimSettings settings;
        settings.technology = technology;
        settings.seed = 9;
        std::vector<PlistData> whole;
        std::vector<PlistData> pieces;
        std::vector<PlistData> otherSeed;
        SimulatedBaseband(settings).runUntil(
            40, [&](ByteView blob) { whole.emplace_back(blob.begin(), blob.end()); });
        SimulatedBaseband cut(settings);
        for (double time = 0; time <= 40.0; time += 0.013) {
            cut.runUntil(time, [&](ByteView blob) { pieces.emplace_back(blob.begin(), blob.end()); });
        }
        cut.runUntil(40, [&](ByteView blob) { pieces.emplace_back(blob.begin(), blob.end()); });
        settings.seed = 10;
        SimulatedBaseband(settings).runUntil(
            40, [&](ByteView blob) { otherSeed.emplace_back(blob.begin(), blob.end()); });
        ASSERT_GT(whole.size(), 50U) << technology;
        EXPECT_EQ(whole, pieces) << technology;
        EXPECT_NE(whole, otherSeed) << technology;
    }
}

}  // namespace
}  // namespace velmar::sim
