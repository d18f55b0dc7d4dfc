#include "logfile/PacketVersionAdapter.h"

#include <algorithm>
#include <array>
#include <limits>

#include "core/platform/BasebandPacket.h"
#include "logfile/versions/VersionRewriter.h"
#include "logfile/versions/VersionTables.h"

namespace velmar {

namespace packet_versions {

// The few codes with known layouts, found by one probe of a small open-addressed table in the common case:
// most packets are of other codes, and rejecting them must cost next to nothing.
class KnownCodes {
  public:
    KnownCodes() {
        for (const auto group : {lteCodeVersions(), otherCodeVersions()}) {
            for (const CodeVersions& code : group) {
                std::size_t slot = slotOf(code.code);
                while (slots_[slot] != nullptr) {
                    slot = (slot + 1) % kSlots;
                }
                slots_[slot] = &code;
            }
        }
    }
    const CodeVersions* find(std::uint16_t code) const {
        for (std::size_t slot = slotOf(code);; slot = (slot + 1) % kSlots) {
            const CodeVersions* known = slots_[slot];
            if (known == nullptr || known->code == code) {
                return known;
            }
        }
    }

    // Bit n set: some known code lies in slot n.
    std::uint64_t slots() const {
        std::uint64_t used = 0;
        for (const CodeVersions* known : slots_) {
            if (known != nullptr) {
                used |= std::uint64_t{1} << slotOf(known->code);
            }
        }
        return used;
    }

  private:
    // Several times the number of known codes, so that probes stay short and one slot is always free.
    static constexpr std::size_t kSlots = 64;
    static std::size_t slotOf(std::uint16_t code) { return knownCodeSlot(code); }

    std::array<const CodeVersions*, kSlots> slots_{};
};

}  // namespace packet_versions

namespace {

using packet_versions::CodeVersions;
using packet_versions::VersionPlace;
using packet_versions::VersionTable;

constexpr unsigned kTopBitsShift = 6;

std::int16_t recordedVersion(const CodeVersions& code, ByteView payload) {
    if (code.place == VersionPlace::None || payload.empty()) {
        return kNoVersion;
    }
    return code.place == VersionPlace::FirstByte ? payload[0]
                                                 : static_cast<std::int16_t>(payload[0] >> kTopBitsShift);
}

// The table that rewrites the record, or null when it is to pass as it is.
const VersionTable* tableFor(const CodeVersions& code, std::int16_t version, const RecordReader& payload) {
    for (const VersionTable& table : code.tables) {
        const bool matches = code.place == VersionPlace::None
                                 ? table.recognises != nullptr && table.recognises(payload)
                                 : table.version == version;
        if (matches) {
            return &table;
        }
    }
    return nullptr;
}

const packet_versions::KnownCodes& knownCodes() {
    static const packet_versions::KnownCodes codes;
    return codes;
}

}  // namespace

std::int16_t decodedLayoutVersion(std::uint16_t code) {
    const CodeVersions* known = knownCodes().find(code);
    return known == nullptr || known->decodedVersion < 0 ? kNoVersion : known->decodedVersion;
}

PacketVersionAdapter::PacketVersionAdapter()
    : knownCodes_(&knownCodes()), knownSlots_(knownCodes_->slots()) {}

AdaptedPacket PacketVersionAdapter::adaptKnown(ByteView blob) {
    AdaptedPacket result;
    result.blob = blob;
    const BasebandPacket framed = frameBasebandPacket(blob);
    if (!framed.hasCode() || !(framed.isPlain() || framed.isExtended())) {
        return result;
    }
    result.logCode = framed.logCode();
    result.outcome = VersionOutcome::Untracked;
    const CodeVersions* code =
        framed.isPlain() && framed.hasHeader() ? knownCodes().find(framed.code) : nullptr;
    if (code == nullptr) {
        return result;
    }

    const ByteView payload = framed.packet.subspan(kPacketHeaderLength);
    result.version = recordedVersion(*code, payload);
    result.outcome = VersionOutcome::DecodedAsIs;
    if (code->place != VersionPlace::None) {
        if (result.version == kNoVersion) {
            result.outcome = VersionOutcome::UnknownVersion;
            return result;
        }
        if (code->decodedVersion < 0 || result.version == code->decodedVersion) {
            return result;
        }
    }
    const VersionTable* table = tableFor(*code, result.version, RecordReader(payload));
    if (table == nullptr) {
        if (code->place != VersionPlace::None) {
            result.outcome = VersionOutcome::UnknownVersion;
        }
        return result;
    }

    // Header as recorded, then the decoded payload.
    const std::size_t base = framed.prefixLength + kPacketHeaderLength;
    buffer_.assign(blob.begin(), blob.begin() + static_cast<std::ptrdiff_t>(base));
    if (packet_versions::rewritePayload(*code, *table, payload, buffer_, base, result.tally)) {
        result.outcome = VersionOutcome::Adapted;
    } else {
        packet_versions::writeDecodedVersionOnly(*code, buffer_, base);
        result.outcome = VersionOutcome::Dropped;
        result.tally = {};
    }
    const std::size_t recordLength = buffer_.size() - framed.prefixLength - 1;
    RecordWriter(buffer_).unsignedLE(
        framed.prefixLength + kPacketRecordLengthOffset, 2,
        std::min<std::size_t>(recordLength, std::numeric_limits<std::uint16_t>::max()));
    result.blob = buffer_;
    return result;
}

}  // namespace velmar
