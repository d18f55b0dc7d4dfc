#include "logfile/DiagCapture.h"

#include "logfile/DiagStreamDeframer.h"
#include "logfile/LogByteStream.h"

namespace velmar {

bool scanDiagCaptureStream(LogByteStream& stream, const std::string& name, const LogItemCallback& callback,
                           std::string& error, LogReadStats* stats) {
    DiagStreamDeframer deframer(name, callback, stats);
    deframer.stopAtOverlongFrame();
    while (!deframer.stopped()) {
        if (!stream.fill(1, name, error)) {
            return false;
        }
        const std::span<const std::uint8_t> bytes = stream.available();
        if (bytes.empty()) {
            break;
        }
        deframer.feed(bytes);
        stream.consume(bytes.size());
    }
    if (const std::optional<std::uint64_t> at = deframer.overlongFrameAt()) {
        error = name + ": offset " + std::to_string(*at) + ": frame longer than " +
                std::to_string(kMaxDiagFrameBytes) + " bytes";
        return false;
    }
    deframer.finish();
    return true;
}

bool scanDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name,
                          const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
    LogByteStream stream(bytes);
    return scanDiagCaptureStream(stream, name, callback, error, stats);
}

LogReadResult parseDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return scanDiagCaptureBytes(bytes, name, callback, error, stats);
    });
}

bool forEachDiagCaptureItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                            LogReadStats* stats) {
    LogByteStream stream;
    return stream.open(path, error) && scanDiagCaptureStream(stream, path, callback, error, stats);
}

LogReadResult readDiagCapture(const std::string& path) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return forEachDiagCaptureItem(path, callback, error, stats);
    });
}

}  // namespace velmar
