// SnapshotFile: replaying the blobs kept in a saved snapshot (.velmar).
//
// A snapshot is a property-list dictionary {"Timestamp", "Data", "Description"}; "Data" is an array of
// dictionaries. A history entry keeps under "DisplayState" (data) the raw blobs of one display interval,
// concatenated: each is a blob as core/platform/BasebandPacket.h frames it (an optional 2-byte channel prefix
// 0x81 xx, a type byte, and a DLF record whose first u16 is the record's length), so a blob is (prefix) + 1 +
// length bytes. Replaying re-feeds
// each blob exactly as the generator first received it (prefix included) and then a tick, once per entry.
// Entries without "DisplayState" data (such as the closing {"Description", "DLF"} entry) are skipped.
//
// Damaged raw data is not fatal: when a record length is below the DLF header or a blob runs past the end
// of the entry's data, that entry's splitting stops there, the blobs before it and the entry's tick are still
// produced, and the damage is counted in LogReadStats::badEntries, described in problems and logged as a
// warning ("snap.velmar: entry 3: offset 40: record length 5 is shorter than the 12-byte header"). Entries
// are numbered from 1 in the order of "Data". A file that is not a property list, or has no "Data" array, is
// an error.
#pragma once

#include <cstddef>
#include <string>

#include "core/platform/plist/PlistValue.h"
#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

// Streams the blobs and ticks of a snapshot already parsed into root; name is used in messages. Items carry
// their 1-based entry and their offset in that entry's data (a tick: the data's size).
bool scanSnapshotValue(const PlistValue& root, const std::string& name, const LogItemCallback& callback,
                       std::string& error, LogReadStats* stats = nullptr);
LogReadResult parseSnapshotValue(const PlistValue& root, const std::string& name);

class LogByteStream;

// The largest snapshot file read: a property list is parsed whole, so its size is bounded instead.
inline constexpr std::size_t kMaxSnapshotBytes = 32 * 1024 * 1024;

// Reads the property list through stream (at most kMaxSnapshotBytes, else an error: "big.velmar: larger
// than 32 MiB, more than a snapshot holds"), then streams its items as scanSnapshotValue does.
bool scanSnapshotStream(LogByteStream& stream, const std::string& name, const LogItemCallback& callback,
                        std::string& error, LogReadStats* stats = nullptr);

bool forEachSnapshotItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                         LogReadStats* stats = nullptr);
LogReadResult readSnapshotFile(const std::string& path);

}  // namespace velmar
