#include "LogGenerator/DlfVersionReport.h"

#include <cstring>
#include <vector>

#include "core/platform/RecordWriter.h"

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

std::int32_t MoxDLFAddVersionReport(std::uint8_t* buffer, std::uint32_t bufferLength,
                                    std::uint32_t* outLength, std::uint16_t firstNumber,
                                    std::uint16_t secondNumber, const char* versionText,
                                    const char* executableName, const char* buildDateText,
                                    std::uint64_t timeInfo) {
    *outLength = 0;
    if (bufferLength < kDlfVersionReportLength) {
        return 3;
    }
    std::vector<std::uint8_t> record(kDlfVersionReportLength, 0);
    RecordWriter(record)
        .unsignedLE(0, 2, kDlfVersionReportLength)
        .unsignedLE(2, 2, kDlfVersionReportCode)
        .unsignedLE(12, 2, firstNumber)
        .unsignedLE(14, 2, secondNumber)
        .unsignedLE(kTimeOffset, 4, timeInfo & 0xFFFFFFFFu)
        .unsignedLE(kZoneOffset, 2, (timeInfo >> 32) & 0xFFFFu)
        .unsignedLE(kDaylightOffset, 2, (timeInfo >> 48) & 0xFFu);
    putText(record.data(), kVersionField, versionText);
    putText(record.data(), kExecutableField, executableName);
    putText(record.data(), kBuildDateField, buildDateText);
    *outLength = kDlfVersionReportLength;
    std::memcpy(buffer, record.data(), record.size());
    return 0;
}

}  // namespace velmar
