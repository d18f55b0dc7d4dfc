#include "service/BasebandBlob.h"

#include "core/platform/BasebandPacket.h"

namespace velmar {

BasebandBlob frameBasebandBlob(ByteView bytes) {
    BasebandBlob blob;
    blob.bytes = bytes;
    const BasebandPacket framed = frameBasebandPacket(bytes);
    if (!framed.hasCode()) {
        return blob;
    }
    if (framed.isPlain()) {
        blob.kind = BlobKind::Ordinary;
    } else if (framed.isExtended()) {
        blob.kind = BlobKind::Extended;
    } else {
        return blob;
    }
    blob.code = framed.code;
    return blob;
}

}  // namespace velmar
