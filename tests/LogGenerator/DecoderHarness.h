// DecoderHarness: the one harness of the record-decoder tests of every technology. A decoder is created as
// its class index creates it (Base::initWithDict, into dictionaries that the harness owns) and bound to a
// fresh section container that the test owns, so the test sees exactly what the decoder writes; a generator
// harness feeds packets through updateState as the model does and finds sections in the display tree. The
// readers turn what was written into plain strings for exact comparisons, and the packet helpers write
// packets by hand where the record builders of logfile/records/ would hide the byte being tested.
#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "LogGenerator/Base.h"
#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/ByteView.h"
#include "core/platform/logcodes/ExtraLogCodes.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::testing {

// ---- Reading what a decoder wrote ----

// The text under key, "<missing>" when absent, "<not a string>" for another kind of value.
inline std::string textOf(const PlistDictionary& dictionary, std::string_view key) {
    const PlistValue* value = dictionary.find(key);
    if (value == nullptr) {
        return "<missing>";
    }
    const std::string* text = value->string();
    return text ? *text : std::string("<not a string>");
}

// The keys of a display dictionary or of a class index's dictionary, in their order.
template <typename Map>
std::vector<std::string> keysOf(const Map& map) {
    std::vector<std::string> keys;
    for (const auto& entry : map) {
        keys.push_back(entry.first);
    }
    return keys;
}

using Entries = std::vector<std::pair<std::string, std::string>>;

// The key and text of every entry of a row, in order.
inline Entries entriesOf(const PlistDictionary& row) {
    Entries entries;
    for (const auto& [key, value] : row) {
        entries.emplace_back(key, value.string() ? *value.string() : "<not a string>");
    }
    return entries;
}

// The row dictionary at index of a list section.
inline const PlistDictionary& rowAt(const PlistArray& rows, std::size_t index) {
    return *rows.at(index).dictionary();
}

// Each row of an array of row dictionaries as "key=text" joined by ", ", for compact comparisons.
inline std::vector<std::string> rowTexts(const PlistValue& rows) {
    std::vector<std::string> result;
    if (!rows.isArray()) {
        result.push_back(std::string("<") + std::string(rows.typeName()) + ">");
        return result;
    }
    for (const PlistValue& row : *rows.array()) {
        std::string line;
        if (!row.isDictionary()) {
            line = "<not a dictionary>";
        } else {
            for (const auto& [key, text] : entriesOf(*row.dictionary())) {
                line += (line.empty() ? "" : ", ") + key + "=" + text;
            }
        }
        result.push_back(line);
    }
    return result;
}

// ---- Expected rows written as literals ----

using Row = std::vector<std::pair<std::string, std::string>>;

// A dictionary of string values, in the given key order.
inline PlistValue rowOf(const Row& keysAndValues) {
    auto row = PlistDictionary::create();
    for (const auto& [key, value] : keysAndValues) {
        row->set(key, value);
    }
    return row;
}

inline PlistValue rowsOf(std::initializer_list<Row> rows) {
    auto array = PlistArray::create();
    for (const Row& row : rows) {
        array->append(rowOf(row));
    }
    return array;
}

// ---- Packets ----

// The code that dispatch hands a packet's decoders: the 16-bit code at offsets 3..4, plus 0xFF0000 for an
// extended packet (log type 0xFF); -1 for a packet too short to hold a code.
inline std::int32_t codeOf(ByteView packet) {
    constexpr std::uint8_t kExtendedLogType = 0xFF;
    if (packet.size() < 5) {
        return -1;
    }
    const std::int32_t code = packet[3] | (packet[4] << 8);
    return packet[0] == kExtendedLogType ? code + kExtraCodeBase : code;
}

// Cuts a packet to length bytes (keeping its header as written).
inline PlistData cut(PlistData packet, std::size_t length) {
    packet.resize(length);
    return packet;
}

// A packet from its bytes written out in a test: the 13-byte header (type 1, length, code, zero timestamp),
// then the payload bytes from offset 13.
inline PlistData packetWithPayload(std::uint16_t code, std::initializer_list<std::uint8_t> payload) {
    PlistData packet(13 + payload.size(), 0);
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
inline PlistData zeroPacket(std::uint16_t code, std::size_t length) {
    PlistData packet(length, 0);
    packet[0] = 1;
    packet[3] = static_cast<std::uint8_t>(code & 0xFF);
    packet[4] = static_cast<std::uint8_t>(code >> 8);
    return packet;
}

// ---- One decoder bound to a section ----

template <typename Decoder, typename Section>
class SectionHarness {
  public:
    SectionHarness()
        : decoder(Base::initWithDict<Decoder>(classDict, codeDict)),
          section(Section::element_type::create()) {
        decoder->updateSectionRef(PlistValue(section));
    }
    // Feeds the packet under the code that dispatch would hand over, or under the code given.
    void feed(ByteView packet) { decoder->updateWithData(packet, codeOf(packet)); }
    void feed(ByteView packet, std::int32_t logCode) { decoder->updateWithData(packet, logCode); }

    ClassDictionary classDict;
    CodeDictionary codeDict;
    std::shared_ptr<Decoder> decoder;
    Section section;
};

// A decoder bound to a key section (a dictionary).
template <typename Decoder>
class KeySectionHarness : public SectionHarness<Decoder, PlistDictionaryRef> {
  public:
    std::string text(std::string_view key) const { return textOf(*this->section, key); }
    std::vector<std::string> keys() const { return keysOf(*this->section); }
};

// A decoder bound to a list section (an array).
template <typename Decoder>
class ListSectionHarness : public SectionHarness<Decoder, PlistArrayRef> {
  public:
    PlistValue rows() const { return PlistValue(this->section); }
    std::vector<std::string> rowTexts() const { return testing::rowTexts(rows()); }
    const PlistDictionary& row(std::size_t index) const { return rowAt(*this->section, index); }
    // Fills the list with one placeholder row, so that a test can see whether a record emptied it.
    void seed() { this->section->append(PlistValue(PlistDictionary::create())); }
};

// ---- A whole generator ----

// The value under name at any depth of a display tree, or none.
inline PlistValue findSection(const PlistValue& tree, const std::string& name) {
    if (const PlistDictionaryRef& dictionary = tree.dictionary()) {
        for (const auto& [key, value] : *dictionary) {
            if (key == name) {
                return value;
            }
            if (PlistValue found = findSection(value, name); !found.isNone()) {
                return found;
            }
        }
    }
    return PlistValue();
}

// A generator with a fresh state; packets go through updateState, as the model hands them over.
template <typename Generator>
struct GeneratorHarness {
    std::unique_ptr<Generator> generator = std::make_unique<Generator>();
    StateDict state = PlistDictionary::create();

    void feed(ByteView packet) { generator->updateState(state, packet); }
    PlistValue section(const std::string& name) const {
        return findSection(state->get(state_keys::kDisplay), name);
    }
    PlistDictionaryRef keySection(const std::string& name) const { return section(name).dictionary(); }
    PlistArrayRef listSection(const std::string& name) const { return section(name).array(); }
};

}  // namespace velmar::testing
