// 0x134F, 1x system identity: at least 171 bytes, version (byte 13) 2 or higher. The system and network ids
// are meaningful for system type 2 only. The base id is read at 184..185, beyond the checked minimum: a
// record of 171 to 185 bytes reads its missing bytes as zero, one of 186 bytes or more shows its own base id.
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "LogGenerator/C2K/C2KValueNames.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar::c2k {

namespace {

constexpr std::size_t kMinimumLength = 171;
constexpr std::size_t kVersionOffset = 13;
constexpr std::uint32_t kFirstVersion = 2;
constexpr std::size_t kSystemTypeOffset = 46;
constexpr std::uint32_t kSystemTypeWithIds = 2;

constexpr RecordField kRoamingFields[] = {
    u32Field(42, "k1xRoamingHome", asName(kRoamingIndicatorNames)),
};
constexpr RecordField kSystemFields[] = {
    u16Field(50, "kSystemId"),
    u16Field(52, "kNetworkId"),
};
constexpr RecordField kCellFields[] = {
    u8Field(131, "kPacketZoneId"),
    u16Field(184, "kBaseId"),
    u8Field(133, "kProtocolRevision"),
};

}  // namespace

void parse1xSystemIdentity(const RecordReader& packet, const C2KRecordContext& context) {
    if (packet.size() < kMinimumLength) {
        SystemLog::log(kLogError, "Log code 0x134f is %d bytes long but must be at least %lu bytes.",
                       static_cast<int>(packet.size()), static_cast<unsigned long>(kMinimumLength));
        return;
    }
    const std::uint32_t version = packet.u8(kVersionOffset);
    if (version < kFirstVersion) {
        SystemLog::log(kLogError,
                       "Log code 0x134f has version=%d; only version 2 or higher expected; dropping.",
                       static_cast<int>(version));
        return;
    }
    writeDisplayFields(kRoamingFields, packet, 0, context.lookup);
    const std::uint32_t systemType = packet.u32(kSystemTypeOffset);
    if (systemType == kSystemTypeWithIds) {
        writeDisplayFields(kSystemFields, packet, 0, context.lookup);
    } else {
        const PlistValue unknown(stringWithFormat("(unknown system type %d)", static_cast<int>(systemType)));
        for (const RecordField& field : kSystemFields) {
            context.show(field.key, unknown);
        }
    }
    writeDisplayFields(kCellFields, packet, 0, context.lookup);
}

}  // namespace velmar::c2k
