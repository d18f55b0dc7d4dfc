// DecoderTestSupport: a record decoder bound to a fresh section container, as the display binds it, and small
// readers of what the decoder wrote, for the LTE and UTRAN decoder tests.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <string>
#include <vector>

#include "LogGenerator/Base.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::testing {

// The text under key, "<missing>" when absent, "<not a string>" for another kind.
inline std::string textOf(const PlistDictionary& dictionary, std::string_view key) {
    const PlistValue* value = dictionary.find(key);
    if (value == nullptr) {
        return "<missing>";
    }
    const std::string* text = value->string();
    return text ? *text : std::string("<not a string>");
}

inline std::vector<std::string> keysOf(const PlistDictionary& dictionary) {
    std::vector<std::string> keys;
    for (const auto& entry : dictionary) {
        keys.push_back(entry.first);
    }
    return keys;
}

// The row dictionary at index of a list section.
inline const PlistDictionary& rowAt(const PlistArray& rows, std::size_t index) {
    return *rows.at(index).dictionary();
}

template <typename Decoder>
struct BoundKeySection {
    std::shared_ptr<Decoder> decoder = std::make_shared<Decoder>();
    PlistDictionaryRef section = PlistDictionary::create();

    BoundKeySection() { decoder->updateSectionRef(PlistValue(section)); }
    void feed(const std::vector<std::uint8_t>& packet, std::int32_t code) {
        decoder->updateWithData(packet, code);
    }
    std::string text(std::string_view key) const { return textOf(*section, key); }
};

template <typename Decoder>
struct BoundListSection {
    std::shared_ptr<Decoder> decoder = std::make_shared<Decoder>();
    PlistArrayRef section = PlistArray::create();

    BoundListSection() { decoder->updateSectionRef(PlistValue(section)); }
    void feed(const std::vector<std::uint8_t>& packet, std::int32_t code) {
        decoder->updateWithData(packet, code);
    }
    const PlistDictionary& row(std::size_t index) const { return rowAt(*section, index); }
    // Fills the list with one placeholder row, so that a test can see whether a record emptied it.
    void seed() { section->append(PlistValue(PlistDictionary::create())); }
};

// A packet from its bytes written out in a test: the 13-byte header (type 1, length, code, zero timestamp),
// then the payload bytes from offset 13.
inline std::vector<std::uint8_t> packetWithPayload(std::uint16_t code,
                                                   std::initializer_list<std::uint8_t> payload) {
    std::vector<std::uint8_t> packet(13 + payload.size(), 0);
    packet[0] = 1;
    packet[3] = static_cast<std::uint8_t>(code & 0xFF);
    packet[4] = static_cast<std::uint8_t>(code >> 8);
    std::size_t at = 13;
    for (const std::uint8_t byte : payload) {
        packet[at++] = byte;
    }
    const std::size_t length = packet.size() - 1;
    packet[1] = static_cast<std::uint8_t>(length & 0xFF);
    packet[2] = static_cast<std::uint8_t>(length >> 8);
    return packet;
}

// A packet of `length` bytes with the given code, zero after the header, for length boundaries.
inline std::vector<std::uint8_t> zeroPacket(std::uint16_t code, std::size_t length) {
    std::vector<std::uint8_t> packet(length, 0);
    packet[0] = 1;
    packet[3] = static_cast<std::uint8_t>(code & 0xFF);
    packet[4] = static_cast<std::uint8_t>(code >> 8);
    return packet;
}

}  // namespace velmar::testing
