// ClassIndex: a technology's set of record decoders and the two lookups that dispatch and display use:
// section name → decoder (classDict) and log code → subscribed decoders (codeDictionary).
//
// Contract: a technology's index hands its decoder table (DecoderTable.h) to the constructor, which creates
// the decoders strictly in the table's order with Base::initWithDict; the order of creation is the order of
// dispatch. Log codes are keyed by their decimal text. getSubscribers() answers from a flat table of the
// codes, rebuilt whenever a code is added to or removed from codeDictionary, because it runs once per packet
// and most packets carry codes that no decoder reads. subscriptions() answers the live code-to-decoder map,
// taken from codeDictionary itself. Destruction writes "Deallocing ClassIndex" to standard output.
#pragma once

#include <bitset>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <utility>
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
    // Inline, so that a code without subscribers is turned away by one bit test.
    const DecoderList* getSubscribers(std::int32_t code) const {
        if (dispatch_.revision == codeDictionary.revision() &&
            !dispatch_.mayHave.test(static_cast<std::uint32_t>(code) & 0xFFFFU)) {
            return nullptr;
        }
        return findSubscribers(code);
    }
    // Logs whether classDict is a dictionary and whether it is a string (diagnostic).
    void status() const;
    // Every code that has subscribers, in ascending order.
    std::vector<std::int32_t> subscribedCodes() const;
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

    // codeDictionary as of one revision: a bit per low 16 bits of a code that may have subscribers, and the
    // codes sorted with their lists.
    struct Dispatch {
        std::uint64_t revision = ~std::uint64_t{0};
        std::bitset<0x10000> mayHave;
        std::vector<std::pair<std::int32_t, const DecoderList*>> codes;
    };
    const Dispatch& dispatch() const;
    const DecoderList* findSubscribers(std::int32_t code) const;
    mutable Dispatch dispatch_;
};

}  // namespace velmar
