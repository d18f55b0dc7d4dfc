// DlfVersionReport: the 161-byte version-report record (log code 0x1FFD) that opens every exported DLF file.
//
// Layout (little-endian): length 161 (u16), code 0x1FFD (u16), timestamp 0 (8 bytes), first and second report
// numbers (u16 each), application version text (7 bytes), executable name text (40 bytes, of which at most
// 15 characters and the NUL are written), build date text (18 bytes), export time in seconds since 1970
// (u32), local zone offset in minutes (s16, east positive), daylight-saving flag (u16), 72 zero bytes. Texts
// are truncated to the field's width minus one and always NUL-terminated.
#pragma once

#include <cstdint>

namespace velmar {

inline constexpr std::uint32_t kDlfVersionReportLength = 161;
inline constexpr std::uint16_t kDlfVersionReportCode = 0x1FFD;

// Packs the time information: seconds since 1970 in bits 0..31, the zone offset in minutes in bits 32..47,
// the daylight-saving flag in bits 48..55.
std::uint64_t packDlfTimeInfo(std::uint32_t secondsSince1970, std::int16_t zoneOffsetMinutes,
                              bool daylightSaving);

// Writes the record to the start of buffer. Returns 0 and sets outLength to 161 on success; returns 3 and
// writes nothing (outLength 0) when bufferLength is under 161.
std::int32_t MoxDLFAddVersionReport(std::uint8_t* buffer, std::uint32_t bufferLength,
                                    std::uint32_t* outLength, std::uint16_t firstNumber,
                                    std::uint16_t secondNumber, const char* versionText,
                                    const char* executableName, const char* buildDateText,
                                    std::uint64_t timeInfo);

}  // namespace velmar
