#include "logfile/LogFormat.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cstring>

#include "core/platform/RecordReader.h"
#include "logfile/DiagCapture.h"
#include "logfile/DlfFile.h"
#include "logfile/HexBlobFile.h"
#include "logfile/LogByteStream.h"
#include "logfile/SnapshotFile.h"

namespace velmar {

namespace {

struct FormatName {
    LogFormat format;
    std::string_view name;
    std::string_view extension;
};

constexpr std::array<FormatName, 5> kFormats = {{
    {LogFormat::Auto, "auto", ""},
    {LogFormat::Hex, "hex", ".hex"},
    {LogFormat::Dlf, "dlf", ".dlf"},
    {LogFormat::DiagCapture, "qmdl", ".qmdl"},
    {LogFormat::Snapshot, "velmar", ".velmar"},
}};

bool startsWith(std::span<const std::uint8_t> bytes, std::string_view prefix) {
    return bytes.size() >= prefix.size() && std::memcmp(bytes.data(), prefix.data(), prefix.size()) == 0;
}

bool isSpace(std::uint8_t byte) {
    return byte == ' ' || byte == '\t' || byte == '\r' || byte == '\n';
}

// Text as a hex blob file holds it: no control characters other than blanks and line ends.
bool looksLikeText(std::span<const std::uint8_t> bytes) {
    return std::all_of(bytes.begin(), bytes.end(), [](std::uint8_t byte) {
        return byte >= 0x20 ? byte != 0x7F : (isSpace(byte) || byte == '\v' || byte == '\f');
    });
}

// True when one of the first few 0x7E-terminated frames, unescaped, ends with its correct CRC.
bool looksLikeDiagCapture(std::span<const std::uint8_t> bytes) {
    constexpr int kFramesToTry = 8;
    PlistData frame;
    std::size_t start = 0;
    int tried = 0;
    for (std::size_t index = 0; index < bytes.size() && tried < kFramesToTry; ++index) {
        if (bytes[index] != kDiagFrameEnd) {
            continue;
        }
        frame.clear();
        bool dangling = false;
        for (std::size_t i = start; i < index; ++i) {
            if (bytes[i] != kDiagEscape) {
                frame.push_back(bytes[i]);
            } else if (i + 1 < index) {
                frame.push_back(bytes[++i] ^ kDiagEscapeXor);
            } else {
                dangling = true;
            }
        }
        start = index + 1;
        if (frame.empty()) {
            continue;
        }
        ++tried;
        if (!dangling && frame.size() >= 3) {
            const std::size_t body = frame.size() - 2;
            const unsigned sent = RecordReader(frame).u16(body);
            if (crc16X25(std::span(frame.data(), body)) == sent) {
                return true;
            }
        }
    }
    return false;
}

}  // namespace

std::string_view logFormatName(LogFormat format) {
    for (const FormatName& entry : kFormats) {
        if (entry.format == format) {
            return entry.name;
        }
    }
    return "unknown";
}

std::optional<LogFormat> parseLogFormatName(std::string_view name) {
    for (const FormatName& entry : kFormats) {
        if (entry.name == name) {
            return entry.format;
        }
    }
    return std::nullopt;
}

std::optional<LogFormat> logFormatForExtension(std::string_view path) {
    const std::size_t slash = path.find_last_of('/');
    const std::string_view file = slash == std::string_view::npos ? path : path.substr(slash + 1);
    const std::size_t dot = file.find_last_of('.');
    if (dot == std::string_view::npos || dot == 0) {
        return std::nullopt;
    }
    std::string extension(file.substr(dot));
    std::transform(extension.begin(), extension.end(), extension.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    for (const FormatName& entry : kFormats) {
        if (!entry.extension.empty() && entry.extension == extension) {
            return entry.format;
        }
    }
    return std::nullopt;
}

LogFormat logFormatForContent(std::span<const std::uint8_t> head) {
    if (startsWith(head, "bplist00")) {
        return LogFormat::Snapshot;
    }
    std::span<const std::uint8_t> text = head;
    if (startsWith(text, "\xEF\xBB\xBF")) {
        text = text.subspan(3);
    }
    while (!text.empty() && isSpace(text.front())) {
        text = text.subspan(1);
    }
    if (startsWith(text, "<?xml") || startsWith(text, "<plist") || startsWith(text, "<!DOCTYPE plist")) {
        return LogFormat::Snapshot;
    }
    if (!text.empty() && looksLikeText(head) &&
        (std::isxdigit(text.front()) != 0 || text.front() == '#' || startsWith(text, "tick"))) {
        return LogFormat::Hex;
    }
    if (looksLikeDiagCapture(head)) {
        return LogFormat::DiagCapture;
    }
    return LogFormat::Dlf;
}

std::optional<LogFormat> detectLogFormat(const std::string& path, std::string& error) {
    if (const std::optional<LogFormat> format = logFormatForExtension(path)) {
        return format;
    }
    LogByteStream stream(kLogFormatProbeSize);
    if (!stream.open(path, error) || !stream.fill(kLogFormatProbeSize, path, error)) {
        return std::nullopt;
    }
    return logFormatForContent(stream.available());
}

bool forEachLogItemInStream(LogByteStream& stream, const std::string& name, LogFormat format,
                            const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
    if (format == LogFormat::Auto) {
        if (const std::optional<LogFormat> named = logFormatForExtension(name)) {
            format = *named;
        } else {
            // Detection looks at the stream's first bytes, which the reader then reads again.
            if (!stream.fill(kLogFormatProbeSize, name, error)) {
                return false;
            }
            const std::span<const std::uint8_t> head = stream.available();
            format = logFormatForContent(head.first(std::min(head.size(), kLogFormatProbeSize)));
        }
    }
    switch (format) {
        case LogFormat::Hex:
            return scanHexBlobStream(stream, name, callback, error, stats);
        case LogFormat::Dlf:
            return scanDlfStream(stream, name, callback, error, stats);
        case LogFormat::DiagCapture:
            return scanDiagCaptureStream(stream, name, callback, error, stats);
        case LogFormat::Snapshot:
            return scanSnapshotStream(stream, name, callback, error, stats);
        case LogFormat::Auto:
            break;
    }
    error = name + ": no reader for this format";
    return false;
}

bool forEachLogItem(const std::string& path, LogFormat format, const LogItemCallback& callback,
                    std::string& error, LogReadStats* stats) {
    LogByteStream stream;
    if (const FileOutcome opened = stream.open(path); !opened.ok()) {
        // A snapshot names its failure as the property-list reader does: "snap.velmar: Is a directory".
        const bool snapshot =
            format == LogFormat::Snapshot ||
            (format == LogFormat::Auto && logFormatForExtension(path) == LogFormat::Snapshot);
        error = snapshot ? path + ": " + opened.reason() : opened.message(path);
        return false;
    }
    return forEachLogItemInStream(stream, path, format, callback, error, stats);
}

bool forEachLogItemInBytes(std::span<const std::uint8_t> bytes, const std::string& name, LogFormat format,
                           const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
    LogByteStream stream(bytes);
    return forEachLogItemInStream(stream, name, format, callback, error, stats);
}

LogReadResult readLogFile(const std::string& path, LogFormat format) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return forEachLogItem(path, format, callback, error, stats);
    });
}

}  // namespace velmar
