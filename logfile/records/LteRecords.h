// LteRecords: builders of the LTE baseband records (serving-cell information 0xB0C2 and 0xB0C1,
// connected-mode intra-frequency measurements 0xB179, idle-mode serving and neighbour measurements 0xB17F and
// 0xB180, reselection candidates 0xB186) and of the LTE cells of the cell-monitor array (0xFF0001), for the
// tests, the benchmarks and the simulated baseband.
//
// Contract: each builder takes a plain struct of field values and writes one whole packet (type byte, DLF
// header, payload at packet offset 13) through RecordBuilder. Field comments give packet offsets; "bits a..b
// of m..n" means bits a (least significant) to b of bytes m..n taken as one little-endian integer. Values are
// masked to their field's width. A record comes out at its layout's length (fixed records: the length named
// with the struct; lists: up to the end of the last entry, never shorter than the record's minimum) unless
// `length` is set, which cuts or zero-fills the packet to that total length. List counts are taken from the
// lists; a count override writes another count while the list stays as given, which builds records whose
// counts point past their end. Fields not named here are written as zero.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/logcodes/LteLogCodes.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

// 0xB0C2: the serving cell's identity and channels (38 bytes).
struct LteServingCellInfoRecord {
    std::uint8_t version = 0;                  // 13
    std::uint16_t physicalCellId = 0;          // 14..15
    std::uint16_t downlinkEarfcn = 0;          // 16..17
    std::uint16_t uplinkEarfcn = 0;            // 18..19
    std::uint8_t downlinkBandwidth = 0;        // 20, in resource blocks
    std::uint8_t uplinkBandwidth = 0;          // 21, in resource blocks
    std::uint32_t cellIdentity = 0;            // 22..25
    std::uint16_t trackingAreaCode = 0;        // 26..27
    std::uint32_t frequencyBandIndicator = 0;  // 28..31
    std::size_t length = 0;
};
PlistData buildLteServingCellInfoRecord(const LteServingCellInfoRecord& record, std::uint64_t timestamp = 0);

// 0xB0C1: the master information of the serving cell (22 bytes).
struct LteMasterInformationRecord {
    std::uint8_t version = 0;          // 13
    std::uint16_t physicalCellId = 0;  // 14..15
    std::uint16_t earfcn = 0;          // 16..17
    std::uint8_t numTxAntennas = 0;    // 20
    std::size_t length = 0;
};
PlistData buildLteMasterInformationRecord(const LteMasterInformationRecord& record,
                                          std::uint64_t timestamp = 0);

// 0xB179: connected-mode intra-frequency measurements. Byte 27 is the measured-neighbour count N, byte 28 the
// detected-cell count D; N 6-byte measured-neighbour entries from 29, then D 2-byte detected-cell entries.
struct LteMeasuredNeighbour {
    std::uint16_t physicalCellId = 0;  // +0
    std::uint16_t filteredRsrp = 0;    // +2, quarter dB above -140 dBm
    std::uint16_t filteredRsrq = 0;    // +4, eighth dB above -20 dB
};
struct LteIntraFrequencyRecord {
    std::uint8_t version = 0;                 // 13
    std::uint16_t earfcn = 0;                 // 17..18
    std::uint16_t servingPhysicalCellId = 0;  // 19..20
    std::uint16_t subframeNumber = 0;         // 21..22
    std::uint16_t servingFilteredRsrp = 0;    // 23..24, quarter dB
    std::uint16_t servingFilteredRsrq = 0;    // 25..26, eighth dB
    std::vector<LteMeasuredNeighbour> measured;
    std::vector<std::uint16_t> detected;  // physical cell identities
    std::optional<std::uint8_t> measuredCountOverride;
    std::optional<std::uint8_t> detectedCountOverride;
    std::size_t length = 0;
};
PlistData buildLteIntraFrequencyRecord(const LteIntraFrequencyRecord& record, std::uint64_t timestamp = 0);

// 0xB17F: idle-mode serving-cell measurements (33 bytes).
struct LteIdleServingMeasurementRecord {
    std::uint8_t version = 0;               // 13
    std::uint16_t earfcn = 0;               // 17..18
    std::uint16_t physicalCellId = 0;       // bits 0..8 of 19..20
    std::uint8_t servingLayerPriority = 0;  // bits 1..4 of 20
    std::uint16_t measuredRsrp = 0;         // bits 0..8 of 21..22, quarter dB
    std::uint16_t averageRsrp = 0;          // bits 1..9 of 22..23, quarter dB
    std::uint8_t measuredRsrq = 0;          // bits 2..8 of 23..24, quarter dB
    std::uint8_t averageRsrq = 0;           // bits 1..7 of 24, quarter dB
    std::uint16_t measuredRssi = 0;         // bits 0..8 of 25..26, half dB
    std::uint8_t qrxlevmin = 0;             // bits 1..6 of 26
    std::uint8_t pMax = 0;                  // bits 7..13 of 26..27 (64: not present)
    std::uint8_t maxUeTxPower = 0;          // bits 6..11 of 27..28
    std::uint8_t srxlev = 0;                // bits 0..6 of 29
    std::uint8_t consecutiveDrxCycles = 0;  // bits 7..12 of 29..30
    std::uint8_t sIntraSearch = 0;          // bits 5..10 of 30..31 (32: not present)
    std::uint8_t sNonIntraSearch = 0;       // bits 3..8 of 31..32 (32: not present)
    bool measurementRulesUpdated = false;   // bit 1 of 32
    std::uint8_t measurementRules = 0;      // bits 2..5 of 32
    std::size_t length = 0;
};
PlistData buildLteIdleServingMeasurementRecord(const LteIdleServingMeasurementRecord& record,
                                               std::uint64_t timestamp = 0);

