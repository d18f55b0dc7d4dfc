// 0x119C, 1x status: at least 17 bytes, carrying the subpackets 1 (state), 2 (radio), 3 (active set) and
// 4 (fingers), which must all be present. The second receive chain and the transmitter are shown only in the
// Traffic state; outside it a traffic frame-error rate still held in the state is shown one last time,
// marked "(old)", and forgotten.
#include "LogGenerator/C2K/C2KFerFilter.h"
#include "LogGenerator/C2K/C2KLogParsers.h"
#include "LogGenerator/C2K/C2KPilotStrength.h"
#include "LogGenerator/C2K/C2KSortedPilots.h"
#include "LogGenerator/C2K/C2KStateKeys.h"
#include "LogGenerator/C2K/C2KSubpackets.h"
#include "LogGenerator/C2K/C2KValueNames.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar::c2k {

namespace {

constexpr std::size_t kMinimumLength = 17;
constexpr std::uint8_t kStateSubpacket = 1;
constexpr std::uint8_t kRadioSubpacket = 2;
constexpr std::uint8_t kActiveSetSubpacket = 3;
constexpr std::uint8_t kFingerSubpacket = 4;

// Offsets within the state subpacket.
constexpr std::size_t kDeviceStateOffset = 4;

// Radio subpacket; AGC raw × 0.334 − 63.248 dBm, transmit power in tenths of a dB.
constexpr RecordField kReceiveFields[] = {
    u8Field(4, "k1xRx0BandClass", asName(kBandClassNames)),
    u16Field(6, "k1xRx0ChanNum"),
    s8Field(10, "k1xRxAGC0", asDouble("%+.2f dBm", 0.334, -63.248)),
};
constexpr RecordField kTrafficFields[] = {
    u8Field(5, "k1xRx1BandClass", asName(kBandClassNames)),
    u16Field(8, "k1xRx1ChanNum"),
    s8Field(11, "k1xRxAGC1", asDouble("%+.2f dBm", 0.334, -63.248)),
    s16Field(12, "k1xTxAGC", asDouble("%+.2f dBm", 0.1)),
};

// Active-set subpacket. Pilot entries follow one another from the start of the subpacket, each
// ((6 × F + 15) rounded down to a multiple of 4) bytes long.
constexpr std::size_t kLOffset = 4;
constexpr std::size_t kMOffset = 6;
constexpr std::size_t kQOffset = 7;
constexpr std::size_t kPilotCountOffset = 8;
constexpr std::size_t kFOffset = 9;
constexpr std::size_t kReferencePilotOffset = 10;
constexpr std::size_t kEntryPilotOffset = 12;
constexpr std::size_t kEntryEnergyOffset = 24;  // + 4 × F

PlistDictionaryRef activeSetPilots(const RecordReader& packet, std::size_t subpacket) {
    const std::uint32_t pilotCount = packet.u8(subpacket + kPilotCountOffset);
    const std::uint32_t f = packet.u8(subpacket + kFOffset);
    const std::uint32_t l = packet.u16(subpacket + kLOffset);
    const std::uint32_t m = packet.u8(subpacket + kMOffset);
    const std::uint32_t q = packet.u8(subpacket + kQOffset);
    const std::uint32_t referencePilot = packet.u16(subpacket + kReferencePilotOffset);
    const std::size_t entrySize = (6 * f + 15) & ~std::size_t{3};

    PlistDictionaryRef pilots = newSortedPilotDictionary();
    for (std::uint32_t index = 0; index < pilotCount; ++index) {
        const std::size_t entry = subpacket + entrySize * index;
        const std::uint32_t pilot = packet.u16(entry + kEntryPilotOffset);
        const std::uint32_t energy = packet.u16(entry + kEntryEnergyOffset + 4 * f);
        const double energyDb = activeSetPilotEnergyDb(energy, l, m, q);
        pilots->set(sortedPilotKey(static_cast<int>(index), static_cast<int>(pilot)),
                    pilot == referencePilot ? stringWithFormat("(ref pilot) %+.2f dB", energyDb)
                                            : stringWithFormat("%+.2f dB", energyDb));
    }
    return pilots;
}

}  // namespace

void parse1xStatus(const RecordReader& packet, const C2KRecordContext& context) {
    if (packet.size() < kMinimumLength) {
        SystemLog::log(kLogError, "Log code 0x119c is %u bytes long but must be at least %lu bytes.",
                       static_cast<unsigned>(packet.size()), static_cast<unsigned long>(kMinimumLength));
        return;
    }
    const std::optional<std::size_t> state = findSubpacket(packet, kStateSubpacket);
    const std::optional<std::size_t> radio = findSubpacket(packet, kRadioSubpacket);
    const std::optional<std::size_t> activeSet = findSubpacket(packet, kActiveSetSubpacket);
    const std::optional<std::size_t> fingers = findSubpacket(packet, kFingerSubpacket);
    if (!state || !radio || !activeSet || !fingers) {
        SystemLog::log(kLogWarning, "Log code 0x119c: missing subpacket (ss=%d,rf=%d,ai=%d,fi=%d).",
                       state ? 1 : 0, radio ? 1 : 0, activeSet ? 1 : 0, fingers ? 1 : 0);
        return;
    }

    const std::uint32_t deviceState = packet.u8(*state + kDeviceStateOffset);
    context.show("k1xDeviceState", PlistValue(k1xDeviceStateNames.nameOf(deviceState)));
    writeDisplayFields(kReceiveFields, packet, *radio, context.lookup);
    const bool traffic = deviceState == k1xTrafficState;
    if (traffic) {
        writeDisplayFields(kTrafficFields, packet, *radio, context.lookup);
    } else {
        for (const RecordField& field : kTrafficFields) {
            context.show(field.key, PlistValue("N/A"));
        }
    }

    context.show("k1xActiveSetInfo", PlistValue(activeSetPilots(packet, *activeSet)));

    if (!traffic) {
        const std::optional<double> rate = storedTrafficFer(context.state);
        if (rate) {
            context.show("k1xTrafficFER", PlistValue(stringWithFormat("%.02f%% (old)", *rate * 100.0)));
            context.state.remove(kTrafficFerKey);
        }
    }
}

}  // namespace velmar::c2k
