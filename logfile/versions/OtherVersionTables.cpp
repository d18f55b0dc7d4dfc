// The newer layouts of GSM/UMTS and NAS records, rewritten into the layouts the GSM/UMTS decoders read.
// Payload offsets (packet offset minus 13).
#include "core/platform/logcodes/CdmaLogCodes.h"
#include "core/platform/logcodes/GsmLogCodes.h"
#include "logfile/versions/VersionTables.h"

namespace velmar::packet_versions {

namespace {

// ---- 0x4005, WCDMA cell reselection ranking. The version is bits 6..7 of byte 0. Decoded layout: version 0:
// byte 0 (bits 0..5, read as the whole byte) the number of WCDMA cells, byte 1 the number of GSM cells,
// 10-byte WCDMA entries from 2 (UARFCN, PSC, RSCP, rank RSCP, Ec/Io, rank), and 7-byte GSM entries after
// them (ARFCN, BSIC, RSSI, rank).
//
// The two decoders of the record read their lists from the same byte 2, so the decoded layout holds one list
// only: a newer record with cells of both kinds keeps its WCDMA cells (the serving technology's) and shows
// no GSM cells, which are counted as dropped. Entry fields have the same units in every version and are
// copied bit for bit.
constexpr FieldMove kWcdmaEntry[] = {
    {u16At(0), u16At(0)},  // downlink UARFCN
    {u16At(2), u16At(2)},  // primary scrambling code
    {u8At(4), u8At(4)},    // RSCP + 21 dB
    {u16At(5), u16At(5)},  // rank by RSCP
    {u8At(7), u8At(7)},    // Ec/Io, half dB
    {u16At(8), u16At(8)},  // rank by Ec/Io
};
constexpr FieldMove kGsmEntry[] = {
    {u16At(0), u16At(0)},  // ARFCN
    {u16At(2), u16At(2)},  // BSIC
    {u8At(4), u8At(4)},    // RSSI, dBm
    {u16At(5), u16At(5)},  // rank
};
constexpr ListPlace kDecodedWcdmaCells{.count = u8At(0), .offset = 2, .stride = 10};
constexpr ListPlace kDecodedGsmCells{.count = u8At(1), .offset = 2, .stride = 7};
constexpr Spot kWcdmaCount = bitsAt(0, 1, 0, 5);
constexpr Spot kGsmCount = bitsAt(1, 1, 0, 5);

// Version 1: entries of 11 and 8 bytes (a reselection status byte each).
constexpr ListMove kRankingListsV1[] = {
    {.from = {.count = kWcdmaCount, .offset = 2, .stride = 11},
     .to = kDecodedWcdmaCells,
     .entry = kWcdmaEntry},
    {.from = {.count = kGsmCount, .followsPrevious = true, .stride = 8},
     .to = kDecodedGsmCells,
     .entry = kGsmEntry,
     .yieldsToPrevious = true},
};
// Version 2: five more header bytes, entries of 16 and 13 bytes (HCS fields).
constexpr ListMove kRankingListsV2[] = {
    {.from = {.count = kWcdmaCount, .offset = 7, .stride = 16},
     .to = kDecodedWcdmaCells,
     .entry = kWcdmaEntry},
    {.from = {.count = kGsmCount, .followsPrevious = true, .stride = 13},
     .to = kDecodedGsmCells,
     .entry = kGsmEntry,
     .yieldsToPrevious = true},
};
constexpr VersionTable kRankingTables[] = {
    {.version = 1, .sourceMinimum = 2, .targetLength = 2, .lists = kRankingListsV1},
    {.version = 2, .sourceMinimum = 7, .targetLength = 2, .lists = kRankingListsV2},
};

// ---- 0x7150, equivalent PLMN list. No version field. Decoded layout: byte 3 is N; entry i at 4 + 3i is read
// as six bytes of one decimal digit each, MCC = 100 b0 + 10 b2 + b4 and MNC = 100 b1 + 10 b3 + b5.
//
// Today's firmware writes 19 bytes: a PLMN in 24.008 BCD at 0 (the registered one), N at 3, and 3-byte BCD
// PLMNs at 4 + 3i, unused bytes 0xFF. A 19-byte record with a byte above 9 outside the count is of that
// layout (every byte the decoded layout reads is a decimal digit). Because the decoded entries are six bytes
// read three bytes apart, only the first entry of a list can be written so that it reads right: the rest are
// dropped and counted. A two-digit MNC shows as its number ("07" as 7), as the decoded format shows it.
constexpr std::size_t kBcdPlmnLayoutLength = 19;
constexpr std::size_t kPlmnCountOffset = 3;
constexpr std::uint8_t kAbsentDigit = 0xF;
constexpr std::uint8_t kLargestDigit = 9;

bool isBcdPlmnLayout(const RecordReader& payload) {
    if (payload.size() != kBcdPlmnLayoutLength) {
        return false;
    }
    for (std::size_t offset = 0; offset < payload.size(); ++offset) {
        if (offset != kPlmnCountOffset && payload.byteAt(offset) > kLargestDigit) {
            return true;
        }
    }
    return false;
}

// One decimal digit of a BCD PLMN; a nibble that is not a digit is clamped to 9 and counted.
std::uint8_t plmnDigit(unsigned nibble, RewriteTally& tally) {
    if (nibble > kLargestDigit) {
        ++tally.clamped;
        return kLargestDigit;
    }
    return static_cast<std::uint8_t>(nibble);
}

// A 24.008 PLMN (MCC2 MCC1 | MNC3 MCC3 | MNC2 MNC1) into the six interleaved digit bytes.
void bcdPlmnToDigits(const RecordReader& payload, std::size_t from, RecordWriter& out, std::size_t to,
                     RewriteTally& tally) {
    const unsigned first = payload.byteAt(from);
    const unsigned second = payload.byteAt(from + 1);
    const unsigned third = payload.byteAt(from + 2);
    const std::uint8_t mcc[3] = {plmnDigit(first & 0xF, tally), plmnDigit(first >> 4, tally),
                                 plmnDigit(second & 0xF, tally)};
    std::uint8_t mnc[3];
    if ((second >> 4) == kAbsentDigit) {  // two digits
        mnc[0] = 0;
        mnc[1] = plmnDigit(third & 0xF, tally);
        mnc[2] = plmnDigit(third >> 4, tally);
    } else {
        mnc[0] = plmnDigit(third & 0xF, tally);
        mnc[1] = plmnDigit(third >> 4, tally);
        mnc[2] = plmnDigit(second >> 4, tally);
    }
    for (std::size_t digit = 0; digit < 3; ++digit) {
        out.unsignedLE(to + 2 * digit, 1, mcc[digit]);
        out.unsignedLE(to + 2 * digit + 1, 1, mnc[digit]);
    }
}

constexpr FieldMove kBcdPlmnHeader[] = {
    {u24At(0), u24At(0)},  // the registered PLMN, which the decoded layout does not read
};
constexpr ListMove kBcdPlmnList[] = {
    {.from = {.count = u8At(3), .offset = 4, .stride = 3},
     .to = {.count = u8At(3), .offset = 4, .stride = 3, .entryLength = 6},
     .capacity = 1,
     .convertEntry = bcdPlmnToDigits},
};
constexpr VersionTable kEquivalentPlmnTables[] = {
    {.sourceMinimum = 4,
     .targetLength = 4,
     .fields = kBcdPlmnHeader,
     .lists = kBcdPlmnList,
     .recognises = isBcdPlmnLayout},
};

constexpr CodeVersions kOtherCodes[] = {
    {.code = kLogCodeUmtsIdleMeasurements,
     .place = VersionPlace::TopBitsOfFirst,
     .decodedVersion = 0,
     .tables = kRankingTables},
    {.code = kLogCodeEquivalentPlmns, .place = VersionPlace::None, .tables = kEquivalentPlmnTables},
    // Version fields of records with no other known layout.
    {.code = kLogCodeUmtsHsdpa, .place = VersionPlace::FirstByte},
    {.code = kLogCodeCdma1xSystemIdentity, .place = VersionPlace::FirstByte},
};

}  // namespace

std::span<const CodeVersions> otherCodeVersions() {
    return kOtherCodes;
}

}  // namespace velmar::packet_versions
