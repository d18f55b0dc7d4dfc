// PacketCensus: how many records of each (log code, version) went through the packet-version adapter, and
// what it did with them.
//
// Contract: add() counts one AdaptedPacket under its (code, recorded version) and outcome, with the values it
// clamped and the list entries it dropped or found missing; it answers true for the first record of a
// (code, version). Blobs without framing are counted apart. Memory is bounded by the number of distinct
// (code, version) pairs, which the 16-bit codes and the few versioned codes bound.
//
// censusReport() writes one line per (code, version), in order of code and then version:
//   "0xB179 v4 237 adapted"
//   "0x7150 v- 94 adapted, 2 list entries dropped"   (v-: the record has no version field)
//   "0xB193 v- 1071 not decoded"
// Outcomes: "decoded as is", "adapted", "dropped", "unknown version"; codes of which no layouts are known
// show as "decoded as is" when the technology decodes them, and every record of a code it does not decode as
// "not decoded". Without a technology (the service, which does not decode) the first show as "passed on".
// Codes that the technology decodes come first. A last line "unframed N" counts blobs without framing, if
// any.
#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "logfile/PacketVersionAdapter.h"

namespace velmar {

struct CensusEntry {
    std::int32_t logCode = 0;
    std::int16_t version = kNoVersion;
    std::array<std::uint64_t, kVersionOutcomeCount> records{};  // by VersionOutcome
    std::uint64_t clamped = 0;
    std::uint64_t droppedEntries = 0;
    std::uint64_t missingEntries = 0;

    std::uint64_t count(VersionOutcome outcome) const { return records[static_cast<std::size_t>(outcome)]; }
    std::uint64_t total() const;
};

class PacketCensus {
  public:
    bool add(const AdaptedPacket& packet);

    // Every (code, version) counted, in order of code and then version.
    std::vector<CensusEntry> entries() const;
    std::uint64_t unframed() const { return unframed_; }
    std::uint64_t records() const { return records_; }

  private:
    std::map<std::uint64_t, CensusEntry> entries_;
    CensusEntry* last_ = nullptr;  // the entry of the previous record: streams repeat codes
    std::uint64_t lastKey_ = 0;
    std::uint64_t unframed_ = 0;
    std::uint64_t records_ = 0;
};

// Whether the technology's generator decodes a log code (as decoders know it); empty: no technology.
using DecodedCodes = std::function<bool(std::int32_t logCode)>;

std::vector<std::string> censusReport(const PacketCensus& census, const DecodedCodes& decoded);

}  // namespace velmar
