// Utf8: checking, decoding and producing UTF-8 text.
//
// Contract: the rules are those of RFC 3629. A well-formed sequence encodes one Unicode scalar value in the
// fewest bytes possible; overlong forms, surrogates (U+D800..U+DFFF), values above U+10FFFF, stray
// continuation bytes and truncated sequences are all invalid. Nothing here allocates except appendUtf8.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace velmar {

// True when the whole of text is well-formed UTF-8 (the empty text is).
bool isValidUtf8(std::string_view text);

// Decodes the code point that starts at text[position] and moves position past it. On an ill-formed or
// truncated sequence answers nullopt and leaves position unchanged. position must be < text.size().
std::optional<char32_t> decodeUtf8(std::string_view text, std::size_t& position);

// Appends the UTF-8 form of a Unicode scalar value (not a surrogate, at most U+10FFFF). Answers false, and
// appends nothing, for any other value.
bool appendUtf8(std::string& out, char32_t codePoint);

}  // namespace velmar
