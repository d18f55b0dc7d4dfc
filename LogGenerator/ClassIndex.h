// ClassIndex: a technology's set of record decoders and the two lookups that dispatch and display use:
// section name → decoder (classDict) and log code → subscribed decoders (codeDictionary).
//
// Contract: a technology's index hands its decoder table (DecoderTable.h) to the constructor, which creates
// the decoders strictly in the table's order with Base::initWithDict; the order of creation is the order of
// dispatch. Log codes are keyed by their decimal text. subscriptions() answers the live code-to-decoder map,
// taken from codeDictionary itself. Destruction writes "Deallocing ClassIndex" to standard output.
#pragma once

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/Base.h"
#include "LogGenerator/DecoderTable.h"

namespace velmar {

class ClassIndex {
  public:
    ClassIndex() = default;
    // Creates one decoder per row, in row order.
    explicit ClassIndex(std::span<const DecoderRow> rows);
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

    // One subscription of the live code-to-decoder map.
    struct Subscription {
        std::optional<std::int32_t> code;  // none for a decoder that subscribes to no code
        const DecoderRow* row;
    };
    // Every code of codeDictionary with each of its subscribers, in dispatch order, then the decoders that
    // subscribe to no code, in creation order. Decoders not created from a row are left out.
    std::vector<Subscription> subscriptions() const;

  protected:
    // Releases the decoders created from the rows, in creation order.
    void releaseDecoders();

    ClassDictionary classDict;
    CodeDictionary codeDictionary;

  private:
    struct CreatedDecoder {
        const DecoderRow* row;
        DecoderRef decoder;
    };
    std::vector<CreatedDecoder> decoders_;
};

}  // namespace velmar
