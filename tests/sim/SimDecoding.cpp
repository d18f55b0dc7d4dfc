#include "tests/sim/SimDecoding.h"

#include <array>
#include <cmath>

#include "LogGenerator/StateKeys.h"
#include "core/platform/KxServerProtocol.h"

namespace velmar::testing {

PlistValue SimDecodingResult::display() const {
    return state ? state->get(state_keys::kDisplay) : PlistValue();
}

std::string_view technologyConstantOf(std::string_view name) {
    constexpr std::array<std::pair<std::string_view, std::string_view>, 5> kConstants = {{
        {"gsm", kKxLogChannelTechnology_Orvane_GSM},
        {"lte", kKxLogChannelTechnology_Orvane_LTE},
        {"utran", kKxLogChannelTechnology_Orvane_UTRAN2},
        {"cdma", kKxLogChannelTechnology_Orvane_CDMA},
        {"ifx", kKxLogChannelTechnology_IFX},
    }};
    for (const auto& [technology, constant] : kConstants) {
        if (technology == name) {
            return constant;
        }
    }
    return {};
}

SimDecodingResult runSimDecoding(const SimDecodingSettings& settings) {
    SimDecodingResult result;
    if (settings.decode) {
        result.generator = LogGenerator::generatorFromTechnology(technologyConstantOf(settings.technology));
    }
    result.state = PlistDictionary::create();

    sim::SimSettings simSettings;
    simSettings.technology = settings.technology;
    simSettings.seed = settings.seed;
    simSettings.scenario = settings.scenario;
    simSettings.startTimestamp = settings.startTimestamp;
    sim::SimulatedBaseband baseband(simSettings);

    const auto take = [&result](ByteView blob) {
        result.blobs.emplace_back(blob.begin(), blob.end());
        if (result.generator) {
            result.generator->updateState(result.state, blob);
        }
    };
    const int wholeSeconds = static_cast<int>(std::floor(settings.seconds));
    for (int second = 0; second <= wholeSeconds; ++second) {
        baseband.runUntil(second, take);
        result.snapshots.push_back(baseband.snapshot());
        if (result.generator && second > 0) {
            result.generator->generateLogUsingState(result.state);
        }
    }
    if (settings.seconds > wholeSeconds) {
        baseband.runUntil(settings.seconds, take);
    }
    if (result.generator) {
        result.generator->generateLogUsingState(result.state);
    }
    return result;
}

PlistValue findInDisplay(const PlistValue& tree, std::string_view key) {
    if (const PlistDictionaryRef& dictionary = tree.dictionary()) {
        if (const PlistValue* found = dictionary->find(key)) {
            return *found;
        }
        for (const auto& [name, value] : dictionary->entries()) {
            if (PlistValue found = findInDisplay(value, key); !found.isNone()) {
                return found;
            }
        }
    } else if (const PlistArrayRef& array = tree.array()) {
        for (std::size_t index = 0; index < array->size(); ++index) {
            if (PlistValue found = findInDisplay(array->at(index), key); !found.isNone()) {
                return found;
            }
        }
    }
    return {};
}

std::int32_t logCodeOf(const PlistData& blob) {
    if (blob.size() < 5) {
        return -1;
    }
    const std::int32_t code = blob[3] | (blob[4] << 8);
    return blob[0] == 0xFF ? 0xFF0000 + code : code;
}

}  // namespace velmar::testing
