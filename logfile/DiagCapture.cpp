#include "logfile/DiagCapture.h"

#include <array>

#include "core/platform/WholeFile.h"
#include "logfile/DiagStreamDeframer.h"

namespace velmar {

namespace {

constexpr std::array<std::uint16_t, 256> makeCrcTable() {
    std::array<std::uint16_t, 256> table{};
    for (unsigned byte = 0; byte < 256; ++byte) {
        unsigned crc = byte;
        for (int bit = 0; bit < 8; ++bit) {
            crc = (crc & 1U) != 0 ? (crc >> 1) ^ 0x8408U : crc >> 1;
        }
        table[byte] = static_cast<std::uint16_t>(crc);
    }
    return table;
}

constexpr std::array<std::uint16_t, 256> kCrcTable = makeCrcTable();

}  // namespace

std::uint16_t crc16X25(std::span<const std::uint8_t> bytes) {
    unsigned crc = 0xFFFF;
    for (const std::uint8_t byte : bytes) {
        crc = (crc >> 8) ^ kCrcTable[(crc ^ byte) & 0xFFU];
    }
    return static_cast<std::uint16_t>(crc ^ 0xFFFFU);
}

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

void appendDiagFrame(PlistData& out, std::span<const std::uint8_t> frame) {
    const std::uint16_t crc = crc16X25(frame);
    const std::uint8_t trailer[2] = {static_cast<std::uint8_t>(crc & 0xFF),
                                     static_cast<std::uint8_t>(crc >> 8)};
    out.reserve(out.size() + frame.size() + 4);
    const auto put = [&out](std::uint8_t byte) {
        if (byte == kDiagFrameEnd || byte == kDiagEscape) {
            out.push_back(kDiagEscape);
            out.push_back(byte ^ kDiagEscapeXor);
        } else {
            out.push_back(byte);
        }
    };
    for (const std::uint8_t byte : frame) {
        put(byte);
    }
    put(trailer[0]);
    put(trailer[1]);
    out.push_back(kDiagFrameEnd);
}

}  // namespace velmar
