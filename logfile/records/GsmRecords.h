// GsmRecords: builders of the GSM/UMTS cell records (GSM serving and neighbour cells, mobile allocation, the
// UMTS idle measurements and connected-mode cell sets) and of the SIM-file, cell-monitor and PDP-context
// extra records, for the tests, the benchmarks and the simulated baseband.
//
// Contract: each builder takes a plain struct of field values and writes one whole packet (type byte, DLF
// header, payload at packet offset 13) through RecordBuilder. Field comments give packet offsets. A record
// comes out at its layout's length (fixed records: the length named with the struct; lists: up to the end of
// the last entry, but never shorter than the record's minimum) unless `length` is set, which cuts or
// zero-fills the packet to that total length. List counts are taken from the lists; a count override writes
// another count while the list stays as given, which builds records whose counts point past their end.
// Fields not named here are written as zero. Extra records carry a property list after the header.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

// 0x5134: GSM serving-cell identity (26 bytes).
struct GsmServingIdentityRecord {
    std::uint16_t arfcn = 0;   // 13..14
    std::uint16_t bsic = 0;    // 15..16
    std::uint16_t cellId = 0;  // 17..18
    std::size_t length = 0;
};
PlistData buildGsmServingIdentityRecord(const GsmServingIdentityRecord& record, std::uint64_t timestamp = 0);

// 0x5137: GSM serving and neighbour measurements. Serving fields at 15..26; byte 28 is the neighbour count;
// 14-byte neighbour entries from 29 (bytes 7..13 of an entry are zero).
struct GsmNeighbourMeasurement {
    std::uint16_t arfcn = 0;   // +0
    std::uint8_t rxLevel = 0;  // +2
    std::int32_t c1 = 0;       // +3..6
};
struct GsmMeasurementRecord {
    std::uint8_t rxLevel = 0;             // 15
    std::uint32_t c1 = 0;                 // 16..19
    std::uint32_t c2 = 0;                 // 20..23
    std::uint8_t reselectHysteresis = 0;  // 26
    std::vector<GsmNeighbourMeasurement> neighbours{};
    std::optional<std::uint8_t> countOverride{};
    std::size_t length = 0;
};
PlistData buildGsmMeasurementRecord(const GsmMeasurementRecord& record, std::uint64_t timestamp = 0);

// 0x5076: GSM dedicated channel (17 bytes).
struct GsmDedicatedChannelRecord {
    std::uint16_t arfcn = 0;  // 13..14
    std::size_t length = 0;
};
PlistData buildGsmDedicatedChannelRecord(const GsmDedicatedChannelRecord& record,
                                         std::uint64_t timestamp = 0);

// 0x51FF: GSM BSIC list. Byte 14 is the count; 4-byte entries from 15: ARFCN (2 bytes), BSIC, a zero byte.
struct GsmBsicEntry {
    std::uint16_t arfcn = 0;
    std::uint8_t bsic = 0;
};
struct GsmBsicListRecord {
    std::vector<GsmBsicEntry> entries;
    std::optional<std::uint8_t> countOverride;
    std::size_t length = 0;
};
PlistData buildGsmBsicListRecord(const GsmBsicListRecord& record, std::uint64_t timestamp = 0);

// 0x51F8: mobile allocation. Byte 13 is the HSN, byte 14 the count; 2-byte ARFCNs from 15.
struct MobileAllocationRecord {
    std::uint8_t hsn = 0;
    std::vector<std::uint16_t> arfcns;
    std::optional<std::uint8_t> countOverride;
    std::size_t length = 0;
};
PlistData buildMobileAllocationRecord(const MobileAllocationRecord& record, std::uint64_t timestamp = 0);

// 0x4005, GSM view: byte 14 is the count of GSM cells; 7-byte entries from 15.
struct GsmSetCell {
    std::uint16_t arfcn = 0;        // +0
    std::uint16_t bsic = 0;         // +2
    std::int8_t rssi = 0;           // +4, dBm
    std::int16_t rankingValue = 0;  // +5
};
struct GsmSetRecord {
    std::vector<GsmSetCell> cells;
    std::optional<std::uint8_t> countOverride;
    std::size_t length = 0;
};
PlistData buildGsmSetRecord(const GsmSetRecord& record, std::uint64_t timestamp = 0);

