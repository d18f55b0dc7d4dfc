// LogFormat: which reader a recorded file needs, and one entry point that reads any of them.
//
// Detection for "auto": the extension decides when it is known (.hex, .dlf, .qmdl, .velmar, in any letter
// case). Otherwise the first bytes do: a property list ("<?xml", "<plist" or "bplist00", after optional
// whitespace and byte-order mark) is a snapshot; text whose first non-blank characters are a hex digit, '#'
// or "tick" is a hex blob file; a stream in which one of the first 0x7E-terminated frames carries a valid
// CRC-16/X.25 is a diagnostic-port capture; anything else is read as DLF records.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

enum class LogFormat : std::uint8_t { Auto, Hex, Dlf, DiagCapture, Snapshot };

// How many leading bytes content detection looks at.
inline constexpr std::size_t kLogFormatProbeSize = 4096;

// The command-line names: "auto", "hex", "dlf", "qmdl", "velmar".
std::string_view logFormatName(LogFormat format);
std::optional<LogFormat> parseLogFormatName(std::string_view name);

// The format that path's extension names, or nullopt when the extension says nothing.
std::optional<LogFormat> logFormatForExtension(std::string_view path);
// The format that the first bytes of a file suggest (never Auto).
LogFormat logFormatForContent(std::span<const std::uint8_t> head);
// The extension's format, else the content's; nullopt with a message when the file cannot be read.
std::optional<LogFormat> detectLogFormat(const std::string& path, std::string& error);

class LogByteStream;

// Reads path with the reader of format (detected first when Auto); see LogReadResult.h for the two forms.
// The file is read once, through a LogByteStream: memory stays bounded whatever its size, and a pipe or FIFO
// is read as it comes.
bool forEachLogItem(const std::string& path, LogFormat format, const LogItemCallback& callback,
                    std::string& error, LogReadStats* stats = nullptr);
LogReadResult readLogFile(const std::string& path, LogFormat format = LogFormat::Auto);
// The same for any stream; name stands for the input in messages and its extension counts for Auto.
bool forEachLogItemInStream(LogByteStream& stream, const std::string& name, LogFormat format,
                            const LogItemCallback& callback, std::string& error,
                            LogReadStats* stats = nullptr);
// The same for bytes already in memory (a pipe read to its end); name stands for the file in messages and its
// extension counts for Auto.
bool forEachLogItemInBytes(std::span<const std::uint8_t> bytes, const std::string& name, LogFormat format,
                           const LogItemCallback& callback, std::string& error,
                           LogReadStats* stats = nullptr);

}  // namespace velmar
