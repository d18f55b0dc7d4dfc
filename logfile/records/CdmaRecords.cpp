#include "logfile/records/CdmaRecords.h"

#include "core/platform/RecordWriter.h"
#include "logfile/records/RecordBuilder.h"

namespace velmar {

namespace {

constexpr std::size_t kSubpacketHeaderLength = 4;
constexpr std::size_t kFirstSubpacketOffset = 17;

PlistData subpacketBytes(const CdmaSubpacket& subpacket) {
    PlistData bytes(kSubpacketHeaderLength, 0);
    const std::uint16_t size = subpacket.declaredSize.value_or(
        static_cast<std::uint16_t>(kSubpacketHeaderLength + subpacket.body.size()));
    RecordWriter(bytes)
        .unsignedLE(0, 1, subpacket.identifier)
        .unsignedLE(1, 1, subpacket.version)
        .unsignedLE(2, 2, size)
        .append(subpacket.body);
    return bytes;
}

PlistData buildSubpacketRecord(std::uint16_t code, const CdmaSubpacketRecord& record,
                               std::uint64_t timestamp) {
    RecordBuilder builder(code, timestamp);
    builder.u8(13, record.version)
        .u8(14, record.declaredCount.value_or(static_cast<std::uint8_t>(record.subpackets.size())))
        .u16(15, 0);
    std::size_t offset = kFirstSubpacketOffset;
    for (const CdmaSubpacket& subpacket : record.subpackets) {
        const PlistData bytes = subpacketBytes(subpacket);
        builder.bytes(offset, bytes);
        offset += bytes.size();
    }
    return builder.resize(offset + record.trailingBytes).build();
}

}  // namespace

PlistData buildEvdoStatusRecord(const EvdoStatusRecord& record, std::uint64_t timestamp) {
    return RecordBuilder(kLogCodeCdmaEvdoStatus, timestamp)
        .u16(13, record.channel & 0x7FF)
        .bits(14, 1, 3, 7, record.bandClass)
        .s8(15, record.rxAgc0)
        .s8(16, record.rxAgc1)
        .s8(17, record.txAgc)
        .u16(18, record.pnOffset)
        .u8(36, record.deviceState)
        .u8(37, record.sessionState)
        .u24(38, record.uati24 & 0xFFFFFF)
        .u8(41, record.colorCode)
        .resize(record.length)
        .build();
}

PlistData buildEvdoActiveSetRecord(const EvdoActiveSetRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeCdmaEvdoActiveSet, timestamp);
    builder.u8(15, record.declaredCount.value_or(static_cast<std::uint8_t>(record.pilots.size())));
    constexpr std::size_t kFirstPilot = 25;
    constexpr std::size_t kPilotSize = 12;
    for (std::size_t i = 0; i < record.pilots.size(); ++i) {
        const std::size_t entry = kFirstPilot + kPilotSize * i;
        builder.u16(entry, record.pilots[i].pn).u16(entry + 2, record.pilots[i].strength);
    }
    return builder.resize(record.length.value_or(kFirstPilot + kPilotSize * record.pilots.size())).build();
}

PlistData buildFingerC2IRecord(const FingerC2IRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeCdmaFingerC2I, timestamp);
    builder.u8(22, record.declaredCount.value_or(static_cast<std::uint8_t>(record.fingers.size())));
    constexpr std::size_t kFirstFinger = 23;
    constexpr std::size_t kFingerSize = 14;
    for (std::size_t i = 0; i < record.fingers.size(); ++i) {
        const std::size_t entry = kFirstFinger + kFingerSize * i;
        builder.u16(entry, record.fingers[i].pilot).u16(entry + 6, record.fingers[i].c2i);
    }
    return builder.resize(record.length.value_or(kFirstFinger + kFingerSize * record.fingers.size())).build();
}

CdmaSubpacket cdma1xStateSubpacket(std::uint8_t deviceState) {
    CdmaSubpacket subpacket;
    subpacket.identifier = 1;
    subpacket.body = {deviceState, 0, 0, 0};
    return subpacket;
}

CdmaSubpacket cdma1xRadioSubpacket(const Cdma1xRadio& radio) {
    CdmaSubpacket subpacket;
    subpacket.identifier = 2;
    PlistData whole(kSubpacketHeaderLength, 0);
    RecordWriter writer(whole);
    writer.unsignedLE(4, 1, radio.rx0BandClass);
    writer.unsignedLE(5, 1, radio.rx1BandClass);
    writer.unsignedLE(6, 2, radio.rx0Channel);
    writer.unsignedLE(8, 2, radio.rx1Channel);
    writer.unsignedLE(10, 1, static_cast<std::uint8_t>(radio.rxAgc0));
    writer.unsignedLE(11, 1, static_cast<std::uint8_t>(radio.rxAgc1));
    writer.unsignedLE(12, 2, static_cast<std::uint16_t>(radio.txPower));
    writer.unsignedLE(14, 2, 0);
    subpacket.body.assign(whole.begin() + kSubpacketHeaderLength, whole.end());
    return subpacket;
}

