// CdmaRecords: builders of the CDMA2000 baseband log packets (1x and EV-DO), for the tests and the simulated
// baseband. Each builds one whole packet (type byte, DLF header, payload; fields at packet offsets from 13)
// from a plain struct of field values, exactly as a baseband writes it; nothing here knows how it is decoded.
//
// Layouts (packet offsets):
// - 0x1183 EV-DO status, 50 bytes: the 16 bits at 13 hold the channel (bits 0..10) and the band class (bits
//   11..15, that is bits 3..7 of byte 14); Rx AGC 0 and 1 and Tx AGC, signed dBm, at 15, 16, 17; serving
//   PN offset u16 at 18 (0xFFFF: invalid); device state at 36; session state at 37; UATI24 at 38..40; color
//   code at 41.
// - 0x12B6 EV-DO active set: pilot count at 15; 12-byte pilots from 25 (PN u16 at 0, strength u16 at 2 in
//   units of 1/512).
// - 0x108A finger C/I: finger count at 22; 14-byte fingers from 23 (pilot u16 at 0, 65535 when unassigned;
//   C/I u16 at 6 in units of 1/512).
// - 0x119C 1x status and 0x119D 1x traffic: version at 13, subpacket count at 14, subpackets from 17, each
//   [identifier][version][total size u16][body]. Subpacket bodies below are given from subpacket offset 4.
// - 0x134F 1x system identity, 186 bytes: version at 13; roaming indicator u32 at 42; system type u32 at 46;
//   SID u16 at 50; NID u16 at 52; packet zone id at 131; protocol revision at 133; base id u16 at 184.
// - 0x1192 EV-DO forward-link counters, 241 bytes: sequence number u32 at 13; 56 u32 counters from 17.
// - 0x127E EV-DO reverse-link counters, 1750 bytes: sequence number u32 at 14; three blocks of 576 bytes at
//   22, 598 and 1174, each holding for the twelve rate classes in turn twelve u32 counters (48 bytes).
// Every struct has a length (or trailing bytes) and, where the packet has a count, a declared count, so that
// malformed packets can be built as easily as good ones.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "core/platform/logcodes/CdmaLogCodes.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

struct EvdoStatusRecord {
    std::uint16_t channel = 0;   // 0..2047
    std::uint8_t bandClass = 0;  // 0..31
    std::int8_t rxAgc0 = 0;      // dBm
    std::int8_t rxAgc1 = 0;
    std::int8_t txAgc = 0;
    std::uint16_t pnOffset = 0;  // in units of 64 chips; 0xFFFF when invalid
    std::uint8_t deviceState = 0;
    std::uint8_t sessionState = 0;
    std::uint32_t uati24 = 0;  // low 24 bits written
    std::uint8_t colorCode = 0;
    std::size_t length = 50;
};
PlistData buildEvdoStatusRecord(const EvdoStatusRecord& record, std::uint64_t timestamp = 0);

struct EvdoPilot {
    std::uint16_t pn = 0;
    std::uint16_t strength = 0;  // 1/512
};
struct EvdoActiveSetRecord {
    std::vector<EvdoPilot> pilots;
    std::optional<std::uint8_t> declaredCount;  // default: the number of pilots
    std::optional<std::size_t> length;          // default: 25 + 12 × pilots
};
PlistData buildEvdoActiveSetRecord(const EvdoActiveSetRecord& record, std::uint64_t timestamp = 0);

struct CdmaFinger {
    std::uint16_t pilot = 0;  // 65535 when unassigned
    std::uint16_t c2i = 0;    // 1/512
};
struct FingerC2IRecord {
    std::vector<CdmaFinger> fingers;
    std::optional<std::uint8_t> declaredCount;  // default: the number of fingers
    std::optional<std::size_t> length;          // default: 23 + 14 × fingers
};
PlistData buildFingerC2IRecord(const FingerC2IRecord& record, std::uint64_t timestamp = 0);

// One subpacket of 0x119C / 0x119D: [identifier][version][size u16][body].
struct CdmaSubpacket {
    std::uint8_t identifier = 0;
    std::uint8_t version = 1;
    PlistData body;                             // from subpacket offset 4
    std::optional<std::uint16_t> declaredSize;  // default: 4 + body
};

