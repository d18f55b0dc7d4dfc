#include "LogGenerator/UTRAN/RRC_State.h"

#include <string>
#include "LogGenerator/UTRAN/UTRANClassIndex.h"

#include "LogGenerator/RecordFields.h"
#include "LogGenerator/RecordRule.h"
#include "core/platform/Json.h"
#include "core/platform/logcodes/UtranLogCodes.h"

namespace velmar {

namespace {

constexpr const DecoderRow& kRow = rowOf(kUtranDecoders, "RRC_State");

constexpr std::size_t kExpectedLength = 15;

constexpr std::size_t kModeValidOffset = 13;
constexpr std::size_t kModeOffset = 14;
constexpr std::uint32_t kUnknownMode = 255;

constexpr ValueName kStateRows[] = {
    {0, 0, "Disconnected"}, {1, 1, "Connecting"}, {2, 2, "Cell Fach"},
    {3, 3, "Cell DCH"},     {4, 4, "Cell PCH"},   {5, 5, "Cell URA PCH"},
};
constexpr ValueNames kStateNames{kStateRows, "Unknown RRC Mode"};

void writeRrcState(ByteView data, const PlistDictionaryRef& section) {
    if (data.size() < kExpectedLength) {
        SystemLog::log(kLogWarning, "LogCode_0xD0E0 is length is %ld expected size %ld",
                       static_cast<long>(data.size()), static_cast<long>(kExpectedLength));
    }
    const RecordReader record(data);
    const std::uint32_t mode = record.u8(kModeValidOffset) == 1 ? record.u8(kModeOffset) : kUnknownMode;
    const std::string state = kStateNames.nameOf(mode);
    if (section) {
        section->set("State", state);
    }
    if (SystemLog::isEnabled(kLogWarning)) {
        const std::string description = section ? plistToJson(PlistValue(section)) : std::string("(null)");
        SystemLog::log(kLogWarning, "Display Dict = %s, rrc mode = %d %s", description.c_str(),
                       static_cast<int>(mode), state.c_str());
    }
}

// The length is only reported, never enforced.
constexpr RecordRule kRules[] = {{kLogCodeUtranRrcState, 0, {}, &writeRrcState}};
constexpr DecoderRules kDecoderRules{"RRC Info", kRules, DecoderRules::OtherCodes::Ignored};

}  // namespace

RRC_State::RRC_State() : KeySectionDecoder(kRow, kDecoderRules) {}
static_assert(rulesMatch(kRules, kRow));

}  // namespace velmar
