#include "LogGenerator/GSM/UMTSSet.h"

#include "LogGenerator/CellMonitorWalk.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/GSM/RecordRows.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kGsmDecoders, "UMTSSet");

constexpr RecordRule kRules[] = {
    {kLogCodeUmtsIdleMeasurements, 15},
    {kLogCodeCellMonitor, 0},
};
constexpr DecoderRules kDecoderRules{"UMTSSet", kRules};

// Written in this key order, which is not the order of the fields in the entry.
constexpr RecordField kUmtsCellFields[] = {
    u16Field(2, "Scrambling Code"),
    s8Field(4, "RSCP", asInt("%d dB", 1, -21)),
    s8Field(7, "Energy Per Chip", asDouble("%f dB", 0.5)),
    s16Field(0, "Downlink Frequency"),
    s16Field(8, "Ranking Value"),
    s16Field(5, "Rank Cell RSCP", asInt("%d dB")),
};

constexpr RecordRowList kUmtsCells{13, 15, 10, kUmtsCellFields};

constexpr CellMonitorField kNeighbourCellFields[] = {
    {kKxCellMonitorUARFCN, "UARFCN", "UMTSSet: Failed to retrieve UARFCN\n"},
    {kKxCellMonitorPSC, "Scrambling Code", "UMTSSet: Failed to retrieve Scrambling Code\n"},
    {kKxCellMonitorRSCP, "RSCP", "UMTSSet: Failed to retrieve RSCP\n",
     asInt("%d dBm").withSentinel(kCellMonitorNoReading, "")},
    {kKxCellMonitorEcN0, "Energy Per Chip", "UMTSSet: Failed to retrieve Energy Per Chip\n",
     asInt("%d dB").withSentinel(kCellMonitorNoReading, "")},
};

}  // namespace

UMTSSet::UMTSSet() : TableDecoder(kRow) {}
static_assert(rulesMatch(kRules, kRow));

void UMTSSet::updateWithData(ByteView data, std::int32_t logCode) {
    const RecordRule* rule = admitRecord(kDecoderRules, data, logCode);
    if (rule == nullptr) {
        return;
    }
    if (rule->code == kLogCodeCellMonitor) {
        showNeighbourCells(data, kKxCellMonitorRadioAccessTechnologyUMTS, kNeighbourCellFields,
                           sectionArray());
    } else {
        showRecordRows(kUmtsCells, RecordReader(data), sectionArray());
    }
}

}  // namespace velmar
