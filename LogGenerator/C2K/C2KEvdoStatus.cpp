// 0x1183, EV-DO status: exactly 50 bytes. The second receive chain and the transmitter are shown only from
// the Access state (4) on; below it both show "N/A".
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "LogGenerator/C2K/C2KValueNames.h"
#include "core/platform/SystemLog.h"

namespace velmar::c2k {

namespace {

constexpr std::size_t kEvdoStatusLength = 50;
constexpr std::size_t kDeviceStateOffset = 36;
constexpr std::uint32_t kFirstTransmittingState = 4;

constexpr RecordField kStatusFields[] = {
    u16Field(13, "kChannel"),
    u8Field(kDeviceStateOffset, "k1xEVDODeviceState", asName(kEvdoDeviceStateNames)),
    bitField(14, 1, 3, 7, "kBandClass", asName(kBandClassNames)),
    s8Field(15, "kRxAGC0", asInt("%+d dBm")),
};

constexpr RecordField kTransmitFields[] = {
    s8Field(16, "kRxAGC1", asInt("%+d dBm")),
    s8Field(17, "kTxAGC", asInt("%+d dBm")),
};

// The multiplication sign is U+00D7, written in UTF-8.
constexpr RecordField kSessionFields[] = {
    u16Field(18, "kServingPNOffset", asInt("%d \xC3\x97 64chips").withSentinel(0xFFFF, "Invalid Value")),
    u8Field(37, "kSessionState", asName(kEvdoSessionStateNames)),
    intField(38, 3, FieldEncoding::LittleUnsigned, "kUATI24", asUnsigned("0x%06x")),
    u8Field(41, "kColorCode"),
};

}  // namespace

void parseEvdoStatus(const RecordReader& packet, const C2KRecordContext& context) {
    if (packet.size() != kEvdoStatusLength) {
        SystemLog::log(kLogError, "Log code 0x1183 is %u bytes long but should be %lu bytes.",
                       static_cast<unsigned>(packet.size()), static_cast<unsigned long>(kEvdoStatusLength));
        return;
    }
    writeDisplayFields(kStatusFields, packet, 0, context.lookup);
    if (packet.u8(kDeviceStateOffset) < kFirstTransmittingState) {
        for (const RecordField& field : kTransmitFields) {
            context.show(field.key, PlistValue("N/A"));
        }
    } else {
        writeDisplayFields(kTransmitFields, packet, 0, context.lookup);
    }
    writeDisplayFields(kSessionFields, packet, 0, context.lookup);
}

}  // namespace velmar::c2k
