// HexBlobFile: blobs written as text, one per line, for hand-made test input and for tools.
//
// Format: each line holds the hex digits of one blob; spaces and tabs may separate digits and bytes, and a
// line must hold an even number of digits. '#' starts a comment that runs to the end of the line. Blank
// lines (after comments are removed) are skipped. A line holding only "tick" is a tick item. Lines may end
// with CR LF; a leading UTF-8 byte-order mark is ignored. Any other character is an error naming the line:
// "capture.hex:12: invalid hex digit 'g'".
#pragma once

#include <span>
#include <string>
#include <string_view>

#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

class LogByteStream;

// Streams the items of hex text read through stream, a line at a time; a line longer than the stream's
// window is an error ("big.hex:1: line longer than 1048576 bytes"). name is the file name used in messages.
bool scanHexBlobStream(LogByteStream& stream, const std::string& name, const LogItemCallback& callback,
                       std::string& error, LogReadStats* stats = nullptr);
// Streams the items of hex text in memory; name is the file name used in messages. Items carry their 1-based
// line and the byte offset where their line starts.
bool scanHexBlobText(std::string_view text, const std::string& name, const LogItemCallback& callback,
                     std::string& error, LogReadStats* stats = nullptr);
LogReadResult parseHexBlobText(std::string_view text, const std::string& name);

bool forEachHexBlobItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                        LogReadStats* stats = nullptr);
LogReadResult readHexBlobFile(const std::string& path);

// The text form of items: a "# " line per line of comment (when given), then one line per item, each blob as
// lowercase hex bytes separated by spaces, each tick as "tick". Reading the text gives the items back.
std::string formatHexBlobText(std::span<const LogItem> items, std::string_view comment = {});
// Writes formatHexBlobText(items, comment) to path, replacing the file; false with a message on failure.
bool writeHexBlobFile(const std::string& path, std::span<const LogItem> items, std::string& error,
                      std::string_view comment = {});

}  // namespace velmar