// 0xB180: idle-mode neighbour measurements. Bits 6..10 of the 16 bits at 19 hold the number of cells minus
// one (1 to 32 cells); 20-byte entries from 21 (bytes 10..11 and 16..19 of an entry are zero). An empty list
// is written with count bits 0.
struct LteIdleNeighbour {
    std::uint16_t physicalCellId = 0;   // bits 0..8 of +0..1
    std::uint8_t measuredRssi = 0;      // bits 1..8 of +1..2
    std::uint16_t measuredRsrp = 0;     // bits 1..9 of +2..3
    std::uint16_t averageRsrp = 0;      // bits 0..8 of +4..5
    std::uint8_t measuredRsrq = 0;      // bits 1..7 of +5
    std::uint8_t averageRsrq = 0;       // bits 0..6 of +6
    std::uint8_t srxlev = 0;            // bits 7..13 of +6..7
    std::uint16_t frequencyOffset = 0;  // +8..9
    std::uint16_t frameOffset = 0;      // bits 0..10 of +12..13
    std::uint32_t sampleOffset = 0;     // bits 3..21 of +13..15
};
struct LteIdleNeighbourMeasurementRecord {
    std::uint8_t version = 0;    // 13
    std::uint16_t earfcn = 0;    // 17..18
    std::uint8_t qrxlevmin = 0;  // bits 0..5 of 19
    std::vector<LteIdleNeighbour> neighbours;
    std::optional<std::uint8_t> countBitsOverride;  // the raw value of bits 6..10 (cells minus one)
    std::size_t length = 0;
};
PlistData buildLteIdleNeighbourMeasurementRecord(const LteIdleNeighbourMeasurementRecord& record,
                                                 std::uint64_t timestamp = 0);

// 0xB186: idle-mode reselection candidates. The 16 bits at 19 are the candidate count; each candidate is a
// 4-byte header (priority, RAT type) at 21 + 4k followed by its technology's fields, which the next
// candidate's header overwrites: the builder writes candidates in order, so a later candidate's header wins
// over an earlier candidate's technology fields.
enum class LteCandidateRat : std::uint16_t { Lte = 0, Utran = 1, Geran = 2, Cdma1xRtt = 3, CdmaHrpd = 4 };
struct LteReselectionCandidate {
    std::uint16_t priority = 0;  // +0..1
    std::uint16_t ratType = 0;   // +2..3
    // Technology fields, relative to +4:
    std::uint16_t channel = 0;  // LTE E-ARFCN, UTRAN UARFCN, GERAN ARFCN: +0..1; CDMA channel: +4..5
    std::uint16_t cellId = 0;   // LTE cell id: bits 7..15 of +2..3; UTRAN PSC: +2..3; CDMA pilot: +6..7
    std::uint8_t band = 0;      // GERAN band: +2; CDMA band: +0
    std::uint8_t bsic = 0;      // GERAN BSIC: +3
};
struct LteReselectionCandidatesRecord {
    std::uint8_t version = 0;         // 13
    std::uint16_t servingEarfcn = 0;  // 15..16
    std::uint16_t servingCellId = 0;  // 17..18
    std::vector<LteReselectionCandidate> candidates;
    std::optional<std::uint16_t> countOverride;
    std::size_t length = 0;
};
PlistData buildLteReselectionCandidatesRecord(const LteReselectionCandidatesRecord& record,
                                              std::uint64_t timestamp = 0);

// 0xFF0001: a cell of the cell-monitor array with the entries an LTE cell carries. Absent optionals are left
// out of the dictionary.
struct LteCellMonitorCell {
    std::optional<std::string> technology;  // kKxCellMonitorCellRadioAccessTechnology
    std::optional<std::string> cellType;    // kKxCellMonitorCellType
    std::optional<std::int64_t> trackingAreaCode;
    std::optional<std::int64_t> cellId;
    std::optional<std::int64_t> physicalCellId;
    std::optional<std::int64_t> bandInfo;
    std::optional<std::int64_t> uarfcn;
};
PlistValue lteCellMonitorDictionary(const LteCellMonitorCell& cell);
PlistData buildLteCellMonitorRecord(const std::vector<LteCellMonitorCell>& cells,
                                    std::uint64_t timestamp = 0);

}  // namespace velmar
