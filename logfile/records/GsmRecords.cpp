#include "logfile/records/GsmRecords.h"

#include <algorithm>
#include <string_view>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/logcodes/GsmLogCodes.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/RecordBuilder.h"

namespace velmar {

namespace {

// The packet at its layout length (never below the record's minimum), or at the length the caller asked for.
PlistData finish(RecordBuilder& builder, std::size_t layoutLength, std::size_t requestedLength) {
    builder.resize(requestedLength != 0 ? requestedLength : layoutLength);
    return builder.build();
}

template <typename List>
std::uint8_t countOf(const List& list, const std::optional<std::uint8_t>& countOverride) {
    return countOverride ? *countOverride : static_cast<std::uint8_t>(list.size());
}

PlistData buildExtraRecord(std::uint16_t code, const PlistValue& payload, PlistEncoding encoding,
                           std::uint64_t timestamp) {
    const std::optional<PlistData> bytes =
        encoding == PlistEncoding::Xml ? serializeXml(payload) : serializeBinary(payload);
    return buildExtendedPacket(code, bytes ? ByteView(*bytes) : ByteView(), timestamp);
}

}  // namespace

PlistData buildGsmServingIdentityRecord(const GsmServingIdentityRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGsmServingIdentity, timestamp);
    builder.u16(13, record.arfcn).u16(15, record.bsic).u16(17, record.cellId);
    return finish(builder, 26, record.length);
}

PlistData buildGsmMeasurementRecord(const GsmMeasurementRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGsmMeasurements, timestamp);
    builder.u8(15, record.rxLevel).u32(16, record.c1).u32(20, record.c2).u8(26, record.reselectHysteresis);
    builder.u8(28, countOf(record.neighbours, record.countOverride));
    std::size_t at = 29;
    for (const GsmNeighbourMeasurement& neighbour : record.neighbours) {
        builder.u16(at, neighbour.arfcn).u8(at + 2, neighbour.rxLevel).s32(at + 3, neighbour.c1);
        at += 14;
    }
    return finish(builder, at, record.length);
}

PlistData buildGsmDedicatedChannelRecord(const GsmDedicatedChannelRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGsmDedicatedChannel, timestamp);
    builder.u16(13, record.arfcn);
    return finish(builder, 17, record.length);
}

PlistData buildGsmBsicListRecord(const GsmBsicListRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGsmBsicList, timestamp);
    builder.u8(14, countOf(record.entries, record.countOverride));
    std::size_t at = 15;
    for (const GsmBsicEntry& entry : record.entries) {
        builder.u16(at, entry.arfcn).u8(at + 2, entry.bsic).u8(at + 3, 0);
        at += 4;
    }
    return finish(builder, at, record.length);
}

PlistData buildMobileAllocationRecord(const MobileAllocationRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGsmMobileAllocation, timestamp);
    builder.u8(13, record.hsn).u8(14, countOf(record.arfcns, record.countOverride));
    std::size_t at = 15;
    for (const std::uint16_t arfcn : record.arfcns) {
        builder.u16(at, arfcn);
        at += 2;
    }
    return finish(builder, at, record.length);
}

PlistData buildGsmSetRecord(const GsmSetRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUmtsIdleMeasurements, timestamp);
    builder.u8(14, countOf(record.cells, record.countOverride));
    std::size_t at = 15;
    for (const GsmSetCell& cell : record.cells) {
        builder.u16(at, cell.arfcn)
            .u16(at + 2, cell.bsic)
            .s8(at + 4, cell.rssi)
            .s16(at + 5, cell.rankingValue);
        at += 7;
    }
    return finish(builder, at, record.length);
}

PlistData buildUmtsSetRecord(const UmtsSetRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUmtsIdleMeasurements, timestamp);
    builder.u8(13, countOf(record.cells, record.countOverride)).u8(14, 0);
    std::size_t at = 15;
    for (const UmtsSetCell& cell : record.cells) {
        builder.s16(at, cell.downlinkFrequency).u16(at + 2, cell.scramblingCode).s8(at + 4, cell.rscpRaw);
        builder.s16(at + 5, cell.rankCellRscp).s8(at + 7, cell.ecioHalfDb).s16(at + 8, cell.rankingValue);
        at += 10;
    }
    return finish(builder, at, record.length);
}

