// 0x108A, finger C/I: more than 22 bytes; byte 22 counts the 14-byte finger entries that start at 23, and the
// length must be exactly 23 + 14 × count. A finger shows when its pilot (16 bits at 0) is below 65535 (an
// unassigned finger); its C/I is the 16-bit value at 6, in units of 1/512.
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "LogGenerator/C2K/C2KPilotStrength.h"
#include "LogGenerator/C2K/C2KSortedPilots.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar::c2k {

namespace {
constexpr std::size_t kMinimumLength = 23;
constexpr std::size_t kCountOffset = 22;
constexpr std::size_t kFirstEntryOffset = 23;
constexpr std::size_t kEntrySize = 14;
constexpr std::size_t kPilotOffset = 0;
constexpr std::size_t kC2IOffset = 6;
constexpr std::uint32_t kUnassignedPilot = 65535;
}  // namespace

void parseFingerC2I(const RecordReader& packet, const C2KRecordContext& context) {
    const std::size_t length = packet.size();
    if (length < kMinimumLength) {
        SystemLog::log(kLogError, "Log code 0x108a is %u bytes long but must be at least %lu bytes.",
                       static_cast<unsigned>(length), static_cast<unsigned long>(kMinimumLength));
        return;
    }
    const std::uint32_t count = packet.u8(kCountOffset);
    if (length != kFirstEntryOffset + kEntrySize * count) {
        SystemLog::log(kLogError,
                       "Log code 0x108a has bad length of %u bytes, but has %d substructs (size=%lu).",
                       static_cast<unsigned>(length), static_cast<int>(count),
                       static_cast<unsigned long>(kMinimumLength));
        return;
    }
    PlistDictionaryRef fingers = newSortedPilotDictionary();
    for (std::uint32_t index = 0; index < count; ++index) {
        const std::size_t entry = kFirstEntryOffset + kEntrySize * index;
        const std::uint32_t pilot = packet.u16(entry + kPilotOffset);
        if (pilot >= kUnassignedPilot) {
            continue;
        }
        const double c2i = evdoPilotStrengthDb(packet.u16(entry + kC2IOffset));
        fingers->set(sortedPilotKey(static_cast<int>(index), static_cast<int>(pilot)),
                     stringWithFormat("%+.2f dB", c2i));
    }
    // Only the marker: no finger is assigned.
    if (fingers->size() == 1) {
        context.show("kFingerC2I", PlistValue(kNoPilots));
        return;
    }
    context.show("kFingerC2I", PlistValue(std::move(fingers)));
}

}  // namespace velmar::c2k
