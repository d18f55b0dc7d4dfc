#include "LogGenerator/ORVLogGenerator.h"

#include "LogGenerator/DlfVersionReport.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/BuildInfo.h"
#include "core/platform/Clock.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar {

ORVLogGenerator::ORVLogGenerator() : _binData(std::make_shared<PlistData>()) {}

std::optional<std::string> ORVLogGenerator::applicationVersion() const {
    return BuildInfo::applicationVersion();
}

std::string ORVLogGenerator::dlfVersionText(const std::optional<std::string>& applicationVersion) {
    return applicationVersion ? "Velmar " + *applicationVersion : std::string("(none)");
}

PlistDataRef ORVLogGenerator::takeBinData() {
    if (!_gathersRawBlobs) {
        return std::make_shared<PlistData>();
    }
    PlistDataRef taken = std::move(_binData);
    _binData = std::make_shared<PlistData>();
    return taken;
}

void ORVLogGenerator::setGathersRawBlobs(bool gathers) {
    _gathersRawBlobs = gathers;
    if (!gathers) {
        _binData = nullptr;
    } else if (!_binData) {
        _binData = std::make_shared<PlistData>();
    }
}

PlistDataRef ORVLogGenerator::generateDlfFromState(const StateDict& state) {
    auto file = std::make_shared<PlistData>(kDlfVersionReportLength, 0);

    const std::string versionText = dlfVersionText(applicationVersion());
    const double now = Clock::now();
    const auto seconds = static_cast<std::int64_t>(now);
    const LocalZoneInfo zone = Clock::localZoneAt(seconds);
    const auto zoneMinutes = static_cast<std::int16_t>(zone.utcOffsetSeconds / 60);
    const std::uint64_t timeInfo =
        packDlfTimeInfo(static_cast<std::uint32_t>(seconds), zoneMinutes, zone.daylightSaving);

    std::uint32_t written = 0;
    const std::string buildDate = BuildInfo::buildDateTime();
    const std::int32_t result =
        MoxDLFAddVersionReport(file->data(), kDlfVersionReportLength, &written, 1, 1, versionText.c_str(),
                               "EXECUTABLE_NAME", buildDate.c_str(), timeInfo);
    if (result != 0) {
        SystemLog::log(kLogRaw16, "Could not write DLF header (result=%d)", result);
        return nullptr;
    }

    if (const PlistArrayRef history = state->get(state_keys::kHistory).array()) {
        for (const PlistValue& entry : *history) {
            const PlistDictionaryRef& fields = entry.dictionary();
            const PlistValue* displayState = fields ? fields->find(state_keys::kDisplayState) : nullptr;
            if (displayState == nullptr || displayState->isNone()) {
                continue;
            }
            const PlistDataRef& bytes = displayState->dataValue();
            if (!bytes) {
                SystemLog::log(kLogRaw16,
                               "Got wrong class writing history to DLF; aborting writing the DLF file");
                return nullptr;
            }
            if (bytes->size() >= 2) {
                file->insert(file->end(), bytes->begin() + 1, bytes->end());
            }
        }
    }
    return file;
}

PlistValue ORVLogGenerator::getSaveContentsFromState(const StateDict& state) {
    auto contents = PlistArray::create();
    if (const PlistArrayRef history = state->get(state_keys::kHistory).array()) {
        contents->items() = history->items();
    }
    if (PlistDataRef file = generateDlfFromState(state)) {
        auto dlfEntry = PlistDictionary::create();
        dlfEntry->set(state_keys::kDescription,
                      stringWithFormat("DLF binary (%d bytes)", static_cast<int>(file->size())));
        dlfEntry->set("DLF", PlistValue(std::move(file)));
        contents->append(std::move(dlfEntry));
    }
    return contents;
}

}  // namespace velmar
