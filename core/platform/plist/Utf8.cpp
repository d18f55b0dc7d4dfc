#include "core/platform/plist/Utf8.h"

#include <cstdint>
#include <cstring>

namespace velmar {

namespace {

bool isContinuation(unsigned char byte) {
    return (byte & 0xC0U) == 0x80U;
}

// True when none of the eight bytes at p has its top bit set.
bool eightAscii(const char* p) {
    std::uint64_t word;
    std::memcpy(&word, p, sizeof word);
    return (word & 0x8080808080808080ULL) == 0;
}

}  // namespace

std::optional<char32_t> decodeUtf8(std::string_view text, std::size_t& position) {
    const std::size_t left = text.size() - position;
    const auto* p = reinterpret_cast<const unsigned char*>(text.data() + position);
    const unsigned char lead = p[0];
    if (lead < 0x80U) {
        position += 1;
        return lead;
    }
    // Lead bytes 0x80..0xC1 are continuations or would start an overlong two-byte form; 0xF5.. are beyond
    // U+10FFFF.
    if (lead < 0xC2U || lead > 0xF4U) {
        return std::nullopt;
    }
    if (lead < 0xE0U) {
        if (left < 2 || !isContinuation(p[1])) {
            return std::nullopt;
        }
        position += 2;
        return static_cast<char32_t>(((lead & 0x1FU) << 6) | (p[1] & 0x3FU));
    }
    if (lead < 0xF0U) {
        if (left < 3 || !isContinuation(p[1]) || !isContinuation(p[2])) {
            return std::nullopt;
        }
        const char32_t cp = ((lead & 0x0FU) << 12) | ((p[1] & 0x3FU) << 6) | (p[2] & 0x3FU);
        if (cp < 0x800U || (cp >= 0xD800U && cp <= 0xDFFFU)) {
            return std::nullopt;
        }
        position += 3;
        return cp;
    }
    if (left < 4 || !isContinuation(p[1]) || !isContinuation(p[2]) || !isContinuation(p[3])) {
        return std::nullopt;
    }
    const char32_t cp =
        ((lead & 0x07U) << 18) | ((p[1] & 0x3FU) << 12) | ((p[2] & 0x3FU) << 6) | (p[3] & 0x3FU);
    if (cp < 0x10000U || cp > 0x10FFFFU) {
        return std::nullopt;
    }
    position += 4;
    return cp;
}

bool isValidUtf8(std::string_view text) {
    std::size_t at = 0;
    const std::size_t size = text.size();
    while (at < size) {
        // Most text the monitor handles is ASCII: skip it a word at a time.
        while (at + 8 <= size && eightAscii(text.data() + at)) {
            at += 8;
        }
        if (at >= size) {
            break;
        }
        if (static_cast<unsigned char>(text[at]) < 0x80U) {
            ++at;
            continue;
        }
        if (!decodeUtf8(text, at)) {
            return false;
        }
    }
    return true;
}

bool appendUtf8(std::string& out, char32_t cp) {
    if (cp < 0x80U) {
        out.push_back(static_cast<char>(cp));
    } else if (cp < 0x800U) {
        const char bytes[2] = {static_cast<char>(0xC0U | (cp >> 6)), static_cast<char>(0x80U | (cp & 0x3FU))};
        out.append(bytes, 2);
    } else if (cp < 0x10000U) {
        if (cp >= 0xD800U && cp <= 0xDFFFU) {
            return false;
        }
        const char bytes[3] = {static_cast<char>(0xE0U | (cp >> 12)),
                               static_cast<char>(0x80U | ((cp >> 6) & 0x3FU)),
                               static_cast<char>(0x80U | (cp & 0x3FU))};
        out.append(bytes, 3);
    } else if (cp <= 0x10FFFFU) {
        const char bytes[4] = {
            static_cast<char>(0xF0U | (cp >> 18)), static_cast<char>(0x80U | ((cp >> 12) & 0x3FU)),
            static_cast<char>(0x80U | ((cp >> 6) & 0x3FU)), static_cast<char>(0x80U | (cp & 0x3FU))};
        out.append(bytes, 4);
    } else {
        return false;
    }
    return true;
}

}  // namespace velmar
