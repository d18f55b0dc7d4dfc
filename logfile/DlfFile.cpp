#include "logfile/DlfFile.h"

#include <cstring>

#include "core/platform/BasebandPacket.h"
#include "core/platform/RecordReader.h"
#include "core/platform/RecordWriter.h"
#include "core/platform/WholeFile.h"
#include "logfile/LogByteStream.h"

namespace velmar {

bool scanDlfStream(LogByteStream& stream, const std::string& name, const LogItemCallback& callback,
                   std::string& error, LogReadStats* stats) {
    PlistData blob;
    blob.reserve(1 + kDlfMaxRecordSize);
    while (true) {
        if (!stream.fill(2, name, error)) {
            return false;
        }
        std::span<const std::uint8_t> bytes = stream.available();
        if (bytes.empty()) {
            return true;
        }
        const std::uint64_t offset = stream.offset();
        const auto where = [&] { return name + ": offset " + std::to_string(offset) + ": "; };
        if (bytes.size() < 2) {
            error = where() + "1 trailing byte is too short for a record length";
            return false;
        }
        const std::size_t length = RecordReader(bytes).u16(0);
        if (length < kDlfHeaderSize) {
            error = where() + "record length " + std::to_string(length) + " is shorter than the " +
                    std::to_string(kDlfHeaderSize) + "-byte header";
            return false;
        }
        if (!stream.fill(length, name, error)) {
            return false;
        }
        bytes = stream.available();
        if (length > bytes.size() && stream.ended()) {
            error = where() + "record length " + std::to_string(length) + " runs past the end of the file (" +
                    std::to_string(bytes.size()) + " bytes left)";
            return false;
        }
        if (length > bytes.size()) {
            error = where() + "record length " + std::to_string(length) + " is longer than the " +
                    std::to_string(stream.capacity()) + "-byte read window";
            return false;
        }
        blob.assign(1, kPlainLogType);
        blob.insert(blob.end(), bytes.begin(), bytes.begin() + static_cast<std::ptrdiff_t>(length));
        LogItemView item;
        item.bytes = blob;
        item.offset = offset;
        if (stats != nullptr) {
            ++stats->blobs;
        }
        stream.consume(length);
        if (!callback(item)) {
            return true;
        }
    }
}

bool scanDlfBytes(std::span<const std::uint8_t> bytes, const std::string& name,
                  const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
    LogByteStream stream(bytes);
    return scanDlfStream(stream, name, callback, error, stats);
}

LogReadResult parseDlfBytes(std::span<const std::uint8_t> bytes, const std::string& name) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return scanDlfBytes(bytes, name, callback, error, stats);
    });
}

bool forEachDlfItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                    LogReadStats* stats) {
    LogByteStream stream;
    return stream.open(path, error) && scanDlfStream(stream, path, callback, error, stats);
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
