// UtranRecords: builders of the UTRAN baseband records (RRC state 0xD0E0, serving cell 0xD0E2, UTRAN and GSM
// neighbour measurements 0xD00A and 0xD00E, transport-channel quality 0xD00C) and of the UTRAN cells of the
// cell-monitor array (0xFF0001), for the tests, the benchmarks and the simulated baseband.
//
// Contract: each builder takes a plain struct of field values and writes one whole packet (type byte, DLF
// header, payload at packet offset 13) through RecordBuilder. Field comments give packet offsets; "bits a..b
// of m..n" means bits a (least significant) to b of bytes m..n taken as one little-endian integer. Values are
// masked to their field's width. A record comes out at its layout's length (fixed records: the length named
// with the struct; lists: up to the end of the last entry, never shorter than the record's minimum) unless
// `length` is set, which cuts or zero-fills the packet to that total length. List counts are taken from the
// lists; a count override writes another count while the list stays as given. Fields not named here are
// written as zero.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/logcodes/UtranLogCodes.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

// 0xD0E0: RRC state (15 bytes). The mode counts only when the valid byte is 1.
struct UtranRrcStateRecord {
    std::uint8_t modeValid = 0;  // 13
    std::uint8_t mode =
        0;  // 14: 0 disconnected, 1 connecting, 2 CELL_FACH, 3 CELL_DCH, 4 CELL_PCH, 5 URA_PCH
    std::size_t length = 0;
};
PlistData buildUtranRrcStateRecord(const UtranRrcStateRecord& record, std::uint64_t timestamp = 0);

// 0xD0E2: serving cell (26 bytes).
struct UtranServingCellRecord {
    std::uint8_t cellAccessRestrictions = 0;  // 14
    std::uint8_t uraId = 0;                   // 15
    std::uint16_t uplinkUarfcn = 0;           // 17..18
    std::uint16_t downlinkUarfcn = 0;         // 19..20
    std::uint32_t cellId = 0;                 // 21..24
    bool emergencyCallsOnly = false;          // bit 0 of 25
    std::size_t length = 0;
};
PlistData buildUtranServingCellRecord(const UtranServingCellRecord& record, std::uint64_t timestamp = 0);

// 0xD00A: UTRAN neighbour measurements. The count (0..127) is bits 1..7 of byte 16; 16-byte entries from 168
// (bytes 4..15 of an entry are zero).
struct UtranNeighbour {
    std::uint16_t uarfcn = 0;     // bits 0..13 of +0..1
    std::uint8_t cellId = 0;      // bits 6..12 of +1..2
    std::uint8_t filterRscp = 0;  // bits 5..12 of +2..3, in 1/256
    std::uint8_t status = 0;      // bits 5..6 of +3: 0 active, 1 monitored, 2 detected set
    bool inJdcs = false;          // bit 7 of +3
};
struct UtranNeighbourMeasurementRecord {
    std::vector<UtranNeighbour> neighbours;
    std::optional<std::uint8_t> countOverride;  // 0..127
    std::uint8_t byte16LowBit = 0;              // bit 0 of byte 16, beside the count
    std::size_t length = 0;
};
PlistData buildUtranNeighbourMeasurementRecord(const UtranNeighbourMeasurementRecord& record,
                                               std::uint64_t timestamp = 0);

// 0xD00E: GSM neighbour measurements. Byte 16 is the count; 8-byte entries from 17.
struct UtranGsmNeighbour {
    std::uint16_t cellId = 0;    // bits 0..13 of +0..1
    bool bandIndicator = false;  // bit 6 of +1
    bool bsicValid = false;      // bit 7 of +1
    std::uint8_t ncc = 0;        // +2
    std::uint8_t bcc = 0;        // +3
    std::uint16_t arfcn = 0;     // +4..5
    std::int16_t rssi = 0;       // +6..7
};
struct UtranGsmNeighbourMeasurementRecord {
    std::vector<UtranGsmNeighbour> neighbours;
    std::optional<std::uint8_t> countOverride;
    std::size_t length = 0;
};
PlistData buildUtranGsmNeighbourMeasurementRecord(const UtranGsmNeighbourMeasurementRecord& record,
                                                  std::uint64_t timestamp = 0);

// 0xD00C: transport-channel quality. The transport-channel count n is bits 6..11 of the 16 bits at 14
// (0..63), with 2-byte entries from 17; the composite-channel count is bits 4..7 of byte 15 (0..15), with
// 8-byte entries from 289 + 34n. The region between them (34 bytes per transport channel) is written as zero.
struct UtranTransportChannel {
    std::uint8_t id = 0;    // +0
    std::uint8_t bler = 0;  // +1
};
struct UtranCompositeChannel {
    std::uint8_t id = 0;                // +0
    std::uint8_t timeslot = 0;          // +1
    std::array<std::uint8_t, 6> sir{};  // +2..7
};
struct UtranChannelQualityRecord {
    std::vector<UtranTransportChannel> transportChannels;
    std::vector<UtranCompositeChannel> compositeChannels;
    std::optional<std::uint8_t> transportCountOverride;
    std::optional<std::uint8_t> compositeCountOverride;
    std::size_t length = 0;
};
PlistData buildUtranChannelQualityRecord(const UtranChannelQualityRecord& record,
                                         std::uint64_t timestamp = 0);

// 0xFF0001: a cell of the cell-monitor array with the entries a UTRAN cell carries. Absent optionals are left
// out of the dictionary.
struct UtranCellMonitorCell {
    std::optional<std::string> technology;  // kKxCellMonitorCellRadioAccessTechnology
    std::optional<std::string> cellType;    // kKxCellMonitorCellType
    std::optional<std::int64_t> locationAreaCode;
    std::optional<std::int64_t> cellId;
    std::optional<std::int64_t> bandInfo;
    std::optional<std::int64_t> scramblingCode;
    std::optional<std::int64_t> uarfcn;
};
PlistValue utranCellMonitorDictionary(const UtranCellMonitorCell& cell);
PlistData buildUtranCellMonitorRecord(const std::vector<UtranCellMonitorCell>& cells,
                                      std::uint64_t timestamp = 0);

}  // namespace velmar
