#include "logfile/DiagCapture.h"

#include <array>
#include <cinttypes>
#include <cstdio>
#include <cstring>

#include "core/platform/SystemLog.h"
#include "logfile/DlfFile.h"

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

std::uint16_t readLe16(const std::uint8_t* bytes) {
    return static_cast<std::uint16_t>(bytes[0] | static_cast<unsigned>(bytes[1]) << 8);
}

std::string hex16(unsigned value) {
    char text[8];
    std::snprintf(text, sizeof text, "0x%04X", value & 0xFFFFU);
    return text;
}

// Walks the frames of one capture, keeping the counters and handing out the log packets.
class FrameScanner {
  public:
    FrameScanner(const std::string& name, const LogItemCallback& callback, LogReadStats& stats)
        : name_(name), callback_(callback), stats_(stats) {}

    void scan(std::span<const std::uint8_t> bytes) {
        const std::uint8_t* const data = bytes.data();
        const std::size_t size = bytes.size();
        std::size_t position = 0;
        while (position < size && !stopped_) {
            const auto* terminator = static_cast<const std::uint8_t*>(
                std::memchr(data + position, kDiagFrameEnd, size - position));
            const std::size_t start = position;
            const std::size_t end =
                terminator != nullptr ? static_cast<std::size_t>(terminator - data) : size;
            position = end + 1;
            if (end == start) {
                continue;
            }
            ++stats_.frames;
            if (terminator == nullptr) {
                bad(start, "no 0x7E after the last " + std::to_string(end - start) + " bytes");
                break;
            }
            std::size_t length = 0;
            if (!unescape(data + start, end - start, length)) {
                bad(start, "escape byte 0x7D at the end of the frame");
                continue;
            }
            if (length < 3) {
                bad(start, std::to_string(length) + (length == 1 ? " byte is" : " bytes are") +
                               " too few for a frame");
                continue;
            }
            const std::uint16_t sent = readLe16(frame_.data() + length - 2);
            const std::uint16_t computed = crc16X25(std::span(frame_.data(), length - 2));
            if (sent != computed) {
                bad(start, "CRC " + hex16(sent) + " does not match the computed " + hex16(computed));
                continue;
            }
            handle(start, length - 2);
        }
        const std::uint64_t unreported =
            stats_.badFrames > kMaxReportedProblems ? stats_.badFrames - kMaxReportedProblems : 0;
        if (unreported > 0) {
            SystemLog::log(kLogWarning, "%s: %" PRIu64 " more bad frames skipped", name_.c_str(), unreported);
        }
    }

  private:
    // Copies the escaped bytes into frame_ without their escapes; false on an escape with nothing after it.
    bool unescape(const std::uint8_t* in, std::size_t size, std::size_t& length) {
        if (frame_.size() < size) {
            frame_.resize(size);
        }
        std::uint8_t* const out = frame_.data();
        std::size_t used = 0;
        std::size_t index = 0;
        while (index < size) {
            const auto* escape =
                static_cast<const std::uint8_t*>(std::memchr(in + index, kDiagEscape, size - index));
            const std::size_t stop = escape != nullptr ? static_cast<std::size_t>(escape - in) : size;
            std::memcpy(out + used, in + index, stop - index);
            used += stop - index;
            index = stop;
            if (index < size) {
                if (index + 1 == size) {
                    return false;
                }
                out[used++] = in[index + 1] ^ kDiagEscapeXor;
                index += 2;
            }
        }
        length = used;
        return true;
    }

    // Classifies the checked frame frame_[0, length), length >= 1, that starts at offset in the input. Every
    // unwrapping step leaves at least one byte, so the loop never looks past the frame.
    void handle(std::uint64_t offset, std::size_t length) {
        std::size_t first = 0;
        int depth = 0;
        while (frame_[first] == kDiagWrapper) {
            if (length - first < 2 || frame_[first + 1] != 0x01) {
                ++stats_.otherFrames;
                return;
            }
            if (depth == kMaxDiagWrapperDepth) {
                bad(offset,
                    "wrappers nested deeper than " + std::to_string(kMaxDiagWrapperDepth) + " levels");
                return;
            }
            if (length - first <= kDiagWrapperHeaderSize) {
                bad(offset, "wrapper of " + std::to_string(length - first) + " bytes holds no frame");
                return;
            }
            first += kDiagWrapperHeaderSize;
            ++depth;
        }
        if (depth > 0) {
            ++stats_.wrappedFrames;
        }
        const std::size_t size = length - first;
        std::uint8_t* const packet = frame_.data() + first;
        if (packet[0] != kDiagLogPacket) {
            ++stats_.otherFrames;
            return;
        }
        if (size < 6) {
            bad(offset, "log packet of " + std::to_string(size) + " bytes is too short for a record length");
            return;
        }
        const std::size_t recordLength = readLe16(packet + 4);
        if (recordLength < kDlfHeaderSize) {
            bad(offset, "record length " + std::to_string(recordLength) + " is shorter than the " +
                            std::to_string(kDlfHeaderSize) + "-byte header");
            return;
        }
        if (4 + recordLength > size) {
            bad(offset, "record length " + std::to_string(recordLength) + " runs past the end of the " +
                            std::to_string(size) + "-byte log packet");
            return;
        }
        ++stats_.logPackets;
        ++stats_.blobs;
        // The byte before the record becomes the blob's type byte, so the blob needs no copy.
        packet[3] = kLogTypeOrdinary;
        LogItemView item;
        item.bytes = std::span<const std::uint8_t>(packet + 3, 1 + recordLength);
        item.offset = offset;
        if (!callback_(item)) {
            stopped_ = true;
        }
    }

    void bad(std::uint64_t offset, const std::string& reason) {
        ++stats_.badFrames;
        if (stats_.badFrameOffsets.size() < kMaxReportedProblems) {
            stats_.badFrameOffsets.push_back(offset);
        }
        if (stats_.problems.size() < kMaxReportedProblems) {
            std::string message = name_ + ": offset " + std::to_string(offset) + ": bad frame: " + reason;
            SystemLog::log(kLogWarning, "%s", message.c_str());
            stats_.addProblem(std::move(message));
        }
    }

    const std::string& name_;
    const LogItemCallback& callback_;
    LogReadStats& stats_;
    PlistData frame_;
    bool stopped_ = false;
};

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
    LogReadStats ignored;
    FrameScanner scanner(name, callback, stats != nullptr ? *stats : ignored);
    scanner.scan(bytes);
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
    if (!readFileBytes(path, bytes, error)) {
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
