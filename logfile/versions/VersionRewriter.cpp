#include "logfile/versions/VersionRewriter.h"

#include <algorithm>

namespace velmar::packet_versions {

namespace {

constexpr Spot kVersionByte = u8At(0);
constexpr Spot kVersionTopBits = bitsAt(0, 1, 6, 7);

std::int64_t readSpot(const RecordReader& payload, std::size_t base, const Spot& spot) {
    if (!spot.present()) {
        return 0;
    }
    const std::uint64_t raw = payload.bits(base + spot.offset, spot.width, spot.lowBit, spot.highBit);
    if (!spot.isSigned) {
        return static_cast<std::int64_t>(raw);
    }
    const std::uint64_t sign = std::uint64_t{1} << (spot.bitCount() - 1);
    return static_cast<std::int64_t>((raw ^ sign) - sign);
}

// numerator / divisor rounded to the nearest integer, halves away from zero; divisor > 0.
std::int64_t roundedQuotient(std::int64_t numerator, std::int64_t divisor) {
    if (numerator >= 0) {
        return (2 * numerator + divisor) / (2 * divisor);
    }
    return -((-2 * numerator + divisor) / (2 * divisor));
}

// Writes value into spot, clamped into the spot's range (a clamp is counted).
void writeSpot(RecordWriter& out, std::size_t base, const Spot& spot, std::int64_t value,
               RewriteTally& tally) {
    const unsigned bits = spot.bitCount();
    const std::int64_t lowest = spot.isSigned ? -(std::int64_t{1} << (bits - 1)) : 0;
    const std::int64_t highest =
        spot.isSigned ? (std::int64_t{1} << (bits - 1)) - 1 : (std::int64_t{1} << bits) - 1;
    if (value < lowest || value > highest) {
        value = std::clamp(value, lowest, highest);
        ++tally.clamped;
    }
    const std::uint64_t pattern = static_cast<std::uint64_t>(value) & ((std::uint64_t{1} << bits) - 1);
    if (spot.lowBit == 0 && bits == 8u * spot.width) {
        out.unsignedLE(base + spot.offset, spot.width, pattern);  // whole bytes: nothing to keep
    } else {
        out.bits(base + spot.offset, spot.width, spot.lowBit, spot.highBit, pattern);
    }
}

void moveFields(std::span<const FieldMove> moves, const RecordReader& payload, std::size_t from,
                RecordWriter& out, std::size_t to, RewriteTally& tally) {
    for (const FieldMove& move : moves) {
        const std::int64_t raw = readSpot(payload, from, move.from);
        const std::int64_t scaled = raw * move.scale.multiply + move.scale.add;
        // Most moves copy a value as it is: no division for them.
        const std::int64_t value =
            move.scale.divide == 1 ? scaled : roundedQuotient(scaled, move.scale.divide);
        writeSpot(out, to, move.to, value, tally);
    }
}

// The payload bytes an entry of the newer version must hold for all its fields to be read.
std::size_t sourceEntryNeed(const ListMove& list) {
    if (list.convertEntry != nullptr) {
        return list.from.stride;
    }
    std::size_t need = 0;
    for (const FieldMove& move : list.entry) {
        need = std::max(need, move.from.end());
    }
    return need;
}

void writeVersion(const CodeVersions& code, RecordWriter& out, std::size_t base) {
    RewriteTally unused;
    switch (code.place) {
        case VersionPlace::FirstByte:
            writeSpot(out, base, kVersionByte, code.decodedVersion, unused);
            break;
        case VersionPlace::TopBitsOfFirst:
            writeSpot(out, base, kVersionTopBits, code.decodedVersion, unused);
            break;
        case VersionPlace::None:
            break;
    }
}

}  // namespace

void writeDecodedVersionOnly(const CodeVersions& code, std::vector<std::uint8_t>& out, std::size_t base) {
    out.resize(base);
    RecordWriter writer(out);
    writeVersion(code, writer, base);
}

bool rewritePayload(const CodeVersions& code, const VersionTable& table, ByteView payload,
                    std::vector<std::uint8_t>& out, std::size_t base, RewriteTally& tally) {
    if (payload.size() < table.sourceMinimum) {
        return false;
    }
    const RecordReader reader(payload);
    // The counts first: a record whose list the decoded layout cannot express is dropped before anything is
    // written.
    for (const ListMove& list : table.lists) {
        if (list.to.countBias > 0 && readSpot(reader, 0, list.from.count) + list.from.countBias == 0) {
            return false;
        }
    }

    out.resize(base);
    out.resize(base + table.targetLength, 0);
    RecordWriter writer(out);
    writeVersion(code, writer, base);
    moveFields(table.fields, reader, 0, writer, base, tally);

    std::size_t fromEnd = 0;  // where the previous list ends, on each side
    std::size_t toEnd = 0;
    std::uint64_t previousWritten = 0;
    for (const ListMove& list : table.lists) {
        const std::uint64_t count =
            static_cast<std::uint64_t>(readSpot(reader, 0, list.from.count)) + list.from.countBias;
        const std::size_t fromStart = list.from.followsPrevious ? fromEnd : list.from.offset;
        const std::size_t toStart = list.to.followsPrevious ? toEnd : list.to.offset;
        const std::uint64_t room = list.yieldsToPrevious && previousWritten > 0 ? 0 : list.capacity;
        const std::uint64_t written = std::min<std::uint64_t>(count, room);
        tally.droppedEntries +=
            static_cast<std::uint32_t>(std::min<std::uint64_t>(count - written, UINT32_MAX));
        writeSpot(writer, base, list.to.count, static_cast<std::int64_t>(written) - list.to.countBias, tally);

        // The decoded list's bytes, zero-filled at once rather than grown entry by entry.
        if (written > 0) {
            const std::size_t entryLength = list.to.entryLength != 0 ? list.to.entryLength : list.to.stride;
            const std::size_t end =
                toStart + static_cast<std::size_t>(written - 1) * list.to.stride + entryLength;
            out.resize(std::max(out.size(), base + end), 0);
        }
        const std::size_t need = sourceEntryNeed(list);
        for (std::uint64_t index = 0; index < written; ++index) {
            const std::size_t from = fromStart + static_cast<std::size_t>(index) * list.from.stride;
            const std::size_t to = base + toStart + static_cast<std::size_t>(index) * list.to.stride;
            if (from + need > payload.size()) {
                ++tally.missingEntries;  // left zero, as the decoders read what is not there
                continue;
            }
            if (list.convertEntry != nullptr) {
                list.convertEntry(reader, from, writer, to, tally);
            } else {
                moveFields(list.entry, reader, from, writer, to, tally);
            }
        }
        // Counts are at most 32 bits wide and strides 16, so these sums cannot wrap.
        fromEnd = fromStart + static_cast<std::size_t>(count) * list.from.stride;
        toEnd = toStart + static_cast<std::size_t>(written) * list.to.stride;
        previousWritten = written;
    }
    return true;
}

}  // namespace velmar::packet_versions