CdmaSubpacket cdma1xActiveSetSubpacket(const Cdma1xActiveSet& activeSet) {
    CdmaSubpacket subpacket;
    subpacket.identifier = 3;
    PlistData whole(12, 0);
    RecordWriter writer(whole);
    writer.unsignedLE(4, 2, activeSet.l);
    writer.unsignedLE(6, 1, activeSet.m);
    writer.unsignedLE(7, 1, activeSet.q);
    writer.unsignedLE(8, 1,
                      activeSet.declaredCount.value_or(static_cast<std::uint8_t>(activeSet.pilots.size())));
    writer.unsignedLE(9, 1, activeSet.f);
    writer.unsignedLE(10, 2, activeSet.referencePn);
    const std::size_t entrySize = (6 * std::size_t{activeSet.f} + 15) & ~std::size_t{3};
    for (std::size_t i = 0; i < activeSet.pilots.size(); ++i) {
        const std::size_t entry = entrySize * i;
        writer.unsignedLE(entry + 12, 2, activeSet.pilots[i].pn);
        writer.unsignedLE(entry + 24 + 4 * std::size_t{activeSet.f}, 2, activeSet.pilots[i].energy);
    }
    subpacket.body.assign(whole.begin() + kSubpacketHeaderLength, whole.end());
    return subpacket;
}

CdmaSubpacket cdma1xFingerSubpacket() {
    CdmaSubpacket subpacket;
    subpacket.identifier = 4;
    subpacket.body.assign(8, 0);
    return subpacket;
}

CdmaSubpacket cdma1xTrafficDemodSubpacket(bool erasure) {
    CdmaSubpacket subpacket;
    subpacket.identifier = 11;
    PlistData whole(28, 0);
    whole[24] = erasure ? 1 : 0;
    subpacket.body.assign(whole.begin() + kSubpacketHeaderLength, whole.end());
    return subpacket;
}

PlistData build1xStatusRecord(const CdmaSubpacketRecord& record, std::uint64_t timestamp) {
    return buildSubpacketRecord(kLogCodeCdma1xStatus, record, timestamp);
}

PlistData build1xTrafficRecord(const CdmaSubpacketRecord& record, std::uint64_t timestamp) {
    return buildSubpacketRecord(kLogCodeCdma1xTraffic, record, timestamp);
}

PlistData build1xSystemIdentityRecord(const Cdma1xSystemIdentityRecord& record, std::uint64_t timestamp) {
    return RecordBuilder(kLogCodeCdma1xSystemIdentity, timestamp)
        .u8(13, record.version)
        .u32(42, record.roamingIndicator)
        .u32(46, record.systemType)
        .u16(50, record.systemId)
        .u16(52, record.networkId)
        .u8(131, record.packetZoneId)
        .u8(133, record.protocolRevision)
        .u16(184, record.baseId)
        .resize(record.length)
        .build();
}

PlistData buildEvdoForwardLinkRecord(const EvdoForwardLinkRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeCdmaForwardLinkRate, timestamp);
    builder.u32(13, record.sequence);
    for (std::size_t i = 0; i < record.counters.size(); ++i) {
        builder.u32(17 + 4 * i, record.counters[i]);
    }
    return builder.resize(record.length).build();
}

PlistData buildEvdoReverseLinkRecord(const EvdoReverseLinkRecord& record, std::uint64_t timestamp) {
    RecordBuilder builder(kLogCodeCdmaReverseLinkRate, timestamp);
    builder.u32(14, record.sequence);
    constexpr std::size_t kBlocks = 22;
    constexpr std::size_t kBlockSize = 576;
    constexpr std::size_t kClassSize = 48;
    for (std::size_t block = 0; block < record.counters.size(); ++block) {
        for (std::size_t rateClass = 0; rateClass < record.counters[block].size(); ++rateClass) {
            for (std::size_t slot = 0; slot < record.counters[block][rateClass].size(); ++slot) {
                builder.u32(kBlocks + kBlockSize * block + kClassSize * rateClass + 4 * slot,
                            record.counters[block][rateClass][slot]);
            }
        }
    }
    return builder.resize(record.length).build();
}

}  // namespace velmar
