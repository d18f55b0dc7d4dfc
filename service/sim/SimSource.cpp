#include "service/sim/SimSource.h"

#include <algorithm>

#include "core/platform/BasebandTime.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar {

namespace {

const char* scenarioName(sim::Scenario scenario) {
    switch (scenario) {
        case sim::Scenario::Drive:
            return "drive";
        case sim::Scenario::Walk:
            return "walk";
        case sim::Scenario::Static:
            break;
    }
    return "static";
}

}  // namespace

SimSource::SimSource(Settings settings)
    : settings_(std::move(settings)), alive_(std::make_shared<bool>(true)) {}

SimSource::~SimSource() {
    stop();
}

std::uint64_t SimSource::basebandTimestampOf(std::chrono::system_clock::time_point instant) {
    const auto sinceUnixEpoch =
        std::chrono::duration_cast<std::chrono::microseconds>(instant.time_since_epoch()).count();
    return basebandTimestampOfUnixMicroseconds(sinceUnixEpoch);
}

bool SimSource::prepare(std::string& error) {
    sim::SimRandom probe(settings_.seed);
    if (!sim::makeTechnologyEmitter(settings_.technology, probe)) {
        error = "the simulated baseband cannot simulate " + settings_.technology + " in this build";
        return false;
    }
    return true;
}

std::string SimSource::description() const {
    return stringWithFormat("simulated %s baseband (%s, seed %llu, rate x%g)", settings_.technology.c_str(),
                            scenarioName(settings_.scenario), static_cast<unsigned long long>(settings_.seed),
                            settings_.rateMultiplier);
}

void SimSource::start(MainQueue& queue, BlobSink& sink) {
    queue_ = &queue;
    sink_ = &sink;
    *alive_ = true;
    sim::SimSettings settings;
    settings.technology = settings_.technology;
    settings.seed = settings_.seed;
    settings.scenario = settings_.scenario;
    settings.startTimestamp = basebandTimestampOf(std::chrono::system_clock::now());
    baseband_ = std::make_unique<sim::SimulatedBaseband>(settings);
    started_ = Clock::now();
    simulated_ = 0;
    pump();
    timer_ = queue.repeating(kTickSeconds, [this, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            pump();
        }
    });
}

void SimSource::stop() {
    *alive_ = false;
    if (queue_ != nullptr && timer_ != 0) {
        queue_->cancelTimer(timer_);
    }
    timer_ = 0;
}

void SimSource::pump() {
    const Clock::time_point began = Clock::now();
    const double target = std::chrono::duration<double>(began - started_).count() * settings_.rateMultiplier;
    const auto deliver = [this](ByteView blob) { sink_->deliver(frameBasebandBlob(blob)); };
    while (simulated_ < target) {
        simulated_ = std::min(target, simulated_ + kSliceSimulatedSeconds);
        baseband_->runUntil(simulated_, deliver);
        if (std::chrono::duration<double>(Clock::now() - began).count() >= kPumpBudgetSeconds) {
            break;
        }
    }
    const double behindWallSeconds = (target - simulated_) / settings_.rateMultiplier;
    if (behindWallSeconds > kMostBehindSeconds) {
        // The wall clock's lead is given up: simulated time goes on from where it is, as fast as it can.
        started_ +=
            std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(behindWallSeconds));
        if (!saidBehind_) {
            saidBehind_ = true;
            SystemLog::log(
                kLogError,
                "sim: this machine cannot run the simulated baseband %g times faster than the wall "
                "clock; simulated time runs as fast as it can",
                settings_.rateMultiplier);
        }
    }
}

}  // namespace velmar
