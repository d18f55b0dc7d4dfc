// The value history on the displays that the real decoders make from recordings: which leaves become series,
// with which value and unit, and which (names from value tables, raw identities) do not.
#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/ArrayLock.h"
#include "core/ValueHistory.h"
#include "core/platform/KxServerProtocol.h"
#include "logfile/LogFormat.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

// Decodes a whole recording with the technology's generator and samples the final display once.
class DecodedHistory {
  public:
    DecodedHistory(const std::string& path, std::string_view technology) {
        testing::LogCapture quiet;
        auto generator = LogGenerator::generatorFromTechnology(technology);
        StateDict state = PlistDictionary::create();
        std::string error;
        const bool read = forEachLogItem(
            path, LogFormat::Auto,
            [&](const LogItemView& item) {
                if (!item.isTick()) {
                    generator->updateState(state, item.bytes);
                }
                return true;
            },
            error);
        EXPECT_TRUE(read) << error;
        generator->generateLogUsingState(state);
        NodePathDictionary paths;
        VelmarModelNode::makeTreeFromObject(state->get(state_keys::kDisplay), paths);
        ArrayLock::releaseOutstandingForTesting();
        history_.sample(paths, 1000.0);
    }

    void expectSeries(const std::string& path, double value, std::string_view unit) const {
        const ValueSeries* series = history_.series(path);
        ASSERT_TRUE(series) << path;
        ASSERT_EQ(series->size(), 1u) << path;
        EXPECT_EQ(series->newest().value, value) << path;
        EXPECT_EQ(series->unit(), unit) << path;
    }
    void expectNoSeries(const std::string& path) const { EXPECT_EQ(history_.series(path), nullptr) << path; }
    const ValueHistory& history() const { return history_; }

  private:
    ValueHistory history_;
};

std::string capture(const std::string& name) {
    return std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
}
std::string testData(const std::string& name) {
    return std::string(VELMAR_TEST_DATA_DIR) + "/" + name;
}

TEST(DisplayHistoryTest, LteCaptureMeasurementsAreSeriesInTheirUnits) {
    const DecodedHistory decoded(capture("lte-connected-1.qmdl"), kKxLogChannelTechnology_Orvane_LTE);
    const std::string measurement = "/Serving Cell/Connected mode LTE Intra-frequency Measurement/";
    decoded.expectSeries(measurement + "Serving Filtered RSRP", -140.0, "dBm");
    decoded.expectSeries(measurement + "Serving Filtered RSRQ", -14.75, "dB");
    decoded.expectSeries("/Serving Cell/Serving Cell Info/Physical Cell ID", 42.0, "");
    decoded.expectSeries("/Serving Cell/Serving Cell Info/Freq Band Indicator", -1342111658.0, "");
    decoded.expectNoSeries("/Serving Cell/Serving Cell Info/Download Bandwidth");  // "Unknown"
    decoded.expectSeries("/Neighbor Cells/Measured Neighbor Cells/0/Filtered RSRP", 133.5, "dBm");
    // Every leaf of the measured neighbours' rows is a number: 90 rows of 3.
    std::size_t neighbours = 0;
    for (int row = 0; row < 200; ++row) {
        neighbours += decoded.history().series("/Neighbor Cells/Measured Neighbor Cells/" +
                                               std::to_string(row) + "/Filtered RSRQ") != nullptr;
    }
    EXPECT_EQ(neighbours, 90u);
}

TEST(DisplayHistoryTest, CdmaFormatsWithUnitsAndRemarks) {
    const DecodedHistory decoded(testData("cdma/evdo-1x.hex"), kKxLogChannelTechnology_Orvane_CDMA);
    decoded.expectSeries("/EV-DO/Radio/Serving PN Offset", 168.0, "\xC3\x97 64chips");
    decoded.expectSeries("/EV-DO/Radio/Rx AGC 0", -85.0, "dBm");
    decoded.expectSeries("/EV-DO/Radio/Tx AGC", 5.0, "dBm");
    decoded.expectSeries("/EV-DO/Data Rates/Forward Link", 3.5, "kbps");
    decoded.expectSeries("/EV-DO/Active Set Pilots/36", -3.01, "dB");
    decoded.expectSeries("/1x/Status/Traffic FER", 3.10, "%");
    decoded.expectSeries("/1x/Radio/Rx0 AGC", -96.65, "dBm");
    decoded.expectSeries("/1x/Active Set/300", 10.0, "dB");  // "(ref pilot) +10.00 dB"
    decoded.expectSeries("/1x/System/SID", 4139.0, "");
    decoded.expectNoSeries("/EV-DO/Status/Device State");        // "Connected [5]"
    decoded.expectNoSeries("/EV-DO/Status/UATI (24 bits)");      // "0x0a1b2c"
    decoded.expectNoSeries("/EV-DO/Radio/Band Class");           // "1.8 to 2.0GHz PCS band [1]"
    decoded.expectNoSeries("/1x/Radio/Rx1 Band Class");          // "800 MHz cellular band [0]"
    decoded.expectNoSeries("/1x/Status/Roaming Indicator");      // "ERI - 13"
    decoded.expectNoSeries("/EV-DO/Active Set Pilots/_sorted");  // never shown
}

TEST(DisplayHistoryTest, GsmUmtsStatesNumbersAndValueTableNames) {
    const DecodedHistory decoded(testData("gsm/states-radio.hex"), kKxLogChannelTechnology_Orvane_GSM);
    decoded.expectSeries("/GSM/GSM Serving Cell/RSSI", 60.0, "dBm");
    decoded.expectSeries("/GSM/GSM RR Info/DRX Used", 4.0, "sec");
    decoded.expectSeries("/UMTS/UMTS RR Info/Transmit Power", -34.5, "dBm");
    decoded.expectNoSeries("/GSM/GPRS Information/T3192");                      // "0 ms"
    decoded.expectNoSeries("/GSM/GPRS Information/Priority Access Threshold");  // "1 to 3"
    decoded.expectNoSeries("/GSM/GPRS Information/Access Burst Type");          // "11-bit format"
}

}  // namespace
}  // namespace velmar