// Subpacket 1: the 1x device state at 4.
CdmaSubpacket cdma1xStateSubpacket(std::uint8_t deviceState);

// Subpacket 2: receive chains and transmitter.
struct Cdma1xRadio {
    std::uint8_t rx0BandClass = 0;  // at 4
    std::uint8_t rx1BandClass = 0;  // at 5
    std::uint16_t rx0Channel = 0;   // at 6
    std::uint16_t rx1Channel = 0;   // at 8
    std::int8_t rxAgc0 = 0;         // at 10, raw AGC units
    std::int8_t rxAgc1 = 0;         // at 11
    std::int16_t txPower = 0;       // at 12, tenths of a dB
};
CdmaSubpacket cdma1xRadioSubpacket(const Cdma1xRadio& radio);

// Subpacket 3: the active set. Header: L u16 at 4, M at 6, Q at 7, pilot count at 8, F at 9, reference PN
// u16 at 10. Pilot i occupies the entry at i × ((6F + 15) rounded down to a multiple of 4) from the start of
// the subpacket: its PN u16 at entry + 12 and its energy u16 at entry + 24 + 4F. (With F = 0 a pilot's
// energy and the next pilot's PN share their place; the later write wins.)
struct Cdma1xActiveSetPilot {
    std::uint16_t pn = 0;
    std::uint16_t energy = 0;
};
struct Cdma1xActiveSet {
    std::uint16_t l = 0;
    std::uint8_t m = 0;
    std::uint8_t q = 0;
    std::uint8_t f = 0;
    std::uint16_t referencePn = 0;
    std::vector<Cdma1xActiveSetPilot> pilots;
    std::optional<std::uint8_t> declaredCount;  // default: the number of pilots
};
CdmaSubpacket cdma1xActiveSetSubpacket(const Cdma1xActiveSet& activeSet);

// Subpacket 4: the fingers (eight bytes of body; their contents are not shown).
CdmaSubpacket cdma1xFingerSubpacket();

// Subpacket 11: traffic demodulation; byte 24 flags an erased frame.
CdmaSubpacket cdma1xTrafficDemodSubpacket(bool erasure);

struct CdmaSubpacketRecord {
    std::uint8_t version = 1;
    std::vector<CdmaSubpacket> subpackets;
    std::optional<std::uint8_t> declaredCount;  // default: the number of subpackets
    std::size_t trailingBytes = 0;              // zero bytes after the last subpacket
};
PlistData build1xStatusRecord(const CdmaSubpacketRecord& record, std::uint64_t timestamp = 0);   // 0x119C
PlistData build1xTrafficRecord(const CdmaSubpacketRecord& record, std::uint64_t timestamp = 0);  // 0x119D

struct Cdma1xSystemIdentityRecord {
    std::uint8_t version = 2;
    std::uint32_t roamingIndicator = 0;
    std::uint32_t systemType = 2;
    std::uint16_t systemId = 0;
    std::uint16_t networkId = 0;
    std::uint8_t packetZoneId = 0;
    std::uint8_t protocolRevision = 0;
    std::uint16_t baseId = 0;  // written only when the length reaches it
    std::size_t length = 186;
};
PlistData build1xSystemIdentityRecord(const Cdma1xSystemIdentityRecord& record, std::uint64_t timestamp = 0);

struct EvdoForwardLinkRecord {
    std::uint32_t sequence = 0;
    std::array<std::uint32_t, 56> counters{};
    std::size_t length = 241;
};
PlistData buildEvdoForwardLinkRecord(const EvdoForwardLinkRecord& record, std::uint64_t timestamp = 0);

struct EvdoReverseLinkRecord {
    std::uint32_t sequence = 0;
    // [block][rate class][slot]
    std::array<std::array<std::array<std::uint32_t, 12>, 12>, 3> counters{};
    std::size_t length = 1750;
};
PlistData buildEvdoReverseLinkRecord(const EvdoReverseLinkRecord& record, std::uint64_t timestamp = 0);

}  // namespace velmar
