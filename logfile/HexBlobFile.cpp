#include "logfile/HexBlobFile.h"

#include <cstdio>
#include <cstring>

#include "core/platform/WholeFile.h"

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

bool scanHexBlobText(std::string_view text, const std::string& name, const LogItemCallback& callback,
                     std::string& error, LogReadStats* stats) {
    LogReadStats ignored;
    LogReadStats& counts = stats != nullptr ? *stats : ignored;
    std::size_t start = 0;
    if (text.starts_with("\xEF\xBB\xBF")) {
        start = 3;
    }
    PlistData blob;
    std::size_t lineNumber = 0;
    while (start < text.size()) {
        ++lineNumber;
        std::size_t end = text.find('\n', start);
        if (end == std::string_view::npos) {
            end = text.size();
        }
        std::string_view line = text.substr(start, end - start);
        const std::uint64_t lineOffset = start;
        start = end + 1;

        if (const std::size_t hash = line.find('#'); hash != std::string_view::npos) {
            line = line.substr(0, hash);
        }
        line = trimmed(line);
        if (line.empty()) {
            continue;
        }
        LogItemView item;
        item.line = lineNumber;
        item.offset = lineOffset;
        if (line == "tick") {
            item.kind = LogItem::Kind::Tick;
            ++counts.ticks;
            if (!callback(item)) {
                return true;
            }
            continue;
        }

        blob.clear();
        blob.reserve(line.size() / 2);
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
        if (!callback(item)) {
            return true;
        }
    }
    return true;
}

LogReadResult parseHexBlobText(std::string_view text, const std::string& name) {
    return collectLogItems([&](const LogItemCallback& callback, std::string& error, LogReadStats* stats) {
        return scanHexBlobText(text, name, callback, error, stats);
    });
}

bool forEachHexBlobItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                        LogReadStats* stats) {
    PlistData bytes;
    if (const FileOutcome read = readWholeFile(path, bytes); !read.ok()) {
        error = read.message(path);
        return false;
    }
    const std::string_view text(reinterpret_cast<const char*>(bytes.data()), bytes.size());
    return scanHexBlobText(text, path, callback, error, stats);
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
