// velmar-decode reads its input through a bounded window: large inputs decode as the whole file would,
// endless ones are refused at the bound.
#include <gtest/gtest.h>

#include <string>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/Json.h"
#include "core/platform/TechnologyNames.h"
#include "logfile/LogFormat.h"
#include "logfile/PacketVersionAdapter.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::runProcess;

const std::string kDecode = VELMAR_DECODE_PATH;

// The display of bytes held whole in memory, decoded as velmar-decode does: adapter, generator, one refresh.
std::string displayOfBytesInMemory(const std::string& bytes, const std::string& name) {
    std::unique_ptr<LogGenerator> generator =
        LogGenerator::generatorFromTechnology(technologyNamed("lte")->constant);
    const StateDict state = PlistDictionary::create();
    PacketVersionAdapter adapter;
    std::string error;
    const bool read = forEachLogItemInBytes(
        std::span(reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size()), name, LogFormat::Auto,
        [&](const LogItemView& item) {
            if (item.isBlob()) {
                generator->updateState(state, adapter.adapt(item.bytes).blob);
            } else {
                generator->generateLogUsingState(state);
            }
            return true;
        },
        error);
    EXPECT_TRUE(read) << error;
    generator->generateLogUsingState(state);
    return plistToJson(state->get(state_keys::kDisplay), 2) + "\n";
}

TEST(DecodeStreaming, AnInputLargerThanTheWindowDecodesAsTheWholeFileDoes) {
    const std::string capture =
        testing::readWholeFile(std::string(VELMAR_SOURCE_DIR) + "/samples/captures/lte-connected-1.qmdl");
    ASSERT_GT(capture.size(), 500000u);
    std::string repeated;
    for (int i = 0; i < 5; ++i) {
        repeated += capture;  // about 2.6 MB: the 1 MiB window slides over it twice and more
    }
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("repeated.qmdl");
    testing::writeWholeFile(path, repeated);
    const auto result = runProcess({kDecode, "--technology", "lte", path});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(result.err, "");
    const std::string expected = displayOfBytesInMemory(repeated, path);
    EXPECT_NE(expected.find("\"Physical Cell ID\""), std::string::npos);
    EXPECT_EQ(result.out, expected);
}

TEST(DecodeStreaming, EndlessInputEndsWithOneLineAndStatusTwo) {
    const auto capture = runProcess({kDecode, "--technology", "lte", "--format", "qmdl", "/dev/zero"});
    EXPECT_EQ(capture.exitCode, 2);
    EXPECT_EQ(capture.err, "velmar-decode: /dev/zero: offset 0: frame longer than 262144 bytes\n");
    EXPECT_EQ(capture.out, "");
    const auto detected = runProcess({kDecode, "--technology", "lte", "/dev/zero"});
    EXPECT_EQ(detected.exitCode, 2);
    EXPECT_EQ(detected.err,
              "velmar-decode: /dev/zero: offset 0: record length 0 is shorter than the 12-byte header\n");
    const auto hex = runProcess({kDecode, "--technology", "lte", "--format", "hex", "/dev/zero"});
    EXPECT_EQ(hex.exitCode, 2);
    EXPECT_EQ(hex.err, "velmar-decode: /dev/zero:1: line longer than 1048576 bytes\n");
}

}  // namespace
}  // namespace velmar
