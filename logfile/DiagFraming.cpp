#include "logfile/DiagFraming.h"

#include <array>

#include "core/platform/BasebandPacket.h"
#include "core/platform/RecordReader.h"
#include "logfile/DlfFile.h"

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

DiagFrameContents bad(std::string problem) {
    DiagFrameContents contents;
    contents.kind = DiagFrameContents::Kind::Bad;
    contents.problem = std::move(problem);
    return contents;
}

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

// Every unwrapping step leaves at least one byte, so nothing past the payload is ever looked at.
DiagFrameContents readDiagFrame(std::span<std::uint8_t> payload) {
    if (payload.empty()) {
        return bad("empty frame");
    }
    DiagFrameContents contents;
    std::size_t first = 0;
    const std::size_t length = payload.size();
    int depth = 0;
    while (payload[first] == kDiagWrapper) {
        if (length - first < 2 || payload[first + 1] != 0x01) {
            break;  // a wrapper version this reader does not know: an "other" frame
        }
        if (depth == kMaxDiagWrapperDepth) {
            return bad("wrappers nested deeper than " + std::to_string(kMaxDiagWrapperDepth) + " levels");
        }
        if (length - first <= kDiagWrapperHeaderSize) {
            return bad("wrapper of " + std::to_string(length - first) + " bytes holds no frame");
        }
        if (depth == 0) {
            contents.subscription = RecordReader(payload.subspan(first)).u32(4);
        }
        first += kDiagWrapperHeaderSize;
        ++depth;
    }
    contents.packet = payload.subspan(first);
    const std::span<std::uint8_t> packet = contents.packet;
    if (packet[0] != kDiagLogPacket) {
        contents.kind = DiagFrameContents::Kind::Other;
        return contents;
    }
    const auto damaged = [&contents](std::string problem) {
        contents.kind = DiagFrameContents::Kind::Bad;
        contents.problem = std::move(problem);
        return contents;
    };
    if (packet.size() < 6) {
        return damaged("log packet of " + std::to_string(packet.size()) +
                       " bytes is too short for a record length");
    }
    const std::size_t recordLength = RecordReader(packet).u16(4);
    if (recordLength < kDlfHeaderSize) {
        return damaged("record length " + std::to_string(recordLength) + " is shorter than the " +
                       std::to_string(kDlfHeaderSize) + "-byte header");
    }
    if (4 + recordLength > packet.size()) {
        return damaged("record length " + std::to_string(recordLength) + " runs past the end of the " +
                       std::to_string(packet.size()) + "-byte log packet");
    }
    packet[3] = kPlainLogType;
    contents.kind = DiagFrameContents::Kind::LogPacket;
    contents.blob = ByteView(packet.data() + 3, 1 + recordLength);
    return contents;
}

}  // namespace velmar
