// Fuzz target: blob intake, dispatch and decoding, refreshes, save contents and the display tree.
//
// Input: byte 0 picks the generator (every log-code technology that this build's factory yields, or a class
// index of byte-reading decoders for the framework alone); the rest is a sequence of blobs, each
// [length u8][bytes]. A blob of length 0 stands for a display refresh. Nothing may crash, leak or read
// outside a buffer. The one exception that the decoders throw on hostile data by design, the SIM-file
// parser's, is an expected outcome.
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string_view>

#include "LogGenerator/ClassIndex.h"
#include "LogGenerator/GSM/LogCode_0xFF0000.h"
#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/ORVLogGenerator2.h"
#include "core/ArrayLock.h"
#include "core/VelmarModelNode.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/RecordReader.h"
#include "core/platform/SystemLog.h"
#include "fuzz/QuietStart.h"

namespace velmar {
namespace {

// Reads every byte of whatever record it is handed, and keeps a row per record in its list section.
class ByteReadingDecoder : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t) override {
        const RecordReader record(data);
        std::uint64_t sum = 0;
        for (std::size_t offset = 0; offset < record.size() + 8; offset += 3) {
            sum += record.u32(offset) + record.bits(offset, 3, 5, 17);
        }
        if (auto list = sectionArray()) {
            auto row = PlistDictionary::create();
            row->set("Sum", std::to_string(sum));
            Base::replaceArray(list, PlistArray::create({PlistValue(row)}));
        }
    }
    std::string_view getSectionName() const override { return "Bytes"; }
    LogCodeArray getLogCodeArray() const override {
        return std::vector<std::int32_t>{0xB179, 0x4005, 0xFF0001, 0xB179};
    }
};

class ByteReadingIndex : public ClassIndex {
  public:
    ByteReadingIndex() { Base::initWithDict<ByteReadingDecoder>(classDict, codeDictionary); }
};

class FrameworkGenerator : public ORVLogGenerator2 {
  public:
    FrameworkGenerator() : ORVLogGenerator2("FuzzFramework", std::make_shared<ByteReadingIndex>()) {}
};

std::unique_ptr<LogGenerator> generatorFor(std::uint8_t selector) {
    static constexpr std::string_view kTechnologies[] = {
        kKxLogChannelTechnology_Orvane_GSM, kKxLogChannelTechnology_Orvane_LTE,
        kKxLogChannelTechnology_Orvane_UTRAN2, kKxLogChannelTechnology_Orvane_CDMA};
    const std::size_t choice = selector % (std::size(kTechnologies) + 1);
    if (choice < std::size(kTechnologies)) {
        if (auto generator = LogGenerator::generatorFromTechnology(kTechnologies[choice])) {
            return generator;
        }
    }
    return std::make_unique<FrameworkGenerator>();
}

void showTree(const PlistValue& display) {
    NodePathDictionary paths;
    VelmarModelNode::makeTreeFromObject(display, paths);
    ArrayLock::releaseOutstandingForTesting();
}

}  // namespace
}  // namespace velmar

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    velmar::fuzzing::quietStart(velmar::kLogDebug);  // format every line: the texts are part of the path
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace velmar;
    if (size == 0) {
        return 0;
    }
    auto generator = generatorFor(data[0]);
    const StateDict state = PlistDictionary::create();
    if (dynamic_cast<FrameworkGenerator*>(generator.get()) != nullptr) {
        // The framework's own generator has no template resource: hand it one through the state.
        auto display = PlistDictionary::create();
        display->set("Bytes", PlistValue::newArray());
        display->set("Label", "static text");
        state->set("Template", display);
    }
    std::size_t at = 1;
    while (at < size) {
        const std::size_t length = data[at++];
        if (length == 0) {
            showTree(generator->generateLogUsingState(state));
            continue;
        }
        const std::size_t available = std::min(length, size - at);
        try {
            generator->updateState(state, ByteView(data + at, available));
        } catch (const LogCode_0xFF0000::UnknownDataException&) {
            // A SIM-file record that is not a property list ends the program by design; not a finding.
            return 0;
        }
        at += available;
    }
    showTree(generator->generateLogUsingState(state));
    generator->getSaveContentsFromState(state);
    return 0;
}
