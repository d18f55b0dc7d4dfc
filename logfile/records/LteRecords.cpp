#include "logfile/records/LteRecords.h"

#include <algorithm>

#include "core/platform/KxServerProtocol.h"
#include "logfile/records/RecordBuilder.h"

namespace velmar {

namespace {

PlistData finish(RecordBuilder& builder, std::size_t layoutLength, std::size_t length) {
    builder.resize(length != 0 ? length : std::max(builder.size(), layoutLength));
    return builder.build();
}

}  // namespace

PlistData buildLteServingCellInfoRecord(const LteServingCellInfoRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeLteServingCellInfo, timestamp);
    builder.u8(13, record.version)
        .u16(14, record.physicalCellId)
        .u16(16, record.downlinkEarfcn)
        .u16(18, record.uplinkEarfcn)
        .u8(20, record.downlinkBandwidth)
        .u8(21, record.uplinkBandwidth)
        .u32(22, record.cellIdentity)
        .u16(26, record.trackingAreaCode)
        .u32(28, record.frequencyBandIndicator);
    return finish(builder, 38, record.length);
}

PlistData buildLteMasterInformationRecord(const LteMasterInformationRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeLteMasterInformation, timestamp);
    builder.u8(13, record.version)
        .u16(14, record.physicalCellId)
        .u16(16, record.earfcn)
        .u8(20, record.numTxAntennas);
    return finish(builder, 22, record.length);
}

PlistData buildLteIntraFrequencyRecord(const LteIntraFrequencyRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeLteIntraFrequency, timestamp);
    builder.u8(13, record.version)
        .u16(17, record.earfcn)
        .u16(19, record.servingPhysicalCellId)
        .u16(21, record.subframeNumber)
        .u16(23, record.servingFilteredRsrp)
        .u16(25, record.servingFilteredRsrq)
        .u8(27, record.measuredCountOverride.value_or(static_cast<std::uint8_t>(record.measured.size())))
        .u8(28, record.detectedCountOverride.value_or(static_cast<std::uint8_t>(record.detected.size())));
    std::size_t at = 29;
    for (const LteMeasuredNeighbour& neighbour : record.measured) {
        builder.u16(at, neighbour.physicalCellId)
            .u16(at + 2, neighbour.filteredRsrp)
            .u16(at + 4, neighbour.filteredRsrq);
        at += 6;
    }
    for (const std::uint16_t cell : record.detected) {
        builder.u16(at, cell);
        at += 2;
    }
    return finish(builder, 29, record.length);
}

PlistData buildLteIdleServingMeasurementRecord(const LteIdleServingMeasurementRecord& record,
                                               std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeLteIdleServingMeasurement, timestamp);
    builder.u8(13, record.version)
        .u16(17, record.earfcn)
        .bits(19, 2, 0, 8, record.physicalCellId)
        .bits(20, 1, 1, 4, record.servingLayerPriority)
        .bits(21, 2, 0, 8, record.measuredRsrp)
        .bits(22, 2, 1, 9, record.averageRsrp)
        .bits(23, 2, 2, 8, record.measuredRsrq)
        .bits(24, 1, 1, 7, record.averageRsrq)
        .bits(25, 2, 0, 8, record.measuredRssi)
        .bits(26, 1, 1, 6, record.qrxlevmin)
        .bits(26, 2, 7, 13, record.pMax)
        .bits(27, 2, 6, 11, record.maxUeTxPower)
        .bits(29, 1, 0, 6, record.srxlev)
        .bits(29, 2, 7, 12, record.consecutiveDrxCycles)
        .bits(30, 2, 5, 10, record.sIntraSearch)
        .bits(31, 2, 3, 8, record.sNonIntraSearch)
        .bits(32, 1, 1, 1, record.measurementRulesUpdated ? 1 : 0)
        .bits(32, 1, 2, 5, record.measurementRules);
    return finish(builder, 33, record.length);
}

