// 0x12B6, EV-DO active set: at least 25 bytes; byte 15 counts the 12-byte pilot entries that start at 25,
// each with its PN (16 bits at 0) and its strength (16 bits at 2, in units of 1/512).
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "LogGenerator/C2K/C2KPilotStrength.h"
#include "LogGenerator/C2K/C2KSortedPilots.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar::c2k {

namespace {
constexpr std::size_t kMinimumLength = 25;
constexpr std::size_t kCountOffset = 15;
constexpr std::size_t kFirstEntryOffset = 25;
constexpr std::size_t kEntrySize = 12;
constexpr std::size_t kPilotOffset = 0;
constexpr std::size_t kStrengthOffset = 2;
}  // namespace

void parseEvdoActiveSet(const RecordReader& packet, const C2KRecordContext& context) {
    const std::size_t length = packet.size();
    if (length < kMinimumLength) {
        SystemLog::log(kLogError, "Log code 0x12b6 is %u bytes long but must be at least %lu bytes.",
                       static_cast<unsigned>(length), static_cast<unsigned long>(kMinimumLength));
        return;
    }
    const std::uint32_t count = packet.u8(kCountOffset);
    if (length < kFirstEntryOffset + kEntrySize * count) {
        SystemLog::log(kLogError, "Log code 0x12b6 is %u bytes long, but has %d substructs.",
                       static_cast<unsigned>(length), static_cast<int>(count));
        return;
    }
    if (count == 0) {
        context.show("kActiveSetPilots", PlistValue(kNoPilots));
        return;
    }
    PlistDictionaryRef pilots = newSortedPilotDictionary();
    for (std::uint32_t index = 0; index < count; ++index) {
        const std::size_t entry = kFirstEntryOffset + kEntrySize * index;
        const auto pilot = static_cast<int>(packet.u16(entry + kPilotOffset));
        const double strength = evdoPilotStrengthDb(packet.u16(entry + kStrengthOffset));
        pilots->set(sortedPilotKey(static_cast<int>(index), pilot), stringWithFormat("%+.2f dB", strength));
    }
    context.show("kActiveSetPilots", PlistValue(std::move(pilots)));
}

}  // namespace velmar::c2k
