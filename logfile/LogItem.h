// LogItem: one unit that the offline readers hand to a log-code generator.
//
// An item is either a blob (the bytes of one baseband log packet, exactly as the generator receives it live:
// optional 2-byte channel prefix 0x81 xx, type byte, DLF record) or a tick (a display refresh: the generator
// publishes what it has gathered since the previous tick). The position fields say where the item came from,
// so that tools can point at the source of a packet they could not decode.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <utility>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

struct LogItem {
    enum class Kind : std::uint8_t { Blob, Tick };

    Kind kind = Kind::Blob;
    // The blob's bytes; empty for a tick.
    PlistData bytes;
    // 1-based line of a hex blob file; 0 for the other formats.
    std::size_t line = 0;
    // 1-based index of the snapshot history entry the item belongs to; 0 for the other formats.
    std::size_t entry = 0;
    // Byte offset where the item starts: in the file for hex, DLF and diagnostic-port captures, in the
    // entry's raw data for snapshots (for a snapshot's tick: the data's size).
    std::uint64_t offset = 0;

    static LogItem blob(PlistData bytes, std::uint64_t offset = 0) {
        LogItem item;
        item.bytes = std::move(bytes);
        item.offset = offset;
        return item;
    }
    static LogItem tick(std::uint64_t offset = 0) {
        LogItem item;
        item.kind = Kind::Tick;
        item.offset = offset;
        return item;
    }

    bool isBlob() const { return kind == Kind::Blob; }
    bool isTick() const { return kind == Kind::Tick; }

    // Where the item came from, for messages: "line 12", "entry 3, offset 40" or "offset 4096".
    std::string position() const {
        if (line != 0) {
            return "line " + std::to_string(line);
        }
        if (entry != 0) {
            return "entry " + std::to_string(entry) + ", offset " + std::to_string(offset);
        }
        return "offset " + std::to_string(offset);
    }

    bool operator==(const LogItem&) const = default;
};

// An item as a streaming reader hands it over: the bytes belong to the reader and stay valid only during the
// callback, which lets the readers pass packets straight out of their buffers.
struct LogItemView {
    LogItem::Kind kind = LogItem::Kind::Blob;
    std::span<const std::uint8_t> bytes;
    std::size_t line = 0;
    std::size_t entry = 0;
    std::uint64_t offset = 0;

    bool isBlob() const { return kind == LogItem::Kind::Blob; }
    bool isTick() const { return kind == LogItem::Kind::Tick; }

    // An owning copy.
    LogItem toItem() const {
        LogItem item;
        item.kind = kind;
        item.bytes.assign(bytes.begin(), bytes.end());
        item.line = line;
        item.entry = entry;
        item.offset = offset;
        return item;
    }
};

}  // namespace velmar
