// DiagCommands: the requests that the live session sends to a modem's diagnostic port and the reading of
// the responses it gets back. Payloads only: DiagFraming frames them.
//
// Contract:
// - Request builders answer the exact payload bytes (little-endian fields, written with RecordWriter).
// - A response is recognised by answers(request, response): the same command byte (and, for log and
//   debug-message configuration, the same operation), or an error response whose copy of the offending
//   request starts with the request's command byte (or is empty). Asynchronous frames (log packets, event
//   reports other than the 3-byte answer, debug messages) never answer a request.
// - Parsers read fields with RecordReader and answer nullopt for a response too short for what it must
//   hold; text fields stop at their width or their first NUL, whichever comes first.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::live {

inline constexpr std::uint8_t kDiagVersionCommand = 0x00;
inline constexpr std::uint8_t kDiagTimestampCommand = 0x1D;
inline constexpr std::uint8_t kDiagEventReportCommand = 0x60;
inline constexpr std::uint8_t kDiagLogConfigCommand = 0x73;
inline constexpr std::uint8_t kDiagBuildIdCommand = 0x7C;
inline constexpr std::uint8_t kDiagDebugConfigCommand = 0x7D;
inline constexpr std::uint8_t kDiagDebugSetAllMasks = 0x05;

// Log configuration operations.
enum class LogConfigOperation : std::uint32_t {
    DisableAll = 0,
    RetrieveRanges = 1,
    SetMask = 3,
    GetMask = 4
};

// Log configuration statuses.
inline constexpr std::uint32_t kLogConfigSuccess = 0;

inline constexpr std::size_t kEquipmentIdCount = 16;
// The most items a log mask may cover.
inline constexpr std::uint32_t kMaxLogMaskItems = 0x1000;
// The longest response the session accepts, unframed.
inline constexpr std::size_t kMaxDiagResponseBytes = 16 * 1024;

using EquipmentRanges = std::array<std::uint32_t, kEquipmentIdCount>;

// One equipment id's log mask: item i is bit (i % 8) of byte i / 8.
struct EquipmentLogMask {
    std::uint32_t equipment = 0;
    std::uint32_t itemCount = 0;  // N
    PlistData bits;               // ceil(N / 8) bytes

    bool operator==(const EquipmentLogMask&) const = default;
};

PlistData versionRequest();
PlistData buildIdRequest();
PlistData timestampRequest();
PlistData eventReportsRequest(bool on);
PlistData debugMessagesOffRequest();
PlistData logConfigRequest(LogConfigOperation operation);
PlistData setLogMaskRequest(const EquipmentLogMask& mask);

// A short name of a request, for messages ("version request", "set log mask").
std::string requestName(ByteView request);

// Frames that the device sends unasked: log packets, debug messages, event reports. An event report frame
// that is exactly the 3-byte answer `60 00 00` is not counted as asynchronous.
bool isAsynchronous(ByteView packet);
bool isErrorResponse(ByteView packet);
// "bad command", "bad parameter", ... for an error response's code.
std::string_view errorResponseName(std::uint8_t code);
bool answers(ByteView request, ByteView response);

// The version response: 11 + 8 + 11 + 8 + 8 ASCII characters from offset 1.
struct VersionInfo {
    std::string compileDate;
    std::string compileTime;
    std::string releaseDate;
    std::string releaseTime;
    std::string directory;
};
std::optional<VersionInfo> parseVersionResponse(ByteView response);

// [7C][u8][2 reserved][hw version u32][model id u32][build id, NUL-terminated][model string, NUL-terminated];
// a string missing its NUL ends with the response.
struct BuildIdInfo {
    std::uint32_t hardwareVersion = 0;
    std::uint32_t modelId = 0;
    std::string buildId;
    std::string model;
};
std::optional<BuildIdInfo> parseBuildIdResponse(ByteView response);

// [73][00 00 00][operation u32][status u32]...
struct LogConfigResponse {
    std::uint32_t operation = 0;
    std::uint32_t status = 0;
    ByteView rest;  // what follows the status
};
std::optional<LogConfigResponse> parseLogConfigResponse(ByteView response);
// The 16 last-item values of a retrieve-ranges response.
std::optional<EquipmentRanges> parseLogRanges(const LogConfigResponse& response);
// The equipment id and N (as the device kept it) of a set-mask response.
struct SetMaskEcho {
    std::uint32_t equipment = 0;
    std::uint32_t itemCount = 0;
};
std::optional<SetMaskEcho> parseSetMaskEcho(const LogConfigResponse& response);

// "success", "invalid", "fail" or "status N".
std::string logConfigStatusName(std::uint32_t status);

}  // namespace velmar::live
