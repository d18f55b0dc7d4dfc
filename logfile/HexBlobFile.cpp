#include "logfile/HexBlobFile.h"

#include <cstdio>
#include <cstring>

#include "core/platform/WholeFile.h"
#include "logfile/LogByteStream.h"

namespace velmar {

namespace {

int hexValue(char c) {
    if (c >= '0' && c <= '9') {
        return c - '0';
    }
    if (c >= 'a' && c <= 'f') {
        return c - 'a' + 10;
    }
    if (c >= 'A' && c <= 'F') {
        return c - 'A' + 10;
    }
    return -1;
}

bool isBlank(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\v' || c == '\f';
}

// A character as a message shows it: 'g', or '\x01' when it is not printable.
std::string quoted(char c) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte >= 0x20 && byte < 0x7F) {
        return std::string("'") + c + "'";
    }
    char text[8];
    std::snprintf(text, sizeof text, "'\\x%02x'", byte);
    return text;
}

std::string_view trimmed(std::string_view text) {
    while (!text.empty() && isBlank(text.front())) {
        text.remove_prefix(1);
    }
    while (!text.empty() && isBlank(text.back())) {
        text.remove_suffix(1);
    }
    return text;
}

}  // namespace

bool scanHexBlobStream(LogByteStream& stream, const std::string& name, const LogItemCallback& callback,
                       std::string& error, LogReadStats* stats) {
    LogReadStats ignored;
    LogReadStats& counts = stats != nullptr ? *stats : ignored;
    if (!stream.fill(3, name, error)) {
        return false;
    }
    if (std::string_view(reinterpret_cast<const char*>(stream.available().data()), stream.available().size())
            .starts_with("\xEF\xBB\xBF")) {
        stream.consume(3);
    }
    PlistData blob;
    std::size_t lineNumber = 0;
    std::size_t searched = 0;  // bytes of the pending line already searched for its end
    while (true) {
        const std::span<const std::uint8_t> bytes = stream.available();
        const auto* newline = static_cast<const std::uint8_t*>(
            bytes.size() > searched ? std::memchr(bytes.data() + searched, '\n', bytes.size() - searched)
                                    : nullptr);
        if (newline == nullptr && !stream.ended()) {
            if (bytes.size() >= stream.capacity()) {
                error = name + ":" + std::to_string(lineNumber + 1) + ": line longer than " +
                        std::to_string(stream.capacity()) + " bytes";
                return false;
            }
            searched = bytes.size();
            if (!stream.fill(bytes.size() + 1, name, error)) {
                return false;
            }
            continue;
        }
        if (bytes.empty()) {
            return true;
        }
        searched = 0;
        const std::size_t length =
            newline != nullptr ? static_cast<std::size_t>(newline - bytes.data()) : bytes.size();
        std::string_view line(reinterpret_cast<const char*>(bytes.data()), length);
        const std::uint64_t lineOffset = stream.offset();
        ++lineNumber;

        if (const std::size_t hash = line.find('#'); hash != std::string_view::npos) {
            line = line.substr(0, hash);
        }
        line = trimmed(line);
        LogItemView item;
        item.line = lineNumber;
        item.offset = lineOffset;
        if (line == "tick") {
            item.kind = LogItem::Kind::Tick;
            ++counts.ticks;
        } else if (!line.empty()) {
            blob.clear();
            int high = -1;
            std::size_t digits = 0;
            for (const char c : line) {
                if (isBlank(c)) {
                    continue;
                }
                const int value = hexValue(c);
                if (value < 0) {
                    error = name + ":" + std::to_string(lineNumber) + ": invalid hex digit " + quoted(c);
                    return false;
                }
                ++digits;
                if (high < 0) {
                    high = value;
                } else {
                    blob.push_back(static_cast<std::uint8_t>(high << 4 | value));
                    high = -1;
                }
            }
            if (high >= 0) {
                error = name + ":" + std::to_string(lineNumber) + ": odd number of hex digits (" +
                        std::to_string(digits) + ")";
                return false;
            }
            item.bytes = blob;
            ++counts.blobs;
        }
        // The line's text is not needed past this point: the blob is a copy.
        stream.consume(length + (newline != nullptr ? 1 : 0));
        if (!line.empty() && !callback(item)) {
            return true;
        }
    }
}

bool scanHexBlobText(std::string_view text, const std::string& name, const LogItemCallback& callback,
                     std::string& error, LogReadStats* stats) {
    LogByteStream stream(std::span(reinterpret_cast<const std::uint8_t*>(text.data()), text.size()));
    return scanHexBlobStream(stream, name, callback, error, stats);
}

LogReadResult parseHexBlobText(std::string_view text, const std::string& name) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return scanHexBlobText(text, name, callback, error, stats);
    });
}

bool forEachHexBlobItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                        LogReadStats* stats) {
    LogByteStream stream;
    return stream.open(path, error) && scanHexBlobStream(stream, path, callback, error, stats);
}

LogReadResult readHexBlobFile(const std::string& path) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return forEachHexBlobItem(path, callback, error, stats);
    });
}

std::string formatHexBlobText(std::span<const LogItem> items, std::string_view comment) {
    static constexpr char kDigits[] = "0123456789abcdef";
    std::string text;
    while (!comment.empty()) {
        const std::size_t end = comment.find('\n');
        const std::string_view line = comment.substr(0, end);
        text += "# ";
        text += line;
        text += '\n';
        comment = end == std::string_view::npos ? std::string_view() : comment.substr(end + 1);
    }
    for (const LogItem& item : items) {
        if (item.isTick()) {
            text += "tick\n";
            continue;
        }
        for (std::size_t i = 0; i < item.bytes.size(); ++i) {
            if (i != 0) {
                text += ' ';
            }
            text += kDigits[item.bytes[i] >> 4];
            text += kDigits[item.bytes[i] & 0x0F];
        }
        text += '\n';
    }
    return text;
}

bool writeHexBlobFile(const std::string& path, std::span<const LogItem> items, std::string& error,
                      std::string_view comment) {
    const std::string text = formatHexBlobText(items, comment);
    const ByteView bytes(reinterpret_cast<const std::uint8_t*>(text.data()), text.size());
    if (const FileOutcome written = writeWholeFile(path, bytes); !written.ok()) {
        error = written.message(path);
        return false;
    }
    return true;
}

}  // namespace velmar
