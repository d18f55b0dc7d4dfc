// GsmStateRecords: builders of the GSM/UMTS state records (mobility management, PLMN, radio resource, GPRS,
// HSDPA, block error rate), for the tests and the simulated baseband. The measurement record 0x5137 and the
// cell-monitor array 0xFF0001, which these decoders share with the cell decoders, are built by GsmRecords.
//
// Contract: each builder takes a plain struct of field values and writes one whole packet (type byte, DLF
// header, payload at packet offset 13) through RecordBuilder. Field comments give packet offsets. A record
// comes out at its layout's length (fixed records: the length named with the struct; lists: up to the end of
// the last entry) unless a struct's `length` is set, which cuts or zero-fills the packet to that total
// length. List counts are taken from the lists; a struct's count override writes another count while the list
// stays as given, which builds records whose counts point past their end. Fields not named here are written
// as zero.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

// 0x7130: GMM state (16 bytes).
struct GmmStateRecord {
    std::uint8_t state = 0;         // 13
    std::uint8_t subState = 0;      // 14
    std::uint8_t updateStatus = 0;  // 15
    std::size_t length = 0;
};
PlistData buildGmmStateRecord(const GmmStateRecord& record, std::uint64_t timestamp = 0);

// 0x7131: MM state (16 bytes).
struct MmStateRecord {
    std::uint8_t state = 0;                 // 13
    std::uint8_t subState = 0;              // 14
    std::uint8_t locationUpdateStatus = 0;  // 15
    std::size_t length = 0;
};
PlistData buildMmStateRecord(const MmStateRecord& record, std::uint64_t timestamp = 0);

// 0x7132: registration state (16 bytes).
struct RegistrationStateRecord {
    std::uint8_t registrationState = 0;  // 13
    std::uint8_t plmnSelectionMode = 0;  // 14
    std::size_t length = 0;
};
PlistData buildRegistrationStateRecord(const RegistrationStateRecord& record, std::uint64_t timestamp = 0);

// The three bytes of a PLMN identity (3GPP TS 24.008): MCC2|MCC1, MNC3|MCC3, MNC2|MNC1 as high|low nibbles.
// mcc has 3 digits, mnc 2 or 3; a 2-digit network code gets the filler 0xF as its third digit.
std::array<std::uint8_t, 3> plmnIdentityBytes(std::string_view mcc, std::string_view mnc);

// 0x7135: registration information (32 bytes).
struct RegistrationInfoRecord {
    std::uint8_t networkOperatingMode = 0;       // 13
    std::uint8_t serviceType = 0;                // 14
    std::array<std::uint8_t, 3> plmnIdentity{};  // 15..17
    std::uint16_t locationAreaCode = 0;          // 18..19, big-endian
    std::uint8_t routingAreaCode = 0;            // 20
    std::size_t length = 0;
};
PlistData buildRegistrationInfoRecord(const RegistrationInfoRecord& record, std::uint64_t timestamp = 0);

// 0x7150: equivalent PLMN list (at least 17 bytes). Byte 16 is the count; the list bytes follow from 17 as
// given (entries are read as six digit bytes starting every 3 bytes).
struct EquivalentPlmnRecord {
    std::uint8_t count = 0;
    std::vector<std::uint8_t> listBytes{};
    std::size_t length = 0;
};
PlistData buildEquivalentPlmnRecord(const EquivalentPlmnRecord& record, std::uint64_t timestamp = 0);

// 0x512C: GSM RR state (17 bytes).
struct GsmRrStateRecord {
    std::uint8_t state = 0;     // 13
    std::uint8_t subState = 0;  // 14
    std::uint8_t status = 0;    // 15
    std::uint8_t mode = 0;      // 16
    std::size_t length = 0;
};
PlistData buildGsmRrStateRecord(const GsmRrStateRecord& record, std::uint64_t timestamp = 0);

// 0x5072: GSM channel parameters (20 bytes).
struct GsmChannelParametersRecord {
    std::uint8_t dtxUsed = 0;  // 19
    std::size_t length = 0;
};
PlistData buildGsmChannelParametersRecord(const GsmChannelParametersRecord& record,
                                          std::uint64_t timestamp = 0);

// 0x51F4: SI13 position (15 bytes).
struct Si13PositionRecord {
    std::uint8_t si13Position = 0;  // 14
    std::size_t length = 0;
};
PlistData buildSi13PositionRecord(const Si13PositionRecord& record, std::uint64_t timestamp = 0);