PlistData buildUmtsCellSetRecord(const UmtsCellSetRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUmtsCellSets, timestamp);
    builder.s16(13, record.powerReading).u8(15, countOf(record.cells, record.countOverride));
    const std::size_t cellsAt = 16;
    const std::size_t energiesAt = cellsAt + 15 * record.cells.size();
    for (std::size_t i = 0; i < record.cells.size(); ++i) {
        const UmtsCellSetCell& cell = record.cells[i];
        const std::size_t cellAt = cellsAt + 15 * i;
        builder.u16(cellAt + 7,
                    static_cast<std::uint32_t>((cell.scramblingCode & 0x1FFF) | (cell.setType & 0x7) << 13));
        const std::size_t energyAt = energiesAt + 44 * i;
        builder.u32(energyAt + 32, cell.energyReadings[0]);
        builder.u32(energyAt + 36, cell.energyReadings[1]);
        builder.u32(energyAt + 40, cell.energyReadings[2]);
    }
    return finish(builder, std::max<std::size_t>(16, energiesAt + 44 * record.cells.size()), record.length);
}

PlistData buildSimFilesRecord(const SimFilesRecord& record, std::uint64_t timestamp) {
    auto files = PlistDictionary::create();
    for (const auto& [key, value] : record.files) {
        files->set(key, value);
    }
    return buildExtraRecord(extraPacketCode(kLogCodeSimFiles), files, record.encoding, timestamp);
}

PlistValue cellMonitorEntryDictionary(const CellMonitorEntry& entry) {
    auto dictionary = PlistDictionary::create();
    if (entry.technology) {
        dictionary->set(kKxCellMonitorCellRadioAccessTechnology, *entry.technology);
    }
    if (entry.cellType) {
        dictionary->set(kKxCellMonitorCellType, *entry.cellType);
    }
    const std::pair<std::string_view, const std::optional<std::int64_t>*> numbers[] = {
        {kKxCellMonitorCellId, &entry.cellId}, {kKxCellMonitorARFCN, &entry.arfcn},
        {kKxCellMonitorRSSI, &entry.rssi},     {kKxCellMonitorUARFCN, &entry.uarfcn},
        {kKxCellMonitorPSC, &entry.psc},       {kKxCellMonitorRSCP, &entry.rscp},
        {kKxCellMonitorEcN0, &entry.ecn0},     {kKxCellMonitorMCC, &entry.mcc},
        {kKxCellMonitorMNC, &entry.mnc},       {kKxCellMonitorLAC, &entry.lac},
    };
    for (const auto& [key, value] : numbers) {
        if (*value) {
            dictionary->set(key, PlistValue::integer(**value));
        }
    }
    return dictionary;
}

PlistData buildCellMonitorEntries(const std::vector<CellMonitorEntry>& entries, std::uint64_t timestamp) {
    auto array = PlistArray::create();
    for (const CellMonitorEntry& entry : entries) {
        array->append(cellMonitorEntryDictionary(entry));
    }
    return buildCellMonitorPacket(array, timestamp);
}

PlistValue pdpContextDictionary(const PdpContext& context) {
    auto dictionary = PlistDictionary::create();
    dictionary->set("Context ID", std::to_string(context.contextId));
    dictionary->set("APN", context.apn);
    dictionary->set("PDP Type", context.pdpType);
    dictionary->set("PDP Address", context.address);
    return dictionary;
}

PlistData buildPdpContextsRecord(const std::vector<PdpContext>& contexts, std::uint64_t timestamp) {
    auto array = PlistArray::create();
    for (const PdpContext& context : contexts) {
        array->append(pdpContextDictionary(context));
    }
    return buildExtraRecord(extraPacketCode(kLogCodePdpContexts), array, PlistEncoding::Binary, timestamp);
}

}  // namespace velmar
