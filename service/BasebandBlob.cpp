#include "service/BasebandBlob.h"

namespace velmar {

namespace {
constexpr std::uint8_t kTypeOrdinary = 0x01;
constexpr std::uint8_t kTypeExtended = 0xFF;
constexpr std::size_t kCodeOffset = 3;
}  // namespace

ByteView basebandPacket(ByteView bytes) {
    if (bytes.size() >= kBlobPrefixSize && bytes[0] == kBlobPrefixMarker) {
        return bytes.subspan(kBlobPrefixSize);
    }
    return bytes;
}

BasebandBlob frameBasebandBlob(ByteView bytes) {
    BasebandBlob blob;
    blob.bytes = bytes;
    const ByteView packet = basebandPacket(bytes);
    if (packet.size() < kCodeOffset + 2) {
        return blob;
    }
    if (packet[0] == kTypeOrdinary) {
        blob.kind = BlobKind::Ordinary;
    } else if (packet[0] == kTypeExtended) {
        blob.kind = BlobKind::Extended;
    } else {
        return blob;
    }
    blob.code = static_cast<std::uint16_t>(packet[kCodeOffset] | packet[kCodeOffset + 1] << 8);
    return blob;
}

}  // namespace velmar