// 0x51F5: GPRS cell options (18 bytes).
struct GprsCellOptionsRecord {
    std::uint8_t pfcSupported = 0;             // 13
    std::uint8_t priorityAccessThreshold = 0;  // 14
    std::uint8_t networkControlOrder = 0;      // 15
    std::size_t length = 0;
};
PlistData buildGprsCellOptionsRecord(const GprsCellOptionsRecord& record, std::uint64_t timestamp = 0);

// 0x51F6: TBF and DRX parameters (24 bytes).
struct GprsTbfParametersRecord {
    std::uint8_t t3192 = 0;            // 15
    std::uint8_t drxTimerMax = 0;      // 16
    std::uint8_t accessBurstType = 0;  // 17
    std::size_t length = 0;
};
PlistData buildGprsTbfParametersRecord(const GprsTbfParametersRecord& record, std::uint64_t timestamp = 0);

// 0x51FB: PBCCH description (34 bytes).
struct PbcchRecord {
    std::uint8_t pbcchPresent = 0;  // 13
    std::size_t length = 0;
};
PlistData buildPbcchRecord(const PbcchRecord& record, std::uint64_t timestamp = 0);

// 0x51FD: packet system information status (35 bytes).
struct PacketSystemInfoRecord {
    std::uint8_t packetPsiStatus = 0;      // 13
    std::uint8_t countLr = 0;              // 14
    std::uint8_t countHr = 0;              // 15
    std::uint8_t extMeasurementOrder = 0;  // 16
    std::uint8_t packetSiStatus = 0;       // 33
    std::size_t length = 0;
};
PlistData buildPacketSystemInfoRecord(const PacketSystemInfoRecord& record, std::uint64_t timestamp = 0);

// 0x4125: UMTS RRC state (14 bytes).
struct RrcStateRecord {
    std::uint8_t state = 0;  // 13
    std::size_t length = 0;
};
PlistData buildRrcStateRecord(const RrcStateRecord& record, std::uint64_t timestamp = 0);

// 0x4031: uplink transmit power. Byte 14 is the count; 14-byte entries from 16, the signed 16-bit reading
// at entry offset 4.
struct UplinkPowerRecord {
    std::vector<std::int16_t> readings{};
    std::optional<std::uint8_t> countOverride{};
    std::size_t length = 0;
};
PlistData buildUplinkPowerRecord(const UplinkPowerRecord& record, std::uint64_t timestamp = 0);

// 0x4127: UMTS cell identity (29 bytes).
struct UmtsCellIdentityRecord {
    std::uint32_t uplinkFrequency = 0;    // 13..16
    std::uint32_t downlinkFrequency = 0;  // 17..20
    std::uint32_t cellId = 0;             // 21..24
    std::uint16_t uraId = 0;              // 25..26
    std::size_t length = 0;
};
PlistData buildUmtsCellIdentityRecord(const UmtsCellIdentityRecord& record, std::uint64_t timestamp = 0);

// 0x4157: ciphering configuration (19 bytes).
struct CipheringRecord {
    std::uint8_t ciphering = 0;  // 13
    std::size_t length = 0;
};
PlistData buildCipheringRecord(const CipheringRecord& record, std::uint64_t timestamp = 0);

// 0x4221: HSDPA statistics. The primary entries start at 18; the secondary entries at 18 + 162·P, where P is
// the primary count written.
struct HarqProcessEntry {
    std::uint8_t processId = 0;
    std::uint32_t receivedBits = 0;
    std::uint16_t newTransmissions = 0;
    std::uint16_t blockErrors = 0;
};
struct HsdpaRecord {
    std::uint8_t version = 0;
    std::uint16_t subFrames = 0;  // 10 bits
    std::uint8_t carrier = 0;     // 2 bits
    std::vector<HarqProcessEntry> primary{};
    std::vector<HarqProcessEntry> secondary{};
    std::optional<std::uint8_t> primaryCountOverride{};
    std::optional<std::uint8_t> secondaryCountOverride{};
    std::size_t length = 0;
};
PlistData buildHsdpaRecord(const HsdpaRecord& record, std::uint64_t timestamp = 0);

// 0x4116: block error counts. Byte 13 is the count, 14..15 the window size, 9-byte entries from 16.
struct TransportChannelEntry {
    std::uint8_t channelId = 0;
    std::uint32_t crcReceived = 0;
    std::uint32_t crcErrors = 0;
};
struct BlockErrorRecord {
    std::uint16_t windowSize = 0;
    std::vector<TransportChannelEntry> channels{};
    std::optional<std::uint8_t> countOverride{};
    std::size_t length = 0;
};
PlistData buildBlockErrorRecord(const BlockErrorRecord& record, std::uint64_t timestamp = 0);

}  // namespace velmar
