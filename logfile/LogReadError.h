// LogReadError: how every log-file reader reports its outcome.
//
// Each reader comes in two forms built on the same code:
// - a streaming form, forEach...Item(path, callback, error, stats): the callback sees each item as it is
//   found (the bytes valid only during the call; return false from the callback to stop early, which is not
//   an error). It answers true when the whole input was read, or false with a one-line message in error.
//   Large captures are never held twice this way.
// - a collecting form, read...(path): a LogReadResult holding either every item or, when the input is
//   unusable, no items and the message.
// Messages name the file and the place: "capture.hex:12: invalid hex digit 'g'" for line-based input,
// "trace.dlf: offset 4096: record length 3 is shorter than the 12-byte header" for binary input.
// Damage that a reader can step over (a frame with a bad checksum in a capture, a broken snapshot entry) is
// not fatal: it is counted in LogReadStats, its first few messages are kept there, and it is logged as a
// warning to the system log.
#pragma once

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <functional>
#include <limits>
#include <string>
#include <vector>

#include <sys/stat.h>

#include "logfile/LogItem.h"

namespace velmar {

// How many damaged parts a reader describes in LogReadStats::problems (all of them are counted).
inline constexpr std::size_t kMaxReportedProblems = 8;

// What a reader saw besides the items it produced. Each reader fills the counters that apply to its format
// and leaves the others at zero.
struct LogReadStats {
    std::uint64_t blobs = 0;  // blob items produced
    std::uint64_t ticks = 0;  // tick items produced

    // Diagnostic-port captures. Every non-empty frame counts once in frames and then in exactly one of
    // logPackets, otherFrames and badFrames; wrappedFrames counts the frames that arrived inside a wrapper.
    std::uint64_t frames = 0;
    std::uint64_t logPackets = 0;
    std::uint64_t otherFrames = 0;
    std::uint64_t badFrames = 0;
    std::uint64_t wrappedFrames = 0;
    // File offsets where the first kMaxReportedProblems bad frames start.
    std::vector<std::uint64_t> badFrameOffsets;

    // Snapshots: history entries holding raw data, and those whose splitting stopped at damaged data.
    std::uint64_t entries = 0;
    std::uint64_t badEntries = 0;

    // Messages for the first kMaxReportedProblems damaged parts that were skipped.
    std::vector<std::string> problems;

    void addProblem(std::string message) {
        if (problems.size() < kMaxReportedProblems) {
            problems.push_back(std::move(message));
        }
    }
};

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

// Reads a file, or at most maxBytes of its beginning, into bytes. On failure answers false with
// "path: cannot open: reason" or "path: cannot read: reason" in error.
inline bool readFileBytes(const std::string& path, PlistData& bytes, std::string& error,
                          std::size_t maxBytes = std::numeric_limits<std::size_t>::max()) {
    bytes.clear();
    std::FILE* file = std::fopen(path.c_str(), "rb");
    if (file == nullptr) {
        error = path + ": cannot open: " + std::strerror(errno);
        return false;
    }
    // The size of a regular file is only a hint (pipes have none); reading continues until the end anyway.
    std::size_t chunk = 64 * 1024;
    struct stat info {};
    if (fstat(fileno(file), &info) == 0) {
        if (S_ISDIR(info.st_mode)) {
            std::fclose(file);
            error = path + ": cannot read: " + std::strerror(EISDIR);
            return false;
        }
        if (S_ISREG(info.st_mode) && info.st_size > 0) {
            chunk = std::min(static_cast<std::size_t>(info.st_size) + 1, maxBytes);
        }
    }
    bool failed = false;
    while (bytes.size() < maxBytes) {
        const std::size_t used = bytes.size();
        const std::size_t want = std::min(std::max<std::size_t>(chunk, 1), maxBytes - used);
        bytes.resize(used + want);
        const std::size_t got = std::fread(bytes.data() + used, 1, want, file);
        bytes.resize(used + got);
        if (got < want) {
            failed = std::ferror(file) != 0;
            break;
        }
        chunk = 64 * 1024;
    }
    const int readErrno = errno;
    std::fclose(file);
    if (failed) {
        bytes.clear();
        error = path + ": cannot read: " + std::strerror(readErrno);
        return false;
    }
    return true;
}

}  // namespace velmar
