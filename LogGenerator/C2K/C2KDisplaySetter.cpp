#include "LogGenerator/C2K/C2KDisplaySetter.h"

namespace velmar::c2k {

void setDisplayValue(const PlistDictionary* lookup, std::string_view key, const PlistValue& value) {
    if (lookup == nullptr) {
        return;
    }
    const PlistValue* places = lookup->find(key);
    if (places == nullptr || !places->isArray()) {
        return;
    }
    for (const PlistValue& place : *places->array()) {
        const PlistDictionaryRef& fields = place.dictionary();
        if (!fields) {
            continue;
        }
        const PlistValue* label = fields->find(kPlaceLabelKey);
        const PlistValue* dictionary = fields->find(kPlaceDictionaryKey);
        if (label == nullptr || label->string() == nullptr || dictionary == nullptr ||
            !dictionary->isDictionary()) {
            continue;
        }
        dictionary->dictionary()->set(*label->string(), value);
    }
}

void writeDisplayFields(std::span<const RecordField> fields, const RecordReader& record, std::size_t base,
                        const PlistDictionary* lookup) {
    for (const RecordField& field : fields) {
        setDisplayValue(lookup, field.key, PlistValue(field.format.render(field.read(record, base))));
    }
}

}  // namespace velmar::c2k
