// DlfFile: files of consecutive DLF records, the monitor's own export format.
//
// A record is [length u16 LE][code u16 LE][timestamp 8 bytes][payload], the length counting the whole
// record. Reading yields one blob per record: the plain log type byte (kPlainLogType, BasebandPacket.h)
// followed by the record, which is what a log-code generator receives live. A length below the 12-byte
// header, a record running past the end of the file, or stray bytes too few for a length are errors naming
// the byte offset of the record: "trace.dlf: offset 4096: record length 3 is shorter than the 12-byte
// header".
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>

#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

// The DLF record header: length, code, timestamp.
inline constexpr std::size_t kDlfHeaderSize = 12;
inline constexpr std::size_t kDlfMaxRecordSize = 0xFFFF;

class LogByteStream;

// Streams the records read through stream as blobs (offset: where the record starts); name is used in
// messages. A record never needs more than kDlfMaxRecordSize bytes of the stream's window.
bool scanDlfStream(LogByteStream& stream, const std::string& name, const LogItemCallback& callback,
                   std::string& error, LogReadStats* stats = nullptr);
// The same for records held in memory (offset: where the record starts); name is used in messages.
bool scanDlfBytes(std::span<const std::uint8_t> bytes, const std::string& name,
                  const LogItemCallback& callback, std::string& error, LogReadStats* stats = nullptr);
LogReadResult parseDlfBytes(std::span<const std::uint8_t> bytes, const std::string& name);

bool forEachDlfItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                    LogReadStats* stats = nullptr);
LogReadResult readDlfFile(const std::string& path);

// Appends the record [length][code][timestamp LE][payload] to out. False, leaving out unchanged, when the
// record would be longer than kDlfMaxRecordSize.
bool appendDlfRecord(PlistData& out, std::uint16_t code, std::uint64_t timestamp,
                     std::span<const std::uint8_t> payload);
// Appends records (bytes made by appendDlfRecord) to the file at path, creating it when missing.
bool appendToDlfFile(const std::string& path, std::span<const std::uint8_t> records, std::string& error);

}  // namespace velmar
