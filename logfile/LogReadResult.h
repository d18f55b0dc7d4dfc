// LogReadResult: the two forms in which every log-file reader hands over what it read.
//
// Each reader comes in two forms built on the same code:
// - a streaming form, forEach...Item(path, callback, error, stats): the callback sees each item as it is
//   found (the bytes valid only during the call; return false from the callback to stop early, which is not
//   an error). It answers true when the whole input was read, or false with a one-line message in error.
//   Large captures are never held twice this way.
// - a collecting form, read...(path): a LogReadResult holding either every item or, when the input is
//   unusable, no items and the message.
// Messages name the file and the place: "capture.hex:12: invalid hex digit 'g'" for line-based input,
// "trace.dlf: offset 4096: record length 3 is shorter than the 12-byte header" for binary input. Damage that
// a reader steps over is counted in LogReadStats.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "logfile/LogItem.h"
#include "logfile/LogReadStats.h"

namespace velmar {

// Receives each item of a streaming reader; false stops the reader early.
using LogItemCallback = std::function<bool(const LogItemView&)>;

struct LogReadResult {
    std::vector<LogItem> items;
    std::string error;  // empty when the input was read
    LogReadStats stats;

    bool ok() const { return error.empty(); }
};

// Runs a streaming reader, called as reader(callback, error, stats), and keeps a copy of every item.
template <typename Reader>
LogReadResult collectLogItems(Reader&& reader) {
    LogReadResult result;
    const LogItemCallback keep = [&result](const LogItemView& item) {
        result.items.push_back(item.toItem());
        return true;
    };
    if (!reader(keep, result.error, &result.stats)) {
        result.items.clear();
        if (result.error.empty()) {
            result.error = "unreadable input";
        }
    }
    return result;
}

}  // namespace velmar
