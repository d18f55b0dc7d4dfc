#include "logfile/records/GsmStateRecords.h"

#include "core/platform/logcodes/GsmLogCodes.h"
#include "logfile/records/RecordBuilder.h"

namespace velmar {

namespace {

// The packet at its layout length, or at the length the caller asked for.
PlistData finish(RecordBuilder& builder, std::size_t layoutLength, std::size_t requestedLength) {
    builder.resize(requestedLength != 0 ? requestedLength : layoutLength);
    return builder.build();
}

std::uint8_t bcdDigit(std::string_view digits, std::size_t index) {
    if (index >= digits.size() || digits[index] < '0' || digits[index] > '9') {
        return 0xF;
    }
    return static_cast<std::uint8_t>(digits[index] - '0');
}

}  // namespace

PlistData buildGmmStateRecord(const GmmStateRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGmmState, timestamp);
    builder.u8(13, record.state).u8(14, record.subState).u8(15, record.updateStatus);
    return finish(builder, 16, record.length);
}

PlistData buildMmStateRecord(const MmStateRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeMmState, timestamp);
    builder.u8(13, record.state).u8(14, record.subState).u8(15, record.locationUpdateStatus);
    return finish(builder, 16, record.length);
}

PlistData buildRegistrationStateRecord(const RegistrationStateRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeRegistrationState, timestamp);
    builder.u8(13, record.registrationState).u8(14, record.plmnSelectionMode);
    return finish(builder, 16, record.length);
}

std::array<std::uint8_t, 3> plmnIdentityBytes(std::string_view mcc, std::string_view mnc) {
    return {
        static_cast<std::uint8_t>(bcdDigit(mcc, 1) << 4 | bcdDigit(mcc, 0)),
        static_cast<std::uint8_t>(bcdDigit(mnc, 2) << 4 | bcdDigit(mcc, 2)),
        static_cast<std::uint8_t>(bcdDigit(mnc, 1) << 4 | bcdDigit(mnc, 0)),
    };
}

PlistData buildRegistrationInfoRecord(const RegistrationInfoRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeRegistrationInfo, timestamp);
    builder.u8(13, record.networkOperatingMode).u8(14, record.serviceType);
    builder.bytes(15, record.plmnIdentity);
    builder.u16be(18, record.locationAreaCode).u8(20, record.routingAreaCode);
    return finish(builder, 32, record.length);
}

PlistData buildEquivalentPlmnRecord(const EquivalentPlmnRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeEquivalentPlmns, timestamp);
    builder.u8(16, record.count).bytes(17, record.listBytes);
    return finish(builder, 17 + record.listBytes.size(), record.length);
}

PlistData buildGsmRrStateRecord(const GsmRrStateRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGsmRrState, timestamp);
    builder.u8(13, record.state).u8(14, record.subState).u8(15, record.status).u8(16, record.mode);
    return finish(builder, 17, record.length);
}

PlistData buildGsmChannelParametersRecord(const GsmChannelParametersRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGsmChannelParameters, timestamp);
    builder.u8(19, record.dtxUsed);
    return finish(builder, 20, record.length);
}

PlistData buildSi13PositionRecord(const Si13PositionRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGprsSi13Position, timestamp);
    builder.u8(14, record.si13Position);
    return finish(builder, 15, record.length);
}

PlistData buildGprsCellOptionsRecord(const GprsCellOptionsRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGprsCellOptions, timestamp);
    builder.u8(13, record.pfcSupported)
        .u8(14, record.priorityAccessThreshold)
        .u8(15, record.networkControlOrder);
    return finish(builder, 18, record.length);
}

PlistData buildGprsTbfParametersRecord(const GprsTbfParametersRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGprsTbfParameters, timestamp);
    builder.u8(15, record.t3192).u8(16, record.drxTimerMax).u8(17, record.accessBurstType);
    return finish(builder, 24, record.length);
}

PlistData buildPbcchRecord(const PbcchRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGprsPbcchDescription, timestamp);
    builder.u8(13, record.pbcchPresent);
    return finish(builder, 34, record.length);
}

