// velmar-decode with --technology cdma, run as a process on recorded hex files: the display, the lookup of
// places and the state values that the CDMA2000 generator keeps.
#include <gtest/gtest.h>

#include "tests/support/Json.h"
#include "tests/support/Process.h"

namespace velmar {
namespace {

const std::string kCdmaData = std::string(VELMAR_TEST_DATA_DIR) + "/cdma/";

struct Decoded {
    int exitCode = -1;
    PlistDictionaryRef root;
    std::string err;
};

Decoded decode(const std::vector<std::string>& options, const std::string& file) {
    std::vector<std::string> arguments{VELMAR_DECODE_PATH, "--technology", "cdma"};
    arguments.insert(arguments.end(), options.begin(), options.end());
    arguments.push_back(kCdmaData + file);
    const testing::ProcessResult result = testing::runProcess(arguments);
    Decoded decoded;
    decoded.exitCode = result.exitCode;
    decoded.err = result.err;
    if (const auto json = testing::parseJson(result.out)) {
        decoded.root = json->dictionary();
    }
    return decoded;
}

// The value at a path of dictionary keys, or none.
PlistValue at(const PlistDictionaryRef& root, std::initializer_list<std::string_view> path) {
    PlistValue value = root ? PlistValue(root) : PlistValue();
    for (const std::string_view key : path) {
        const PlistDictionaryRef& dictionary = value.dictionary();
        if (!dictionary) {
            return PlistValue();
        }
        PlistValue child = dictionary->get(key);
        value = std::move(child);
    }
    return value;
}

std::string text(const PlistDictionaryRef& root, std::initializer_list<std::string_view> path) {
    const PlistValue value = at(root, path);
    return value.string() ? *value.string() : std::string("<not text>");
}

TEST(CdmaDecode, StartCommandListsTheEightCodes) {
    const testing::ProcessResult result =
        testing::runProcess({VELMAR_DECODE_PATH, "--technology", "cdma", "--start-command"});
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_EQ(
        result.out,
        "{\"SetState\": \"Streaming\", \"SetOrvaneLogCodes\": [4234, 4483, 4498, 4790, 4508, 4509, 4734, "
        "4943]}\n");
}

TEST(CdmaDecode, DisplayOfEveryRecord) {
    const Decoded decoded = decode({}, "evdo-1x.hex");
    ASSERT_EQ(decoded.exitCode, 0) << decoded.err;
    ASSERT_TRUE(decoded.root);
    const PlistDictionaryRef& d = decoded.root;
    EXPECT_EQ(text(d, {"EV-DO", "Status", "Device State"}), "Connected [5]");
    EXPECT_EQ(text(d, {"EV-DO", "Status", "Session State"}), "Open [4]");
    EXPECT_EQ(text(d, {"EV-DO", "Status", "UATI (24 bits)"}), "0x0a1b2c");
    EXPECT_EQ(text(d, {"EV-DO", "Status", "Color Code"}), "7");
    EXPECT_EQ(text(d, {"EV-DO", "Radio", "Band Class"}), "1.8 to 2.0GHz PCS band [1]");
    EXPECT_EQ(text(d, {"EV-DO", "Radio", "Channel"}), "2331");
    EXPECT_EQ(text(d, {"EV-DO", "Radio", "Serving PN Offset"}), "168 \xC3\x97 64chips");
    EXPECT_EQ(text(d, {"EV-DO", "Radio", "Rx AGC 0"}), "-85 dBm");
    EXPECT_EQ(text(d, {"EV-DO", "Radio", "Rx AGC 1"}), "-90 dBm");
    EXPECT_EQ(text(d, {"EV-DO", "Radio", "Tx AGC"}), "+5 dBm");
    EXPECT_EQ(text(d, {"EV-DO", "Active Set Pilots", "0;100"}), "+0.00 dB");
    EXPECT_EQ(text(d, {"EV-DO", "Active Set Pilots", "1;36"}), "-3.01 dB");
    EXPECT_EQ(text(d, {"EV-DO", "Active Set Pilots", "_sorted"}), "_sorted");
    EXPECT_EQ(at(d, {"EV-DO", "Active Set Pilots"}).dictionary()->size(), 3u);
    EXPECT_EQ(text(d, {"EV-DO", "Finger C2I", "0;100"}), "+6.02 dB");
    EXPECT_EQ(text(d, {"EV-DO", "Finger C2I", "2;36"}), "-6.02 dB");
    EXPECT_EQ(at(d, {"EV-DO", "Finger C2I"}).dictionary()->size(), 3u);
    EXPECT_EQ(text(d, {"EV-DO", "Data Rates", "Forward Link"}), "3.50 kbps");
    EXPECT_EQ(text(d, {"EV-DO", "Data Rates", "Reverse Link"}), "6.00 kbps");

    EXPECT_EQ(text(d, {"1x", "Status", "Device State"}), "Traffic [8]");
    EXPECT_EQ(text(d, {"1x", "Status", "Roaming Indicator"}), "ERI - 13");
    EXPECT_EQ(text(d, {"1x", "Status", "Traffic FER"}), "3.10%");
    EXPECT_EQ(text(d, {"1x", "Radio", "Rx0 Band Class"}), "1.8 to 2.0GHz PCS band [1]");
    EXPECT_EQ(text(d, {"1x", "Radio", "Rx0 Channel"}), "25");
    EXPECT_EQ(text(d, {"1x", "Radio", "Rx0 AGC"}), "-96.65 dBm");
    EXPECT_EQ(text(d, {"1x", "Radio", "Rx1 Band Class"}), "800 MHz cellular band [0]");
    EXPECT_EQ(text(d, {"1x", "Radio", "Rx1 Channel"}), "1013");
    EXPECT_EQ(text(d, {"1x", "Radio", "Rx1 AGC"}), "-46.55 dBm");
    EXPECT_EQ(text(d, {"1x", "Radio", "Tx AGC"}), "-12.30 dBm");
    EXPECT_EQ(text(d, {"1x", "System", "SID"}), "4139");
    EXPECT_EQ(text(d, {"1x", "System", "NID"}), "7");
    EXPECT_EQ(text(d, {"1x", "System", "Packet Zone ID"}), "17");
    EXPECT_EQ(text(d, {"1x", "System", "Base ID"}), "48879");
    EXPECT_EQ(text(d, {"1x", "System", "Protocol Revision"}), "6");
    EXPECT_EQ(text(d, {"1x", "Active Set", "0;12"}), "+0.00 dB");
    EXPECT_EQ(text(d, {"1x", "Active Set", "1;300"}), "(ref pilot) +10.00 dB");
}

TEST(CdmaDecode, StateHoldsTheLookupTheFrameErrorRateAndTheSamples) {
    const Decoded decoded = decode({"--output", "state"}, "evdo-1x.hex");
    ASSERT_EQ(decoded.exitCode, 0) << decoded.err;
    const PlistDictionaryRef& s = decoded.root;
    ASSERT_TRUE(s);

    const PlistArrayRef channelPlaces = at(s, {"Lookup", "kChannel"}).array();
    ASSERT_TRUE(channelPlaces);
    ASSERT_EQ(channelPlaces->size(), 1u);
    const PlistDictionaryRef place = channelPlaces->at(0).dictionary();
    ASSERT_TRUE(place);
    EXPECT_EQ(place->size(), 2u);
    EXPECT_EQ(place->get("key"), PlistValue("Channel"));
    // The place's dictionary is the "Radio" group of the display, values included.
    EXPECT_EQ(place->get("dict"), at(s, {"Display", "EV-DO", "Radio"}));
    EXPECT_EQ(at(s, {"Lookup"}).dictionary()->size(), 30u);

    EXPECT_EQ(at(s, {"TrafficFER"}), PlistValue::real(127.0 / 4096.0));
    EXPECT_EQ(at(s, {"FLDataSeqNum"}), PlistValue::integer(102));
    EXPECT_EQ(at(s, {"FLDataSent"}), PlistValue::integer(25856));
    EXPECT_EQ(at(s, {"RLDataSeqNum"}), PlistValue::integer(8));
    EXPECT_EQ(at(s, {"RLDataSent"}), PlistValue::integer(19712));
    EXPECT_EQ(at(s, {"ExtraInfo", "FLDataSeqNum2"}), PlistValue::integer(100));
    EXPECT_EQ(at(s, {"ExtraInfo", "FLDataSent2"}), PlistValue::integer(18688));
    EXPECT_EQ(at(s, {"ExtraInfo", "FLDataSeqNum1"}), PlistValue::integer(102));
    EXPECT_EQ(at(s, {"ExtraInfo", "FLDataSent1"}), PlistValue::integer(25856));
    EXPECT_EQ(at(s, {"ExtraInfo", "RLDataSeqNum2"}), PlistValue::integer(7));
    EXPECT_EQ(at(s, {"ExtraInfo", "RLDataSent2"}), PlistValue::integer(13568));
    EXPECT_EQ(at(s, {"ExtraInfo", "RLDataSent1"}), PlistValue::integer(19712));

    // One refresh at the tick, one after the last blob.
    const PlistArrayRef history = at(s, {"History"}).array();
    ASSERT_TRUE(history);
    EXPECT_EQ(history->size(), 2u);
    EXPECT_TRUE(at(s, {"Template", "EV-DO"}).isDictionary());
}

TEST(CdmaDecode, FrameErrorRateShownOldOutsideTrafficAndForgotten) {
    const Decoded decoded = decode({"--output", "state", "--log-stderr"}, "fer-old.hex");
    ASSERT_EQ(decoded.exitCode, 0) << decoded.err;
    const PlistDictionaryRef& s = decoded.root;
    ASSERT_TRUE(s);
    EXPECT_EQ(text(s, {"Display", "1x", "Status", "Traffic FER"}), "1.56% (old)");
    EXPECT_EQ(text(s, {"Display", "1x", "Status", "Device State"}), "Paging [6]");
    EXPECT_EQ(text(s, {"Display", "1x", "Radio", "Tx AGC"}), "N/A");
    EXPECT_FALSE(s->contains("TrafficFER"));
    // The record of log type 2 is logged and decoded all the same.
    EXPECT_NE(decoded.err.find("<3> Invalid log type: 2. Dropping.\n"), std::string::npos) << decoded.err;
    EXPECT_EQ(text(s, {"Display", "EV-DO", "Radio", "Channel"}), "2331");
}

}  // namespace
}  // namespace velmar
