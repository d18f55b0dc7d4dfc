#include "LogGenerator/DlfVersionReport.h"

#include <array>
#include <cstring>

namespace velmar {

namespace {

struct TextField {
    std::size_t offset;
    std::size_t width;  // bytes available, terminator included
};

constexpr TextField kVersionField{16, 7};
constexpr TextField kExecutableField{23, 16};  // the 40-byte field holds at most 15 characters and the NUL
constexpr TextField kBuildDateField{63, 18};
constexpr std::size_t kTimeOffset = 81;
constexpr std::size_t kZoneOffset = 85;
constexpr std::size_t kDaylightOffset = 87;

void putLittleEndian(std::uint8_t* at, std::uint64_t value, std::size_t width) {
    for (std::size_t i = 0; i < width; ++i) {
        at[i] = static_cast<std::uint8_t>(value >> (8 * i));
    }
}

void putText(std::uint8_t* record, const TextField& field, const char* text) {
    if (text == nullptr) {
        return;
    }
    const std::size_t length = strnlen(text, field.width - 1);
    std::memcpy(record + field.offset, text, length);
    record[field.offset + length] = 0;
}

}  // namespace

std::uint64_t packDlfTimeInfo(std::uint32_t secondsSince1970, std::int16_t zoneOffsetMinutes,
                              bool daylightSaving) {
    return static_cast<std::uint64_t>(secondsSince1970) |
           (static_cast<std::uint64_t>(static_cast<std::uint16_t>(zoneOffsetMinutes)) << 32) |
           (static_cast<std::uint64_t>(daylightSaving ? 1 : 0) << 48);
}

std::int32_t MoxDLFAddVersionReport(std::uint8_t* buffer, std::uint32_t bufferLength, std::uint32_t* outLength,
                                    std::uint16_t firstNumber, std::uint16_t secondNumber,
                                    const char* versionText, const char* executableName,
                                    const char* buildDateText, std::uint64_t timeInfo) {
    *outLength = 0;
    if (bufferLength < kDlfVersionReportLength) {
        return 3;
    }
    std::array<std::uint8_t, kDlfVersionReportLength> record{};
    putLittleEndian(&record[0], kDlfVersionReportLength, 2);
    putLittleEndian(&record[2], kDlfVersionReportCode, 2);
    putLittleEndian(&record[12], firstNumber, 2);
    putLittleEndian(&record[14], secondNumber, 2);
    putText(record.data(), kVersionField, versionText);
    putText(record.data(), kExecutableField, executableName);
    putText(record.data(), kBuildDateField, buildDateText);
    putLittleEndian(&record[kTimeOffset], timeInfo & 0xFFFFFFFFu, 4);
    putLittleEndian(&record[kZoneOffset], (timeInfo >> 32) & 0xFFFFu, 2);
    putLittleEndian(&record[kDaylightOffset], (timeInfo >> 48) & 0xFFu, 2);
    *outLength = kDlfVersionReportLength;
    std::memcpy(buffer, record.data(), record.size());
    return 0;
}

}  // namespace velmar
