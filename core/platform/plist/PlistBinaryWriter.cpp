// serializeBinary: the "bplist00" encoding of a property list.
//
// Every value becomes its own object (nothing is shared, not even repeated keys), numbered in depth-first
// order with the root as object 0. Integers use the fewest bytes that hold them (1, 2 or 4 bytes unsigned,
// 8 bytes for larger and negative numbers), reals are 8-byte doubles, dates are doubles counted from
// 2001-01-01, strings are ASCII when they can be and UTF-16BE otherwise. Object references and offsets use
// the fewest bytes that hold the largest of them. Fails on a none value, on text that is not valid UTF-8 and
// on nesting deeper than kMaxPlistDepth (which also stops a tree that contains itself).
#include <bit>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/plist/PlistCodec.h"
#include "core/platform/plist/Utf8.h"

namespace velmar {

namespace {

constexpr double kDateOriginSince1970 = 978307200.0;

// Bytes needed for value as an unsigned number (at least 1).
std::size_t widthFor(std::uint64_t value) {
    std::size_t width = 1;
    while (width < 8 && (value >> (8 * width)) != 0) {
        ++width;
    }
    return width;
}

class BinaryWriter {
  public:
    std::optional<PlistData> write(const PlistValue& root) {
        std::size_t rootIndex = 0;
        if (!collect(root, 0, rootIndex)) {
            return std::nullopt;
        }
        refWidth_ = widthFor(nodes_.size() - 1);
        out_.reserve(64 + nodes_.size() * 8);
        const std::uint8_t magic[] = {'b', 'p', 'l', 'i', 's', 't', '0', '0'};
        out_.insert(out_.end(), magic, magic + sizeof magic);

        std::vector<std::uint64_t> offsets;
        offsets.reserve(nodes_.size());
        for (const Node& node : nodes_) {
            offsets.push_back(out_.size());
            if (!writeNode(node)) {
                return std::nullopt;
            }
        }
        const std::uint64_t tableOffset = out_.size();
        const std::size_t offsetWidth = widthFor(offsets.empty() ? 0 : offsets.back());
        for (const std::uint64_t offset : offsets) {
            putUnsigned(offset, offsetWidth);
        }
        // Trailer: six unused bytes, the two widths, then count, top object and table position.
        out_.insert(out_.end(), 6, 0);
        out_.push_back(static_cast<std::uint8_t>(offsetWidth));
        out_.push_back(static_cast<std::uint8_t>(refWidth_));
        putUnsigned(nodes_.size(), 8);
        putUnsigned(0, 8);
        putUnsigned(tableOffset, 8);
        return std::move(out_);
    }

  private:
    // One object to write: a value, or a dictionary key. Containers own refCount entries of refs_ from
    // firstRef on (a dictionary's keys, then its values).
    struct Node {
        const PlistValue* value;
        const std::string* key;
        std::size_t firstRef;
        std::size_t refCount;
    };

    bool collect(const PlistValue& value, std::size_t depth, std::size_t& index) {
        index = nodes_.size();
        if (value.isNone()) {
            return false;
        }
        nodes_.push_back(Node{&value, nullptr, 0, 0});
        if (const auto& array = value.array()) {
            if (depth + 1 > static_cast<std::size_t>(kMaxPlistDepth)) {
                return false;
            }
            const std::size_t first = refs_.size();
            refs_.resize(first + array->size());
            nodes_[index].firstRef = first;
            nodes_[index].refCount = array->size();
            std::size_t i = 0;
            for (const auto& item : *array) {
                std::size_t child = 0;
                if (!collect(item, depth + 1, child)) {
                    return false;
                }
                refs_[first + i++] = child;
            }
        } else if (const auto& dictionary = value.dictionary()) {
            if (depth + 1 > static_cast<std::size_t>(kMaxPlistDepth)) {
                return false;
            }
            const std::size_t count = dictionary->size();
            const std::size_t first = refs_.size();
            refs_.resize(first + 2 * count);
            nodes_[index].firstRef = first;
            nodes_[index].refCount = 2 * count;
            std::size_t i = 0;
            for (const auto& [key, item] : *dictionary) {
                refs_[first + i] = nodes_.size();
                nodes_.push_back(Node{nullptr, &key, 0, 0});
                std::size_t child = 0;
                if (!collect(item, depth + 1, child)) {
                    return false;
                }
                refs_[first + count + i] = child;
                ++i;
            }
        }
        return true;
    }

