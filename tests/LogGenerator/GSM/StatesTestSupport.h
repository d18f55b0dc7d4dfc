// StatesTestSupport: drives one GSM/UMTS state decoder directly, without a class index or generator. The
// decoder is created with Base::initWithDict into dictionaries that the harness owns and bound to a section
// container that the test owns, so the test sees exactly what the decoder writes.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "LogGenerator/Base.h"
#include "core/platform/plist/PlistValue.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/RecordBuilder.h"

namespace velmar::testing {

// The code that dispatch hands a packet's decoders: the 16-bit code at offsets 3..4, plus 0xFF0000 for an
// extended packet (log type 0xFF).
inline std::int32_t codeOf(const PlistData& packet) {
    if (packet.size() < 5) {
        return -1;
    }
    const std::int32_t code = packet[3] | (packet[4] << 8);
    return packet[0] == kExtendedLogType ? (code | 0xFF0000) : code;
}

// Cuts a packet to length bytes (keeping its header as written).
inline PlistData cut(PlistData packet, std::size_t length) {
    packet.resize(length);
    return packet;
}

// A text value of a dictionary, or a marker that tells what is there instead.
inline std::string textAt(const PlistDictionary& dictionary, std::string_view key) {
    const PlistValue* value = dictionary.find(key);
    if (value == nullptr) {
        return "<missing>";
    }
    if (const std::string* text = value->string()) {
        return *text;
    }
    std::string marker(1, '<');
    marker.append(value->typeName()).push_back('>');
    return marker;
}

// The keys of a dictionary or of a class index's dictionary, in their order.
template <typename Map>
std::vector<std::string> keysOf(const Map& map) {
    std::vector<std::string> keys;
    for (const auto& entry : map.entries()) {
        keys.push_back(entry.first);
    }
    return keys;
}

// Each row of an array of row dictionaries as "key=value" texts joined by ", " (for compact comparisons).
inline std::vector<std::string> rowsOf(const PlistValue& rows) {
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
            for (const auto& [key, value] : row.dictionary()->entries()) {
                if (!line.empty()) {
                    line += ", ";
                }
                line += key + "=" + textAt(*row.dictionary(), key);
            }
        }
        result.push_back(line);
    }
    return result;
}

// The measurement record 0x5137 with its serving fields only (no neighbours).
inline PlistData servingMeasurement(std::uint8_t rxLevel, std::uint32_t c1, std::uint32_t c2,
                                    std::uint8_t reselectHysteresis) {
    GsmMeasurementRecord record;
    record.rxLevel = rxLevel;
    record.c1 = c1;
    record.c2 = c2;
    record.reselectHysteresis = reselectHysteresis;
    return buildGsmMeasurementRecord(record);
}

// One cell of a cell-monitor array, written with designated initializers in the tests; absent values are left
// out of the cell's dictionary.
struct Cell {
    std::optional<std::string> technology{};
    std::optional<std::string> cellType{};
    std::optional<std::int64_t> cellId{};
    std::optional<std::int64_t> uarfcn{};
    std::optional<std::int64_t> psc{};
    std::optional<std::int64_t> mcc{};
    std::optional<std::int64_t> mnc{};
    std::optional<std::int64_t> lac{};
};

// The extra record 0xFF0001 holding the cells.
inline PlistData cellMonitorRecord(const std::vector<Cell>& cells) {
    std::vector<CellMonitorEntry> entries;
    for (const Cell& cell : cells) {
        CellMonitorEntry entry;
        entry.technology = cell.technology;
        entry.cellType = cell.cellType;
        entry.cellId = cell.cellId;
        entry.uarfcn = cell.uarfcn;
        entry.psc = cell.psc;
        entry.mcc = cell.mcc;
        entry.mnc = cell.mnc;
        entry.lac = cell.lac;
        entries.push_back(entry);
    }
    return buildCellMonitorEntries(entries);
}

// One decoder bound to a key section (a dictionary) owned by the test.
template <typename Decoder>
class KeySectionHarness {
  public:
    KeySectionHarness()
        : decoder(Base::initWithDict<Decoder>(classDict, codeDict)), section(PlistDictionary::create()) {
        decoder->updateSectionRef(PlistValue(section));
    }
    void feed(const PlistData& packet) { decoder->updateWithData(packet, codeOf(packet)); }
    void feed(const PlistData& packet, std::int32_t logCode) { decoder->updateWithData(packet, logCode); }
    std::string text(std::string_view key) const { return textAt(*section, key); }
    std::vector<std::string> keys() const { return keysOf(*section); }

    ClassDictionary classDict;
    CodeDictionary codeDict;
    std::shared_ptr<Decoder> decoder;
    PlistDictionaryRef section;
};

// One decoder bound to a list section (an array) owned by the test.
template <typename Decoder>
class ListSectionHarness {
  public:
    ListSectionHarness()
        : decoder(Base::initWithDict<Decoder>(classDict, codeDict)), section(PlistArray::create()) {
        decoder->updateSectionRef(PlistValue(section));
    }
    void feed(const PlistData& packet) { decoder->updateWithData(packet, codeOf(packet)); }
    void feed(const PlistData& packet, std::int32_t logCode) { decoder->updateWithData(packet, logCode); }
    std::vector<std::string> rows() const { return rowsOf(PlistValue(section)); }

    ClassDictionary classDict;
    CodeDictionary codeDict;
    std::shared_ptr<Decoder> decoder;
    PlistArrayRef section;
};

}  // namespace velmar::testing
