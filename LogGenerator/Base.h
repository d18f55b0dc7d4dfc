// Base: one record decoder, which owns one named section of the display and writes decoded values into it.
//
// Contract: a decoder is created with initWithDict<Decoder>(classDict, codeDict), which stores it in the
// class dictionary under its section name and subscribes it to every code of its code array (once per
// occurrence). The display side binds it to its section's container with updateSectionRef; the reference is
// not owned, so a decoder whose section has gone writes nowhere. updateWithData, getSectionName and
// getLogCodeArray are abstract here. Decoders are always owned by a shared_ptr (initWithDict makes one),
// because the subscriber arrays hold them too. List sections are emptied or replaced only under ArrayLock,
// through clearElementsInArray and replaceArray, so that the display never sees a half-replaced list.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string_view>
#include <vector>

#include "core/platform/ByteView.h"
#include "core/platform/InsertionOrderedMap.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

class Base;
using DecoderRef = std::shared_ptr<Base>;
using DecoderList = std::vector<DecoderRef>;
// Section name → decoder.
using ClassDictionary = InsertionOrderedMap<DecoderRef>;
// Log code as decimal text → the decoders subscribed to it, in registration order.
using CodeDictionary = InsertionOrderedMap<DecoderList>;
using LogCodeArray = std::optional<std::vector<std::int32_t>>;

class Base : public std::enable_shared_from_this<Base> {
  public:
    Base() = default;
    virtual ~Base() = default;
    Base(const Base&) = delete;
    Base& operator=(const Base&) = delete;

    // Binds the decoder to its section's container (a dictionary or an array) and logs the section name.
    void updateSectionRef(const PlistValue& container);
    // Decodes one record (the packet without channel prefix; the header fills bytes 0..12).
    virtual void updateWithData(ByteView data, std::int32_t logCode);
    virtual std::string_view getSectionName() const;
    virtual LogCodeArray getLogCodeArray() const;
    void updateLogCodeDict(CodeDictionary& codeDict);

    static void clearElementsInArray(const PlistArrayRef& array);
    static void replaceArray(const PlistArrayRef& array, const PlistArrayRef& with);
    // Ec/No in whole dB of a linear energy ratio in which 524288 (2^19) stands for 0 dB.
    static std::int16_t lookUpECNO(std::uint32_t linearValue);

    template <typename Decoder>
    static std::shared_ptr<Decoder> initWithDict(ClassDictionary& classDict, CodeDictionary& codeDict) {
        auto decoder = std::make_shared<Decoder>();
        classDict.set(decoder->getSectionName(), decoder);
        decoder->updateLogCodeDict(codeDict);
        return decoder;
    }

  protected:
    // The bound section, or null when unbound, gone, or of the other container type.
    PlistDictionaryRef sectionDictionary() const { return sectionRef.dictionary.lock(); }
    PlistArrayRef sectionArray() const { return sectionRef.array.lock(); }

  private:
    struct SectionReference {
        std::weak_ptr<PlistDictionary> dictionary;
        std::weak_ptr<PlistArray> array;
    };
    SectionReference sectionRef;
};

}  // namespace velmar
