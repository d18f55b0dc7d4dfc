// PacketVersionAdapter: rewrites the records of newer baseband firmware into the layouts that the monitor's
// decoders read, so that the decoders stay exactly as they are. The service applies it to every blob a
// source produces, before the channels' log-code filters; velmar-decode applies it to every blob it reads.
//
// Contract:
// - adapt(blob) answers the blob to hand on and what was done with it (AdaptedPacket). A blob that is not a
//   plain log packet, a record of a code or version that no table knows, and a record already in the decoded
//   layout are answered as the very bytes given: no copy.
// - A record of a known newer version (logfile/versions/) is rewritten into the adapter's own buffer, reused
//   from call to call: the answer's bytes are valid until the next adapt() or the adapter's end. The channel
//   prefix, log type, code and timestamp are kept; the length field is set to the new length. The rewritten
//   record carries the decoded layout's version number, so adapting it again leaves it alone.
// - A record too short for its version's fixed fields, or one whose content the decoded layout cannot
//   express, is rewritten to its header and decoded version alone, which every decoder ignores: its sections
//   keep their values, as they do for any short record.
// - Nothing outside the blob is read, whatever its counts and lengths claim.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "core/platform/BasebandPacket.h"
#include "core/platform/ByteView.h"
#include "logfile/versions/VersionLayout.h"

namespace velmar {

enum class VersionOutcome : std::uint8_t {
    DecodedAsIs,     // in the decoded layout (the decoded version, or a code with no other known layout)
    Adapted,         // rewritten into the decoded layout
    Dropped,         // rewritten to a record that every decoder ignores
    UnknownVersion,  // a version of a known code that no table knows: passed on as recorded
    Untracked,       // a code of which no layouts are known (or not a plain packet): passed on as recorded
    Unframed,        // no log type and code to tell: passed on as recorded
};
inline constexpr std::size_t kVersionOutcomeCount = 6;

// A version that a record does not have (no version field, or no payload to hold it).
inline constexpr std::int16_t kNoVersion = -1;

struct AdaptedPacket {
    ByteView blob;  // the blob to hand on
    VersionOutcome outcome = VersionOutcome::Unframed;
    // As decoders know it (0xFF0000 + code for an extended packet); 0 when unframed.
    std::int32_t logCode = 0;
    std::int16_t version = kNoVersion;  // the recorded version
    packet_versions::RewriteTally tally;
};

// The version number of the decoded layout of a plain log code, which adapted records carry and which records
// written for the decoders (the simulated baseband's) must carry to be left alone; kNoVersion when no other
// layout of the code is known.
std::int16_t decodedLayoutVersion(std::uint16_t code);

namespace packet_versions {
class KnownCodes;
// The slot of a code in the adapter's table of known codes (0..63).
constexpr unsigned knownCodeSlot(std::uint16_t code) {
    return static_cast<unsigned>(code ^ (code >> 7)) % 64;
}
}  // namespace packet_versions

class PacketVersionAdapter {
  public:
    PacketVersionAdapter();

    // Inline, so that the packets of the many codes without other layouts (most of a stream) cost a few
    // instructions: a plain packet whose code's slot holds no known code is passed on at once.
    AdaptedPacket adapt(ByteView blob) {
        const std::size_t prefix =
            blob.size() >= kChannelPrefixLength && blob[0] == kChannelPrefixMarker ? kChannelPrefixLength : 0;
        if (blob.size() >= prefix + kPacketTimestampOffset && blob[prefix] == kPlainLogType) {
            const auto code = static_cast<std::uint16_t>(blob[prefix + kPacketCodeOffset] |
                                                         blob[prefix + kPacketCodeOffset + 1] << 8);
            if ((knownSlots_ >> packet_versions::knownCodeSlot(code) & 1) == 0) {
                AdaptedPacket untracked;
                untracked.blob = blob;
                untracked.outcome = VersionOutcome::Untracked;
                untracked.logCode = code;
                return untracked;
            }
        }
        return adaptKnown(blob);
    }

  private:
    AdaptedPacket adaptKnown(ByteView blob);

    const packet_versions::KnownCodes* knownCodes_;
    std::uint64_t knownSlots_ = 0;  // bit n: some known code lies in slot n
    std::vector<std::uint8_t> buffer_;
};

}  // namespace velmar
