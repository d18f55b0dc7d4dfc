// DecoderTable: a class index's decoders declared as one table. Each row names a decoder class, the section
// of the display that it fills and the log codes that it subscribes to; the order of the rows is the order
// of creation, and therefore the order in which the decoders sharing a code receive it.
//
// Contract: a class index creates its decoders from its table (ClassIndex(rows)); every decoder of a table
// derives from TableDecoder and answers getSectionName and getLogCodeArray from its own row, which it finds
// by its class name (rowOf), so the table is the one place that says which decoder handles which code. A row
// without codes subscribes to nothing (its code array is null). Decoders that every technology shares keep
// their row beside their class and the tables name that row.
#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <span>
#include <string_view>

#include "LogGenerator/Base.h"

namespace velmar {

// The log codes of one row, in the order in which the decoder lists them.
class LogCodeList {
  public:
    static constexpr std::size_t kMaxCodes = 8;

    constexpr LogCodeList() = default;
    constexpr LogCodeList(std::initializer_list<std::int32_t> codes) : count_(codes.size()) {
        if (codes.size() > kMaxCodes) {
            throw "a decoder lists at most LogCodeList::kMaxCodes codes";
        }
        std::copy(codes.begin(), codes.end(), codes_.begin());
    }

    constexpr std::span<const std::int32_t> codes() const { return {codes_.data(), count_}; }
    // The codes as a decoder's code array: null when there are none.
    LogCodeArray toArray() const {
        if (count_ == 0) {
            return std::nullopt;
        }
        return std::vector<std::int32_t>(codes_.begin(),
                                         codes_.begin() + static_cast<std::ptrdiff_t>(count_));
    }

  private:
    std::array<std::int32_t, kMaxCodes> codes_{};
    std::size_t count_ = 0;
};

using DecoderFactory = DecoderRef (*)(ClassDictionary& classDict, CodeDictionary& codeDict);

template <typename Decoder>
DecoderRef createDecoder(ClassDictionary& classDict, CodeDictionary& codeDict) {
    return Base::initWithDict<Decoder>(classDict, codeDict);
}

struct DecoderRow {
    const char* decoder;  // the class name
    std::string_view section;
    LogCodeList codes;
    DecoderFactory create;
};

// One row: VELMAR_DECODER_ROW(Class, "Section", code, code, ...).
// clang-format off
#define VELMAR_DECODER_ROW(Decoder, section, ...) \
    ::velmar::DecoderRow{#Decoder, section, {__VA_ARGS__}, &::velmar::createDecoder<Decoder>}
// clang-format on

// The row of the decoder class named `decoder` in table; a name missing from the table does not compile.
template <std::size_t N>
consteval const DecoderRow& rowOf(const DecoderRow (&table)[N], std::string_view decoder) {
    for (const DecoderRow& row : table) {
        if (decoder == row.decoder) {
            return row;
        }
    }
    throw "the decoder has no row in this table";
}

// A decoder whose section name and log codes are those of its row.
class TableDecoder : public Base {
  public:
    std::string_view getSectionName() const override { return row_.section; }
    LogCodeArray getLogCodeArray() const override { return row_.codes.toArray(); }
    const DecoderRow& row() const { return row_; }

  protected:
    explicit TableDecoder(const DecoderRow& row) : row_(row) {}

  private:
    const DecoderRow& row_;
};

}  // namespace velmar
