// 0x1192 and 0x127E, the EV-DO forward- and reverse-link packet counters. Each yields a sample of its link:
// a sequence number and a byte total, the sum of every packet counter times the payload size of its rate.
//
// 0x1192 (at least 241 bytes): sequence number 32 bits at 13; 56 counters of 32 bits from 17.
// 0x127E (at least 1750 bytes): sequence number 32 bits at 14; three blocks of 576 bytes at 22, 598 and 1174,
// each holding, for the twelve rate classes in turn, 48 bytes of twelve 32-bit counters. The counter of a
// rate class is the sum of eight of them: slots 0 to 2 of the first two blocks and slots 0 and 1 of the
// third.
#include <array>

#include "LogGenerator/C2K/C2KDataRate.h"
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "core/platform/SystemLog.h"

namespace velmar::c2k {

namespace {

constexpr std::size_t kForwardMinimumLength = 241;
constexpr std::size_t kForwardSequenceOffset = 13;
constexpr std::size_t kForwardCountersOffset = 17;

// Payload size of each forward-link counter; 0 for counters that carry no payload.
// clang-format off
constexpr std::array<std::uint32_t, 56> kForwardWeights{
    128, 256, 512, 1024, 0,
    128, 256, 512, 1024, 0,
    128, 256, 512, 1024, 0,
    128, 256, 512, 1024, 0,
    128, 256, 512, 1024, 0,
    512, 1024, 2048, 0,
    128, 256, 512, 1024, 0,
    512, 1024, 2048, 0,
    1024, 3072, 0,
    512, 1024, 2048, 0,
    4096, 0,
    1024, 3072, 0,
    4096, 0,
    5120, 0,
    5120, 0,
};
// clang-format on

constexpr std::size_t kReverseMinimumLength = 1750;
constexpr std::size_t kReverseSequenceOffset = 14;
constexpr std::size_t kReverseBlocksOffset = 22;
constexpr std::size_t kReverseBlockSize = 576;
constexpr std::size_t kReverseClassSize = 48;

constexpr std::array<std::uint32_t, 12> kReverseWeights{128,  256,  512,  768,  1024, 1536,
                                                        2048, 3072, 4096, 6144, 8192, 12288};

struct CounterSlot {
    std::size_t block;
    std::size_t slot;
};
constexpr std::array<CounterSlot, 8> kReverseClassSlots{{
    {0, 0},
    {0, 1},
    {0, 2},
    {1, 0},
    {1, 1},
    {1, 2},
    {2, 0},
    {2, 1},
}};

}  // namespace

void parseForwardLinkRate(const RecordReader& packet, const C2KRecordContext& context) {
    if (packet.size() < kForwardMinimumLength) {
        SystemLog::log(kLogError, "Log code 0x1192 is %d bytes long but must be at least %ld bytes.",
                       static_cast<int>(packet.size()), static_cast<long>(kForwardMinimumLength));
        return;
    }
    std::uint64_t total = 0;
    for (std::size_t i = 0; i < kForwardWeights.size(); ++i) {
        total += std::uint64_t{packet.u32(kForwardCountersOffset + 4 * i)} * kForwardWeights[i];
    }
    recordDataRateSample(kForwardLinkRateKeys, packet.u32(kForwardSequenceOffset), total, context);
}

void parseReverseLinkRate(const RecordReader& packet, const C2KRecordContext& context) {
    if (packet.size() < kReverseMinimumLength) {
        SystemLog::log(kLogError, "Log code 0x127e is %d bytes long but must be at least %ld bytes.",
                       static_cast<int>(packet.size()), static_cast<long>(kReverseMinimumLength));
        return;
    }
    std::uint64_t total = 0;
    for (std::size_t rateClass = 0; rateClass < kReverseWeights.size(); ++rateClass) {
        std::uint64_t packets = 0;
        for (const CounterSlot& counter : kReverseClassSlots) {
            packets += packet.u32(kReverseBlocksOffset + kReverseBlockSize * counter.block +
                                  kReverseClassSize * rateClass + 4 * counter.slot);
        }
        total += packets * kReverseWeights[rateClass];
    }
    recordDataRateSample(kReverseLinkRateKeys, packet.u32(kReverseSequenceOffset), total, context);
}

}  // namespace velmar::c2k
