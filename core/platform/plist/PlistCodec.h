// PlistCodec: the property-list encodings the monitor reads and writes.
//
// Contract:
// - serializeXml writes the XML encoding (version "1.0", tab indentation, the standard header and document
//   type; data as base64 lines of at most 76 characters; dates to the whole second). It fails (nullopt),
//   never producing a partial document, when the value is not a property list XML can carry: a none value
//   anywhere, a string or key that is not valid UTF-8 or holds a character XML cannot carry (control
//   characters other than tab, line feed and carriage return; U+FFFE, U+FFFF), a date outside the years
//   0000 to 9999, or nesting deeper than kMaxPlistDepth (which also stops a tree that contains itself).
// - writeXmlFile writes that encoding straight to the path (no temporary file, not atomic); false on failure.
// - parsePropertyList detects the encoding itself (XML, or binary "bplist00") and returns an immutable-by-
//   convention tree. It is safe on hostile input: no entity expansion, no external entities, nesting limited
//   to kMaxPlistDepth, integer overflow, bad base64, bad dates and invalid UTF-8 rejected. Any failure yields
//   nullopt and, when asked, a one-line reason (with the line or byte offset where known); never a partial
//   tree.
// - readDictionaryFile reads a property-list file whose root is a dictionary (templates, snapshots).
// - serializeBinary writes the binary encoding; the monitor itself only reads it, the tests and the object-
//   based simulated baseband write it.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

inline constexpr int kMaxPlistDepth = 512;

std::optional<PlistData> serializeXml(const PlistValue& value);
bool writeXmlFile(const PlistValue& dictionary, const std::string& path);

std::optional<PlistValue> parsePropertyList(std::span<const std::uint8_t> bytes,
                                            std::string* error = nullptr);
std::optional<PlistValue> readDictionaryFile(const std::string& path, std::string* error = nullptr);

std::optional<PlistData> serializeBinary(const PlistValue& value);

}  // namespace velmar
