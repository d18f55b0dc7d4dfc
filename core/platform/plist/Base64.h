// Base64: the standard alphabet (A-Z a-z 0-9 + /) with '=' padding, as property lists carry binary data.
//
// Contract: appendBase64 writes the encoding of bytes on one line, padded to a multiple of four characters.
// decodeBase64 ignores white space (space, tab, CR, LF) anywhere in the text; it fails (nullopt) on any other
// character outside the alphabet, on a length that is not a multiple of four, and on padding anywhere but
// the last one or two places. Bits left over in the final character are ignored.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace velmar {

void appendBase64(std::string& out, std::span<const std::uint8_t> bytes);
std::optional<std::vector<std::uint8_t>> decodeBase64(std::string_view text);

}  // namespace velmar
