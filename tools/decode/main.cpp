// velmar-decode: feeds recorded baseband blobs through the packet-version adapter and a technology's
// generator, exactly as the service and the monitor's model do, and prints the display (or the whole state,
// or the save contents) as JSON, or the adapter's census or the decoder map.
//
// Standard output carries that only (StandardOutputDiversion): the generator family's own lines go to
// standard error with --log-stderr, like the log lines, and nowhere otherwise, so that a failure prints one
// line only.
#include <algorithm>
#include <cstdio>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "LogGenerator/DecoderMap.h"
#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/ORVLogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "LogGenerator/SubscribedCodes.h"
#include "core/platform/BasebandPacket.h"
#include "core/platform/BasebandTime.h"
#include "core/platform/BuildInfo.h"
#include "core/platform/CommandLine.h"
#include "core/platform/Json.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/StandardOutputDiversion.h"
#include "core/platform/SystemLog.h"
#include "logfile/LogFormat.h"
#include "logfile/PacketCensus.h"
#include "logfile/PacketVersionAdapter.h"
#include "tools/decode/CsvTimeSeries.h"
#include "tools/decode/DecodeOptions.h"
#include "tools/decode/ProgressLine.h"
#include "tools/decode/RecordingClock.h"

namespace velmar {
namespace {

constexpr int kExitUsageOrInput = 2;
constexpr int kPrettyIndent = 2;

// Standard output: JSON documents, or the lines of the census or the decoder map.
class StandardOutput {
  public:
    explicit StandardOutput(bool diagnosticsToStderr) : diversion_(diagnosticsToStderr) {}

    void write(const PlistValue& value, int indent) {
        std::string text = plistToJson(value, indent);
        text.push_back('\n');
        std::fwrite(text.data(), 1, text.size(), diversion_.stream());
        std::fflush(diversion_.stream());
    }

    std::FILE* stream() { return diversion_.stream(); }

    void writeLines(const std::vector<std::string>& lines) {
        for (const std::string& line : lines) {
            std::fputs(line.c_str(), diversion_.stream());
            std::fputc('\n', diversion_.stream());
        }
        std::fflush(diversion_.stream());
    }

