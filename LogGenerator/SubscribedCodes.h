// SubscribedCodes: which baseband packets a log-code generator would do anything with, answered without
// calling it. An offline reader hands the generator only these, as a live modem sends only the codes of the
// generator's log mask; decoding a recording then costs little more than framing it, since most of a
// capture's packets carry codes that no decoder reads.
//
// Contract: of() answers only for a log-code generator (ORVLogGenerator2) that does not gather raw blobs,
// because only then does a packet of a code without subscribers leave the state untouched; for any other
// generator it answers none, and every packet must go to the generator. The codes are those subscribed when
// of() was called. passes() is false only for a plain or extended log packet, with a whole header, of a code
// that no decoder subscribes to; a blob that is too short or of another log type passes, because the
// generator itself skips or reports it. The generator builds its display at the first packet it sees, so a
// reader hands it the first packet whatever its code: leaving out later ones then changes neither the display
// nor the log lines or their order.
#pragma once

#include <bitset>
#include <optional>

#include "LogGenerator/LogGenerator.h"
#include "core/platform/BasebandPacket.h"
#include "core/platform/ByteView.h"

namespace velmar {

class SubscribedCodes {
  public:
    static std::optional<SubscribedCodes> of(const LogGenerator& generator);

    // Inline: it runs once per packet.
    bool passes(ByteView blob) const {
        if (blob.size() < kPacketHeaderLength) {
            return true;
        }
        const BasebandPacket framed = frameBasebandPacket(blob);
        if (framed.isPlain()) {
            return plain_.test(framed.code);
        }
        if (framed.isExtended()) {
            return extended_.test(framed.code);
        }
        return true;
    }

  private:
    SubscribedCodes() = default;

    std::bitset<0x10000> plain_;     // by 16-bit code
    std::bitset<0x10000> extended_;  // by 16-bit code, without the 0xFF0000 that decoders add
};

}  // namespace velmar
