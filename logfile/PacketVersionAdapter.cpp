#include "logfile/PacketVersionAdapter.h"

#include <algorithm>
#include <bitset>
#include <limits>

#include "core/platform/BasebandPacket.h"
#include "logfile/versions/VersionRewriter.h"
#include "logfile/versions/VersionTables.h"

namespace velmar {

namespace {

using packet_versions::CodeVersions;
using packet_versions::VersionPlace;
using packet_versions::VersionTable;

constexpr unsigned kTopBitsShift = 6;

// The few codes with known layouts, and a bit per code so that the many others cost one test.
class KnownCodes {
  public:
    KnownCodes() {
        for (const auto group : {packet_versions::lteCodeVersions(), packet_versions::otherCodeVersions()}) {
            for (const CodeVersions& code : group) {
                codes_.push_back(&code);
                known_.set(code.code);
            }
        }
    }
    const CodeVersions* find(std::uint16_t code) const {
        if (!known_.test(code)) {
            return nullptr;
        }
        const auto found = std::find_if(codes_.begin(), codes_.end(),
                                        [code](const CodeVersions* c) { return c->code == code; });
        return found == codes_.end() ? nullptr : *found;
    }

  private:
    std::bitset<std::numeric_limits<std::uint16_t>::max() + 1> known_;
    std::vector<const CodeVersions*> codes_;
};

const KnownCodes& knownCodes() {
    static const KnownCodes codes;
    return codes;
}

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

}  // namespace

std::int16_t decodedLayoutVersion(std::uint16_t code) {
    const CodeVersions* known = knownCodes().find(code);
    return known == nullptr || known->decodedVersion < 0 ? kNoVersion : known->decodedVersion;
}

AdaptedPacket PacketVersionAdapter::adapt(ByteView blob) {
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
