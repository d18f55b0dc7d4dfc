#include "LogGenerator/RecordRule.h"

namespace velmar {

void logDecoderTitle(const char* title, int priority) {
    SystemLog::log(priority, "%s", title);
}

void reportUnknownLogMessage(std::int32_t logCode) {
    SystemLog::log(kLogError, "Received an unknown log message: %d", logCode);
}

const RecordRule* admitRecord(const DecoderRules& decoder, ByteView record, std::int32_t logCode) {
    logDecoderTitle(decoder.title, decoder.titlePriority);
    for (const RecordRule& rule : decoder.rules) {
        if (rule.code == logCode) {
            return record.size() >= rule.minimumLength ? &rule : nullptr;
        }
    }
    if (decoder.otherCodes == DecoderRules::OtherCodes::Reported) {
        reportUnknownLogMessage(logCode);
    }
    return nullptr;
}

void writeRecord(const RecordRule& rule, ByteView record, const PlistDictionaryRef& section) {
    if (rule.write != nullptr) {
        rule.write(record, section);
    } else if (section) {
        writeFields(rule.fields, RecordReader(record), 0, *section);
    }
}

}  // namespace velmar