// 0x4005, UMTS view: byte 13 is the count of UMTS cells; 10-byte entries from 15 (the same offset as the GSM
// entries of the other view).
struct UmtsSetCell {
    std::int16_t downlinkFrequency = 0;  // +0
    std::uint16_t scramblingCode = 0;    // +2
    std::int8_t rscpRaw = 0;             // +4, RSCP + 21 dB
    std::int16_t rankCellRscp = 0;       // +5, dB
    std::int8_t ecioHalfDb = 0;          // +7, in 0.5 dB steps
    std::int16_t rankingValue = 0;       // +8
};
struct UmtsSetRecord {
    std::vector<UmtsSetCell> cells;
    std::optional<std::uint8_t> countOverride;
    std::size_t length = 0;
};
PlistData buildUmtsSetRecord(const UmtsSetRecord& record, std::uint64_t timestamp = 0);

// 0x417A: connected-mode cell sets. A signed 16-bit received-power reading at 13, the cell count at 15,
// 15-byte cell entries from 16 (scrambling code in bits 0..12 and set type in bits 13..15 of the 16-bit word
// at +7), then one 44-byte energy entry per cell with three 32-bit linear Ec/Io readings at +32, +36, +40.
struct UmtsCellSetCell {
    std::uint16_t scramblingCode = 0;  // 13 bits
    std::uint8_t setType = 0;          // 3 bits; 0 is the active set
    std::array<std::uint32_t, 3> energyReadings{};
};
struct UmtsCellSetRecord {
    std::int16_t powerReading = 0;
    std::vector<UmtsCellSetCell> cells;
    std::optional<std::uint8_t> countOverride;
    std::size_t length = 0;
};
PlistData buildUmtsCellSetRecord(const UmtsCellSetRecord& record, std::uint64_t timestamp = 0);

// The property-list encoding of an extra record's payload.
enum class PlistEncoding { Binary, Xml };

// 0xFF0000: SIM elementary files, a dictionary of SIM-file keys ("kSimFile_ICCID", ...) to their values.
struct SimFilesRecord {
    std::vector<std::pair<std::string, PlistValue>> files;
    PlistEncoding encoding = PlistEncoding::Binary;
};
PlistData buildSimFilesRecord(const SimFilesRecord& record, std::uint64_t timestamp = 0);

// 0xFF0001: one cell of the cell-monitor array. Absent optionals are left out of the dictionary.
struct CellMonitorEntry {
    std::optional<std::string> technology{};  // kKxCellMonitorCellRadioAccessTechnology
    std::optional<std::string> cellType{};    // kKxCellMonitorCellType
    std::optional<std::int64_t> cellId{};
    std::optional<std::int64_t> arfcn{};
    std::optional<std::int64_t> rssi{};
    std::optional<std::int64_t> uarfcn{};
    std::optional<std::int64_t> psc{};
    std::optional<std::int64_t> rscp{};
    std::optional<std::int64_t> ecn0{};
    std::optional<std::int64_t> mcc{};
    std::optional<std::int64_t> mnc{};
    std::optional<std::int64_t> lac{};
};
PlistValue cellMonitorEntryDictionary(const CellMonitorEntry& entry);
PlistData buildCellMonitorEntries(const std::vector<CellMonitorEntry>& entries, std::uint64_t timestamp = 0);

// 0xFF0002: the active PDP contexts, an array of one dictionary per context as the telephony service reports
// it ("Context ID", "APN", "PDP Type", "PDP Address"). Every value is text, the context id in decimal: the
// panes show text leaves only (a number would read "(unknown)").
struct PdpContext {
    std::int64_t contextId = 0;
    std::string apn;
    std::string pdpType;
    std::string address;
};
PlistValue pdpContextDictionary(const PdpContext& context);
PlistData buildPdpContextsRecord(const std::vector<PdpContext>& contexts, std::uint64_t timestamp = 0);

}  // namespace velmar
