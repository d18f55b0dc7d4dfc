// The simulated baseband writes the decoded layouts with their own version numbers: the service's
// packet-version adapter hands every simulated blob on as it is, without a copy.
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "logfile/PacketVersionAdapter.h"
#include "tests/sim/SimDecoding.h"

namespace velmar::testing {
namespace {

TEST(SimVersions, TheAdapterLeavesEverySimulatedRecordAlone) {
    for (const char* technology : {"gsm", "lte", "utran", "cdma", "ifx"}) {
        SimDecodingSettings settings;
        settings.technology = technology;
        settings.decode = false;
        settings.seconds = 20;
        const SimDecodingResult run = runSimDecoding(settings);
        ASSERT_GT(run.blobs.size(), 20U) << technology;
        PacketVersionAdapter adapter;
        std::map<VersionOutcome, std::size_t> outcomes;
        for (const PlistData& blob : run.blobs) {
            const AdaptedPacket adapted = adapter.adapt(blob);
            ++outcomes[adapted.outcome];
            EXPECT_EQ(adapted.blob.data(), blob.data()) << technology << " code " << adapted.logCode;
            EXPECT_TRUE(adapted.outcome != VersionOutcome::Adapted &&
                        adapted.outcome != VersionOutcome::Dropped &&
                        adapted.outcome != VersionOutcome::UnknownVersion)
                << technology << " code " << adapted.logCode << " version " << adapted.version;
        }
        if (std::string(technology) == "lte") {
            // The LTE records of the versioned codes are recognised as decoded layouts.
            EXPECT_GT(outcomes[VersionOutcome::DecodedAsIs], 20U);
        }
    }
}

}  // namespace
}  // namespace velmar::testing
