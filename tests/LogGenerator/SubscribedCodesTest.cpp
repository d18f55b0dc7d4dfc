// Leaving out the packets that no decoder reads must not change what a recording decodes to: the display,
// the log lines and their order are those of a generator that was handed every packet.
#include <gtest/gtest.h>

#include <regex>
#include <string>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "LogGenerator/SubscribedCodes.h"
#include "core/platform/Json.h"
#include "core/platform/TechnologyNames.h"
#include "logfile/LogFormat.h"
#include "logfile/PacketVersionAdapter.h"
#include "tests/LogGenerator/RecordingDecoder.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::RecordingGenerator;

std::vector<std::uint8_t> packet(std::uint8_t type, std::uint16_t code, std::size_t length = 13) {
    std::vector<std::uint8_t> bytes(length, 0);
    bytes[0] = type;
    bytes[1] = static_cast<std::uint8_t>((length - 1) & 0xFF);
    bytes[3] = static_cast<std::uint8_t>(code & 0xFF);
    bytes[4] = static_cast<std::uint8_t>(code >> 8);
    return bytes;
}

TEST(SubscribedCodes, OnlyPacketsOfCodesWithoutSubscribersAreLeftOut) {
    RecordingGenerator generator("NoSuchTemplate", {{"Plain", std::vector<std::int32_t>{0xB179, 0x1234}},
                                                    {"Extended", std::vector<std::int32_t>{0xFF00C1}}});
    generator.setGathersRawBlobs(false);
    const std::optional<SubscribedCodes> codes = SubscribedCodes::of(generator);
    ASSERT_TRUE(codes);
    EXPECT_TRUE(codes->passes(packet(1, 0xB179)));
    EXPECT_TRUE(codes->passes(packet(1, 0x1234, 40)));
    EXPECT_FALSE(codes->passes(packet(1, 0xB17A)));
    EXPECT_FALSE(codes->passes(packet(1, 0x00C1)));
    EXPECT_TRUE(codes->passes(packet(0xFF, 0x00C1)));
    EXPECT_FALSE(codes->passes(packet(0xFF, 0xB179)));
    // A channel prefix is looked past.
    std::vector<std::uint8_t> prefixed = {0x81, 0x02};
    const std::vector<std::uint8_t> unread = packet(1, 0xB17A);
    prefixed.insert(prefixed.end(), unread.begin(), unread.end());
    EXPECT_FALSE(codes->passes(prefixed));
    prefixed[5] = 0x79;
    EXPECT_TRUE(codes->passes(prefixed));
    // What the generator itself skips or reports goes to it.
    EXPECT_TRUE(codes->passes(packet(1, 0xB17A, 12)));
    EXPECT_TRUE(codes->passes(packet(2, 0xB17A)));
    EXPECT_TRUE(codes->passes({}));
}

TEST(SubscribedCodes, NoFilterForAGeneratorThatGathersBlobsOrReadsNoCodes) {
    RecordingGenerator gathering("NoSuchTemplate", {{"Plain", std::vector<std::int32_t>{0xB179}}});
    EXPECT_FALSE(SubscribedCodes::of(gathering));
    for (const char* name : {"cdma", "ifx"}) {
        const std::unique_ptr<LogGenerator> generator =
            LogGenerator::generatorFromTechnology(technologyNamed(name)->constant);
        ASSERT_TRUE(generator) << name;
        EXPECT_FALSE(SubscribedCodes::of(*generator)) << name;
    }
}

struct Decoded {
    std::string display;
    std::vector<std::string> lines;  // every log line, addresses blanked
};

// Decodes a capture as velmar-decode does, handing the generator every packet or, after the first, only
// those that pass.
Decoded decode(const char* technology, const std::string& capture, bool filtered) {
    const testing::LogCapture logged;  // at every priority
    std::unique_ptr<LogGenerator> generator =
        LogGenerator::generatorFromTechnology(technologyNamed(technology)->constant);
    dynamic_cast<ORVLogGenerator&>(*generator).setGathersRawBlobs(false);
    const std::optional<SubscribedCodes> codes = filtered ? SubscribedCodes::of(*generator) : std::nullopt;
    EXPECT_EQ(filtered, codes.has_value());
    const StateDict state = PlistDictionary::create();
    PacketVersionAdapter adapter;
    bool seenOne = false;
    std::string error;
    EXPECT_TRUE(forEachLogItem(
        capture, LogFormat::Auto,
        [&](const LogItemView& item) {
            if (!codes || !seenOne || codes->passes(item.bytes)) {
                seenOne = true;
                generator->updateState(state, adapter.adapt(item.bytes).blob);
            }
            return true;
        },
        error))
        << error;
    generator->generateLogUsingState(state);
    generator.reset();
    Decoded decoded{plistToJson(state->get(state_keys::kDisplay), 2), {}};
    const std::regex address("0x[0-9a-f]{6,}");
    for (const std::string& line : logged.texts()) {
        decoded.lines.push_back(std::regex_replace(line, address, "ADDRESS"));
    }
    return decoded;
}

TEST(SubscribedCodes, RealCapturesDecodeAsWithEveryPacket) {
    struct Case {
        const char* technology;
        const char* capture;
    };
    const Case cases[] = {
        {"lte", "mixed-large-1.qmdl"}, {"lte", "lte-connected-1.qmdl"}, {"gsm", "multisim-1.qmdl"},
        {"utran", "nas-lte-1.qmdl"},   {"gsm", "nas-lte-1.qmdl"},
    };
    for (const Case& test : cases) {
        const std::string path = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + test.capture;
        const Decoded every = decode(test.technology, path, false);
        const Decoded passing = decode(test.technology, path, true);
        EXPECT_GT(every.display.size(), 100u) << test.technology << " " << test.capture;
        EXPECT_FALSE(every.lines.empty()) << test.technology << " " << test.capture;
        EXPECT_EQ(passing.display, every.display) << test.technology << " " << test.capture;
        EXPECT_EQ(passing.lines, every.lines) << test.technology << " " << test.capture;
    }
}

}  // namespace
}  // namespace velmar
