// DecoderMap: which decoder handles which log code in a live generator, as velmar-decode --list-decoders
// shows it.
//
// Contract: the map of a log-code generator is its class index's subscriptions (ClassIndex::subscriptions):
// every code in dispatch order with each subscriber's class and section, then the decoders that subscribe to
// no code; the map of the CDMA2000 generator is its parser table (its parsers fill no section of their own).
// A generator that dispatches no log codes (the object-based one, or one that could not be initialised) has
// no map.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "LogGenerator/LogGenerator.h"

namespace velmar {

struct DecoderMapEntry {
    std::optional<std::int32_t> code;  // none for a decoder that subscribes to no code
    std::string decoder;
    std::string section;  // empty when the decoder fills no section of its own
};

std::optional<std::vector<DecoderMapEntry>> decoderMapOf(const LogGenerator& generator);

}  // namespace velmar
