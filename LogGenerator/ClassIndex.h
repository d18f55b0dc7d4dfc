// ClassIndex: a technology's set of record decoders and the two lookups that dispatch and display use:
// section name → decoder (classDict) and log code → subscribed decoders (codeDictionary).
//
// Contract: a subclass creates its decoders in its constructor, strictly in its technology's order, with
// Base::initWithDict<Decoder>(classDict, codeDictionary); the order of creation is the order of dispatch.
// Log codes are keyed by their decimal text. Destruction writes "Deallocing ClassIndex" to standard output.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/Base.h"

namespace velmar {

class ClassIndex {
public:
    ClassIndex() = default;
    virtual ~ClassIndex();
    ClassIndex(const ClassIndex&) = delete;
    ClassIndex& operator=(const ClassIndex&) = delete;

    Base* getClass(std::string_view sectionName) const;
    // The decoders subscribed to the code, in registration order, or null when none registered for it.
    const DecoderList* getSubscribers(std::int32_t code) const;
    // Logs whether classDict is a dictionary and whether it is a string (diagnostic).
    void status() const;
    // Every registered code's decimal text, in the dictionary's order.
    std::vector<std::string> getAllLogCodes() const;

protected:
    ClassDictionary classDict;
    CodeDictionary codeDictionary;
};

}  // namespace velmar
