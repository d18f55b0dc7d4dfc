// RecordingDecoder: a decoder for the framework's tests that records every packet it is handed, and a class
// index and generator built from such decoders.
#pragma once

#include <string>
#include <vector>

#include "LogGenerator/ClassIndex.h"
#include "LogGenerator/ORVLogGenerator2.h"

namespace velmar::testing {

struct ReceivedPacket {
    std::string decoder;
    std::int32_t code;
    std::vector<std::uint8_t> packet;
};

// Every call of every RecordingDecoder, in order.
inline std::vector<ReceivedPacket>& receivedPackets() {
    static std::vector<ReceivedPacket> log;
    return log;
}

class RecordingDecoder : public Base {
  public:
    RecordingDecoder(std::string section, LogCodeArray codes)
        : section_(std::move(section)), codes_(std::move(codes)) {}
    void updateWithData(ByteView data, std::int32_t logCode) override {
        receivedPackets().push_back({section_, logCode, std::vector<std::uint8_t>(data.begin(), data.end())});
        // Writes the packet length into its section so tests can see that binding worked.
        if (auto dictionary = sectionDictionary()) {
            dictionary->set("Length", std::to_string(data.size()));
        }
    }
    std::string_view getSectionName() const override { return section_; }
    LogCodeArray getLogCodeArray() const override { return codes_; }

  private:
    std::string section_;
    LogCodeArray codes_;
};

// A class index whose decoders are given as (section, codes) pairs, created in order.
class RecordingClassIndex : public ClassIndex {
  public:
    RecordingClassIndex(std::vector<std::pair<std::string, LogCodeArray>> decoders) {
        for (auto& [section, codes] : decoders) {
            auto decoder = std::make_shared<RecordingDecoder>(section, codes);
            classDict.set(decoder->getSectionName(), decoder);
            decoder->updateLogCodeDict(codeDictionary);
        }
    }
};

class RecordingGenerator : public ORVLogGenerator2 {
  public:
    RecordingGenerator(std::string templateName, std::vector<std::pair<std::string, LogCodeArray>> decoders)
        : ORVLogGenerator2(std::move(templateName),
                           std::make_shared<RecordingClassIndex>(std::move(decoders))) {}
    std::optional<std::string> applicationVersion() const override { return version; }
    std::optional<std::string> version = std::string("1234");
    const PlistDataRef& binData() const { return _binData; }
};

}  // namespace velmar::testing
