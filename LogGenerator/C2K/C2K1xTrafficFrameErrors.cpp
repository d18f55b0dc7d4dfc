// 0x119D, 1x traffic frame errors: at least 17 bytes, carrying the traffic demodulation subpacket 11, whose
// byte 24 flags an erased frame. Each packet moves the filtered frame-error rate one frame on.
#include "LogGenerator/C2K/C2KFerFilter.h"
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "LogGenerator/C2K/C2KStateKeys.h"
#include "LogGenerator/C2K/C2KSubpackets.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar::c2k {

namespace {
constexpr std::size_t kMinimumLength = 17;
constexpr std::uint8_t kTrafficDemodSubpacket = 11;
constexpr std::size_t kErasureOffset = 24;
}  // namespace

void parse1xTrafficFrameErrors(const RecordReader& packet, const C2KRecordContext& context) {
    if (packet.size() < kMinimumLength) {
        SystemLog::log(kLogError, "Log code 0x119d is %d bytes long but must be at least %ld bytes.",
                       static_cast<int>(packet.size()), static_cast<long>(kMinimumLength));
        return;
    }
    const std::optional<std::size_t> demod = findSubpacket(packet, kTrafficDemodSubpacket);
    if (!demod) {
        SystemLog::log(kLogWarning, "Log code 0x119d: missing traffic demod subpacket.");
        return;
    }
    const bool erasure = packet.u8(*demod + kErasureOffset) != 0;
    const double rate = filterFrameErrorRate(storedTrafficFer(context.state).value_or(0.0), erasure);
    context.state.set(kTrafficFerKey, PlistValue::real(rate));
    context.show("k1xTrafficFER", PlistValue(stringWithFormat("%.02f%%", rate * 100.0)));
}

}  // namespace velmar::c2k
