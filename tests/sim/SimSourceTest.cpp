// The simulated baseband as kxserverd's source: the default service serves a living LTE network, each
// channel receives only what its start command names, and the source's clock and description.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>

#include "service/sim/SimSource.h"
#include "tests/sim/SimDecoding.h"
#include "tests/support/ServiceTestFixture.h"

namespace velmar::testing {
namespace {

std::uint64_t timestampOf(const PlistData& blob) {
    std::uint64_t timestamp = 0;
    for (int byte = 7; byte >= 0; --byte) {
        timestamp = (timestamp << 8) | blob[5 + static_cast<std::size_t>(byte)];
    }
    return timestamp;
}

using SimSourceServiceTest = ServiceTest;

TEST_F(SimSourceServiceTest, WithNoOptionsTheServiceSimulatesAnLteNetwork) {
    ServiceProcess& service = startService({});
    KxTestClient& client = newClient();
    EXPECT_EQ(client.technology(), std::optional<std::string>("kKxLogChannelTechnology_Orvane_LTE"));
    const auto before = std::chrono::system_clock::now();
    ASSERT_TRUE(client.start({0xB0C2, 0xB0C1, 0xB179, 0xB17F, 0xB180, 0xB186}, {0, 1, 2}));
    const auto hasServingCellInfo = [&] {
        return std::any_of(client.blobs().begin(), client.blobs().end(),
                           [](const PlistData& blob) { return logCodeOf(blob) == 0xB0C2; });
    };
    ASSERT_TRUE(runUntil(hasServingCellInfo, 20)) << service.errorOutput();
    EXPECT_TRUE(service.waitForError("source: simulated lte baseband (drive, seed 1, rate x1)", 5))
        << service.errorOutput();
    // The baseband's clock is the wall clock: 1/800 s since 1980-01-06 in the upper 48 bits.
    const std::uint64_t now = SimSource::basebandTimestampOf(std::chrono::system_clock::now()) >> 16;
    const std::uint64_t then = SimSource::basebandTimestampOf(before - std::chrono::seconds(5)) >> 16;
    for (const PlistData& blob : client.blobs()) {
        const std::uint64_t ticks = timestampOf(blob) >> 16;
        EXPECT_GE(ticks, then);
        EXPECT_LE(ticks, now);
    }
}

TEST_F(SimSourceServiceTest, AChannelAskingForOneCodeReceivesOnlyThatCode) {
    startService({"--source", "sim", "--rate-multiplier", "20"});
    KxTestClient& measurements = newClient();
    KxTestClient& cellMonitor = newClient();
    ASSERT_TRUE(measurements.start({0xB17F}, {}));
    ASSERT_TRUE(cellMonitor.start({}, {1}));
    ASSERT_TRUE(
        runUntil([&] { return measurements.blobs().size() >= 6 && cellMonitor.blobs().size() >= 3; }, 30));
    for (const PlistData& blob : measurements.blobs()) {
        EXPECT_EQ(logCodeOf(blob), 0xB17F) << hexOf(blob);
    }
    for (const PlistData& blob : cellMonitor.blobs()) {
        EXPECT_EQ(logCodeOf(blob), 0xFF0001) << hexOf(blob);
    }
    // Simulated time runs 20 times faster: consecutive idle measurements are 1.28 s of baseband time
    // apart (1024 ticks), or a connected period apart.
    for (std::size_t index = 1; index < measurements.blobs().size(); ++index) {
        const std::uint64_t gap = (timestampOf(measurements.blobs()[index]) >> 16) -
                                  (timestampOf(measurements.blobs()[index - 1]) >> 16);
        EXPECT_TRUE(gap == 1024 || gap > 15 * 800) << gap;
    }
}

TEST_F(SimSourceServiceTest, TheCdmaSimulatorHonoursTheStartCommandToo) {
    startService({"--technology", "cdma", "--rate-multiplier", "10", "--scenario", "walk", "--seed", "4"});
    KxTestClient& client = newClient();
    EXPECT_EQ(client.technology(), std::optional<std::string>("kKxLogChannelTechnology_Orvane_CDMA"));
    ASSERT_TRUE(client.start({0x1183}, {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 4; }, 30));
    for (const PlistData& blob : client.blobs()) {
        EXPECT_EQ(logCodeOf(blob), 0x1183) << hexOf(blob);
        EXPECT_EQ(blob.size(), 50U);
    }
}

TEST(SimSource, ConvertsTheWallClockToBasebandTime) {
    using std::chrono::seconds;
    using std::chrono::system_clock;
    const system_clock::time_point epoch{seconds(315964800)};  // 1980-01-06 00:00:00 UTC
    EXPECT_EQ(SimSource::basebandTimestampOf(epoch), 0U);
    EXPECT_EQ(SimSource::basebandTimestampOf(epoch + seconds(1)), 800ULL << 16);
    EXPECT_EQ(SimSource::basebandTimestampOf(epoch + std::chrono::milliseconds(1250)), 1000ULL << 16);
    // 2026-01-01 00:00:00 UTC: 1451260800 s after the epoch.
    EXPECT_EQ(SimSource::basebandTimestampOf(system_clock::time_point{seconds(1767225600)}),
              (1451260800ULL * 800ULL) << 16);
}

TEST(SimSource, DescribesItself) {
    EXPECT_EQ(SimSource({"lte", 1, sim::Scenario::Drive, 1.0}).description(),
              "simulated lte baseband (drive, seed 1, rate x1)");
    EXPECT_EQ(SimSource({"cdma", 42, sim::Scenario::Static, 2.5}).description(),
              "simulated cdma baseband (static, seed 42, rate x2.5)");
}

TEST(SimSource, RefusesATechnologyWithoutASimulator) {
    SimSource source({"wimax", 1, sim::Scenario::Walk, 1.0});
    std::string error;
    EXPECT_FALSE(source.prepare(error));
    EXPECT_EQ(error, "the simulated baseband cannot simulate wimax in this build");
    SimSource lte({"lte", 1, sim::Scenario::Walk, 1.0});
    EXPECT_TRUE(lte.prepare(error));
}

}  // namespace
}  // namespace velmar::testing
