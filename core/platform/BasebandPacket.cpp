#include "core/platform/BasebandPacket.h"

namespace velmar {

BasebandPacket frameShortBasebandPacket(ByteView blob) {
    return readBasebandHeader(blob, withoutChannelPrefix(blob));
}

}  // namespace velmar
