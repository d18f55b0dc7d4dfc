#include "logfile/DiagFraming.h"

#include <array>

namespace velmar {

namespace {

// Slice-by-8 tables: kCrcTables[k][b] is the CRC register change of byte b followed by k zero bytes, so that
// eight bytes fold in with eight independent lookups instead of a chain of eight dependent ones.
using CrcTables = std::array<std::array<std::uint16_t, 256>, 8>;

constexpr CrcTables makeCrcTables() {
    CrcTables tables{};
    for (unsigned byte = 0; byte < 256; ++byte) {
        unsigned crc = byte;
        for (int bit = 0; bit < 8; ++bit) {
            crc = (crc & 1U) != 0 ? (crc >> 1) ^ 0x8408U : crc >> 1;
        }
        tables[0][byte] = static_cast<std::uint16_t>(crc);
    }
    for (std::size_t k = 1; k < tables.size(); ++k) {
        for (unsigned byte = 0; byte < 256; ++byte) {
            const unsigned previous = tables[k - 1][byte];
            tables[k][byte] = static_cast<std::uint16_t>((previous >> 8) ^ tables[0][previous & 0xFFU]);
        }
    }
    return tables;
}

constexpr CrcTables kCrcTables = makeCrcTables();

}  // namespace

std::uint16_t crc16X25(std::span<const std::uint8_t> bytes) {
    unsigned crc = 0xFFFF;
    const std::uint8_t* data = bytes.data();
    std::size_t left = bytes.size();
    for (; left >= 8; left -= 8, data += 8) {
        const unsigned first = crc ^ (data[0] | static_cast<unsigned>(data[1]) << 8);
        crc = kCrcTables[7][first & 0xFFU] ^ kCrcTables[6][first >> 8] ^ kCrcTables[5][data[2]] ^
              kCrcTables[4][data[3]] ^ kCrcTables[3][data[4]] ^ kCrcTables[2][data[5]] ^
              kCrcTables[1][data[6]] ^ kCrcTables[0][data[7]];
    }
    for (; left > 0; --left, ++data) {
        crc = (crc >> 8) ^ kCrcTables[0][(crc ^ *data) & 0xFFU];
    }
    return static_cast<std::uint16_t>(crc ^ 0xFFFFU);
}

void appendDiagFrame(PlistData& out, std::span<const std::uint8_t> payload) {
    const std::uint16_t crc = crc16X25(payload);
    const std::uint8_t trailer[2] = {static_cast<std::uint8_t>(crc & 0xFF),
                                     static_cast<std::uint8_t>(crc >> 8)};
    out.reserve(out.size() + payload.size() + 4);
    const auto put = [&out](std::uint8_t byte) {
        if (byte == kDiagFrameEnd || byte == kDiagEscape) {
            out.push_back(kDiagEscape);
            out.push_back(byte ^ kDiagEscapeXor);
        } else {
            out.push_back(byte);
        }
    };
    for (const std::uint8_t byte : payload) {
        put(byte);
    }
    put(trailer[0]);
    put(trailer[1]);
    out.push_back(kDiagFrameEnd);
}

std::string DiagFrameContents::problemText() const {
    switch (problem) {
        case DiagFrameProblem::None:
            return {};
        case DiagFrameProblem::Empty:
            return "empty frame";
        case DiagFrameProblem::WrappersTooDeep:
            return "wrappers nested deeper than " + std::to_string(kMaxDiagWrapperDepth) + " levels";
        case DiagFrameProblem::EmptyWrapper:
            return "wrapper of " + std::to_string(size) + " bytes holds no frame";
        case DiagFrameProblem::ShortLogPacket:
            return "log packet of " + std::to_string(size) + " bytes is too short for a record length";
        case DiagFrameProblem::ShortRecord:
            return "record length " + std::to_string(size) + " is shorter than the " +
                   std::to_string(kDlfHeaderSize) + "-byte header";
        case DiagFrameProblem::LongRecord:
            return "record length " + std::to_string(size) + " runs past the end of the " +
                   std::to_string(packetSize) + "-byte log packet";
    }
    return {};
}

}  // namespace velmar
