#include "LogGenerator/GSM/GsmDecoderSupport.h"

#include "LogGenerator/CellInfoArray.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"

namespace velmar::gsm {

void logDecoderEntry(const char* entryLine) {
    SystemLog::log(kLogWarning, "%s", entryLine);
}

void logUnknownCode(std::int32_t logCode) {
    SystemLog::log(kLogError, "Received an unknown log message: %d", logCode);
}

const RecordRule* findRule(std::span<const RecordRule> rules, std::int32_t logCode) {
    for (const RecordRule& rule : rules) {
        if (rule.code == logCode) {
            return &rule;
        }
    }
    return nullptr;
}

const RecordRule* admitRecord(const char* entryLine, std::span<const RecordRule> rules, ByteView record,
                              std::int32_t logCode) {
    logDecoderEntry(entryLine);
    const RecordRule* rule = findRule(rules, logCode);
    if (rule == nullptr) {
        logUnknownCode(logCode);
        return nullptr;
    }
    if (record.size() < rule->minimumLength) {
        return nullptr;
    }
    return rule;
}

LogCodeArray codesOf(std::span<const RecordRule> rules) {
    std::vector<std::int32_t> codes;
    codes.reserve(rules.size());
    for (const RecordRule& rule : rules) {
        codes.push_back(rule.code);
    }
    return codes;
}

void writeRuleFields(const RecordRule& rule, ByteView record, PlistDictionary* section) {
    if (section != nullptr) {
        writeFields(rule.fields, RecordReader(record), 0, *section);
    }
}

PlistDictionaryRef firstMatchingCell(ByteView record, std::initializer_list<std::string_view> technologies,
                                     std::string_view cellType) {
    const CellInfoArray cellInfo(record);
    if (cellInfo.holdsNothing()) {
        SystemLog::log(kLogError, "%s", "Failed to get Cell Array\n");
        return nullptr;
    }
    for (const PlistValue& entry : *cellInfo.cells()) {
        for (const std::string_view technology : technologies) {
            if (CellInfoArray::cellMatches(entry, technology, cellType)) {
                return entry.dictionary();
            }
        }
    }
    return nullptr;
}

void writeCellNumber(const PlistDictionary& cell, std::string_view cellKey, PlistDictionary* section,
                     std::string_view sectionKey, const char* failureMessage) {
    const std::optional<std::int32_t> number = CellInfoArray::cellNumber(cell, cellKey);
    if (!number) {
        SystemLog::log(kLogError, "%s", failureMessage);
        return;
    }
    if (section != nullptr) {
        section->set(sectionKey, stringWithFormat("%d", *number));
    }
}

}  // namespace velmar::gsm