PlistData buildPacketSystemInfoRecord(const PacketSystemInfoRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeGprsPacketSystemInfo, timestamp);
    builder.u8(13, record.packetPsiStatus).u8(14, record.countLr).u8(15, record.countHr);
    builder.u8(16, record.extMeasurementOrder).u8(33, record.packetSiStatus);
    return finish(builder, 35, record.length);
}

PlistData buildRrcStateRecord(const RrcStateRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUmtsRrcState, timestamp);
    builder.u8(13, record.state);
    return finish(builder, 14, record.length);
}

PlistData buildUplinkPowerRecord(const UplinkPowerRecord& record, std::uint64_t timestamp) {
    constexpr std::size_t kFirstEntry = 16;
    constexpr std::size_t kEntryLength = 14;
    RecordBuilder builder(kLogCodeUmtsTransmitPower, timestamp);
    builder.u8(14, record.countOverride.value_or(static_cast<std::uint8_t>(record.readings.size())));
    for (std::size_t i = 0; i < record.readings.size(); ++i) {
        builder.s16(kFirstEntry + kEntryLength * i + 4, record.readings[i]);
    }
    return finish(builder, kFirstEntry + kEntryLength * record.readings.size(), record.length);
}

PlistData buildUmtsCellIdentityRecord(const UmtsCellIdentityRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUmtsCellIdentity, timestamp);
    builder.u32(13, record.uplinkFrequency).u32(17, record.downlinkFrequency).u32(21, record.cellId);
    builder.u16(25, record.uraId);
    return finish(builder, 29, record.length);
}

PlistData buildCipheringRecord(const CipheringRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeUmtsCiphering, timestamp);
    builder.u8(13, record.ciphering);
    return finish(builder, 19, record.length);
}

PlistData buildHsdpaRecord(const HsdpaRecord& record, std::uint64_t timestamp) {
    constexpr std::size_t kFirstEntry = 18;
    constexpr std::size_t kEntryLength = 9;
    const auto primaryCount =
        record.primaryCountOverride.value_or(static_cast<std::uint8_t>(record.primary.size()));
    const auto secondaryCount =
        record.secondaryCountOverride.value_or(static_cast<std::uint8_t>(record.secondary.size()));
    RecordBuilder builder(kLogCodeUmtsHsdpa, timestamp);
    builder.u8(13, record.version).u8(14, record.subFrames & 0xFF);
    builder.bits(15, 1, 0, 1, (record.subFrames >> 8) & 0x3).bits(15, 1, 2, 3, record.carrier & 0x3);
    builder.u8(16, primaryCount).u8(17, secondaryCount);
    const auto writeEntries = [&](std::size_t first, const std::vector<HarqProcessEntry>& entries) {
        for (std::size_t i = 0; i < entries.size(); ++i) {
            const std::size_t at = first + kEntryLength * i;
            builder.u8(at, entries[i].processId).u32(at + 1, entries[i].receivedBits);
            builder.u16(at + 5, entries[i].newTransmissions).u16(at + 7, entries[i].blockErrors);
        }
        return first + kEntryLength * entries.size();
    };
    std::size_t end = writeEntries(kFirstEntry, record.primary);
    if (!record.secondary.empty()) {
        end = writeEntries(kFirstEntry + 162 * std::size_t{primaryCount}, record.secondary);
    }
    return finish(builder, end, record.length);
}

PlistData buildBlockErrorRecord(const BlockErrorRecord& record, std::uint64_t timestamp) {
    constexpr std::size_t kFirstEntry = 16;
    constexpr std::size_t kEntryLength = 9;
    RecordBuilder builder(kLogCodeUmtsBlockErrors, timestamp);
    builder.u8(13, record.countOverride.value_or(static_cast<std::uint8_t>(record.channels.size())));
    builder.u16(14, record.windowSize);
    for (std::size_t i = 0; i < record.channels.size(); ++i) {
        const std::size_t at = kFirstEntry + kEntryLength * i;
        builder.u8(at, record.channels[i].channelId).u32(at + 1, record.channels[i].crcReceived);
        builder.u32(at + 5, record.channels[i].crcErrors);
    }
    return finish(builder, kFirstEntry + kEntryLength * record.channels.size(), record.length);
}

}  // namespace velmar
