// parsePropertyList (choosing the reader by the document's first bytes) and readDictionaryFile.
#include <cstring>
#include <optional>
#include <span>
#include <string>

#include "core/platform/WholeFile.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

namespace plist_detail {
// The two readers, defined in PlistXmlReader.cpp and PlistBinaryReader.cpp.
std::optional<PlistValue> parseXmlPropertyList(std::span<const std::uint8_t> bytes, std::string* error);
std::optional<PlistValue> parseBinaryPropertyList(std::span<const std::uint8_t> bytes, std::string* error);
}  // namespace plist_detail

namespace {

constexpr char kBinaryMagic[] = "bplist00";
constexpr std::size_t kBinaryMagicSize = sizeof kBinaryMagic - 1;

}  // namespace

std::optional<PlistValue> parsePropertyList(std::span<const std::uint8_t> bytes, std::string* error) {
    if (bytes.size() >= kBinaryMagicSize && std::memcmp(bytes.data(), kBinaryMagic, kBinaryMagicSize) == 0) {
        return plist_detail::parseBinaryPropertyList(bytes, error);
    }
    return plist_detail::parseXmlPropertyList(bytes, error);
}

std::optional<PlistValue> readDictionaryFile(const std::string& path, std::string* error) {
    PlistData contents;
    if (const FileOutcome read = readWholeFile(path, contents); !read.ok()) {
        if (error != nullptr) {
            *error = path + ": " + read.reason();
        }
        return std::nullopt;
    }
    std::string problem;
    auto value = parsePropertyList(contents, &problem);
    if (!value) {
        if (error != nullptr) {
            *error = path + ": " + problem;
        }
        return std::nullopt;
    }
    if (!value->isDictionary()) {
        if (error != nullptr) {
            *error = path + ": the root is " + std::string(value->typeName()) + ", not a dictionary";
        }
        return std::nullopt;
    }
    return value;
}

}  // namespace velmar
