// Fuzz target: the recorded-log readers, each through a small sliding window and over the bytes whole.
//
// Input: byte 0 picks the format (hex, DLF, raw capture, snapshot) and byte 1 the window's size (16 to
// 4096 bytes, so that records, lines and frames straddle its ends); the rest is the file. The file is read
// from a memory file through the window and from memory whole; the two must give the same items, or both
// fail. Nothing may crash, leak, read outside a buffer or hold more than the window.
#include <sys/mman.h>
#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "core/platform/SystemLog.h"
#include "logfile/DiagCapture.h"
#include "logfile/DlfFile.h"
#include "logfile/HexBlobFile.h"
#include "logfile/LogByteStream.h"
#include "logfile/LogFormat.h"
#include "logfile/SnapshotFile.h"

namespace velmar {
namespace {

using Scan = bool (*)(LogByteStream&, const std::string&, const LogItemCallback&, std::string&,
                      LogReadStats*);

struct Outcome {
    bool ok = false;
    std::vector<LogItem> items;
};

Outcome readWith(Scan scan, LogByteStream& stream) {
    Outcome outcome;
    std::string error;
    outcome.ok = scan(
        stream, "fuzz",
        [&outcome](const LogItemView& item) {
            outcome.items.push_back(item.toItem());
            return outcome.items.size() < 10000;
        },
        error, nullptr);
    return outcome;
}

}  // namespace
}  // namespace velmar

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace velmar;
    SystemLog::setSink([](int, const std::string&) {});
    if (size < 2) {
        return 0;
    }
    static const Scan kScans[] = {scanHexBlobStream, scanDlfStream, scanDiagCaptureStream,
                                  scanSnapshotStream};
    const Scan scan = kScans[data[0] % 4];
    const std::size_t capacity = 16 + (static_cast<std::size_t>(data[1]) * 16);
    const std::span<const std::uint8_t> file(data + 2, size - 2);

    const int fd = memfd_create("fuzz", MFD_CLOEXEC);
    if (fd < 0 || write(fd, file.data(), file.size()) != static_cast<ssize_t>(file.size())) {
        std::abort();
    }
    LogByteStream windowed(capacity);
    const FileOutcome opened = windowed.open("/proc/self/fd/" + std::to_string(fd));
    close(fd);
    if (!opened.ok()) {
        std::abort();
    }
    const Outcome slid = readWith(scan, windowed);
    LogByteStream whole(file);
    const Outcome once = readWith(scan, whole);
    // A unit that fits the window reads alike both ways; one that does not fails only through the window.
    if (slid.ok && (!once.ok || slid.items != once.items)) {
        std::abort();
    }
    if (!slid.ok && once.ok && slid.items.size() > once.items.size()) {
        std::abort();
    }
    return 0;
}
