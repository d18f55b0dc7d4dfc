#include "logfile/DlfFile.h"

#include <cstring>

#include "core/platform/BasebandPacket.h"
#include "core/platform/RecordReader.h"
#include "core/platform/RecordWriter.h"
#include "core/platform/WholeFile.h"

namespace velmar {

bool scanDlfBytes(std::span<const std::uint8_t> bytes, const std::string& name,
                  const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
    PlistData blob;
    blob.reserve(1 + kDlfMaxRecordSize);
    std::size_t offset = 0;
    while (offset < bytes.size()) {
        const std::size_t left = bytes.size() - offset;
        const auto where = [&] { return name + ": offset " + std::to_string(offset) + ": "; };
        if (left < 2) {
            error = where() + "1 trailing byte is too short for a record length";
            return false;
        }
        const std::size_t length = RecordReader(bytes).u16(offset);
        if (length < kDlfHeaderSize) {
            error = where() + "record length " + std::to_string(length) + " is shorter than the " +
                    std::to_string(kDlfHeaderSize) + "-byte header";
            return false;
        }
        if (length > left) {
            error = where() + "record length " + std::to_string(length) + " runs past the end of the file (" +
                    std::to_string(left) + " bytes left)";
            return false;
        }
        blob.assign(1, kPlainLogType);
        blob.insert(blob.end(), bytes.begin() + static_cast<std::ptrdiff_t>(offset),
                    bytes.begin() + static_cast<std::ptrdiff_t>(offset + length));
        LogItemView item;
        item.bytes = blob;
        item.offset = offset;
        if (stats != nullptr) {
            ++stats->blobs;
        }
        offset += length;
        if (!callback(item)) {
            return true;
        }
    }
    return true;
}

LogReadResult parseDlfBytes(std::span<const std::uint8_t> bytes, const std::string& name) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return scanDlfBytes(bytes, name, callback, error, stats);
    });
}

bool forEachDlfItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                    LogReadStats* stats) {
    PlistData bytes;
    if (const FileOutcome read = readWholeFile(path, bytes); !read.ok()) {
        error = read.message(path);
        return false;
    }
    return scanDlfBytes(bytes, path, callback, error, stats);
}

LogReadResult readDlfFile(const std::string& path) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return forEachDlfItem(path, callback, error, stats);
    });
}

bool appendDlfRecord(PlistData& out, std::uint16_t code, std::uint64_t timestamp,
                     std::span<const std::uint8_t> payload) {
    if (payload.size() > kDlfMaxRecordSize - kDlfHeaderSize) {
        return false;
    }
    const std::size_t length = kDlfHeaderSize + payload.size();
    out.reserve(out.size() + length);
    RecordWriter(out).appendLE(2, length).appendLE(2, code).appendLE(8, timestamp).append(payload);
    return true;
}

bool appendToDlfFile(const std::string& path, std::span<const std::uint8_t> records, std::string& error) {
    if (const FileOutcome written = writeWholeFile(path, records, FileWrite::Append); !written.ok()) {
        error = written.message(path);
        return false;
    }
    return true;
}

}  // namespace velmar
