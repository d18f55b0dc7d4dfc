// parsePropertyList (choosing the reader by the document's first bytes) and readDictionaryFile.
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <optional>
#include <span>
#include <string>

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

bool readFile(const std::string& path, PlistData& contents, std::string& problem) {
    std::FILE* file = std::fopen(path.c_str(), "rb");
    if (file == nullptr) {
        problem = std::strerror(errno);
        return false;
    }
    contents.clear();
    std::uint8_t chunk[65536];
    std::size_t got = 0;
    while ((got = std::fread(chunk, 1, sizeof chunk, file)) > 0) {
        contents.insert(contents.end(), chunk, chunk + got);
    }
    const bool failed = std::ferror(file) != 0;
    std::fclose(file);
    if (failed) {
        problem = "read error";
        return false;
    }
    return true;
}

}  // namespace

std::optional<PlistValue> parsePropertyList(std::span<const std::uint8_t> bytes, std::string* error) {
    if (bytes.size() >= kBinaryMagicSize && std::memcmp(bytes.data(), kBinaryMagic, kBinaryMagicSize) == 0) {
        return plist_detail::parseBinaryPropertyList(bytes, error);
    }
    return plist_detail::parseXmlPropertyList(bytes, error);
}

std::optional<PlistValue> readDictionaryFile(const std::string& path, std::string* error) {
    PlistData contents;
    std::string problem;
    if (!readFile(path, contents, problem)) {
        if (error != nullptr) {
            *error = path + ": " + problem;
        }
        return std::nullopt;
    }
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
