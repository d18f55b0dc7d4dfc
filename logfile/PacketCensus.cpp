#include "logfile/PacketCensus.h"

#include <cinttypes>
#include <cstdio>
#include <numeric>

namespace velmar {

namespace {

constexpr std::int32_t kLargestPlainCode = 0xFFFF;

std::uint64_t keyOf(std::int32_t logCode, std::int16_t version) {
    // Versions from -1 (none) upward sort in order.
    return static_cast<std::uint64_t>(static_cast<std::uint32_t>(logCode)) << 16 |
           static_cast<std::uint16_t>(version + 1);
}

void appendCount(std::string& line, bool& first, std::uint64_t count, const char* what) {
    if (count == 0) {
        return;
    }
    char text[48];
    std::snprintf(text, sizeof text, "%s%" PRIu64 " %s", first ? " " : ", ", count, what);
    line += text;
    first = false;
}

enum class Decoding { ByTechnology, NotByTechnology, NoTechnology };

std::string lineOf(const CensusEntry& entry, Decoding decoding) {
    char head[32];
    if (entry.version == kNoVersion) {
        std::snprintf(head, sizeof head, entry.logCode > kLargestPlainCode ? "0x%06X v-" : "0x%04X v-",
                      static_cast<unsigned>(entry.logCode));
    } else {
        std::snprintf(head, sizeof head, entry.logCode > kLargestPlainCode ? "0x%06X v%d" : "0x%04X v%d",
                      static_cast<unsigned>(entry.logCode), entry.version);
    }
    std::string line = head;
    bool first = true;
    if (decoding == Decoding::NotByTechnology) {
        appendCount(line, first, entry.total(), "not decoded");
    } else {
        const std::uint64_t untracked = entry.count(VersionOutcome::Untracked);
        const bool asDecoded = decoding == Decoding::ByTechnology;
        appendCount(line, first, entry.count(VersionOutcome::DecodedAsIs) + (asDecoded ? untracked : 0),
                    "decoded as is");
        appendCount(line, first, entry.count(VersionOutcome::Adapted), "adapted");
        appendCount(line, first, entry.count(VersionOutcome::Dropped), "dropped");
        appendCount(line, first, entry.count(VersionOutcome::UnknownVersion), "unknown version");
        appendCount(line, first, asDecoded ? 0 : untracked, "passed on");
    }
    appendCount(line, first, entry.clamped, "values clamped");
    appendCount(line, first, entry.droppedEntries, "list entries dropped");
    appendCount(line, first, entry.missingEntries, "list entries missing");
    return line;
}

}  // namespace

std::uint64_t CensusEntry::total() const {
    return std::accumulate(records.begin(), records.end(), std::uint64_t{0});
}

bool PacketCensus::add(const AdaptedPacket& packet) {
    if (packet.outcome == VersionOutcome::Unframed) {
        ++unframed_;
        return false;
    }
    ++records_;
    const std::uint64_t key = keyOf(packet.logCode, packet.version);
    bool first = false;
    if (last_ == nullptr || key != lastKey_) {
        auto [found, inserted] = entries_.try_emplace(key);
        if (inserted) {
            found->second.logCode = packet.logCode;
            found->second.version = packet.version;
            first = true;
        }
        last_ = &found->second;
        lastKey_ = key;
    }
    ++last_->records[static_cast<std::size_t>(packet.outcome)];
    last_->clamped += packet.tally.clamped;
    last_->droppedEntries += packet.tally.droppedEntries;
    last_->missingEntries += packet.tally.missingEntries;
    return first;
}

std::vector<CensusEntry> PacketCensus::entries() const {
    std::vector<CensusEntry> out;
    out.reserve(entries_.size());
    for (const auto& [key, entry] : entries_) {
        out.push_back(entry);
    }
    return out;
}

std::vector<std::string> censusReport(const PacketCensus& census, const DecodedCodes& decoded) {
    std::vector<std::string> lines;
    const std::vector<CensusEntry> entries = census.entries();
    if (!decoded) {
        for (const CensusEntry& entry : entries) {
            lines.push_back(lineOf(entry, Decoding::NoTechnology));
        }
    } else {
        for (const bool technologyCodes : {true, false}) {
            for (const CensusEntry& entry : entries) {
                if (decoded(entry.logCode) == technologyCodes) {
                    lines.push_back(
                        lineOf(entry, technologyCodes ? Decoding::ByTechnology : Decoding::NotByTechnology));
                }
            }
        }
    }
    if (census.unframed() > 0) {
        lines.push_back("unframed " + std::to_string(census.unframed()));
    }
    return lines;
}

}  // namespace velmar
