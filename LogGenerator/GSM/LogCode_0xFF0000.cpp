#include "LogGenerator/GSM/LogCode_0xFF0000.h"

#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar::LogCode_0xFF0000 {

namespace {
constexpr std::size_t kRecordHeaderLength = 13;
}

SimFileDictionary::SimFileDictionary(ByteView record) {
    const ByteView body =
        record.size() > kRecordHeaderLength ? record.subspan(kRecordHeaderLength) : ByteView();
    if (auto parsed = parsePropertyList(body)) {
        files_ = parsed->dictionary();
    }
    if (!files_) {
        SystemLog::log(kLogError, "SIM File dictionary data could not be constructed");
        throw UnknownDataException();
    }
}

}  // namespace velmar::LogCode_0xFF0000
