#include "logfile/DiagCapture.h"

#include "core/platform/WholeFile.h"
#include "logfile/DiagStreamDeframer.h"

namespace velmar {

bool scanDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name,
                          const LogItemCallback& callback, std::string& /*error*/, LogReadStats* stats) {
    DiagStreamDeframer deframer(name, callback, stats);
    deframer.feed(bytes);
    deframer.finish();
    return true;
}

LogReadResult parseDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return scanDiagCaptureBytes(bytes, name, callback, error, stats);
    });
}

bool forEachDiagCaptureItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                            LogReadStats* stats) {
    PlistData bytes;
    if (const FileOutcome read = readWholeFile(path, bytes); !read.ok()) {
        error = read.message(path);
        return false;
    }
    return scanDiagCaptureBytes(bytes, path, callback, error, stats);
}

LogReadResult readDiagCapture(const std::string& path) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return forEachDiagCaptureItem(path, callback, error, stats);
    });
}

}  // namespace velmar