PlistData buildLteIdleNeighbourMeasurementRecord(const LteIdleNeighbourMeasurementRecord& record,
                                                 std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeLteIdleNeighbourMeasurement, timestamp);
    const std::uint8_t countBits = record.countBitsOverride.value_or(
        record.neighbours.empty() ? 0 : static_cast<std::uint8_t>(record.neighbours.size() - 1));
    builder.u8(13, record.version)
        .u16(17, record.earfcn)
        .bits(19, 1, 0, 5, record.qrxlevmin)
        .bits(19, 2, 6, 10, countBits);
    std::size_t at = 21;
    for (const LteIdleNeighbour& cell : record.neighbours) {
        builder.bits(at, 2, 0, 8, cell.physicalCellId)
            .bits(at + 1, 2, 1, 8, cell.measuredRssi)
            .bits(at + 2, 2, 1, 9, cell.measuredRsrp)
            .bits(at + 4, 2, 0, 8, cell.averageRsrp)
            .bits(at + 5, 1, 1, 7, cell.measuredRsrq)
            .bits(at + 6, 1, 0, 6, cell.averageRsrq)
            .bits(at + 6, 2, 7, 13, cell.srxlev)
            .u16(at + 8, cell.frequencyOffset)
            .bits(at + 12, 2, 0, 10, cell.frameOffset)
            .bits(at + 13, 3, 3, 21, cell.sampleOffset)
            .u32(at + 16, 0);  // the entry's last four bytes are zero
        at += 20;
    }
    return finish(builder, 21, record.length);
}

PlistData buildLteReselectionCandidatesRecord(const LteReselectionCandidatesRecord& record,
                                              std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeLteReselectionCandidates, timestamp);
    builder.u8(13, record.version)
        .u16(15, record.servingEarfcn)
        .u16(17, record.servingCellId)
        .u16(19, record.countOverride.value_or(static_cast<std::uint16_t>(record.candidates.size())));
    std::size_t at = 21;
    for (const LteReselectionCandidate& candidate : record.candidates) {
        const std::size_t fields = at + 4;
        switch (static_cast<LteCandidateRat>(candidate.ratType)) {
            case LteCandidateRat::Lte:
                builder.u16(fields, candidate.channel).bits(fields + 2, 2, 7, 15, candidate.cellId);
                break;
            case LteCandidateRat::Utran:
                builder.u16(fields, candidate.channel).u16(fields + 2, candidate.cellId);
                break;
            case LteCandidateRat::Geran:
                builder.u16(fields, candidate.channel)
                    .u8(fields + 2, candidate.band)
                    .u8(fields + 3, candidate.bsic);
                break;
            case LteCandidateRat::Cdma1xRtt:
            case LteCandidateRat::CdmaHrpd:
                builder.u8(fields, candidate.band)
                    .u16(fields + 4, candidate.channel)
                    .u16(fields + 6, candidate.cellId);
                break;
        }
        // The header goes last so that it wins over the previous candidate's technology fields.
        builder.u16(at, candidate.priority).u16(at + 2, candidate.ratType);
        at += 4;
    }
    return finish(builder, 21, record.length);
}

PlistValue lteCellMonitorDictionary(const LteCellMonitorCell& cell) {
    auto dictionary = PlistDictionary::create();
    auto put = [&](std::string_view key, const std::optional<std::int64_t>& value) {
        if (value) {
            dictionary->set(key, PlistValue::integer(*value));
        }
    };
    if (cell.technology) {
        dictionary->set(kKxCellMonitorCellRadioAccessTechnology, *cell.technology);
    }
    if (cell.cellType) {
        dictionary->set(kKxCellMonitorCellType, *cell.cellType);
    }
    put(kKxCellMonitorTAC, cell.trackingAreaCode);
    put(kKxCellMonitorCellId, cell.cellId);
    put(kKxCellMonitorPID, cell.physicalCellId);
    put(kKxCellMonitorBandInfo, cell.bandInfo);
    put(kKxCellMonitorUARFCN, cell.uarfcn);
    return dictionary;
}

PlistData buildLteCellMonitorRecord(const std::vector<LteCellMonitorCell>& cells, std::uint64_t timestamp) {
    auto array = PlistArray::create();
    for (const LteCellMonitorCell& cell : cells) {
        array->append(lteCellMonitorDictionary(cell));
    }
    return buildCellMonitorPacket(array, timestamp);
}

}  // namespace velmar
