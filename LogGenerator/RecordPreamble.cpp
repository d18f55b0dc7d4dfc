#include "LogGenerator/RecordPreamble.h"

namespace velmar {

void logDecoderTitle(const char* title, int priority) {
    SystemLog::log(priority, "%s", title);
}

void reportUnknownLogMessage(std::int32_t logCode) {
    SystemLog::log(kLogError, "Received an unknown log message: %d", logCode);
}

bool acceptRecord(const RecordPreamble& preamble, ByteView data, std::int32_t logCode) {
    logDecoderTitle(preamble.title, preamble.titlePriority);
    if (logCode != preamble.logCode) {
        if (preamble.otherCodes == RecordPreamble::OtherCodes::Reported) {
            reportUnknownLogMessage(logCode);
        }
        return false;
    }
    return data.size() >= preamble.minimumLength;
}

}  // namespace velmar
