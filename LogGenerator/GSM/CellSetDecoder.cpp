#include "LogGenerator/GSM/CellSetDecoder.h"

#include "LogGenerator/GSM/CellSetRecord.h"
#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/logcodes/GsmLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kActiveSetRow = rowOf(kGsmDecoders, "ActiveSet");
constexpr const DecoderRow& kDetectedSetRow = rowOf(kGsmDecoders, "DetectedSet");
constexpr const DecoderRow& kMonitoredSetRow = rowOf(kGsmDecoders, "MonitoredSet");
constexpr const DecoderRow& kVirtualActiveSetRow = rowOf(kGsmDecoders, "VirtualActiveSet");

constexpr RecordRule kRules[] = {
    {kLogCodeUmtsCellSets, CellSetRecord::kMinimumLength},
};

// RSCP in dB: the received-power reading brought to dBm (division truncating toward zero), plus Ec/Io.
int rscpOf(std::int32_t powerReading, int energyPerChip) {
    return (powerReading + 512) / 10 - 106 + energyPerChip;
}

constexpr ValueFormat kScramblingCodeFormat = asInt("%d");
constexpr ValueFormat kDecibelFormat = asInt("%d dB");

PlistDictionaryRef activeCellRow(const CellSetRecord& record, std::size_t index,
                                 const CellSetRecord::Cell& cell) {
    const int energyPerChip = Base::lookUpECNO(record.energyReading(index));
    auto row = PlistDictionary::create();
    row->reserve(3);
    row->set("Scrambling Code", kScramblingCodeFormat.render(cell.scramblingCode));
    row->set("RSCP", kDecibelFormat.render(rscpOf(record.powerReading(), energyPerChip)));
    row->set("Energy Per Chip", kDecibelFormat.render(energyPerChip));
    return row;
}

}  // namespace

void CellSetDecoder::updateWithData(ByteView data, std::int32_t logCode) {
    // Each of the four logs its own class name.
    if (admitRecord(DecoderRules{row().decoder, kRules}, data, logCode) == nullptr) {
        return;
    }
    const PlistArrayRef section = sectionArray();
    clearElementsInArray(section);
    const CellSetRecord record(data);
    if (record.cellCount() == 0) {
        return;
    }
    auto rows = PlistArray::create();
    for (std::size_t i = 0; i < record.cellCount(); ++i) {
        const CellSetRecord::Cell cell = record.cell(i);
        if (listsActiveCells_ && cell.setType == CellSetRecord::kActiveSetType) {
            rows->append(activeCellRow(record, i, cell));
        }
    }
    replaceArray(section, rows);
}

ActiveSet::ActiveSet() : CellSetDecoder(kActiveSetRow, true) {}
static_assert(rulesMatch(kRules, kActiveSetRow));
DetectedSet::DetectedSet() : CellSetDecoder(kDetectedSetRow, false) {}
static_assert(rulesMatch(kRules, kDetectedSetRow));
MonitoredSet::MonitoredSet() : CellSetDecoder(kMonitoredSetRow, false) {}
static_assert(rulesMatch(kRules, kMonitoredSetRow));
VirtualActiveSet::VirtualActiveSet() : CellSetDecoder(kVirtualActiveSetRow, false) {}
static_assert(rulesMatch(kRules, kVirtualActiveSetRow));

}  // namespace velmar
