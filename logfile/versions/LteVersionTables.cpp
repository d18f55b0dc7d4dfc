// The LTE records' newer versions, rewritten into the layouts the LTE decoders read. Payload offsets (packet
// offset minus 13).
//
// Units: the newer measurement versions count levels in 1/16 dB: RSRP dBm = raw / 16 - 180, RSRQ dB =
// raw / 16 - 30, RSSI dBm = raw / 16 - 110. The decoded layouts count RSRP in quarter dB above -140 dBm
// (connected mode and idle serving cell) or half dB above -140 dBm (idle neighbours), RSRQ in eighth dB
// above -20 dB (connected mode) or quarter dB above -30 dB (idle), RSSI in half dB above -140 dBm. Hence
// the scales below, e.g. quarter-dB RSRP = (raw - 640) / 4.
#include <array>

#include "core/platform/logcodes/LteLogCodes.h"
#include "logfile/versions/VersionTables.h"

namespace velmar::packet_versions {

namespace {

// 1/16 dB above -180 dBm -> quarter dB above -140 dBm.
constexpr Scale kRsrpToQuarterDb{1, -640, 4};
// 1/16 dB above -180 dBm -> half dB above -140 dBm.
constexpr Scale kRsrpToHalfDb{1, -640, 8};
// 1/16 dB above -30 dB -> eighth dB above -20 dB.
constexpr Scale kRsrqToEighthDb{1, -160, 2};
// 1/16 dB above -30 dB -> quarter dB above -30 dB.
constexpr Scale kRsrqToQuarterDb{1, 0, 4};
// 1/16 dB above -110 dBm -> half dB above -140 dBm.
constexpr Scale kRssiToHalfDb{1, 480, 8};

// ---- 0xB0C2, serving cell information. Decoded layout: version 2 (25 bytes): PCI u16 at 1, DL and UL
// EARFCN u16 at 3 and 5, bandwidths u8 at 7 and 8, cell identity u32 at 9, TAC u16 at 13, band u32 at 15,
// MCC u16 at 19, MNC digit count u8 at 21, MNC u16 at 22, allowed access u8 at 24.

// Version 3 (29 bytes): the EARFCNs grew to 32 bits and everything after them moved.
constexpr FieldMove kServingCellV3[] = {
    {u16At(1), u16At(1)},    // physical cell identity
    {u32At(3), u16At(3)},    // downlink EARFCN
    {u32At(7), u16At(5)},    // uplink EARFCN
    {u8At(11), u8At(7)},     // downlink bandwidth, resource blocks
    {u8At(12), u8At(8)},     // uplink bandwidth
    {u32At(13), u32At(9)},   // cell identity
    {u16At(17), u16At(13)},  // tracking area code
    {u32At(19), u32At(15)},  // frequency band indicator
    {u16At(23), u16At(19)},  // MCC
    {u8At(25), u8At(21)},    // MNC digit count
    {u16At(26), u16At(22)},  // MNC
    {u8At(28), u8At(24)},    // allowed access
};
constexpr VersionTable kServingCellTables[] = {
    {.version = 3, .sourceMinimum = 23, .targetLength = 25, .fields = kServingCellV3},
};

// ---- 0xB0C1, master information block. Decoded layout: version 1 (9 bytes): PCI u16 at 1, EARFCN u16 at
// 3, SFN u16 at 5, transmit antennas u8 at 7, downlink bandwidth u8 at 8.

// Versions 2 and 3 (11 and 12 bytes): a 32-bit EARFCN; version 3 adds a SIB1-BR byte that has no place.
constexpr FieldMove kMasterInformationV2[] = {
    {u16At(1), u16At(1)},  // physical cell identity
    {u32At(3), u16At(3)},  // EARFCN
    {u16At(7), u16At(5)},  // system frame number
    {u8At(9), u8At(7)},    // transmit antennas
    {u8At(10), u8At(8)},   // downlink bandwidth
};
// Version 17 (18 bytes, the narrowband MIB): no downlink bandwidth (neutral 0, no resource-block count).
constexpr FieldMove kMasterInformationV17[] = {
    {u16At(1), u16At(1)},  // physical cell identity
    {u32At(3), u16At(3)},  // EARFCN
    {u16At(7), u16At(5)},  // system frame number
    {u8At(17), u8At(7)},   // transmit antennas
    neutral(u8At(8)),      // downlink bandwidth
};
constexpr VersionTable kMasterInformationTables[] = {
    {.version = 2, .sourceMinimum = 10, .targetLength = 9, .fields = kMasterInformationV2},
    {.version = 3, .sourceMinimum = 10, .targetLength = 9, .fields = kMasterInformationV2},
    {.version = 17, .sourceMinimum = 18, .targetLength = 9, .fields = kMasterInformationV17},
};

// ---- 0xB179, connected-mode intra-frequency measurements. Decoded layout (no published version number;
// it predates version 3, so adapted records carry 2): bytes 1..3 unknown, E-ARFCN u16 at 4, serving PCI u16
// at 6, subframe u16 at 8, filtered RSRP u16 at 10 (quarter dB), filtered RSRQ u16 at 12 (eighth dB), N u8
// at 14, D u8 at 15; N measured neighbours of 6 bytes from 16 (PCI, RSRP, RSRQ), then D detected cells of 2
// bytes (PCI).

constexpr FieldMove kIntraFrequencyNeighbour[] = {
    {u16At(0), u16At(0)},                    // physical cell identity
    {s16At(2), u16At(2), kRsrpToQuarterDb},  // filtered RSRP (+4 repeats it)
    {s16At(6), u16At(4), kRsrqToEighthDb},   // filtered RSRQ (+8 repeats it)
};
constexpr FieldMove kIntraFrequencyDetectedV4[] = {
    {u16At(0), u16At(0)},  // physical cell identity
};
constexpr FieldMove kIntraFrequencyDetectedV3[] = {
    {u32At(0), u16At(0)},  // physical cell identity, 32 bits in version 3
};
constexpr ListPlace kDecodedMeasured{.count = u8At(14), .offset = 16, .stride = 6};
constexpr ListPlace kDecodedDetected{.count = u8At(15), .followsPrevious = true, .stride = 2};
// The decoded layout's preamble bytes 1..3 have no counterpart: neutral 0.
constexpr FieldMove kIntraFrequencyPreamble[] = {neutral(u24At(1))};

// Version 3 (24 + 12N + 16D bytes).
constexpr FieldMove kIntraFrequencyV3[] = {
    kIntraFrequencyPreamble[0],
    {u16At(8), u16At(4)},                      // E-ARFCN
    {u16At(10), u16At(6)},                     // serving physical cell identity
    {u16At(12), u16At(8)},                     // subframe number
    {s16At(14), u16At(10), kRsrpToQuarterDb},  // serving filtered RSRP (16 repeats it)
    {s16At(18), u16At(12), kRsrqToEighthDb},   // serving filtered RSRQ (20 repeats it)
};
constexpr ListMove kIntraFrequencyListsV3[] = {
    {.from = {.count = u8At(22), .offset = 24, .stride = 12},
     .to = kDecodedMeasured,
     .entry = kIntraFrequencyNeighbour},
    {.from = {.count = u8At(23), .followsPrevious = true, .stride = 16},
     .to = kDecodedDetected,
     .entry = kIntraFrequencyDetectedV3},
};
// Version 4 (28 + 12N + 16D bytes): a 32-bit E-ARFCN, and everything after it moved.
constexpr FieldMove kIntraFrequencyV4[] = {
    kIntraFrequencyPreamble[0],
    {u32At(8), u16At(4)},                      // E-ARFCN
    {u16At(12), u16At(6)},                     // serving physical cell identity
    {u16At(14), u16At(8)},                     // subframe number (10 x SFN + subframe)
    {s16At(16), u16At(10), kRsrpToQuarterDb},  // serving filtered RSRP (18 repeats it)
    {s16At(20), u16At(12), kRsrqToEighthDb},   // serving filtered RSRQ (22 repeats it)
};
constexpr ListMove kIntraFrequencyListsV4[] = {
    {.from = {.count = u8At(24), .offset = 28, .stride = 12},
     .to = kDecodedMeasured,
     .entry = kIntraFrequencyNeighbour},
    {.from = {.count = u8At(25), .followsPrevious = true, .stride = 16},
     .to = kDecodedDetected,
     .entry = kIntraFrequencyDetectedV4},
};
constexpr VersionTable kIntraFrequencyTables[] = {
    {.version = 3,
     .sourceMinimum = 24,
     .targetLength = 16,
     .fields = kIntraFrequencyV3,
     .lists = kIntraFrequencyListsV3},
    {.version = 4,
     .sourceMinimum = 26,
     .targetLength = 16,
     .fields = kIntraFrequencyV4,
     .lists = kIntraFrequencyListsV4},
};

// ---- 0xB17F, idle-mode serving cell measurements. Decoded layout (no published version number; its header
// is that of version 4 but its measurements are packed tighter, so it predates version 4 and adapted records
// carry 3), 20 bytes: RRC release u8 at 1; E-ARFCN u16 at 4; in the 16 bits at 6, PCI bits 0..8 and serving
// layer priority bits 9..12; in the 32 bits at 8, measured RSRP bits 0..8, average RSRP 9..17 (quarter dB),
// measured RSRQ 18..24, average RSRQ 25..31 (quarter dB); in the 32 bits at 12, RSSI bits 0..8 (half dB),
// Qrxlevmin 9..14, P_Max 15..21, max UE Tx power 22..27; in the 32 bits at 16, Srxlev bits 0..6, DRX cycles
// with S < 0 7..12, S intra search 13..18, S non-intra search 19..24, measurement rules updated 25, rules
// 26..29.
//
// Versions 4 and 5 share the measurement words; version 5 has a 32-bit E-ARFCN, its PCI word two bytes later
// and its measurement words four bytes later. Qrxlevmin, P_Max, max UE Tx power, the DRX count and the search
// thresholds keep their raw units. Srxlev counts from -50 dB in the newer versions (on the published sample
// packets raw - 50 equals average RSRP minus Qrxlevmin), from -30 dB in the decoded layout. The positions of
// the measurement-rules bits are not known in the newer versions: neutral 0 ("False", 0). identity: the 16
// bits of PCI and priority; measurements: the first of the six 32-bit measurement words.
constexpr std::array<FieldMove, 18> servingMeasurementMoves(Spot earfcn, std::uint16_t identity,
                                                            std::uint16_t measurements) {
    const auto word = [measurements](std::uint16_t index, std::uint8_t lowBit, std::uint8_t highBit) {
        return bitsAt(static_cast<std::uint16_t>(measurements + 4 * index), 4, lowBit, highBit);
    };
    return {{
        {u8At(1), u8At(1)},                                         // RRC release
        {earfcn, u16At(4)},                                         // E-ARFCN
        {bitsAt(identity, 2, 0, 8), bitsAt(6, 2, 0, 8)},            // physical cell identity
        {bitsAt(identity, 2, 9, 15), bitsAt(6, 2, 9, 12)},          // serving layer priority
        {word(0, 0, 11), bitsAt(8, 4, 0, 8), kRsrpToQuarterDb},     // measured RSRP
        {word(1, 0, 11), bitsAt(8, 4, 9, 17), kRsrpToQuarterDb},    // average RSRP
        {word(2, 0, 9), bitsAt(8, 4, 18, 24), kRsrqToQuarterDb},    // measured RSRQ
        {word(2, 20, 29), bitsAt(8, 4, 25, 31), kRsrqToQuarterDb},  // average RSRQ
        {word(3, 10, 20), bitsAt(12, 4, 0, 8), kRssiToHalfDb},      // measured RSSI
        {word(4, 0, 5), bitsAt(12, 4, 9, 14)},                      // Qrxlevmin
        {word(4, 6, 12), bitsAt(12, 4, 15, 21)},                    // P_Max
        {word(4, 13, 18), bitsAt(12, 4, 22, 27)},                   // max UE Tx power
        {word(4, 19, 25), bitsAt(16, 4, 0, 6), Scale{1, -20, 1}},   // Srxlev
        {word(4, 26, 31), bitsAt(16, 4, 7, 12)},                    // DRX cycles with S < 0
        {word(5, 0, 5), bitsAt(16, 4, 13, 18)},                     // S intra search
        {word(5, 6, 11), bitsAt(16, 4, 19, 24)},                    // S non-intra search
        neutral(bitsAt(16, 4, 25, 25)),                             // measurement rules updated
        neutral(bitsAt(16, 4, 26, 29)),                             // measurement rules
    }};
}
constexpr auto kServingMeasurementV4 = servingMeasurementMoves(u16At(4), 6, 8);
constexpr auto kServingMeasurementV5 = servingMeasurementMoves(u32At(4), 8, 12);
constexpr VersionTable kServingMeasurementTables[] = {
    {.version = 4, .sourceMinimum = 32, .targetLength = 20, .fields = kServingMeasurementV4},
    {.version = 5, .sourceMinimum = 36, .targetLength = 20, .fields = kServingMeasurementV5},
};

// ---- 0xB180, idle-mode neighbour measurements. Decoded layout (no published version number; header of
// version 4, older entries: adapted records carry 3): RRC release u8 at 1, E-ARFCN u16 at 4, Qrxlevmin bits
// 0..5 and the number of cells minus one in bits 6..10 of the 16 bits at 6 (1 to 32 cells), 20-byte entries
// from 8: in the 32 bits at +0, PCI bits 0..8, RSSI 9..16 (half dB), RSRP 17..25 (half dB); in the 32 bits at
// +4, average RSRP bits 0..8 (half dB), RSRQ 9..15, average RSRQ 16..22 (quarter dB), Srxlev 23..29;
// frequency offset u16 at +8; antenna-0 frame offset bits 0..10 of the 16 bits at +12, sample offset bits
// 3..21 of the 24 bits at +13.
//
// Versions 4 and 5 hold the count itself (a record of no cells, which the decoded layout cannot express, is
// dropped), and 32-byte entries. Srxlev counts from -30 dB in both. The antenna-1 offsets have no place.
constexpr FieldMove kNeighbourEntry[] = {
    {bitsAt(0, 4, 0, 8), bitsAt(0, 4, 0, 8)},                       // physical cell identity
    {bitsAt(0, 4, 9, 19), bitsAt(0, 4, 9, 16), kRssiToHalfDb},      // measured RSSI
    {bitsAt(0, 4, 20, 31), bitsAt(0, 4, 17, 25), kRsrpToHalfDb},    // measured RSRP
    {bitsAt(4, 4, 12, 23), bitsAt(4, 4, 0, 8), kRsrpToHalfDb},      // average RSRP
    {bitsAt(8, 4, 12, 21), bitsAt(4, 4, 9, 15), kRsrqToQuarterDb},  // measured RSRQ
    {bitsAt(12, 4, 0, 9), bitsAt(4, 4, 16, 22), kRsrqToQuarterDb},  // average RSRQ
    {bitsAt(12, 4, 20, 25), bitsAt(4, 4, 23, 29)},                  // Srxlev
    {u16At(16), u16At(8)},                                          // frequency offset
    {bitsAt(20, 4, 0, 10), bitsAt(12, 2, 0, 10)},                   // antenna-0 frame offset
    {bitsAt(20, 4, 11, 31), bitsAt(13, 3, 3, 21)},                  // antenna-0 sample offset
};
constexpr ListPlace kDecodedNeighbours{
    .count = bitsAt(6, 2, 6, 10), .countBias = 1, .offset = 8, .stride = 20};
constexpr FieldMove kNeighbourHeaderV4[] = {
    {u8At(1), u8At(1)},                        // RRC release
    {u16At(4), u16At(4)},                      // E-ARFCN
    {bitsAt(6, 2, 0, 5), bitsAt(6, 2, 0, 5)},  // Qrxlevmin
};
constexpr ListMove kNeighbourListV4[] = {
    {.from = {.count = bitsAt(6, 2, 6, 15), .offset = 8, .stride = 32},
     .to = kDecodedNeighbours,
     .entry = kNeighbourEntry,
     .capacity = 32},
};
constexpr FieldMove kNeighbourHeaderV5[] = {
    {u8At(1), u8At(1)},                        // RRC release
    {u32At(4), u16At(4)},                      // E-ARFCN
    {bitsAt(8, 4, 0, 5), bitsAt(6, 2, 0, 5)},  // Qrxlevmin
};
constexpr ListMove kNeighbourListV5[] = {
    {.from = {.count = bitsAt(8, 4, 6, 31), .offset = 12, .stride = 32},
     .to = kDecodedNeighbours,
     .entry = kNeighbourEntry,
     .capacity = 32},
};
constexpr VersionTable kNeighbourTables[] = {
    {.version = 4,
     .sourceMinimum = 8,
     .targetLength = 8,
     .fields = kNeighbourHeaderV4,
     .lists = kNeighbourListV4},
    {.version = 5,
     .sourceMinimum = 12,
     .targetLength = 8,
     .fields = kNeighbourHeaderV5,
     .lists = kNeighbourListV5},
};

constexpr CodeVersions kLteCodes[] = {
    {.code = kLogCodeLteServingCellInfo,
     .place = VersionPlace::FirstByte,
     .decodedVersion = 2,
     .tables = kServingCellTables},
    {.code = kLogCodeLteMasterInformation,
     .place = VersionPlace::FirstByte,
     .decodedVersion = 1,
     .tables = kMasterInformationTables},
    {.code = kLogCodeLteIntraFrequency,
     .place = VersionPlace::FirstByte,
     .decodedVersion = 2,
     .tables = kIntraFrequencyTables},
    {.code = kLogCodeLteIdleServingMeasurement,
     .place = VersionPlace::FirstByte,
     .decodedVersion = 3,
     .tables = kServingMeasurementTables},
    {.code = kLogCodeLteIdleNeighbourMeasurement,
     .place = VersionPlace::FirstByte,
     .decodedVersion = 3,
     .tables = kNeighbourTables},
    // Reselection candidates: no other layout is known.
    {.code = kLogCodeLteReselectionCandidates, .place = VersionPlace::FirstByte},
};

}  // namespace

std::span<const CodeVersions> lteCodeVersions() {
    return kLteCodes;
}

}  // namespace velmar::packet_versions
