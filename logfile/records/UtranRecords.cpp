#include "logfile/records/UtranRecords.h"

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

PlistData buildUtranRrcStateRecord(const UtranRrcStateRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUtranRrcState, timestamp);
    builder.u8(13, record.modeValid).u8(14, record.mode);
    return finish(builder, 15, record.length);
}

PlistData buildUtranServingCellRecord(const UtranServingCellRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUtranServingCell, timestamp);
    builder.u8(14, record.cellAccessRestrictions)
        .u8(15, record.uraId)
        .u16(17, record.uplinkUarfcn)
        .u16(19, record.downlinkUarfcn)
        .u32(21, record.cellId)
        .bits(25, 1, 0, 0, record.emergencyCallsOnly ? 1 : 0);
    return finish(builder, 26, record.length);
}

PlistData buildUtranNeighbourMeasurementRecord(const UtranNeighbourMeasurementRecord& record,
                                               std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUtranNeighbourMeasurement, timestamp);
    builder.bits(16, 1, 0, 0, record.byte16LowBit)
        .bits(16, 1, 1, 7,
              record.countOverride.value_or(static_cast<std::uint8_t>(record.neighbours.size())));
    std::size_t at = 168;
    for (const UtranNeighbour& cell : record.neighbours) {
        builder.bits(at, 2, 0, 13, cell.uarfcn)
            .bits(at + 1, 2, 6, 12, cell.cellId)
            .bits(at + 2, 2, 5, 12, cell.filterRscp)
            .bits(at + 3, 1, 5, 6, cell.status)
            .bits(at + 3, 1, 7, 7, cell.inJdcs ? 1 : 0)
            .u32(at + 12, 0);  // bytes 4..15 of the entry are zero
        at += 16;
    }
    return finish(builder, 21, record.length);
}

PlistData buildUtranGsmNeighbourMeasurementRecord(const UtranGsmNeighbourMeasurementRecord& record,
                                                  std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUtranGsmNeighbourMeasurement, timestamp);
    builder.u8(16, record.countOverride.value_or(static_cast<std::uint8_t>(record.neighbours.size())));
    std::size_t at = 17;
    for (const UtranGsmNeighbour& cell : record.neighbours) {
        builder.bits(at, 2, 0, 13, cell.cellId)
            .bits(at + 1, 1, 6, 6, cell.bandIndicator ? 1 : 0)
            .bits(at + 1, 1, 7, 7, cell.bsicValid ? 1 : 0)
            .u8(at + 2, cell.ncc)
            .u8(at + 3, cell.bcc)
            .u16(at + 4, cell.arfcn)
            .s16(at + 6, cell.rssi);
        at += 8;
    }
    return finish(builder, 17, record.length);
}

PlistData buildUtranChannelQualityRecord(const UtranChannelQualityRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUtranChannelQuality, timestamp);
    const std::uint8_t transportCount =
        record.transportCountOverride.value_or(static_cast<std::uint8_t>(record.transportChannels.size()));
    builder.bits(14, 2, 6, 11, transportCount)
        .bits(15, 1, 4, 7,
              record.compositeCountOverride.value_or(
                  static_cast<std::uint8_t>(record.compositeChannels.size())));
    std::size_t at = 17;
    for (const UtranTransportChannel& channel : record.transportChannels) {
        builder.u8(at, channel.id).u8(at + 1, channel.bler);
        at += 2;
    }
    at = 289 + 34 * static_cast<std::size_t>(transportCount & 0x3F);
    for (const UtranCompositeChannel& channel : record.compositeChannels) {
        builder.u8(at, channel.id).u8(at + 1, channel.timeslot);
        for (std::size_t i = 0; i < channel.sir.size(); ++i) {
            builder.u8(at + 2 + i, channel.sir[i]);
        }
        at += 8;
    }
    return finish(builder, 17, record.length);
}

PlistValue utranCellMonitorDictionary(const UtranCellMonitorCell& cell) {
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
    put(kKxCellMonitorLAC, cell.locationAreaCode);
    put(kKxCellMonitorCellId, cell.cellId);
    put(kKxCellMonitorBandInfo, cell.bandInfo);
    put(kKxCellMonitorSCN, cell.scramblingCode);
    put(kKxCellMonitorUARFCN, cell.uarfcn);
    return dictionary;
}

PlistData buildUtranCellMonitorRecord(const std::vector<UtranCellMonitorCell>& cells,
                                      std::uint64_t timestamp) {
    auto array = PlistArray::create();
    for (const UtranCellMonitorCell& cell : cells) {
        array->append(utranCellMonitorDictionary(cell));
    }
    return buildCellMonitorPacket(array, timestamp);
}

}  // namespace velmar
