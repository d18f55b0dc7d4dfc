// VersionLayout: the vocabulary in which a newer version of a baseband record is declared as a table that
// rewrites it into the layout the monitor's decoders read (the decoded layout).
//
// A table lists field moves: where a value lies in the newer version (a Spot), where it goes in the decoded
// layout, and the linear conversion between their units. Lists are moved entry by entry, with their counts,
// strides and starts declared on both sides. Offsets count from the first payload byte (packet offset 13,
// where the version byte of most records stands), because that is how the record versions are laid out.
//
// Contract of a move: the value is read through RecordReader (bytes past the end read as zero), converted as
// (raw × multiply + add) / divide rounded to the nearest integer (halves away from zero), clamped into the
// target field's range and written through RecordWriter; a clamp is counted. A move without a source (width
// 0) writes the neutral value `add`: that is how a field that the newer version lacks gets a documented
// value.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "core/platform/RecordReader.h"
#include "core/platform/RecordWriter.h"

namespace velmar::packet_versions {

// Bits lowBit..highBit (inclusive) of the little-endian word of `width` bytes (1..4) at a payload offset,
// signed (two's complement of the bit range) or unsigned. A width of 0 marks "no field".
struct Spot {
    std::uint16_t offset = 0;
    std::uint8_t width = 0;
    std::uint8_t lowBit = 0;
    std::uint8_t highBit = 0;
    bool isSigned = false;

    constexpr bool present() const { return width != 0; }
    constexpr unsigned bitCount() const { return static_cast<unsigned>(highBit - lowBit + 1); }
    // The first payload byte after the field.
    constexpr std::size_t end() const { return static_cast<std::size_t>(offset) + width; }
};

constexpr Spot u8At(std::uint16_t offset) {
    return {offset, 1, 0, 7, false};
}
constexpr Spot u16At(std::uint16_t offset) {
    return {offset, 2, 0, 15, false};
}
constexpr Spot s16At(std::uint16_t offset) {
    return {offset, 2, 0, 15, true};
}
constexpr Spot u24At(std::uint16_t offset) {
    return {offset, 3, 0, 23, false};
}
constexpr Spot u32At(std::uint16_t offset) {
    return {offset, 4, 0, 31, false};
}
constexpr Spot bitsAt(std::uint16_t offset, std::uint8_t width, std::uint8_t lowBit, std::uint8_t highBit) {
    return {offset, width, lowBit, highBit, false};
}
inline constexpr Spot kNoField{};

// target = (raw × multiply + add) / divide, rounded to nearest; divide > 0.
struct Scale {
    std::int32_t multiply = 1;
    std::int32_t add = 0;
    std::int32_t divide = 1;
};
inline constexpr Scale kAsIs{};

struct FieldMove {
    Spot from = kNoField;
    Spot to = kNoField;
    Scale scale = kAsIs;
};

// A field that the newer version lacks, written as `value`.
constexpr FieldMove neutral(Spot to, std::int32_t value = 0) {
    return {kNoField, to, Scale{1, value, 1}};
}

// What a rewrite did that the census reports.
struct RewriteTally {
    std::uint32_t clamped = 0;         // values that did not fit their decoded field
    std::uint32_t droppedEntries = 0;  // list entries the decoded layout has no room for
    std::uint32_t missingEntries = 0;  // entries the count names but the record is too short to hold
};

// Rewrites one entry of a list whose entries are not a plain list of fields; `from` and `to` are payload
// offsets of the entry.
using EntryConversion = void (*)(const RecordReader& payload, std::size_t from, RecordWriter& out,
                                 std::size_t to, RewriteTally& tally);

// Where a list lies on one side of the move.
struct ListPlace {
    Spot count = kNoField;
    // The count field holds the number of entries minus countBias (1 for "count minus one").
    std::uint8_t countBias = 0;
    // First entry; ignored when followsPrevious (entries start right after the previous list's).
    std::uint16_t offset = 0;
    bool followsPrevious = false;
    std::uint16_t stride = 0;
    // Bytes one entry spans when that differs from the stride (entries read overlapping); 0: the stride.
    std::uint16_t entryLength = 0;
};

struct ListMove {
    ListPlace from = {};
    ListPlace to = {};
    std::span<const FieldMove> entry = {};  // offsets relative to the entry
    // Most entries the decoded layout holds; the rest are dropped and counted.
    std::uint16_t capacity = 255;
    // The list shares its place in the decoded layout with the previous list: it is laid out only when that
    // list is empty, and otherwise written with count zero and its entries counted as dropped.
    bool yieldsToPrevious = false;
    EntryConversion convertEntry = nullptr;  // instead of `entry`
};

// One newer version of a record, and how it becomes the decoded layout.
struct VersionTable {
    std::uint8_t version = 0;  // the version it reads; unused for a record without a version field
    // Payload bytes that hold every fixed field the decoders need; a shorter record is dropped (rewritten to
    // its header and version alone, which every decoder ignores, as it ignores a short record).
    std::uint16_t sourceMinimum = 0;
    std::uint16_t targetLength = 0;  // payload bytes of the decoded layout's fixed part
    std::span<const FieldMove> fields = {};
    std::span<const ListMove> lists = {};
    // For a record without a version field: whether a payload has this layout.
    bool (*recognises)(const RecordReader& payload) = nullptr;
};

enum class VersionPlace : std::uint8_t {
    None,            // no version field: layouts are told apart by VersionTable::recognises
    FirstByte,       // payload byte 0
    TopBitsOfFirst,  // bits 6..7 of payload byte 0
};

// Every layout known of one log code.
struct CodeVersions {
    std::uint16_t code = 0;
    VersionPlace place = VersionPlace::None;
    // The version number of the decoded layout, which adapted records carry; -1 when no other layout of the
    // record is known, so that every version passes as it is.
    std::int16_t decodedVersion = -1;
    std::span<const VersionTable> tables = {};
};

}  // namespace velmar::packet_versions