  private:
    StandardOutputDiversion diversion_;
};

int fail(const std::string& message) {
    std::fprintf(stderr, "velmar-decode: %s\n", message.c_str());
    return kExitUsageOrInput;
}

void reportCaptureStatistics(const std::string& path, const LogReadStats& stats) {
    if (stats.frames == 0 && stats.badFrames == 0 && stats.badEntries == 0) {
        return;
    }
    SystemLog::log(kLogNotice, "%s: %llu frames, %llu log packets, %llu other frames, %llu wrapped, %llu bad",
                   path.c_str(), static_cast<unsigned long long>(stats.frames),
                   static_cast<unsigned long long>(stats.logPackets),
                   static_cast<unsigned long long>(stats.otherFrames),
                   static_cast<unsigned long long>(stats.wrappedFrames),
                   static_cast<unsigned long long>(stats.badFrames));
    if (stats.badFrames > 0) {
        SystemLog::log(
            kLogError, "%s: %llu bad frames skipped (first at offset %llu)", path.c_str(),
            static_cast<unsigned long long>(stats.badFrames),
            static_cast<unsigned long long>(stats.badFrameOffsets.empty() ? 0 : stats.badFrameOffsets[0]));
    }
    for (const std::string& problem : stats.problems) {
        SystemLog::log(kLogError, "%s", problem.c_str());
    }
}

std::string codeText(const std::optional<std::int32_t>& code) {
    char text[16];
    if (!code) {
        return "none";
    }
    std::snprintf(text, sizeof text, "0x%04X", static_cast<unsigned>(*code));
    return text;
}

// One line per code and decoder, in dispatch order, in aligned columns; the section column only when some
// decoder fills a section of its own.
std::vector<std::string> decoderListing(const std::vector<DecoderMapEntry>& map) {
    const bool withSections = std::any_of(
        map.begin(), map.end(), [](const DecoderMapEntry& entry) { return !entry.section.empty(); });
    std::vector<std::vector<std::string>> rows{{"code", "decoder"}};
    for (const DecoderMapEntry& entry : map) {
        rows.push_back({codeText(entry.code), entry.decoder});
    }
    if (withSections) {
        rows[0].push_back("section");
        for (std::size_t i = 0; i < map.size(); ++i) {
            rows[i + 1].push_back(map[i].section);
        }
    }
    std::vector<std::size_t> widths(rows[0].size(), 0);
    for (const auto& row : rows) {
        for (std::size_t column = 0; column < row.size(); ++column) {
            widths[column] = std::max(widths[column], row[column].size());
        }
    }
    std::vector<std::string> lines;
    for (const auto& row : rows) {
        std::string& line = lines.emplace_back();
        for (std::size_t column = 0; column < row.size(); ++column) {
            line += row[column];
            if (column + 1 < row.size()) {
                line.append(widths[column] - row[column].size() + 2, ' ');
            }
        }
    }
    return lines;
}

// Whether the generator's start command subscribes to a log code (extra codes count from 0xFF0000).
DecodedCodes codesOfStartCommand(const PlistValue& command) {
    auto codes = std::make_shared<std::set<std::int32_t>>();
    if (const PlistDictionaryRef dictionary = command.dictionary()) {
        for (const auto& [key, base] :
             {std::pair{kKxSetLogCodesKey, 0}, std::pair{kKxSetExtraCodesKey, kExtendedCodeBase}}) {
            const PlistValue list = dictionary->get(std::string(key));
            if (!list.isArray()) {
                continue;
            }
            for (const PlistValue& code : *list.array()) {
                if (const auto value = code.integerValue()) {
                    codes->insert(static_cast<std::int32_t>(*value + base));
                }
            }
        }
    }
    return [codes](std::int32_t logCode) { return codes->contains(logCode); };
}

int run(const DecodeOptions& options) {
    StandardOutput json(options.logStderr);
    std::unique_ptr<LogGenerator> generator =
        LogGenerator::generatorFromTechnology(options.technologyConstant);
    if (!generator) {
        return fail("technology '" + options.technology + "' has no generator in this build");
    }
    if (options.startCommand) {
        json.write(generator->getStartCommand(), 0);
        return 0;
    }
    if (options.listDecoders) {
        const std::optional<std::vector<DecoderMapEntry>> map = decoderMapOf(*generator);
        if (!map) {
            return fail("technology '" + options.technology + "' dispatches no log codes");
        }
        json.writeLines(decoderListing(*map));
        return 0;
    }

    // Only the state and the save contents show the raw blobs of an interval: without them, a recording of
    // any length decodes in bounded memory.
    if (options.output == DecodeOptions::Output::Display && !options.saveContents) {
        if (auto* binary = dynamic_cast<ORVLogGenerator*>(generator.get())) {
            binary->setGathersRawBlobs(false);
        }
    }
    const StateDict state = PlistDictionary::create();
    auto shownValue = [&]() -> PlistValue {
        return options.output == DecodeOptions::Output::State ? PlistValue(state)
                                                              : state->get(state_keys::kDisplay);
    };
    std::optional<CsvTimeSeries> csv;
    if (options.csv) {
        csv.emplace(options.csvPaths, json.stream());
    }
    auto refresh = [&](std::optional<std::int64_t> time) {
        generator->generateLogUsingState(state);
        if (csv) {
            csv->addRefresh(time, state->get(state_keys::kDisplay));
        } else if (options.everyTick && !options.saveContents) {
            json.write(shownValue(), 0);
        }
    };
    // With --every (or --csv) refreshes follow the packets' timestamps instead of the input's own ticks.
    std::optional<RecordingClock> clock;
    if (options.everyMicroseconds > 0) {
        clock.emplace(options.everyMicroseconds);
    }
    auto advanceClock = [&](ByteView blob) {
        const BasebandPacket framed = frameBasebandPacket(blob);
        if (!framed.hasHeader()) {
            return;
        }
        if (const std::optional<std::int64_t> time = unixMicrosecondsOfBasebandTimestamp(framed.timestamp)) {
            if (const std::optional<std::int64_t> due = clock->refreshBefore(*time)) {
                refresh(due);
            }
        }
    };

    // Every blob passes the packet-version adapter on its way to the generator, as in the service. After the
    // first, packets of codes that no decoder reads skip both, as a live modem would not send them.
    PacketVersionAdapter adapter;
    PacketCensus census;
    const std::optional<SubscribedCodes> subscribed = SubscribedCodes::of(*generator);
    bool generatorHasSeenAPacket = false;
    auto intake = [&](ByteView blob) {
        if (options.census) {
            census.add(adapter.adapt(blob));
            return;
        }
        if (subscribed && generatorHasSeenAPacket && !subscribed->passes(blob)) {
            return;
        }
        generatorHasSeenAPacket = true;
        if (options.rawVersions) {
            generator->updateState(state, blob);
        } else {
            generator->updateState(state, adapter.adapt(blob).blob);
        }
    };
    for (const std::string& path : options.files) {
        std::string error;
        LogReadStats stats;
        ProgressLine progress(stderr, path);
        std::uint64_t packets = 0;
        const bool read = forEachLogItem(
            path, options.format,
            [&](const LogItemView& item) {
                if (!item.isTick()) {
                    progress.update(item.offset, ++packets);
                    if (clock && !options.census) {
                        advanceClock(item.bytes);
                    }
                    intake(item.bytes);
                } else if (!options.census && !clock) {
                    refresh(std::nullopt);
                }
                return true;
            },
            error, &stats);
        progress.finish();
        reportCaptureStatistics(path, stats);
        if (!read) {
            return fail(error);
        }
    }
    if (options.census) {
        json.writeLines(censusReport(census, codesOfStartCommand(generator->getStartCommand())));
        return 0;
    }
    refresh(clock ? clock->currentPeriodEnd() : std::nullopt);
    if (csv) {
        csv->finish();
        return 0;
    }

    if (options.saveContents) {
        json.write(generator->getSaveContentsFromState(state), kPrettyIndent);
    } else if (!options.everyTick) {
        json.write(shownValue(), kPrettyIndent);
    }
    return 0;
}

}  // namespace
}  // namespace velmar

int main(int argc, char** argv) {
    using namespace velmar;
    // An offline tool does not write the system journal: lines go nowhere unless --log-stderr mirrors them.
    SystemLog::setSink([](int, const std::string&) {});
    if (const char* level = std::getenv("VELMAR_LOG_LEVEL")) {
        if (const int parsed = SystemLog::parseLevel(level); parsed >= 0) {
            SystemLog::setThreshold(parsed);
        }
    }
    std::string error;
    const auto options = parseDecodeOptions(commandLineArguments(argc, argv), error);
    if (!options) {
        std::fprintf(stderr, "velmar-decode: %s (see --help)\n", error.c_str());
        return 2;
    }
    if (options->help) {
        std::fputs(decodeUsage().c_str(), stdout);
        return 0;
    }
    if (options->version) {
        std::fputs(BuildInfo::versionText("velmar-decode").c_str(), stdout);
        return 0;
    }
    SystemLog::setMirrorToStderr(options->logStderr);
    return run(*options);
}
