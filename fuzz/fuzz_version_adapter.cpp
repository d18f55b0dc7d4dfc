// Fuzz target: the packet-version adapter, its census, and the decoders behind it.
//
// Input: byte 0 picks the generator (bit 0: GSM/UMTS or LTE, the two whose records have newer versions; bit 1
// set: no generator, the adapter alone, which runs far faster than a generator's set-up); the rest is a
// sequence of blobs, each [length u16 little-endian][bytes]. Each blob is copied to a buffer of exactly its
// size, adapted, counted, adapted again (which must leave it alone, without a copy) and decoded. Nothing may
// crash, leak or read outside a buffer (the SIM-file parser's exception on hostile data is expected, as in
// fuzz_intake), and an adapted record's length field must match its length.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <string_view>
#include <vector>

#include "LogGenerator/GSM/LogCode_0xFF0000.h"
#include "LogGenerator/LogGenerator.h"
#include "core/platform/KxServerProtocol.h"
#include "fuzz/QuietStart.h"
#include "logfile/PacketCensus.h"
#include "logfile/PacketVersionAdapter.h"

namespace {

using velmar::AdaptedPacket;
using velmar::VersionOutcome;

void check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

bool rewritten(const AdaptedPacket& packet) {
    return packet.outcome == VersionOutcome::Adapted || packet.outcome == VersionOutcome::Dropped;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    velmar::fuzzing::quietStart();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace velmar;
    if (size == 0) {
        return 0;
    }
    const std::string_view technology =
        data[0] % 2 == 0 ? kKxLogChannelTechnology_Orvane_LTE : kKxLogChannelTechnology_Orvane_GSM;
    std::unique_ptr<LogGenerator> generator =
        (data[0] & 2) == 0 ? LogGenerator::generatorFromTechnology(technology) : nullptr;
    const StateDict state = PlistDictionary::create();
    PacketVersionAdapter adapter;
    PacketVersionAdapter again;
    PacketCensus census;
    std::size_t at = 1;
    while (at + 2 <= size) {
        const std::size_t length = data[at] | static_cast<std::size_t>(data[at + 1]) << 8;
        at += 2;
        const std::size_t available = std::min(length, size - at);
        const std::vector<std::uint8_t> blob(data + at, data + at + available);
        at += available;

        const AdaptedPacket adapted = adapter.adapt(blob);
        census.add(adapted);
        if (!rewritten(adapted)) {
            check(adapted.blob.data() == blob.data() && adapted.blob.size() == blob.size());
        } else {
            const std::vector<std::uint8_t> out(adapted.blob.begin(), adapted.blob.end());
            check(out.size() >= 14 && static_cast<std::size_t>(out[1] | out[2] << 8) == out.size() - 1);
            const AdaptedPacket twice = again.adapt(out);
            check(twice.outcome == VersionOutcome::DecodedAsIs && twice.blob.data() == out.data());
        }
        if (generator) {
            try {
                generator->updateState(state, adapted.blob);
            } catch (const LogCode_0xFF0000::UnknownDataException&) {
                // A SIM-file record that is not a property list ends the program by design; not a finding.
                return 0;
            }
        }
    }
    censusReport(census, [](std::int32_t code) { return code >= 0xB000; });
    censusReport(census, nullptr);
    if (generator) {
        generator->generateLogUsingState(state);
    }
    return 0;
}
