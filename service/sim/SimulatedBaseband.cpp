#include "service/sim/SimulatedBaseband.h"

#include <algorithm>

#include "service/sim/ActivityController.h"
#include "service/sim/CellGrid.h"
#include "service/sim/DeviceRoute.h"
#include "service/sim/MobilityController.h"
#include "service/sim/Propagation.h"

namespace velmar::sim {

namespace {

constexpr double kStepSeconds = 0.02;
// One step in baseband timestamp units (1/800 s).
constexpr std::uint64_t kStepTicks = 16;
// Cells weaker than this are not heard (the serving cell is listed all the same).
constexpr double kHearingThresholdDb = -135.0;

double speedOf(Scenario scenario) {
    switch (scenario) {
        case Scenario::Drive:
            return DeviceRoute::kDriveSpeed;
        case Scenario::Walk:
            return DeviceRoute::kWalkSpeed;
        case Scenario::Static:
            break;
    }
    return 0.0;
}

// The emitter's generator is seeded apart from the world's so that the two sequences do not interleave.
std::uint64_t emitterSeed(std::uint64_t seed) {
    return seed * 0xD1B54A32D192ED03ULL + 0x8CB92BA72F3D8DD7ULL;
}

}  // namespace

struct SimulatedBaseband::World {
    explicit World(const SimSettings& settings)
        : settings(settings),
          random(settings.seed),
          emitterRandom(emitterSeed(settings.seed)),
          cells(buildCellGrid(settings.technology, random, sectorOf)),
          route(speedOf(settings.scenario), random),
          propagation(cells, sectorOf, random),
          mobility(cells),
          activity(random),
          emitter(makeTechnologyEmitter(settings.technology, emitterRandom)) {
        gains.assign(cells.size(), -200.0);
        snapshot.cells = cells;
        snapshot.heard.reserve(cells.size());
    }

    void advanceWorld(bool firstInstant) {
        double moved = 0;
        if (!firstInstant) {
            ++steps;
            const double before = route.travelled();
            route.advance(kStepSeconds);
            moved = route.travelled() - before;
        }
        propagation.update(route.x(), route.y(), moved, kStepSeconds, route.speed());
        for (std::size_t index = 0; index < cells.size(); ++index) {
            gains[index] = propagation.pathGainDb(static_cast<int>(index));
        }

        snapshot.handoverJustHappened = false;
        if (!firstInstant) {
            const ActivityPhase before = activity.phase();
            const double servingGain =
                mobility.serving() >= 0 ? gains[static_cast<std::size_t>(mobility.serving())] : -200.0;
            activity.advance(kStepSeconds, servingGain);
            if (before == ActivityPhase::PowerOn && activity.phase() != ActivityPhase::PowerOn) {
                mobility.camp(gains);
            } else if (mobility.serving() >= 0) {
                const int previous = mobility.serving();
                const bool connected = activity.phase() == ActivityPhase::Connected;
                if (mobility.evaluate(gains, connected, kStepSeconds)) {
                    snapshot.previousServingCell = previous;
                    ++snapshot.servingChanges;
                    snapshot.handoverJustHappened = connected;
                }
            }
        }

        snapshot.time = static_cast<double>(steps) * kStepSeconds;
        snapshot.basebandTimestamp = settings.startTimestamp + ((steps * kStepTicks) << 16);
        snapshot.servingCell = mobility.serving();
        snapshot.phase = activity.phase();
        snapshot.phaseTime = activity.phaseTime();
        snapshot.dataSession = activity.dataSession();
        snapshot.throughputKbps = activity.throughputKbps();
        snapshot.speedMetresPerSecond = route.speed();
        snapshot.x = route.x();
        snapshot.y = route.y();
        snapshot.heard.clear();
        for (std::size_t index = 0; index < cells.size(); ++index) {
            const int cell = static_cast<int>(index);
            if (gains[index] >= kHearingThresholdDb || cell == snapshot.servingCell) {
                snapshot.heard.push_back({cell, gains[index], propagation.fastFadingDb(cell)});
            }
        }
        std::sort(snapshot.heard.begin(), snapshot.heard.end(), [](const HeardCell& a, const HeardCell& b) {
            return a.pathGainDb != b.pathGainDb ? a.pathGainDb > b.pathGainDb : a.cell < b.cell;
        });
    }

    void emitStep(const BlobOutput& emit) {
        if (emitter) {
            emitter->step(snapshot, emit);
        }
    }

    SimSettings settings;
    SimRandom random;
    SimRandom emitterRandom;
    std::vector<int> sectorOf;
    std::vector<SimCell> cells;
    DeviceRoute route;
    Propagation propagation;
    MobilityController mobility;
    ActivityController activity;
    std::unique_ptr<TechnologyEmitter> emitter;
    std::vector<double> gains;
    RadioSnapshot snapshot;
    std::uint64_t steps = 0;
    bool started = false;
};

SimulatedBaseband::SimulatedBaseband(const SimSettings& settings)
    : world_(std::make_unique<World>(settings)) {}

SimulatedBaseband::~SimulatedBaseband() = default;

void SimulatedBaseband::runUntil(double seconds, const BlobOutput& emit) {
    World& world = *world_;
    if (!world.started) {
        world.started = true;
        world.advanceWorld(true);
        world.emitStep(emit);
    }
    while (static_cast<double>(world.steps + 1) * kStepSeconds <= seconds + 1e-9) {
        world.advanceWorld(false);
        world.emitStep(emit);
    }
}

const RadioSnapshot& SimulatedBaseband::snapshot() const {
    return world_->snapshot;
}

}  // namespace velmar::sim
