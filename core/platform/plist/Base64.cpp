#include "core/platform/plist/Base64.h"

#include <array>

namespace velmar {

namespace {

constexpr char kAlphabet[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

// Decoding table: the six-bit value of each alphabet character, or one of the markers below.
constexpr std::uint8_t kInvalid = 0xFF;
constexpr std::uint8_t kSpace = 0xFE;
constexpr std::uint8_t kPad = 0xFD;

constexpr std::array<std::uint8_t, 256> makeDecodeTable() {
    std::array<std::uint8_t, 256> table{};
    for (auto& entry : table) {
        entry = kInvalid;
    }
    for (std::uint8_t i = 0; i < 64; ++i) {
        table[static_cast<unsigned char>(kAlphabet[i])] = i;
    }
    table[' '] = kSpace;
    table['\t'] = kSpace;
    table['\r'] = kSpace;
    table['\n'] = kSpace;
    table['='] = kPad;
    return table;
}

constexpr std::array<std::uint8_t, 256> kDecode = makeDecodeTable();

}  // namespace

void appendBase64(std::string& out, std::span<const std::uint8_t> bytes) {
    const std::size_t start = out.size();
    out.resize(start + (bytes.size() + 2) / 3 * 4);
    char* p = out.data() + start;
    std::size_t i = 0;
    for (; i + 3 <= bytes.size(); i += 3) {
        const std::uint32_t triple = (std::uint32_t{bytes[i]} << 16) | (std::uint32_t{bytes[i + 1]} << 8) |
                                     std::uint32_t{bytes[i + 2]};
        *p++ = kAlphabet[(triple >> 18) & 0x3F];
        *p++ = kAlphabet[(triple >> 12) & 0x3F];
        *p++ = kAlphabet[(triple >> 6) & 0x3F];
        *p++ = kAlphabet[triple & 0x3F];
    }
    const std::size_t rest = bytes.size() - i;
    if (rest > 0) {
        std::uint32_t triple = std::uint32_t{bytes[i]} << 16;
        if (rest == 2) {
            triple |= std::uint32_t{bytes[i + 1]} << 8;
        }
        *p++ = kAlphabet[(triple >> 18) & 0x3F];
        *p++ = kAlphabet[(triple >> 12) & 0x3F];
        *p++ = rest == 2 ? kAlphabet[(triple >> 6) & 0x3F] : '=';
        *p++ = '=';
    }
}

std::optional<std::vector<std::uint8_t>> decodeBase64(std::string_view text) {
    std::vector<std::uint8_t> out;
    out.reserve(text.size() / 4 * 3);
    std::uint32_t quad = 0;  // the six-bit groups gathered so far
    int filled = 0;          // how many of the current four places are taken
    int padding = 0;         // '=' seen in the current group
    bool finished = false;   // a padded group ended the data
    for (const char c : text) {
        const std::uint8_t code = kDecode[static_cast<unsigned char>(c)];
        if (code == kSpace) {
            continue;
        }
        if (code == kInvalid || finished) {
            return std::nullopt;
        }
        if (code == kPad) {
            // Padding may only fill the third and fourth places of a group.
            if (filled < 2) {
                return std::nullopt;
            }
            ++padding;
            quad <<= 6;
        } else {
            if (padding > 0) {
                return std::nullopt;
            }
            quad = (quad << 6) | code;
        }
        if (++filled == 4) {
            out.push_back(static_cast<std::uint8_t>(quad >> 16));
            if (padding < 2) {
                out.push_back(static_cast<std::uint8_t>(quad >> 8));
            }
            if (padding < 1) {
                out.push_back(static_cast<std::uint8_t>(quad));
            }
            finished = padding > 0;
            quad = 0;
            filled = 0;
            padding = 0;
        }
    }
    if (filled != 0) {
        return std::nullopt;
    }
    return out;
}

}  // namespace velmar