    void putUnsigned(std::uint64_t value, std::size_t width) {
        for (std::size_t i = width; i-- > 0;) {
            out_.push_back(static_cast<std::uint8_t>(value >> (8 * i)));
        }
    }

    void putInteger(std::int64_t value) {
        const auto bits = static_cast<std::uint64_t>(value);
        if (value < 0 || bits > 0xFFFFFFFFU) {
            out_.push_back(0x13);
            putUnsigned(bits, 8);
        } else if (bits > 0xFFFFU) {
            out_.push_back(0x12);
            putUnsigned(bits, 4);
        } else if (bits > 0xFFU) {
            out_.push_back(0x11);
            putUnsigned(bits, 2);
        } else {
            out_.push_back(0x10);
            putUnsigned(bits, 1);
        }
    }

    // A marker whose low nibble holds count, or 15 and an integer object when count does not fit there.
    void putMarker(std::uint8_t type, std::size_t count) {
        if (count < 15) {
            out_.push_back(static_cast<std::uint8_t>((type << 4) | count));
        } else {
            out_.push_back(static_cast<std::uint8_t>((type << 4) | 0x0F));
            putInteger(static_cast<std::int64_t>(count));
        }
    }

    void putDouble(std::uint8_t marker, double value) {
        out_.push_back(marker);
        putUnsigned(std::bit_cast<std::uint64_t>(value), 8);
    }

    bool putString(const std::string& text) {
        bool ascii = true;
        for (const char c : text) {
            if (static_cast<unsigned char>(c) >= 0x80) {
                ascii = false;
                break;
            }
        }
        if (ascii) {
            putMarker(0x5, text.size());
            out_.insert(out_.end(), text.begin(), text.end());
            return true;
        }
        units_.clear();
        std::size_t at = 0;
        while (at < text.size()) {
            const auto codePoint = decodeUtf8(text, at);
            if (!codePoint) {
                return false;
            }
            if (*codePoint >= 0x10000) {
                const char32_t offset = *codePoint - 0x10000;
                units_.push_back(static_cast<char16_t>(0xD800 + (offset >> 10)));
                units_.push_back(static_cast<char16_t>(0xDC00 + (offset & 0x3FF)));
            } else {
                units_.push_back(static_cast<char16_t>(*codePoint));
            }
        }
        putMarker(0x6, units_.size());
        for (const char16_t unit : units_) {
            putUnsigned(unit, 2);
        }
        return true;
    }

    bool writeNode(const Node& node) {
        if (node.key != nullptr) {
            return putString(*node.key);
        }
        const PlistValue& value = *node.value;
        switch (value.kind()) {
            case PlistValue::Kind::None:
                return false;
            case PlistValue::Kind::Dictionary:
            case PlistValue::Kind::Array:
                putMarker(value.isDictionary() ? 0xD : 0xA,
                          value.isDictionary() ? node.refCount / 2 : node.refCount);
                for (std::size_t i = 0; i < node.refCount; ++i) {
                    putUnsigned(refs_[node.firstRef + i], refWidth_);
                }
                return true;
            case PlistValue::Kind::String:
                return putString(*value.string());
            case PlistValue::Kind::Integer:
                putInteger(*value.integerValue());
                return true;
            case PlistValue::Kind::Real:
                putDouble(0x23, *value.realValue());
                return true;
            case PlistValue::Kind::Boolean:
                out_.push_back(*value.booleanValue() ? 0x09 : 0x08);
                return true;
            case PlistValue::Kind::Data: {
                const PlistData& bytes = *value.dataValue();
                putMarker(0x4, bytes.size());
                out_.insert(out_.end(), bytes.begin(), bytes.end());
                return true;
            }
            case PlistValue::Kind::Date:
                putDouble(0x33, value.dateValue()->secondsSince1970 - kDateOriginSince1970);
                return true;
        }
        return false;
    }

    std::vector<Node> nodes_;
    std::vector<std::size_t> refs_;
    std::vector<char16_t> units_;
    std::size_t refWidth_ = 1;
    PlistData out_;
};

}  // namespace

std::optional<PlistData> serializeBinary(const PlistValue& value) {
    BinaryWriter writer;
    return writer.write(value);
}

}  // namespace velmar
