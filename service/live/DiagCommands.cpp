#include "service/live/DiagCommands.h"

#include <algorithm>
#include <cstdio>

#include "core/platform/RecordReader.h"
#include "core/platform/RecordWriter.h"

namespace velmar::live {

namespace {

struct ErrorCode {
    std::uint8_t code;
    std::string_view name;
};

constexpr std::array<ErrorCode, 7> kErrorCodes = {{
    {0x13, "bad command"},
    {0x14, "bad parameter"},
    {0x15, "bad length"},
    {0x18, "bad mode"},
    {0x42, "bad SPC mode"},
    {0x47, "bad security mode"},
    {0x95, "bad transaction"},
}};

constexpr std::array<std::uint8_t, 5> kDebugMessageCommands = {0x79, 0x92, 0x99, 0x9C, 0x9D};
constexpr std::uint8_t kLastDebugMessageCommand = 0x9E;
constexpr std::size_t kLogConfigHeaderSize = 8;
constexpr std::size_t kEventReportAnswerSize = 3;

// The text of a fixed-width field, up to its first NUL.
std::string textField(ByteView bytes, std::size_t offset, std::size_t width) {
    const ByteView field = bytes.subspan(offset, width);
    const auto end = std::find(field.begin(), field.end(), 0);
    return std::string(field.begin(), end);
}

// A NUL-terminated string from offset (or to the end); next is where the following field starts.
std::string nulTerminated(ByteView bytes, std::size_t offset, std::size_t& next) {
    if (offset >= bytes.size()) {
        next = bytes.size();
        return {};
    }
    const ByteView rest = bytes.subspan(offset);
    const auto end = std::find(rest.begin(), rest.end(), 0);
    next = offset + static_cast<std::size_t>(end - rest.begin()) + (end == rest.end() ? 0 : 1);
    return std::string(rest.begin(), end);
}

PlistData logConfigHeader(LogConfigOperation operation) {
    PlistData request = {kDiagLogConfigCommand, 0, 0, 0};
    RecordWriter(request).appendLE(4, static_cast<std::uint32_t>(operation));
    return request;
}

bool isDebugMessage(std::uint8_t command) {
    return std::find(kDebugMessageCommands.begin(), kDebugMessageCommands.end(), command) !=
               kDebugMessageCommands.end() ||
           command == kLastDebugMessageCommand;
}

}  // namespace

PlistData versionRequest() {
    return {kDiagVersionCommand};
}

PlistData buildIdRequest() {
    return {kDiagBuildIdCommand};
}

PlistData timestampRequest() {
    return {kDiagTimestampCommand};
}

PlistData eventReportsRequest(bool on) {
    return {kDiagEventReportCommand, static_cast<std::uint8_t>(on ? 1 : 0)};
}

PlistData debugMessagesOffRequest() {
    PlistData request = {kDiagDebugConfigCommand, kDiagDebugSetAllMasks, 0, 0};
    RecordWriter(request).appendLE(4, 0);
    return request;
}

PlistData logConfigRequest(LogConfigOperation operation) {
    return logConfigHeader(operation);
}

PlistData setLogMaskRequest(const EquipmentLogMask& mask) {
    PlistData request = logConfigHeader(LogConfigOperation::SetMask);
    RecordWriter(request).appendLE(4, mask.equipment).appendLE(4, mask.itemCount).append(mask.bits);
    return request;
}

std::string requestName(ByteView request) {
    if (request.empty()) {
        return "empty request";
    }
    switch (request[0]) {
        case kDiagVersionCommand:
            return "version request";
        case kDiagBuildIdCommand:
            return "build id request";
        case kDiagTimestampCommand:
            return "timestamp request";
        case kDiagEventReportCommand:
            return request.size() >= 2 && request[1] != 0 ? "event reports on" : "event reports off";
        case kDiagDebugConfigCommand:
            return "debug messages off";
        case kDiagLogConfigCommand:
            if (request.size() >= kLogConfigHeaderSize) {
                switch (static_cast<LogConfigOperation>(RecordReader(request).u32(4))) {
                    case LogConfigOperation::DisableAll:
                        return "log disable";
                    case LogConfigOperation::RetrieveRanges:
                        return "log ranges request";
                    case LogConfigOperation::SetMask:
                        return "set log mask";
                    case LogConfigOperation::GetMask:
                        return "get log mask";
                }
            }
            return "log configuration";
        default:
            break;
    }
    char name[32];
    std::snprintf(name, sizeof name, "command 0x%02X", request[0]);
    return name;
}

bool isAsynchronous(ByteView packet) {
    if (packet.empty()) {
        return false;
    }
    const std::uint8_t command = packet[0];
    if (command == 0x10 || isDebugMessage(command)) {
        return true;
    }
    return command == kDiagEventReportCommand && packet.size() != kEventReportAnswerSize;
}

bool isErrorResponse(ByteView packet) {
    return !packet.empty() && std::any_of(kErrorCodes.begin(), kErrorCodes.end(),
                                          [&](const ErrorCode& error) { return error.code == packet[0]; });
}

std::string_view errorResponseName(std::uint8_t code) {
    for (const ErrorCode& error : kErrorCodes) {
        if (error.code == code) {
            return error.name;
        }
    }
    return "error";
}

bool answers(ByteView request, ByteView response) {
    if (request.empty() || response.empty() || isAsynchronous(response)) {
        return false;
    }
    if (isErrorResponse(response)) {
        return response.size() == 1 || response[1] == request[0];
    }
    if (response[0] != request[0]) {
        return false;
    }
    switch (request[0]) {
        case kDiagLogConfigCommand:
            // The operation sits at the same place in both.
            return request.size() >= kLogConfigHeaderSize && response.size() >= kLogConfigHeaderSize &&
                   RecordReader(request).u32(4) == RecordReader(response).u32(4);
        case kDiagDebugConfigCommand:
            return request.size() >= 2 && response.size() >= 2 && request[1] == response[1];
        default:
            return true;
    }
}

std::optional<VersionInfo> parseVersionResponse(ByteView response) {
    constexpr std::size_t kVersionFieldsEnd = 47;
    if (response.size() < kVersionFieldsEnd || response[0] != kDiagVersionCommand) {
        return std::nullopt;
    }
    VersionInfo info;
    info.compileDate = textField(response, 1, 11);
    info.compileTime = textField(response, 12, 8);
    info.releaseDate = textField(response, 20, 11);
    info.releaseTime = textField(response, 31, 8);
    info.directory = textField(response, 39, 8);
    return info;
}

std::optional<BuildIdInfo> parseBuildIdResponse(ByteView response) {
    constexpr std::size_t kStringsStart = 12;
    if (response.size() < kStringsStart || response[0] != kDiagBuildIdCommand) {
        return std::nullopt;
    }
    const RecordReader fields(response);
    BuildIdInfo info;
    info.hardwareVersion = fields.u32(4);
    info.modelId = fields.u32(8);
    std::size_t next = 0;
    info.buildId = nulTerminated(response, kStringsStart, next);
    info.model = nulTerminated(response, next, next);
    return info;
}

std::optional<LogConfigResponse> parseLogConfigResponse(ByteView response) {
    constexpr std::size_t kStatusEnd = kLogConfigHeaderSize + 4;
    if (response.size() < kStatusEnd || response[0] != kDiagLogConfigCommand) {
        return std::nullopt;
    }
    const RecordReader fields(response);
    LogConfigResponse parsed;
    parsed.operation = fields.u32(4);
    parsed.status = fields.u32(8);
    parsed.rest = response.subspan(kStatusEnd);
    return parsed;
}

std::optional<EquipmentRanges> parseLogRanges(const LogConfigResponse& response) {
    if (response.rest.size() < kEquipmentIdCount * 4) {
        return std::nullopt;
    }
    const RecordReader fields(response.rest);
    EquipmentRanges ranges{};
    for (std::size_t id = 0; id < kEquipmentIdCount; ++id) {
        ranges[id] = fields.u32(id * 4);
    }
    return ranges;
}

std::optional<SetMaskEcho> parseSetMaskEcho(const LogConfigResponse& response) {
    if (response.rest.size() < 8) {
        return std::nullopt;
    }
    const RecordReader fields(response.rest);
    return SetMaskEcho{fields.u32(0), fields.u32(4)};
}

std::string logConfigStatusName(std::uint32_t status) {
    switch (status) {
        case 0:
            return "success";
        case 1:
            return "invalid";
        case 2:
            return "fail";
        default:
            return "status " + std::to_string(status);
    }
}

}  // namespace velmar::live
