// LogCodeFilter: which blobs one log channel receives, as its start command names them.
//
// Contract: a filter built from a start command takes ordinary packets whose code is in "SetOrvaneLogCodes"
// and extended packets whose code is in "SetKxExtraCodes" (the extra codes count from 0xFF0000, so extra
// code 1 is the extended packet of code 1); a missing list names no code. A filter that takes everything
// (the object-based technology, whose start command names no codes) also takes blobs of no known framing.
// Lookups are a bit test, so filtering costs the same however many codes a channel asks for.
#pragma once

#include <bitset>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>

#include "core/platform/plist/PlistValue.h"
#include "service/BasebandBlob.h"

namespace velmar {

class LogCodeFilter {
  public:
    static constexpr std::size_t kCodeCount = 0x10000;

    // Takes nothing.
    LogCodeFilter() = default;
    static LogCodeFilter everything();

    // The filter of a start command's code lists. Elements that are not integers in 0..65535 are skipped
    // and counted in ignored; a list key holding something other than an array makes it fail (nullopt,
    // with the reason).
    static std::optional<LogCodeFilter> fromStartCommand(const PlistDictionary& command, std::size_t& ignored,
                                                         std::string& reason);

    void addCode(std::uint16_t code) { codes_.set(code); }
    void addExtraCode(std::uint16_t code) { extraCodes_.set(code); }
    // Takes, from now on, whatever other takes too.
    void unite(const LogCodeFilter& other) {
        all_ = all_ || other.all_;
        codes_ |= other.codes_;
        extraCodes_ |= other.extraCodes_;
    }

    bool accepts(const BasebandBlob& blob) const {
        switch (blob.kind) {
            case BlobKind::Ordinary:
                return all_ || codes_.test(blob.code);
            case BlobKind::Extended:
                return all_ || extraCodes_.test(blob.code);
            case BlobKind::Unframed:
                break;
        }
        return all_;
    }

    bool takesEverything() const { return all_; }
    bool operator==(const LogCodeFilter&) const = default;
    const std::bitset<kCodeCount>& codes() const { return codes_; }
    std::size_t codeCount() const { return codes_.count(); }
    std::size_t extraCodeCount() const { return extraCodes_.count(); }

  private:
    bool all_ = false;
    std::bitset<kCodeCount> codes_;
    std::bitset<kCodeCount> extraCodes_;
};

}  // namespace velmar
