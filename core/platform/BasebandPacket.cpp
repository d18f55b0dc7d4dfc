#include "core/platform/BasebandPacket.h"

#include "core/platform/RecordReader.h"

namespace velmar {

ByteView withoutChannelPrefix(ByteView blob) {
    if (blob.size() >= kChannelPrefixLength && blob[0] == kChannelPrefixMarker) {
        return blob.subspan(kChannelPrefixLength);
    }
    return blob;
}

BasebandPacket frameBasebandPacket(ByteView blob) {
    BasebandPacket framed;
    framed.packet = withoutChannelPrefix(blob);
    framed.prefixLength = blob.size() - framed.packet.size();
    const RecordReader reader(framed.packet);
    framed.logType = reader.byteAt(0);
    framed.recordLength = static_cast<std::uint16_t>(reader.u16(kPacketRecordLengthOffset));
    framed.code = static_cast<std::uint16_t>(reader.u16(kPacketCodeOffset));
    framed.timestamp = reader.unsignedLE(kPacketTimestampOffset, 8);
    return framed;
}

}  // namespace velmar
