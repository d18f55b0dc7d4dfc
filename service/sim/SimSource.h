// SimSource: the simulated baseband as the service's source. Simulated time follows the wall clock, times
// the rate multiplier: a repeating timer on the queue (every 20 ms of wall time) runs the simulation up to
// the time due and delivers every blob it produced, as a baseband would, whether or not a channel streams.
// One run takes at most kPumpBudgetSeconds of the thread, in slices of simulated time, so that the service
// answers its clients and signals in between; where the machine cannot keep up with the rate, simulated time
// falls behind by at most kMostBehindSeconds of wall time and then runs as fast as the machine lets it (said
// once in the log).
//
// Contract: prepare() fails when the technology has no simulator. start() takes the wall clock as the
// baseband's time 0 (its timestamps continue from the current date), stop() cancels the timer and nothing
// scheduled earlier delivers anything afterwards. The blob stream depends only on the settings (the seed,
// the scenario, the technology) and on how far simulated time has run.
#pragma once

#include <chrono>
#include <cstdint>
#include <memory>
#include <string>

#include "service/BasebandSource.h"
#include "service/sim/SimulatedBaseband.h"

namespace velmar {

class SimSource : public BasebandSource {
  public:
    struct Settings {
        std::string technology = "lte";
        std::uint64_t seed = 1;
        sim::Scenario scenario = sim::Scenario::Drive;
        double rateMultiplier = 1.0;
    };
    static constexpr double kTickSeconds = 0.02;
    static constexpr double kPumpBudgetSeconds = 0.02;
    static constexpr double kSliceSimulatedSeconds = 0.5;
    static constexpr double kMostBehindSeconds = 1.0;

    explicit SimSource(Settings settings);
    ~SimSource() override;

    bool prepare(std::string& error) override;
    void start(MainQueue& queue, BlobSink& sink) override;
    void stop() override;
    std::string description() const override;

    // The baseband timestamp (1/800 s since 1980-01-06, shifted left by 16) of a wall-clock instant.
    static std::uint64_t basebandTimestampOf(std::chrono::system_clock::time_point instant);

  private:
    using Clock = std::chrono::steady_clock;

    void pump();

    Settings settings_;
    std::unique_ptr<sim::SimulatedBaseband> baseband_;
    MainQueue* queue_ = nullptr;
    BlobSink* sink_ = nullptr;
    std::shared_ptr<bool> alive_;  // tasks scheduled on the queue hold it weakly
    MainQueue::Handle timer_ = 0;
    Clock::time_point started_;
    double simulated_ = 0;  // seconds of simulated time run so far
    bool saidBehind_ = false;
};

}  // namespace velmar
